#include "apps/moka/LogCollector.h"

#include "apps/moka/Failure.h"
#include "moka/base/log/AndroidLog.h"

#include <cstdio>

namespace Moka::Tool {
namespace {

char const* NameOf(int priority) {
    if (priority >= ANDROID_LOG_ERROR) return "error";
    if (priority == ANDROID_LOG_WARN) return "warning";
    return priority == ANDROID_LOG_INFO ? "info" : "debug";
}

} // namespace

LogCollector::LogCollector(bool verbose)
    : mVerbose(verbose), mPrevious(SetLogSink([this](LogLine const& line) { OnLine(line); })) {}

LogCollector::~LogCollector() { SetLogSink(mPrevious); }

std::string LogCollector::GetError() const {
    std::lock_guard const lock(mMutex);
    return mError;
}

void LogCollector::Clear() {
    std::lock_guard const lock(mMutex);
    mError.clear();
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
    if (line.priority >= ANDROID_LOG_ERROR && mError.empty()) mError = line.text;
    if (mVerbose) std::fprintf(stderr, "%s: %s\n", NameOf(line.priority), line.text.c_str());
}

} // namespace Moka::Tool
