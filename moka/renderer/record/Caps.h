// RecorderCaps: the capabilities of the attached device, or of the last one after it was detached.
// Thread: Set() runs on the render thread. Any thread may call the getters, also while a context is attached.
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
