#include "moka/renderer/record/Caps.h"

#include "moka/renderer/device/Device.h"

#include <algorithm>
#include <set>
#include <string>

namespace Moka::detail {
namespace {

// Callers keep the pointers for the life of the process, so the strings are never freed; a set, because
// contexts of one driver repeat them. Render threads come one after the other: no lock.
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
