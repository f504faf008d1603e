// RecorderCaps: the capabilities of the device that is attached, or was attached last.
// Thread: Set on the render thread; the rest anywhere, also while another context is being attached.
#pragma once

#include "moka/renderer/IRendererDeviceCaps.h"

#include <atomic>

namespace Moka {
struct RendererLimits;
}

namespace Moka::detail {

struct DeviceCaps;

class RecorderCaps final : public IRendererDeviceCaps {
public:
    static RecorderCaps& Get();

    void Set(DeviceCaps const& caps, RendererLimits const& limits);

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
