#include "moka/host/TaskTrace.h"

#include "moka/graphics/task/ITask.h"

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
    mType = &typeid(task);
    Trace::TakeTaskName();
}

void TaskTrace::End() {
    char const* const name = Trace::TakeTaskName();
    std::int64_t const now = Trace::GetTime();
    bool const isShort = now - mLast < kShort;
    bool const isSame = mCount > 0 && mPendingName == name && (name || *mPendingType == *mType);
    if (!isShort || !isSame) AddPending();
    if (mCount == 0) {
        mPendingBegin = mLast;
        mPendingType = mType;
        mPendingName = name;
    }
    ++mCount;
    mLast = now;
    if (!isShort) AddPending();
}

void TaskTrace::AddPending() {
    if (mCount == 0) return;
    TraceArgument const count{"count", static_cast<std::int64_t>(mCount), nullptr};
    Trace::Add("task", mPendingName ? mPendingName : GetTypeName(*mPendingType), mPendingBegin, mLast, &count,
               1);
    mCount = 0;
}

} // namespace Moka::detail
