#include "moka/host/RenderThread.h"

#include "moka/base/Check.h"
#include "moka/base/RunGuarded.h"
#include "moka/base/Thread.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/host/HostContext.h"
#include "moka/renderer/IRendererDeviceCaps.h"

#include <atomic>
#include <future>
#include <new>
#include <utility>

namespace Moka {
namespace {

// The renderer has one context in a process. A second thread is turned away before it opens a display, since
// closing it again would close the first one's: EGL hands both the same.
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
    std::promise<bool> mResult; // here, so that the caller that it wakes cannot destroy it at work
};

} // namespace

struct RenderThread::Impl {
    Impl(RenderThread& queue, RenderThreadOptions const& settings)
        : owner(queue), options(settings), thread(&Impl::Main, this, "moka-render") {}

    static void Main(void* self) { static_cast<Impl*>(self)->Live(); }

    void Live() {
        ProcessSlot const slot;
        if (!slot) {
            return started.set_value("another RenderThread is running in this process; stop it first");
        }
        std::string error;
        context = detail::HostContext::Open(options, &error);
        if (!context) return started.set_value(std::move(error));
        if (!RendererFactory::AttachContext(options.limits, context->GetLoader())) {
            error = "the renderer refused the context reached through " + context->GetPath() +
                    "; its line in the log says why";
            context.reset();
            return started.set_value(std::move(error));
        }
        // Nothing is shown before the queue runs empty, so the renderer may collect until then.
        RendererFactory::SetDeferred(true);
        DescribeContext();
        started.set_value({});
        owner.Run([] { RendererFactory::Flush(); });
        RendererFactory::DetachContext();
        context.reset();
    }

    void Present() {
        RendererFactory::Flush();
        context->SwapBuffers();
    }

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
    RenderContextInfo info;
    std::unique_ptr<detail::HostContext> context; // made and destroyed on the thread
    std::promise<std::string> started;            // an error, or empty
    Thread thread;
};

RenderThread::RenderThread() = default;

std::unique_ptr<RenderThread> RenderThread::Start(RenderThreadOptions const& options, std::string* error) {
    std::string failure;
    if (options.surfaceWidth < 1 || options.surfaceHeight < 1) {
        failure = "a surface of " + std::to_string(options.surfaceWidth) + " x " +
                  std::to_string(options.surfaceHeight) + " pixels; both sides must be at least 1";
    } else {
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
}

RenderContextInfo const& RenderThread::GetContextInfo() const { return mImpl->info; }

bool RenderThread::Present() {
    return mImpl->options.nativeWindow != 0 && WorkerTask::PostMember(this, mImpl.get(), &Impl::Present);
}

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
