#include "moka/graphics/debug/CanvasChecker.h"

#include <cxxabi.h>

namespace Moka::detail {

void EndAsPureVirtual() { abi::__cxa_pure_virtual(); }

} // namespace Moka::detail
