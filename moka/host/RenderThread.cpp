#include "moka/host/RenderThread.h"

#include "moka/base/Check.h"
#include "moka/base/RunGuarded.h"
#include "moka/base/Thread.h"
#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/task/ITask.h"
#include "moka/host/FramePacer.h"
#include "moka/host/HostContext.h"
#include "moka/renderer/IRendererDeviceCaps.h"

#include <atomic>
#include <cstdlib>
#include <future>
#include <mutex>
#include <new>
#include <string>
#include <utility>

namespace Moka {
namespace {

// The renderer supports one context in a process. A second thread is refused before it opens a display: EGL
// would return the same display, and closing it would close that of the first thread.
class ProcessSlot {
public:
    ProcessSlot() : mTaken(!theTaken.exchange(true)) {}
    ~ProcessSlot() {
        if (mTaken) theTaken = false;
    }
    ProcessSlot(ProcessSlot const&) = delete;
    ProcessSlot& operator=(ProcessSlot const&) = delete;

    explicit operator bool() const { return mTaken; }

private:
    static std::atomic<bool> theTaken;
    bool mTaken;
};

std::atomic<bool> ProcessSlot::theTaken{false};

bool RunCall(std::function<void()> const& function) {
    return RunGuarded("mok_log", "RenderThread::Call: the function", function);
}

class CallTask final : public ITask {
public:
    explicit CallTask(std::function<void()> const& function) : mFunction(function) {}
    void run() override { mResult.set_value(RunCall(mFunction)); }
    std::future<bool> GetResult() { return mResult.get_future(); }

private:
    std::function<void()> const& mFunction;
    std::promise<bool> mResult; // owned here, so that the woken caller cannot destroy it while it is used
};

// Traces while a render thread runs. If MOKA_TRACE requests the trace, it lasts from the first render thread
// on until the process ends.
class ThreadTrace {
public:
    explicit ThreadTrace(std::string const& path) : mIsOwn(!path.empty()) {
        char const* const wanted = mIsOwn ? path.c_str() : TakeEnvironment();
        if (!wanted || !*wanted) return;
        std::string error;
        mIsOn = Trace::Start(wanted, &error);
        if (!mIsOn) __android_log_print(ANDROID_LOG_WARN, "mok_log", "RenderThread: %s", error.c_str());
    }
    ~ThreadTrace() { Stop(); }
    ThreadTrace(ThreadTrace const&) = delete;
    ThreadTrace& operator=(ThreadTrace const&) = delete;

    // Trace::Stop logs write errors itself.
    void Stop() {
        if (mIsOwn && std::exchange(mIsOn, false)) Trace::Stop(nullptr);
    }

private:
    // Each file once in a process: a file that cannot be written, or that filled the disk, is reported once.
    static char const* TakeEnvironment() {
        static std::mutex lock;
        static std::string taken;
        char const* const wanted = Trace::IsOn() ? nullptr : std::getenv("MOKA_TRACE");
        std::lock_guard const guard(lock);
        if (!wanted || taken == wanted) return nullptr;
        taken = wanted;
        return wanted;
    }

    bool const mIsOwn;
    bool mIsOn = false;
};

std::string FindMistake(RenderThreadOptions const& options) {
    if (options.surfaceWidth < 1 || options.surfaceHeight < 1) {
        return "a surface of " + std::to_string(options.surfaceWidth) + " x " +
               std::to_string(options.surfaceHeight) + " pixels; both sides must be at least 1";
    }
    if (options.framesInFlight < 1)
        return "framesInFlight is " + std::to_string(options.framesInFlight) + "; it must be at least 1";
    if (options.swapInterval < 0)
        return "swapInterval is " + std::to_string(options.swapInterval) + "; it must be at least 0";
    return {};
}

} // namespace

struct RenderThread::Impl {
    Impl(RenderThread& queue, RenderThreadOptions const& settings)
        : owner(queue),
          options(settings),
          trace(options.tracePath),
          pacer(options.framesInFlight),
          thread(&Impl::Main, this, "moka-render") {}

    static void Main(void* self) { static_cast<Impl*>(self)->Live(); }

