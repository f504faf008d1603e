#include "moka/host/EglPlatform.h"

#include "moka/host/EglError.h"

#include <EGL/eglext.h>

#include <cstring>

namespace Moka::detail {
namespace {

// From EGL_ANGLE_platform_angle and related extensions, which the system's header does not contain.
constexpr EGLenum kPlatformAngle = 0x3202;
constexpr EGLint kPlatformAngleType = 0x3203;
constexpr EGLint kPlatformAngleDeviceType = 0x3209;
constexpr EGLint kPlatformAngleDeviceSwiftShader = 0x3487;
constexpr EGLint kPlatformAngleVulkan = 0x3450;
// From EGL_EXT_platform_xcb, which older headers do not contain.
constexpr EGLenum kPlatformXcb = 0x31DC;

template <class Function>
Function Load(char const* name) {
    return reinterpret_cast<Function>(eglGetProcAddress(name));
}

EglPlatform Finish(std::string name, EGLDisplay display, char const* function) {
    if (display == EGL_NO_DISPLAY) return {std::move(name), display, DescribeEglFailure(function)};
    return {std::move(name), display, {}};
}

class Finder {
public:
    std::vector<EglPlatform> List() {
        char const* const extensions = eglQueryString(EGL_NO_DISPLAY, EGL_EXTENSIONS);
        if (HasEglExtension(extensions, "EGL_EXT_platform_base")) {
            mGetDisplay = Load<PFNEGLGETPLATFORMDISPLAYEXTPROC>("eglGetPlatformDisplayEXT");
        }
        if (mGetDisplay) {
            if (HasEglExtension(extensions, "EGL_EXT_platform_device")) AddDevices();
            if (HasEglExtension(extensions, "EGL_MESA_platform_surfaceless")) AddSurfaceless();
            if (HasEglExtension(extensions, "EGL_ANGLE_platform_angle")) AddAngle();
        }
        mPlatforms.push_back(Finish("default display", eglGetDisplay(EGL_DEFAULT_DISPLAY), "eglGetDisplay"));
        return std::move(mPlatforms);
    }

private:
    void Add(std::string name, EGLenum platform, void* native, EGLint const* attributes) {
        EGLDisplay const display = mGetDisplay(platform, native, attributes);
        mPlatforms.push_back(Finish(std::move(name), display, "eglGetPlatformDisplayEXT"));
    }

    void AddDevices() {
        auto const queryDevices = Load<PFNEGLQUERYDEVICESEXTPROC>("eglQueryDevicesEXT");
        EGLint count = 0;
        if (!queryDevices || !queryDevices(0, nullptr, &count) || count < 1) return;
        std::vector<EGLDeviceEXT> devices(static_cast<std::size_t>(count));
        if (!queryDevices(count, devices.data(), &count)) return;
        for (int i = 0; i < count; ++i) {
            Add("device platform, device " + std::to_string(i + 1) + " of " + std::to_string(count),
                EGL_PLATFORM_DEVICE_EXT, devices[static_cast<std::size_t>(i)], nullptr);
        }
    }

    void AddSurfaceless() {
        Add("surfaceless platform", EGL_PLATFORM_SURFACELESS_MESA, EGL_DEFAULT_DISPLAY, nullptr);
    }

    void AddAngle() {
        EGLint const attributes[] = {kPlatformAngleType, kPlatformAngleVulkan, kPlatformAngleDeviceType,
                                     kPlatformAngleDeviceSwiftShader, EGL_NONE};
        Add("ANGLE platform, Vulkan on SwiftShader", kPlatformAngle, EGL_DEFAULT_DISPLAY, attributes);
    }

    PFNEGLGETPLATFORMDISPLAYEXTPROC mGetDisplay = nullptr;
    std::vector<EglPlatform> mPlatforms;
};

} // namespace

std::vector<EglPlatform> ListEglPlatforms() { return Finder().List(); }

std::vector<EglPlatform> ListWindowPlatforms(void* xcbConnection, void* nativeDisplay) {
    std::vector<EglPlatform> platforms;
    char const* const extensions = eglQueryString(EGL_NO_DISPLAY, EGL_EXTENSIONS);
    if (xcbConnection && HasEglExtension(extensions, "EGL_EXT_platform_xcb")) {
        auto const getDisplay = Load<PFNEGLGETPLATFORMDISPLAYEXTPROC>("eglGetPlatformDisplayEXT");
        platforms.push_back(Finish("XCB platform", getDisplay(kPlatformXcb, xcbConnection, nullptr),
                                   "eglGetPlatformDisplayEXT"));
    }
    // EGL's native types are pointers or numbers, depending on the window system. Only a C-style cast
    // converts to both.
    platforms.push_back(
        Finish("window system", eglGetDisplay((EGLNativeDisplayType)nativeDisplay), "eglGetDisplay"));
    return platforms;
}

bool HasEglExtension(char const* extensions, char const* name) {
    std::size_t const length = std::strlen(name);
    for (char const* at = extensions; at && *at;) {
        std::size_t const word = std::strcspn(at, " ");
        if (word == length && std::strncmp(at, name, length) == 0) return true;
        at += word + std::strspn(at + word, " ");
    }
    return false;
}

} // namespace Moka::detail
