// RendererPtr: owns an object of the renderer's that is given back with Release().
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

// From any thread; null posts nothing. Refused, the object leaks rather than being released on the wrong
// thread.
template <class T>
void PostRelease(IGLMsgQueue* queue, RendererPtr<T> object) {
    if (T* const released = object.release()) WorkerTask::PostMember(queue, released, &T::Release);
}

} // namespace Moka::detail
