#include "moka/renderer/record/DepthStencilPool.h"

#include "moka/renderer/record/Recorder.h"

#include <algorithm>
#include <iterator>

namespace Moka::detail {

DeviceName DepthStencilPool::Take(int width, int height) {
    auto const found = std::find_if(mWaiting.rbegin(), mWaiting.rend(), [=](Entry const& entry) {
        return entry.width == width && entry.height == height;
    });
    DeviceName name = 0;
    if (found != mWaiting.rend()) {
        name = found->name;
        mWaiting.erase(std::next(found).base());
        --mRecorder.counters.pooledRenderBuffers;
    } else {
        name = mRecorder.GetDevice().CreateDepthStencil(width, height);
    }
    if (name != 0) ++mRecorder.counters.renderBuffers;
    return name;
}

void DepthStencilPool::Return(DeviceName name, int width, int height) {
    --mRecorder.counters.renderBuffers;
    ++mRecorder.counters.pooledRenderBuffers;
    mWaiting.push_back({name, width, height});
    if (mWaiting.size() <= kMaxWaiting) return;
    mRecorder.Flush();
    DeleteOldest();
}

void DepthStencilPool::Clear() {
    while (!mWaiting.empty()) DeleteOldest();
}

void DepthStencilPool::DeleteOldest() {
    mRecorder.ForgetStencil(mWaiting.front().name);
    mRecorder.GetDevice().DeleteDepthStencil(mWaiting.front().name);
    mWaiting.pop_front();
    --mRecorder.counters.pooledRenderBuffers;
}

} // namespace Moka::detail
