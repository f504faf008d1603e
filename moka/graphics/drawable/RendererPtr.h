// RendererPtr: owns an object of the renderer and calls its Release().
// Thread: render thread, except PostRelease.
#pragma once

#include "moka/graphics/task/WorkerTask.h"

#include <memory>

namespace Moka::detail {

struct ReleaseObject {
    template <class T>
    void operator()(T* object) const {
        object->Release();
    }
};

template <class T>
using RendererPtr = std::unique_ptr<T, ReleaseObject>;

// Posts the release of the object. Callable on any thread. Null posts nothing. If the queue refuses, the
// object leaks, because it must not be released on another thread.
template <class T>
void PostRelease(IGLMsgQueue* queue, RendererPtr<T> object) {
    if (T* const released = object.release()) WorkerTask::PostMember(queue, released, &T::Release);
}

} // namespace Moka::detail
