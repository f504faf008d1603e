#include "moka/host/TaskTrace.h"

#include "moka/graphics/task/ITask.h"

#include <algorithm>
#include <cstdlib>
#include <cxxabi.h>
#include <map>
#include <mutex>
#include <string>
#include <typeindex>

namespace Moka::detail {
namespace {

void Remove(std::string& text, char const* part) {
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at)) {
        text.erase(at, std::string(part).size());
    }
}

std::string Describe(std::type_info const& type) {
    int status = 0;
    char* const demangled = abi::__cxa_demangle(type.name(), nullptr, nullptr, &status);
    std::string text = demangled ? demangled : type.name();
    std::free(demangled);
    for (char const* part : {"Moka::", "WorkerTask::", "(anonymous namespace)::", "detail::"}) {
        Remove(text, part);
    }
    return text;
}

// Returns a name that stays valid until the process ends, as a trace requires.
char const* GetTypeName(std::type_info const& type) {
    static std::mutex lock;
    static auto& names = *new std::map<std::type_index, std::string>;
    std::lock_guard<std::mutex> const guard(lock);
    auto const found = names.find(type);
    return (found != names.end() ? found : names.emplace(type, Describe(type)).first)->second.c_str();
}

} // namespace

void TaskTrace::Begin(ITask const& task) {
    std::type_info const& type = typeid(task);
    if (mCount > 0 && type != *mType) AddPending();
    mType = &type;
}

void TaskTrace::End() {
    Trace::TaskName const given = Trace::TakeTaskName();
    if (mCount > 0 && given.name != mName) {
        // A task names itself before it does anything, so the ones before ended then. One without a name takes the
        // time since the last reading.
        if (given.name) mLast = given.changed;
        Add(mCount);
    }
    if (mCount == 0) {
        mBegin = mLast;
        mName = given.name;
    }
    ++mCount;
    if (++mUnread == kReading) ReadClock();
}

// What took long is an event of its own.
void TaskTrace::ReadClock() {
    std::int64_t const now = Trace::GetTime();
    bool const isShort = now - mLast < kShort;
    if (!isShort && mCount > mUnread) Add(mCount - mUnread);
    mUnread = 0;
    mLast = now;
    if (!isShort) Add(mCount);
}

void TaskTrace::AddPending() {
    if (mUnread > 0) ReadClock();
    if (mCount > 0) Add(mCount);
}

// The first pending ones, until the last reading.
void TaskTrace::Add(std::uint64_t count) {
    TraceArgument const argument{"count", static_cast<std::int64_t>(count), nullptr};
    Trace::Add("task", mName ? mName : GetTypeName(*mType), mBegin, mLast, &argument, 1);
    mBegin = mLast;
    mCount -= count;
    mUnread = std::min(mUnread, mCount);
}

} // namespace Moka::detail
