// HostContext: the GL context and the surface of a render thread, or nothing for the device without a driver.
// The implementation is chosen at link time.
// Owner:  the render thread, which opens and destroys it.
#pragma once

#include "moka/renderer/RendererFactory.h"

#include <memory>
#include <string>

namespace Moka {
struct RenderThreadOptions;
}

namespace Moka::detail {

class HostContext {
public:
    // On failure returns null; *error names the attempts and the packages to install.
    static std::unique_ptr<HostContext> Open(RenderThreadOptions const& options, std::string* error);
    virtual ~HostContext() = default;

    // The platform and the surface: "EGL surfaceless platform, pbuffer 640 x 480".
    virtual std::string const& GetPath() const = 0;
    virtual std::string const& GetVersion() const = 0;
    // The loader for RendererFactory::AttachContext; may be null.
    virtual RendererProcLoader GetLoader() const = 0;
    // Shows the window's frame buffer. If there is no window any more, logs an error and returns false.
    virtual bool SwapBuffers() = 0;
};

} // namespace Moka::detail
