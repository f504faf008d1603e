// RunGuarded: calls what somebody else wrote, on a thread that must go on afterwards.
// Fails:  what it throws is one error line, and false.
#pragma once

#include "moka/base/log/AndroidLog.h"

#include <exception>

namespace Moka {

// The line stands under tag and begins with who.
template <class Function>
bool RunGuarded(char const* tag, char const* who, Function const& function) {
    try {
        function();
        return true;
    } catch (std::exception const& error) {
        __android_log_print(ANDROID_LOG_ERROR, tag, "%s threw: %s", who, error.what());
    } catch (...) {
        __android_log_print(ANDROID_LOG_ERROR, tag, "%s threw something that is no std::exception", who);
    }
    return false;
}

} // namespace Moka
