/// System: facts about the build that the host sets once.
/// Thread: any (atomic).
#pragma once

#include "moka/base/Export.h"

namespace Moka {

class MOKA_API System {
public:
    /// Whether this is an engineering build, which may print file paths. False until set.
    static bool IsBuildTypeEngMode();
    static void SetBuildTypeEngMode(bool on);
};

} // namespace Moka
