#include "moka/base/MessageLoop.h"

#include "moka/base/Check.h"
#include "moka/base/MessageQueue.h"
#include "moka/base/log/AndroidLog.h"

#include <exception>

namespace Moka {
namespace {

using detail::HandlerState;
using detail::Message;
using detail::MessageQueue;

thread_local MessageLoop* currentLoop = nullptr;

void Call(HandlerState const& target, int what) {
    try {
        target.function(target.handler, target.argument, what);
    } catch (std::exception const& error) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "MessageLoop: message %d threw: %s", what,
                            error.what());
    } catch (...) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "MessageLoop: message %d threw", what);
    }
}

// Runs the first message. lock holds the queue's mutex and is released while the message runs.
void RunFirst(MessageQueue& queue, std::unique_lock<std::mutex>& lock) {
    Message const message = std::move(queue.messages.front());
    queue.messages.pop_front();
    HandlerState& target = *message.target;
    ++target.running;
    lock.unlock();
    Call(target, message.what);
    lock.lock();
    --target.running;
    if (target.closed) queue.finished.notify_all();
}

} // namespace

MessageLoop::MessageLoop() : mQueue(std::make_shared<MessageQueue>()) {
    MOKA_CHECK(!currentLoop, "this thread has a MessageLoop already");
    currentLoop = this;
}

MessageLoop::~MessageLoop() {
    MOKA_CHECK(currentLoop == this, "a MessageLoop is destroyed by the thread that made it");
    currentLoop = nullptr;
    std::list<Message>
        dropped; // destroyed after the lock is released, because messages may own the state of a handler
    std::lock_guard<std::mutex> const lock(mQueue->mutex);
    mQueue->closed = true;
    mQueue->messages.swap(dropped);
}

MessageLoop* MessageLoop::GetCurrent() { return currentLoop; }

void MessageLoop::Run() {
    MOKA_CHECK(currentLoop == this, "a MessageLoop runs on the thread that made it");
    auto const queue = mQueue; // the last message may destroy the loop
    std::unique_lock<std::mutex> lock(queue->mutex);
    while (true) {
        queue->changed.wait(lock, [&] { return queue->quit || queue->closed || !queue->messages.empty(); });
        if (queue->quit || queue->closed) break;
        RunFirst(*queue, lock);
    }
    queue->quit = false;
}

int MessageLoop::RunPending() {
    MOKA_CHECK(currentLoop == this, "a MessageLoop runs on the thread that made it");
    auto const queue = mQueue;
    std::unique_lock<std::mutex> lock(queue->mutex);
    std::uint64_t const end = queue->nextSerial;
    int count = 0;
    while (!queue->messages.empty() && queue->messages.front().serial < end) {
        RunFirst(*queue, lock);
        ++count;
    }
    return count;
}

void MessageLoop::Quit() {
    auto const queue = mQueue; // the loop may be destroyed as soon as its thread sees the flag
    {
        std::lock_guard<std::mutex> const lock(queue->mutex);
        queue->quit = true;
    }
    queue->changed.notify_all();
}

} // namespace Moka
