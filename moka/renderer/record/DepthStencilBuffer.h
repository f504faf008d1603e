// DepthStencilBuffer: the factory's implementation of IDepthStencilBuffer. Its device buffer comes from the
// DepthStencilPool and returns there on release.
#pragma once

#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class Recorder;
class RenderTarget;

class DepthStencilBuffer final : public IDepthStencilBuffer {
public:
    // Takes ownership of name, which DepthStencilPool::Take returned.
    DepthStencilBuffer(std::shared_ptr<Recorder> recorder, DeviceName name, int width, int height);
    DepthStencilBuffer(DepthStencilBuffer const&) = delete;
    ~DepthStencilBuffer();
    DepthStencilBuffer& operator=(DepthStencilBuffer const&) = delete;

    void Release() override;

    std::shared_ptr<Recorder> const& GetRecorder() const { return mRecorder; }
    DeviceName GetName() const { return mName; }
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }

    // The target that this buffer is attached to, or null. RenderTarget updates it.
    RenderTarget* GetTarget() const { return mTarget; }
    void SetTarget(RenderTarget* target) { mTarget = target; }

private:
    std::shared_ptr<Recorder> const mRecorder;
    DeviceName const mName;
    int const mWidth;
    int const mHeight;
    RenderTarget* mTarget = nullptr;
};

} // namespace Moka::detail
