// PathForLog: a path as a log line may show it: in an engineering build its UTF-8, at most MaxBytes of it,
// cut at a character boundary; in any other build nothing.
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
