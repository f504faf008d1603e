// InfoLog: logs lines of info priority with one tag.
//     constexpr InfoLog LogInfo{"mok_log"};
//     LogInfo("queue size(%d)", size);
#pragma once

#include "moka/base/log/AndroidLog.h"

namespace Moka {

struct InfoLog {
    char const* tag;

    template <class... Values>
    void operator()(char const* format, Values... values) const {
        if constexpr (sizeof...(values) == 0)
            __android_log_print(ANDROID_LOG_INFO, tag, "%s", format);
        else
            __android_log_print(ANDROID_LOG_INFO, tag, format, values...);
    }
};

} // namespace Moka
