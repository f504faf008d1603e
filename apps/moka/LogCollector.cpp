#include "apps/moka/LogCollector.h"

#include "apps/moka/Failure.h"
#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <cstdio>

namespace Moka::Tool {
namespace {

constexpr std::size_t kMaxErrors = 300;

// As the library's messages quote it.
std::string Quote(std::string const& path) {
    std::string quoted = "'" + path + "'";
    for (char& c : quoted) {
        if (static_cast<unsigned char>(c) < ' ' || c == 0x7F) c = '?';
    }
    return quoted;
}

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
    return mFirst;
}

void LogCollector::Clear() {
    std::lock_guard const lock(mMutex);
    mFirst.clear();
    mErrors.clear();
}

std::string LogCollector::GetErrorAbout(std::string const& path) const {
    std::string const name = Quote(path);
    std::lock_guard const lock(mMutex);
    auto const found = std::find_if(mErrors.begin(), mErrors.end(), [&](Error const& error) {
        return error.text.find(name) != std::string::npos;
    });
    return found == mErrors.end() ? std::string() : found->text;
}

std::string LogCollector::TakeErrorOf(std::thread::id thread) {
    std::lock_guard const lock(mMutex);
    auto const others = std::stable_partition(mErrors.begin(), mErrors.end(),
                                              [&](Error const& error) { return error.thread != thread; });
    std::string const first = others == mErrors.end() ? std::string() : others->text;
    mErrors.erase(others, mErrors.end());
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
