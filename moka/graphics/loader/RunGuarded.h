// RunGuarded: calls what somebody else wrote, on a thread that must go on afterwards.
#pragma once

#include "moka/base/log/AndroidLog.h"

#include <exception>

namespace Moka::detail {

// What function throws is one error line under tag, which begins with who.
template <class Function>
void RunGuarded(char const* tag, char const* who, Function const& function) {
    try {
        function();
    } catch (std::exception const& error) {
        __android_log_print(ANDROID_LOG_ERROR, tag, "%s threw: %s", who, error.what());
    } catch (...) {
        __android_log_print(ANDROID_LOG_ERROR, tag, "%s threw something that is no std::exception", who);
    }
}

} // namespace Moka::detail
