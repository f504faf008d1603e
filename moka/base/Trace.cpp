#include "moka/base/Trace.h"

#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>
#include <string_view>
#include <utility>
#include <vector>

#include <fcntl.h>
#include <pthread.h>
#include <unistd.h>

namespace Moka {

std::atomic<bool> Trace::theIsOn{false};

namespace {

constexpr std::size_t kThreadNameBytes = 16;

// An event. If category is null, it sets the name of a thread.
struct Event {
    char const* category;
    char const* name;
    std::int64_t begin;
    std::int64_t end;
    int thread;
    std::uint32_t argumentCount;
    TraceArgument arguments[Trace::kMaxArguments];
    char threadName[kThreadNameBytes];
};

constexpr std::size_t kBufferedEvents = 4096;
constexpr std::int64_t kOldest = 500'000'000; // nanoseconds after which buffered events are written

constexpr std::string_view kSeparator = ",\n";
constexpr std::string_view kEnd = "\n]\n";

// Appends a JSON string. Thread names may contain any bytes.
void AppendText(std::string& out, char const* text) {
    out += '"';
    for (; *text; ++text) {
        if (*text == '"' || *text == '\\') out += '\\';
        bool const isPrintable = *text >= ' ' && *text < 0x7F;
        out += isPrintable ? *text : '?';
    }
    out += '"';
}

void AppendNumber(std::string& out, char const* key, long long number) {
    char text[64];
    std::snprintf(text, sizeof text, ",\"%s\":%lld", key, number);
    out += text;
}

void AppendMicroseconds(std::string& out, char const* key, std::int64_t nanoseconds) {
    char text[64];
    std::snprintf(text, sizeof text, ",\"%s\":%lld.%03d", key, static_cast<long long>(nanoseconds / 1000),
                  static_cast<int>(nanoseconds % 1000));
    out += text;
}

void AppendEvent(std::string& out, Event const& event, std::int64_t start) {
    out += "{\"ph\":\"X\",\"cat\":";
    AppendText(out, event.category);
    out += ",\"name\":";
    AppendText(out, event.name);
    AppendNumber(out, "pid", getpid());
    AppendNumber(out, "tid", event.thread);
    AppendMicroseconds(out, "ts", event.begin - start);
    AppendMicroseconds(out, "dur", event.end - event.begin);
    if (event.argumentCount > 0) out += ",\"args\":";
    for (std::uint32_t i = 0; i < event.argumentCount; ++i) {
        TraceArgument const& argument = event.arguments[i];
        out += i == 0 ? '{' : ',';
        AppendText(out, argument.key);
        out += ':';
        if (argument.text) {
            AppendText(out, argument.text);
        } else {
            out += std::to_string(argument.number);
        }
    }
    out += event.argumentCount > 0 ? "}}" : "}";
}

void AppendName(std::string& out, char const* what, int thread, char const* name) {
    out += "{\"ph\":\"M\",\"name\":";
    AppendText(out, what);
    AppendNumber(out, "pid", getpid());
    AppendNumber(out, "tid", thread);
    out += ",\"args\":{\"name\":";
    AppendText(out, name);
    out += "}}";
}

// The trace file. If a write fails, the file is truncated after the last complete event that leaves room for
// the closing bracket, so that it stays readable.
class TraceFile {
public:
    bool Open(std::string const& path) {
        mFile = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
        mPath = path;
        mBytes = 0;
        mFailure.clear();
        return mFile >= 0;
    }
    bool IsOpen() const { return mFile >= 0; }
    std::string const& GetPath() const { return mPath; }
    std::string const& GetFailure() const { return mFailure; }

    // Returns false at the first failure. Later blocks are dropped silently. Each event of a block begins
    // with kSeparator.
    bool Write(std::string const& block) {
        if (!mFailure.empty()) return true;
        std::size_t done = 0;
        while (done < block.size()) {
            ssize_t const written = write(mFile, block.data() + done, block.size() - done);
            if (written < 0 && errno == EINTR) continue;
            if (written <= 0) {
                char const* const reason =
                    written < 0 ? std::strerror(errno) : "the file takes no more bytes";
                mBytes += CountWhole(block, done);
                return Fail(reason);
            }
            done += static_cast<std::size_t>(written);
        }
        mBytes += static_cast<off_t>(done);
        return true;
    }

