// RunGuarded: calls a function of the application on a thread that must survive its exceptions.
// Fails:  if the function throws, logs an error and returns false.
#pragma once

#include "moka/base/log/AndroidLog.h"

#include <exception>

namespace Moka {

// The log line has this tag and begins with who.
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
