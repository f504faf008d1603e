#include "apps/moka/LogCollector.h"

#include "apps/moka/Failure.h"
#include "moka/base/System.h"
#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <cstdio>

namespace Moka::Tool {
namespace {

constexpr std::size_t kMaxErrors = 300;

char const* NameOf(int priority) {
    if (priority >= ANDROID_LOG_ERROR) return "error";
    if (priority == ANDROID_LOG_WARN) return "warning";
    return priority == ANDROID_LOG_INFO ? "info" : "debug";
}

} // namespace

LogCollector::LogCollector(bool verbose)
    : mVerbose(verbose), mPrevious(SetLogSink([this](LogLine const& line) { OnLine(line); })) {
    System::SetBuildTypeEngMode(verbose);
}

LogCollector::~LogCollector() { SetLogSink(mPrevious); }

std::string LogCollector::GetError() const {
    std::lock_guard const lock(mMutex);
    return mFirst;
}

void LogCollector::Clear() {
    std::lock_guard const lock(mMutex);
    mFirst.clear();
    mErrors.clear();
}

std::string LogCollector::TakeOwnError() {
    auto const isOwn = [own = std::this_thread::get_id()](Error const& error) { return error.thread == own; };
    std::lock_guard const lock(mMutex);
    std::string first;
    auto const found = std::find_if(mErrors.begin(), mErrors.end(), isOwn);
    if (found != mErrors.end()) first.swap(found->text);
    mErrors.erase(std::remove_if(found, mErrors.end(), isOwn), mErrors.end());
    return first;
}

void LogCollector::ThrowError() const {
    std::string const error = GetError();
    if (!error.empty()) throw Failure(error);
}

void LogCollector::Throw(std::string const& fallback) const {
    ThrowError();
    throw Failure(fallback);
}

void LogCollector::OnLine(LogLine const& line) {
    std::lock_guard const lock(mMutex);
    if (line.priority >= ANDROID_LOG_ERROR) {
        if (mFirst.empty()) mFirst = line.text;
        if (mErrors.size() == kMaxErrors) mErrors.pop_front();
        mErrors.push_back({line.text, std::this_thread::get_id()});
    }
    if (mVerbose) std::fprintf(stderr, "%s: %s\n", NameOf(line.priority), line.text.c_str());
}

} // namespace Moka::Tool
