// Implements HostContext for the device without a driver.
#include "moka/host/HostContext.h"
#include "moka/host/RenderThread.h"

namespace Moka::detail {
namespace {

class NullHostContext final : public HostContext {
public:
    std::string const& GetPath() const override { return mPath; }
    std::string const& GetVersion() const override { return mVersion; }
    RendererProcLoader GetLoader() const override { return nullptr; }
    bool SwapBuffers() override { return false; }

private:
    std::string const mPath = "no driver";
    std::string const mVersion = "none";
};

} // namespace

std::unique_ptr<HostContext> HostContext::Open(RenderThreadOptions const& options, std::string* error) {
    if (options.nativeWindow == 0) return std::make_unique<NullHostContext>();
    *error = "the device without a driver shows no windows; leave nativeWindow 0, or link moka_host";
    return nullptr;
}

} // namespace Moka::detail
