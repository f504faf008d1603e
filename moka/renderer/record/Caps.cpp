#include "moka/renderer/record/Caps.h"

#include "moka/renderer/device/Device.h"

#include <algorithm>
#include <set>
#include <string>

namespace Moka::detail {
namespace {

// Callers may keep the pointers until the process ends, so the strings are never freed. The set stores each
// text once, however many contexts one driver creates. No lock: at most one render thread is attached at a
// time.
char const* Intern(std::string const& text) {
    static auto& strings = *new std::set<std::string>;
    return strings.insert(text).first->c_str();
}

} // namespace

RecorderCaps& RecorderCaps::Get() {
    static RecorderCaps caps;
    return caps;
}

void RecorderCaps::Set(DeviceCaps const& caps, RendererLimits const& limits) {
    int const size = caps.maxTextureSize;
    mMaxTextureSize = limits.maxTextureSize > 0 ? std::min(size, limits.maxTextureSize) : size;
    mVendor = Intern(caps.vendor);
    mRenderer = Intern(caps.renderer);
    mVersion = Intern(caps.version);
}

} // namespace Moka::detail
