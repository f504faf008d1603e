// PathForLog: the text of a path for log lines. In engineering builds it is UTF-8, cut to MaxBytes at a
// character boundary. In other builds it is empty, because a path is private data.
#pragma once

#include "moka/base/String.h"
#include "moka/base/System.h"

namespace Moka::detail {

template <int MaxBytes>
class PathForLog {
public:
    explicit PathForLog(String const& path) {
        if (mIsShown) path.ToUtf8(mText, MaxBytes);
    }

    bool IsShown() const { return mIsShown; }
    char const* Get() const { return mText; }

private:
    bool const mIsShown = System::IsBuildTypeEngMode();
    char mText[MaxBytes + 1] = "";
};

} // namespace Moka::detail
