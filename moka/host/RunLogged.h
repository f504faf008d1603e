// RunLogged: calls what somebody else wrote, on a thread that must go on afterwards.
#pragma once

#include "moka/base/log/AndroidLog.h"

#include <exception>

namespace Moka::detail {

// False, and one error line that begins with who, when function threw.
template <class Function>
bool RunLogged(char const* who, Function const& function) {
    try {
        function();
        return true;
    } catch (std::exception const& error) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s threw: %s", who, error.what());
    } catch (...) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s threw something that is no std::exception",
                            who);
    }
    return false;
}

} // namespace Moka::detail
