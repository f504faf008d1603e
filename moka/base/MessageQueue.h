// MessageQueue.h: what a MessageLoop and the Handlers of its thread share.
// Owner:  the loop, every handler, and whoever is inside one of their functions; so each may go first.
// Thread: mutex guards everything that is not const. It is never held while a message runs.
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
    std::uint64_t serial = 0; // in the order of sending
};

struct MessageQueue {
    std::thread::id const owner = std::this_thread::get_id();
    std::mutex mutex;
    std::condition_variable changed;  // a message came, or Quit
    std::condition_variable finished; // a message of a handler that is being destroyed has run
    std::list<Message> messages;      // a deque would allocate even where it is empty, in destructors too
    std::uint64_t nextSerial = 0;
    bool quit = false;
    bool closed = false; // the loop is gone
};

struct HandlerState {
    Handler* const handler;
    void (*const function)(Handler* handler, void* argument, int what);
    void* const argument;
    std::shared_ptr<MessageQueue> const queue;
    int running = 0;     // calls of the function; more than one when a message runs the loop
    bool closed = false; // the handler is being destroyed, or gone
};

} // namespace detail
} // namespace Moka
