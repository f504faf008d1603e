#include "moka/renderer/null/NullDevice.h"

namespace Moka::detail {

std::unique_ptr<Device> MakeDevice(RendererProcLoader, Counters& counters) {
    return std::make_unique<NullDevice>(counters);
}

} // namespace Moka::detail