    void Close() {
        // Does not use Write: after a failure there may still be room for these few bytes.
        if (write(mFile, kEnd.data(), kEnd.size()) != static_cast<ssize_t>(kEnd.size()) && mFailure.empty())
            mFailure = std::strerror(errno);
        if (close(mFile) != 0 && mFailure.empty()) mFailure = std::strerror(errno);
        mFile = -1;
    }

    bool Fail(char const* reason) {
        mFailure = reason;
        if (ftruncate(mFile, mBytes) == 0) lseek(mFile, mBytes, SEEK_SET);
        return false;
    }

private:
    // The bytes of a block that the file keeps: its whole events, if the closing bracket fits after them.
    static off_t CountWhole(std::string const& block, std::size_t written) {
        std::size_t const whole = block.rfind(kSeparator, written - std::min(written, kEnd.size()));
        return whole == std::string::npos ? 0 : static_cast<off_t>(whole);
    }

    int mFile = -1;
    std::string mPath;
    off_t mBytes = 0;
    std::string mFailure;
};

int GetThreadNumber() {
    thread_local int const number = static_cast<int>(gettid());
    return number;
}

class Writer {
public:
    static Writer& Get(std::atomic<bool>& isOn) {
        // Never destroyed, because threads may trace until the process has ended.
        static Writer& writer = *new Writer(isOn);
        return writer;
    }
    explicit Writer(std::atomic<bool>& isOn) : mIsOn(isOn) {}

    bool Start(std::string const& path, std::string* error);
    bool Stop(std::string* error);
    void Add(Event const& event) noexcept;

private:
    bool Open(std::string const& path, std::string& reason);
    void WriteOut(std::unique_lock<std::mutex>& buffer) noexcept;
    bool WriteEvents(std::int64_t start) noexcept;
    void Format(std::int64_t start);

    std::atomic<bool>& mIsOn;

    // Guards the file and the events that are being written. It is locked before the buffer's lock is
    // released, so that Stop does not miss events between the two.
    std::mutex mFileLock;
    TraceFile mFile;
    std::vector<Event> mWriting;
    std::string mText;

