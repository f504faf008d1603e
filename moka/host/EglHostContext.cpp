// Implements HostContext with EGL.
#include "moka/host/EglContext.h"
#include "moka/host/HostContext.h"
#include "moka/host/RenderThread.h"

#include <utility>

namespace Moka::detail {
namespace {

class EglHostContext final : public HostContext {
public:
    explicit EglHostContext(std::unique_ptr<EglContext> egl) : mEgl(std::move(egl)) {}

    std::string const& GetPath() const override { return mEgl->GetPath(); }
    std::string const& GetVersion() const override { return mEgl->GetVersion(); }
    RendererProcLoader GetLoader() const override { return eglGetProcAddress; }
    bool SwapBuffers() override { return mEgl->SwapBuffers(); }

private:
    std::unique_ptr<EglContext> const mEgl;
};

} // namespace

std::unique_ptr<HostContext> HostContext::Open(RenderThreadOptions const& options, std::string* error) {
    std::unique_ptr<EglContext> egl =
        EglContext::Open({options.debugContext, options.surfaceWidth, options.surfaceHeight,
                          options.nativeWindow, options.nativeDisplay, options.swapInterval},
                         error);
    return egl ? std::make_unique<EglHostContext>(std::move(egl)) : nullptr;
}

} // namespace Moka::detail
