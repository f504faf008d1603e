// MessageQueue.h: the state that a MessageLoop and the Handlers of its thread share.
// Owner:  shared by the loop, the handlers, and their running functions, so each of them may be destroyed
//         first.
// Thread: mutex guards all members that are not const. It is never held while a message runs.
#pragma once

#include <condition_variable>
#include <cstdint>
#include <list>
#include <memory>
#include <mutex>
#include <thread>

namespace Moka {

class Handler;

namespace detail {

struct HandlerState;

struct Message {
    std::shared_ptr<HandlerState> target; // a handler may be destroyed by its own message
    int what = 0;
    std::uint64_t serial = 0; // increases in the order of sending
};

struct MessageQueue {
    std::thread::id const owner = std::this_thread::get_id();
    std::mutex mutex;
    std::condition_variable changed;  // a message was sent, or Quit was called
    std::condition_variable finished; // a message of a handler that is being destroyed has run
    std::list<Message> messages;      // not a deque, which allocates even if it is empty
    std::uint64_t nextSerial = 0;
    bool quit = false;
    bool closed = false; // the loop was destroyed
};

struct HandlerState {
    Handler* const handler;
    void (*const function)(Handler* handler, void* argument, int what);
    void* const argument;
    std::shared_ptr<MessageQueue> const queue;
    int running = 0;     // running calls of the function; more than one if a message runs the loop
    bool closed = false; // the handler is being destroyed, or was destroyed
};

} // namespace detail
} // namespace Moka
