// CanvasReach.h: the two ways from a front end to its render side.
#pragma once

#include "moka/graphics/task/WorkerTask.h"

#include <utility>

namespace Moka::detail {

// From any thread: each call is posted. A refused one is dropped; references taken for it stay.
struct ByTask {
    static constexpr bool kOnRenderThread = false;

    template <class Impl, class Function, class... Values>
    static bool Call(IGLMsgQueue* queue, Impl* impl, Function function, Values&&... values) {
        return WorkerTask::PostMember(queue, impl, function, std::forward<Values>(values)...);
    }
    template <class Impl>
    static void Delete(IGLMsgQueue* queue, Impl* impl) {
        WorkerTask::PostDelete(queue, impl);
    }
};

// On the render thread: the task that would have been posted is run here. So the arguments are copied all the
// same, and a drawable may change the canvas that draws it.
struct AtOnce {
    static constexpr bool kOnRenderThread = true;

    template <class Impl, class Function, class... Values>
    static bool Call(IGLMsgQueue*, Impl* impl, Function function, Values&&... values) {
        using Task = typename WorkerTask::detail::TaskFor<Impl, Function>::Type;
        Task(impl, function, std::forward<Values>(values)...).run();
        return true;
    }
    template <class Impl>
    static void Delete(IGLMsgQueue*, Impl* impl) {
        delete impl;
    }
};

} // namespace Moka::detail
