#include "moka/renderer/record/DepthStencilBuffer.h"

#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/Recorder.h"
#include "moka/renderer/record/RenderTarget.h"

#include <utility>

namespace Moka::detail {

DepthStencilBuffer::DepthStencilBuffer(std::shared_ptr<Recorder> recorder, DeviceName name, int width,
                                       int height)
    : mRecorder(std::move(recorder)), mName(name), mWidth(width), mHeight(height) {
    ++mRecorder->counters.depthStencilBuffers;
}

DepthStencilBuffer::~DepthStencilBuffer() { --mRecorder->counters.depthStencilBuffers; }

void DepthStencilBuffer::Release() {
    Observe(ObjectKind::kDepthStencilBuffer, this, "Release");
    // Keeps the recorder alive after `delete this`.
    std::shared_ptr<Recorder> const recorder = mRecorder;
    RequestScope const scope(*recorder);
    if (mTarget) mTarget->ForgetDepthStencil();
    if (scope) recorder->depthStencilPool.Return(mName, mWidth, mHeight);
    delete this;
}

} // namespace Moka::detail