    std::mutex mBufferLock;
    std::vector<Event> mEvents;
    std::int64_t mStart = 0;
    std::int64_t mLastWritten = 0;
    // The number of the trace. A thread that sees a new number adds an event with its name.
    unsigned mNumber = 0;
};

thread_local unsigned theNamedIn = 0;

// Of the task at hand and of the one before.
struct TaskNames {
    Trace::TaskName current;
    char const* last;
};
thread_local TaskNames theTaskNames{};

void StopAtExit() { Trace::Stop(nullptr); }

bool Writer::Open(std::string const& path, std::string& reason) {
    if (mFile.IsOpen()) {
        reason = "a trace is being written to " + mFile.GetPath() + "; stop it first";
        return false;
    }
    reason = "cannot write the trace " + path + ": ";
    if (!mFile.Open(path)) {
        reason += std::strerror(errno);
        return false;
    }
    mText = "[\n";
    AppendName(mText, "process_name", getpid(), "libMokaGraphics");
    if (mFile.Write(mText)) return true;
    mFile.Close();
    reason += mFile.GetFailure();
    return false;
}

bool Writer::Start(std::string const& path, std::string* error) {
    std::lock_guard<std::mutex> const buffer(mBufferLock);
    std::lock_guard<std::mutex> const file(mFileLock);
    std::string reason;
    if (!Open(path, reason)) {
        if (error) error->swap(reason);
        return false;
    }
    static int const isRegistered = std::atexit(StopAtExit);
    static_cast<void>(isRegistered);
    mEvents.clear();
    mEvents.reserve(kBufferedEvents);
    mWriting.reserve(kBufferedEvents);
    mStart = mLastWritten = Trace::GetTime();
    ++mNumber;
    mIsOn.store(true);
    return true;
}

bool Writer::Stop(std::string* error) {
    {
        std::unique_lock<std::mutex> buffer(mBufferLock);
        mIsOn.store(false);
        WriteOut(buffer);
    }
    std::lock_guard<std::mutex> const file(mFileLock);
    if (!mFile.IsOpen()) return true;
    mFile.Close();
    if (mFile.GetFailure().empty()) return true;
    if (error) *error = "cannot write the trace " + mFile.GetPath() + ": " + mFile.GetFailure();
    return false;
}

void Writer::Add(Event const& event) noexcept {
    std::unique_lock<std::mutex> buffer(mBufferLock);
    if (!mIsOn.load() || event.begin < mStart) return;
    if (theNamedIn != mNumber) {
        theNamedIn = mNumber;
        Event name = event;
        name.category = nullptr;
        pthread_getname_np(pthread_self(), name.threadName, kThreadNameBytes);
        mEvents.push_back(name);
    }
    mEvents.push_back(event);
    bool const isFull =
        mEvents.size() + 2 > kBufferedEvents; // the next event may need another one for the name
    if (isFull || event.end - mLastWritten > kOldest) WriteOut(buffer);
}

// Releases the buffer's lock as soon as it holds the file's lock. Logs without either lock.
void Writer::WriteOut(std::unique_lock<std::mutex>& buffer) noexcept {
    std::unique_lock<std::mutex> file(mFileLock);
    mWriting.clear();
    mWriting.swap(mEvents);
    mLastWritten = Trace::GetTime();
    std::int64_t const start = mStart;
    buffer.unlock();
    if (!mFile.IsOpen() || WriteEvents(start)) return;
    mIsOn.store(false);
    std::string const path = mFile.GetPath();
    std::string const failure = mFile.GetFailure();
    file.unlock();
    __android_log_print(ANDROID_LOG_WARN, "mok_log", "Trace: cannot write %s: %s; the trace ends here",
                        path.c_str(), failure.c_str());
}

bool Writer::WriteEvents(std::int64_t start) noexcept {
    try {
        Format(start);
        return mFile.Write(mText);
    } catch (std::bad_alloc const&) {
        return mFile.Fail("not enough memory");
    }
}

void Writer::Format(std::int64_t start) {
    mText.clear();
    for (Event const& event : mWriting) {
        mText += kSeparator;
        if (event.category) {
            AppendEvent(mText, event, start);
        } else {
            AppendName(mText, "thread_name", event.thread, event.threadName);
        }
    }
}

} // namespace

bool Trace::Start(std::string const& path, std::string* error) {
    return Writer::Get(theIsOn).Start(path, error);
}

bool Trace::Stop(std::string* error) { return Writer::Get(theIsOn).Stop(error); }

std::int64_t Trace::GetTime() noexcept {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
               std::chrono::steady_clock::now().time_since_epoch())
        .count();
}

void Trace::Add(char const* category, char const* name, std::int64_t begin, std::int64_t end,
                TraceArgument const* arguments, std::size_t count) noexcept {
    Event event;
    event.category = category;
    event.name = name;
    event.begin = begin;
    event.end = end;
    event.thread = GetThreadNumber();
    event.argumentCount = static_cast<std::uint32_t>(std::min<std::size_t>(count, kMaxArguments));
    std::copy_n(arguments, event.argumentCount, event.arguments);
    Writer::Get(theIsOn).Add(event);
}

Trace::TaskName Trace::TakeTaskName() noexcept {
    TaskNames& names = theTaskNames;
    names.last = names.current.name;
    return {std::exchange(names.current.name, nullptr), names.current.changed};
}

void Trace::SetTaskName(char const* name) noexcept {
    TaskNames& names = theTaskNames;
    if (names.current.name) return;
    names.current.name = name;
    if (name != names.last) names.current.changed = GetTime();
}

} // namespace Moka
