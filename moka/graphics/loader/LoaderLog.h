// LoaderLog.h: the log lines of the loader itself.
#pragma once

#include "moka/base/log/InfoLog.h"

namespace Moka::detail {

constexpr char const* kLoaderTag = "BitmapLoaderImpl";

constexpr InfoLog LogInfo{kLoaderTag};

} // namespace Moka::detail
