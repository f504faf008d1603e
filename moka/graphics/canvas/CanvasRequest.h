// CanvasRequest.h: how a canvas front end reaches its render side.
#pragma once

#include "moka/graphics/task/WorkerTask.h"

#include <utility>

namespace Moka::detail {

// Calls impl->function(values...): posted as a task with copies of the values, or at once with the values
// themselves. False when it will never run (no impl, or the queue refused): then the caller still owns the
// values' objects.
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
