// LoaderLog.h: the log tag of the loader, and a function for its information lines.
#pragma once

#include "moka/base/log/InfoLog.h"

namespace Moka::detail {

constexpr char const* kLoaderTag = "BitmapLoaderImpl";

constexpr InfoLog LogInfo{kLoaderTag};

} // namespace Moka::detail
