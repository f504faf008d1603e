#include "moka/base/System.h"

#include <atomic>

namespace Moka {
namespace {
std::atomic<bool> engineeringBuild{false};
}

bool System::IsBuildTypeEngMode() { return engineeringBuild.load(std::memory_order_relaxed); }

void System::SetBuildTypeEngMode(bool on) { engineeringBuild.store(on, std::memory_order_relaxed); }

} // namespace Moka
