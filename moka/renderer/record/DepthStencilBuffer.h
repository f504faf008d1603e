// DepthStencilBuffer: a depth-stencil buffer as the factory hands it out. The device's buffer comes from the
// pool and returns there.
#pragma once

#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class Recorder;
class RenderTarget;

class DepthStencilBuffer final : public IDepthStencilBuffer {
public:
    // Adopts a name that the pool gave.
    DepthStencilBuffer(std::shared_ptr<Recorder> recorder, DeviceName name, int width, int height);
    DepthStencilBuffer(DepthStencilBuffer const&) = delete;
    ~DepthStencilBuffer();
    DepthStencilBuffer& operator=(DepthStencilBuffer const&) = delete;

    void Release() override;

    std::shared_ptr<Recorder> const& GetRecorder() const { return mRecorder; }
    DeviceName GetName() const { return mName; }
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }

    // The target it is attached to, or null; RenderTarget keeps it current.
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
