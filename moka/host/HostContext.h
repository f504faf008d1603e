// HostContext: what a render thread owns so that the renderer works on it: a GL context and its surface, or
// nothing over the device without a driver. Which one is decided when linking.
// Owner:  the render thread, which opens and destroys it on itself.
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
    // Null, with what was tried and what to install.
    static std::unique_ptr<HostContext> Open(RenderThreadOptions const& options, std::string* error);
    virtual ~HostContext() = default;

    // How it was reached: "EGL surfaceless platform, pbuffer 640 x 480".
    virtual std::string const& GetPath() const = 0;
    virtual std::string const& GetVersion() const = 0;
    // For RendererFactory::AttachContext; may be null.
    virtual RendererProcLoader GetLoader() const = 0;
    // False, with one error line, when there is nothing to show it in, now and from now on.
    virtual bool SwapBuffers() = 0;
};

} // namespace Moka::detail
