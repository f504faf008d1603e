// CanvasRequest.h: the calls from a canvas front end to its render side.
#pragma once

#include "moka/graphics/task/WorkerTask.h"

#include <utility>

namespace Moka::detail {

// Calls impl->function(values...), in a posted task with copies of the values, or at once. Returns false if
// the call will never run (impl is null, or the queue refused it). The caller then still owns the objects
// that the values point to.
template <bool kPosts, class Impl, class Function, class... Values>
bool Request(IGLMsgQueue* queue, Impl* impl, Function function, Values&&... values) {
    if (!impl) return false;
    if constexpr (kPosts) {
        return WorkerTask::PostMember(queue, impl, function, std::forward<Values>(values)...);
    } else {
        (impl->*function)(std::forward<Values>(values)...);
        return true;
    }
}

} // namespace Moka::detail
