#include "moka/base/Thread.h"

#include "moka/base/Check.h"
#include "moka/base/log/AndroidLog.h"

#include <cstring>
#include <exception>
#include <future>

#include <pthread.h>
#include <sys/resource.h>
#include <unistd.h>

namespace Moka {
namespace {

// Returns the length of the longest beginning of name that has at most maxBytes and does not cut a UTF-8
// character.
std::size_t CutLength(char const* name, std::size_t maxBytes) {
    std::size_t length = strnlen(name, maxBytes + 1);
    if (length <= maxBytes) return length;
    length = maxBytes;
    while (length > 0 && (static_cast<unsigned char>(name[length]) & 0xc0) == 0x80) --length;
    return length;
}

void DescribeThisThread(char const* name, int priority) {
    if (*name != '\0') pthread_setname_np(pthread_self(), name);
    // On Linux every thread has its own nice value, set by the thread id.
    setpriority(PRIO_PROCESS, static_cast<id_t>(gettid()), priority);
}

} // namespace

Thread::Thread(Function function, void* argument, char const* name, int priority)
    : mFunction(function), mArgument(argument), mPriority(priority) {
    MOKA_CHECK(function, "a Thread needs a function");
    if (name) std::memcpy(mName, name, CutLength(name, kNameBytes));
}

Thread::~Thread() {
    if (!mThread.joinable()) return;
    if (mThread.get_id() == std::this_thread::get_id()) {
        mThread.detach();
    } else {
        mThread.join();
    }
}

bool Thread::Start() {
    if (mStarted) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "Thread::Start: '%s' was started before", mName);
        return false;
    }
    struct Name {
        char text[kNameBytes + 1];
    } name;
    std::memcpy(name.text, mName, sizeof mName);
    try {
        // The function may delete this object. So it waits until Start no longer uses the object.
        std::promise<void> ready;
        mThread = std::thread([go = ready.get_future(), name, priority = mPriority, function = mFunction,
                               argument = mArgument]() mutable {
            DescribeThisThread(name.text, priority);
            go.wait();
            function(argument);
        });
        mStarted = true;
        ready.set_value();
        return true;
    } catch (std::exception const& error) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "Thread::Start: '%s' cannot be started: %s",
                            name.text, error.what());
        return false;
    }
}

void Thread::Join() {
    if (!mThread.joinable()) return;
    if (mThread.get_id() == std::this_thread::get_id()) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "Thread::Join: '%s' cannot wait for itself", mName);
        return;
    }
    mThread.join();
}

} // namespace Moka
