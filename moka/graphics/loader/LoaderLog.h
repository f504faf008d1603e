// LoaderLog.h: the log lines of the loader itself.
#pragma once

#include "moka/base/log/AndroidLog.h"

namespace Moka::detail {

constexpr char const* kLoaderTag = "BitmapLoaderImpl";

inline void LogInfo(char const* text) { __android_log_print(ANDROID_LOG_INFO, kLoaderTag, "%s", text); }

template <class... Values>
void LogInfo(char const* format, Values... values) {
    __android_log_print(ANDROID_LOG_INFO, kLoaderTag, format, values...);
}

} // namespace Moka::detail