    void Live() {
        ProcessSlot const slot;
        if (!slot) {
            return started.set_value("another RenderThread is running in this process; stop it first");
        }
        std::string error;
        {
            TraceScope const opening("host", "open the context");
            context = detail::HostContext::Open(options, &error);
        }
        if (!context) return started.set_value(std::move(error));
        if (!RendererFactory::AttachContext(options.limits, context->GetLoader())) {
            error = "the renderer refused the context reached through " + context->GetPath() +
                    "; its line in the log says why";
            context.reset();
            return started.set_value(std::move(error));
        }
        // This thread flushes whenever its queue is empty, so requests may wait until then.
        RendererFactory::SetDeferred(true);
        DescribeContext();
        started.set_value({});
        owner.Run([] { RendererFactory::Flush(); });
        RendererFactory::DetachContext();
        context.reset();
    }

    // Runs on the render thread. If the window is destroyed, waiting frames are dropped.
    void Show() {
        Trace::NameTask("Present");
        if (isWindowGone) return;
        TraceScope const frame("frame", "Present", "number", ++shown);
        RendererFactory::Flush();
        TraceScope const swap("frame", "SwapBuffers");
        if (context->SwapBuffers()) return;
        isWindowGone = true;
        isRefusalTold = true;
    }

    // Returns false. Logs the reason of the first refusal only.
    bool Refuse(char const* reason) {
        if (isRefusalTold.exchange(true)) return false;
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "RenderThread::Present: %s", reason);
        return false;
    }

    bool Present();

    void DescribeContext() {
        IRendererDeviceCaps const* const caps = RendererFactory::GetRendererDeviceCaps();
        info.path = context->GetPath();
        info.eglVersion = context->GetVersion();
        info.vendor = caps->GetVendor();
        info.renderer = caps->GetRenderer();
        info.version = caps->GetVersion();
        info.maxTextureSize = caps->GetMaxTextureSize();
    }

    RenderThread& owner;
    RenderThreadOptions const options;
    ThreadTrace trace;
    detail::FramePacer pacer;
    std::atomic<bool> isWindowGone{false};
    std::atomic<bool> isRefusalTold{false};
    std::uint64_t shown = 0; // frames
    RenderContextInfo info;
    std::unique_ptr<detail::HostContext> context; // created and destroyed on the render thread
    std::promise<std::string> started;            // an error, or empty
    Thread thread;
};

namespace {

// Shows a frame. Its destructor leaves the pacer, whether the task ran or not.
template <class Impl>
class PresentTask final : public ITask {
public:
    explicit PresentTask(Impl& impl) : mImpl(impl) {}
    ~PresentTask() override { mImpl.pacer.Leave(); }
    void run() override { mImpl.Show(); }

private:
    Impl& mImpl;
};

} // namespace

bool RenderThread::Impl::Present() {
    if (options.nativeWindow == 0) return Refuse("there is no window; give Start a nativeWindow");
    if (isWindowGone) return false; // logged when the window was lost
    pacer.Enter(!owner.IsConsumerThread());
    std::unique_ptr<ITask> task(new (std::nothrow) PresentTask<Impl>(*this));
    if (!task) {
        pacer.Leave();
        return Refuse("not enough memory");
    }
    if (isWindowGone) return false;
    if (!owner.Post(task.get())) return Refuse("the render thread has been stopped");
    static_cast<void>(task.release());
    return true;
}

RenderThread::RenderThread() = default;

std::unique_ptr<RenderThread> RenderThread::Start(RenderThreadOptions const& options, std::string* error) {
    std::string failure = FindMistake(options);
    if (failure.empty()) {
        std::unique_ptr<RenderThread> self(new RenderThread);
        self->mImpl = std::make_unique<Impl>(*self, options);
        failure = self->mImpl->thread.Start() ? self->mImpl->started.get_future().get()
                                              : "the system has no more threads";
        if (failure.empty()) return self;
    }
    if (error) *error = "RenderThread: " + failure;
    return nullptr;
}

RenderThread::~RenderThread() { Stop(); }

void RenderThread::Stop() {
    MOKA_CHECK(!IsConsumerThread(), "RenderThread::Stop waits for the render thread, so not from there");
    RequestStop();
    mImpl->thread.Join();
    mImpl->trace.Stop();
}

RenderContextInfo const& RenderThread::GetContextInfo() const { return mImpl->info; }

bool RenderThread::Present() { return mImpl->Present(); }

bool RenderThread::Call(std::function<void()> const& function) {
    if (IsConsumerThread()) return RunCall(function);
    std::unique_ptr<CallTask> task(new (std::nothrow) CallTask(function));
    if (!task) return false;
    std::future<bool> result = task->GetResult();
    if (!Post(task.get())) return false;
    static_cast<void>(task.release());
    return result.get();
}

} // namespace Moka
