#include "moka/base/Handler.h"

#include "moka/base/Check.h"
#include "moka/base/MessageLoop.h"
#include "moka/base/MessageQueue.h"
#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <new>

namespace Moka {

using detail::HandlerState;
using detail::Message;

Handler::Handler(Function function, void* argument) {
    MOKA_CHECK(function, "a Handler needs a function");
    MessageLoop const* const loop = MessageLoop::GetCurrent();
    if (!loop) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "Handler: this thread has no MessageLoop; make one before the handler");
        return;
    }
    try {
        mState = std::shared_ptr<HandlerState>(new HandlerState{this, function, argument, loop->mQueue});
    } catch (std::bad_alloc const&) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "Handler: out of memory");
    }
}

Handler::~Handler() {
    if (!mState) return;
    auto const& queue = mState->queue;
    std::unique_lock<std::mutex> lock(queue->mutex);
    mState->closed = true;
    queue->messages.remove_if([this](Message const& message) { return message.target == mState; });
    if (queue->owner == std::this_thread::get_id()) return;
    queue->finished.wait(lock, [this] { return mState->running == 0; });
}

bool Handler::HasMessage(int what) const {
    if (!mState) return false;
    std::lock_guard<std::mutex> const lock(mState->queue->mutex);
    auto const& messages = mState->queue->messages;
    return std::any_of(messages.begin(), messages.end(), [&](Message const& message) {
        return message.target == mState && message.what == what;
    });
}

bool Handler::SendMessage(int what) {
    if (!mState) return false;
    auto const queue = mState->queue; // the message may destroy this handler before it is announced
    {
        std::lock_guard<std::mutex> const lock(queue->mutex);
        if (queue->closed || mState->closed) return false;
        try {
            queue->messages.push_back({mState, what, queue->nextSerial});
        } catch (std::bad_alloc const&) {
            return false;
        }
        ++queue->nextSerial;
    }
    queue->changed.notify_one();
    return true;
}

} // namespace Moka
