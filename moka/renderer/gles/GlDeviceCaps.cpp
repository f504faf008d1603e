#include "moka/renderer/gles/GlDeviceCaps.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/RendererFactory.h"

#include <GLES3/gl3.h>

#include <algorithm>
#include <cstdio>
#include <set>
#include <string>

namespace Moka::detail {
namespace {

// Callers keep the pointers for the life of the process, so the strings are never freed; a set, because
// contexts of one driver repeat them. Render threads come one after the other: no lock.
char const* Intern(GLenum name) {
    static auto& strings = *new std::set<std::string>;
    auto const* const text = reinterpret_cast<char const*>(glGetString(name));
    return strings.insert(text ? text : "").first->c_str();
}

bool IsGles3(char const* version) {
    int major = 0;
    return std::sscanf(version, "OpenGL ES %d.", &major) == 1 && major >= 3;
}

} // namespace

GlDeviceCaps& GlDeviceCaps::Get() {
    static GlDeviceCaps caps;
    return caps;
}

bool GlDeviceCaps::Read(RendererLimits const& limits) {
    char const* const version = Intern(GL_VERSION);
    if (!IsGles3(version)) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "RendererFactory::AttachContext needs a current context of OpenGL ES 3.0 or later; "
            "found \"%s\"",
            version);
        return false;
    }
    GLint size = 0;
    glGetIntegerv(GL_MAX_TEXTURE_SIZE, &size);
    mMaxTextureSize = limits.maxTextureSize > 0 ? std::min(size, limits.maxTextureSize) : size;
    mVendor = Intern(GL_VENDOR);
    mRenderer = Intern(GL_RENDERER);
    mVersion = version;
    return true;
}

} // namespace Moka::detail
