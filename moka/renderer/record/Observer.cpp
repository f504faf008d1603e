#include "moka/renderer/record/Observer.h"

namespace Moka::detail {

RecorderObserver* theObserver = nullptr;

} // namespace Moka::detail
