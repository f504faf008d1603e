#include "moka/base/Check.h"

#include "moka/base/log/AndroidLog.h"

#include <cstdlib>

namespace Moka::detail {

void CheckFailed(char const* file, int line, char const* condition, char const* text) {
    __android_log_print(ANDROID_LOG_FATAL, "mok_log", "%s:%d: %s (%s)", file, line, text, condition);
    std::abort();
}

} // namespace Moka::detail
