// GlDeviceCaps: what the driver said when a context was attached.
// Thread: Read on the render thread; the rest anywhere, also while another context is being attached.
#pragma once

#include "moka/renderer/IRendererDeviceCaps.h"

#include <atomic>

namespace Moka {
struct RendererLimits;
}

namespace Moka::detail {

class GlDeviceCaps final : public IRendererDeviceCaps {
public:
    static GlDeviceCaps& Get();

    // False, with an error line, without a current context of OpenGL ES 3.0 or later.
    bool Read(RendererLimits const& limits);

    int GetMaxTextureSize() const override { return mMaxTextureSize; }
    char const* GetVendor() const override { return mVendor; }
    char const* GetRenderer() const override { return mRenderer; }
    char const* GetVersion() const override { return mVersion; }

private:
    std::atomic<int> mMaxTextureSize{4096};
    std::atomic<char const*> mVendor{""};
    std::atomic<char const*> mRenderer{""};
    std::atomic<char const*> mVersion{""};
};

} // namespace Moka::detail
