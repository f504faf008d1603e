/// System: properties of the build, which the host sets once.
/// Thread: any (atomic).
#pragma once

#include "moka/base/Export.h"

namespace Moka {

class MOKA_API System {
public:
    /// True in an engineering build, which may log file paths. The default is false.
    static bool IsBuildTypeEngMode();
    static void SetBuildTypeEngMode(bool on);
};

} // namespace Moka
