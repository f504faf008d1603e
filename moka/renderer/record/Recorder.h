// Recorder: one attached context. It holds the requested state, the draw list and the names that wait for
// their deletion, and decides when the list is flushed.
// Owner:   the factory from attach to detach, and every object created in the context until that object is
//          deleted. So a late release finds a recorder that knows that its context is gone.
// Thread:  the render thread, except where a line says otherwise.
//
// In deferred mode, requests reach the device at a flush. Between flushes none of our targets is bound, and
// the host must not change GL state unannounced. In immediate mode, every request except a draw flushes, and
// a deactivation binds the host's frame buffer again. While no target is active, the host may call GL between
// two requests.
#pragma once

#include "moka/base/Check.h"
#include "moka/base/Likely.h"
#include "moka/renderer/device/Device.h"
#include "moka/renderer/record/DepthStencilPool.h"
#include "moka/renderer/record/DrawListBuilder.h"
#include "moka/renderer/record/Fill.h"
#include "moka/renderer/record/Mipmaps.h"
#include "moka/renderer/record/RequestedState.h"
#include "moka/renderer/record/StencilPreparations.h"

#include <atomic>
#include <memory>
#include <mutex>
#include <optional>
#include <thread>
#include <vector>

namespace Moka::detail {

class GraphicsObject;
class RenderTarget;
class TextureStorage;

// The kinds of GL objects whose last owner may be on any thread.
enum class DroppedKind { Texture, FrameBuffer, Program };

class Recorder : public std::enable_shared_from_this<Recorder> {
public:
    // The calling thread becomes the render thread. Without a usable context, logs an error and returns null.
    static std::shared_ptr<Recorder> Create(RendererLimits const& limits, RendererProcLoader loader);
    Recorder() = default;
    ~Recorder();
    Recorder(Recorder const&) = delete;
    Recorder& operator=(Recorder const&) = delete;

    // Flushes, then deletes pooled and dropped names and the device. Names that are dropped later are left to
    // the destruction of the GL context.
    void Detach();

    // Callable on any thread.
    bool IsAttached() const { return !Has(kDetached); }
    bool IsRenderThread() const { return std::this_thread::get_id() == mRenderThread; }

    // Call this at the beginning of each request. Returns false if the context is detached.
    bool Begin() {
        if (MOKA_UNLIKELY(mUnusual.load(std::memory_order_relaxed) != 0)) return Prepare();
        MOKA_CHECK(IsRenderThread(), "the renderer is used on the thread that attached it");
        return true;
    }
    // Call this at the end of a request that may have bound a frame buffer. Binds the one that the caller
    // expects.
    void End() {
        if (IsThrough()) BindExpected();
    }

    // The following functions may be called between Begin and End only.
    Device& GetDevice() { return *mDevice; }
    // Draws count vertices of the object, starting with vertex first, with the requested state. Returns false
    // if nothing can be drawn. Throws bad_alloc.
    bool Draw(GraphicsObject& object, int format, PrimitiveType primitive, int first, int count);
    // Adds a command other than a draw to the list. Flushes in immediate mode or if the list is full.
    template <class Other>
    void Add(Other const& command) {
        list.Add(command);
        if (FlushesAtOnce() || list.IsFull()) Flush();
    }
    void AddStencilClear(DepthStencilClear const& clear);
    // Call these around draws that are added to the list directly, as Fill does.
    void BeforeDraw(RunState const& state, DrawBounds const& bounds) {
        if (state.depthStencil.IsStencil()) mStencils.BeforeDraw(state, bounds);
    }
    void AfterDraw();
    // Call this before a draw samples the texture. Returns true if it added a command that generates the
    // mipmap levels.
    bool UpdateMipmaps(TextureRef const& texture);
    bool FlushesAtOnce() const { return Has(kFlushesAtOnce); }
    // Call this when the contents of the buffer are lost.
    void ForgetStencil(DeviceName depthStencil) { mStencils.Forget(depthStencil); }
    void Flush();
    // Call this before an upload to the texture or a read-back from it. Flushes if the list uses the texture.
    void FlushIfUsed(DeviceName texture);
    // A request that changed a state calls this. In immediate mode with an empty list it calls
    // commit(StateCommit&), which adds the state, and passes the result to GL at once.
    template <class Commit>
    void CommitAtOnce(Commit commit) {
        if (IsThrough()) CommitNow(commit);
    }
    bool IsThrough() const { return MOKA_UNLIKELY(FlushesAtOnce()) && list.IsEmpty(); }

    void Activate(RenderTarget& target);
    void Deactivate(RenderTarget const& target);
    RenderTarget* GetActive() const { return mActive; }
    // The active target, or the host's frame buffer with the host's viewport.
    TargetRef GetCurrentTarget();

    // Registers an object that has vertices in the list. They are copied before the list is cleared.
    void AddHolder(GraphicsObject& object) { mHolders.push_back(&object); }
    void RemoveHolder(GraphicsObject const& object);

    // Call these around external GL. Each begins a request itself.
    void FlushForHost();
    void CommitForExternal();
    void InvalidateState();
    void SetDeferred(bool on);

    // Callable on any thread. Deletes the name at once if that is safe; otherwise the render thread deletes
    // it when the list no longer uses it.
    void Drop(DroppedKind kind, DeviceName name);
    void DropProgram(ProgramState const& program, DeviceName name);
    // Callable on any thread. When the last texture object is deleted, the cached samplers are deleted as
    // well.
    void DropTextureObject();

    Counters counters;
    DrawListBuilder list{counters};
    DepthStencilPool depthStencilPool{*this};
    Fill fill;
    Mipmaps mipmaps;
    // Has a value while the context is attached.
    std::optional<RequestedState> requested;

private:
    struct Dropped {
        DroppedKind kind;
        DeviceName name;
    };

    template <class Commit>
    [[gnu::cold, gnu::noinline]] void CommitNow(Commit commit) {
        StateCommit state;
        commit(state);
        mDevice->Commit(state);
    }
    bool Has(unsigned unusual) const { return (mUnusual.load(std::memory_order_relaxed) & unusual) != 0; }
    void SetFlushesAtOnce();
    // True if no recorded or pending command refers to a name.
    bool IsIdle() const { return list.IsEmpty() && !mStencils.IsPending(); }
    bool MayDeleteNow() const { return IsAttached() && IsRenderThread() && IsIdle(); }
    [[gnu::cold]] bool Prepare();
    [[gnu::cold]] void BindExpected();
    void Delete(Dropped const& dropped);
    void DeleteDropped();
    bool TakeForStencil(RunState const& state, GraphicsObject& object, int first, int count);
    void SampleCopyOfTarget(RunState& state);
    void ForgetMipmapsOfTarget();
    void CommitStates();
    // Call this before external GL may see the stencil of the active target, or before a program that draws
    // it is deleted. Throws bad_alloc.
    void CompleteStencils();
    void TryToCompleteStencils() noexcept;

    std::unique_ptr<Device> mDevice;
    std::thread::id const mRenderThread = std::this_thread::get_id();
    RenderTarget* mActive = nullptr;
    bool mIsDeferred = false;
    bool mIsExternal = false; // from a commit to the invalidation: external code may call GL
    std::vector<GraphicsObject*> mHolders;
    StencilPreparations mStencils{list};
    // A draw that samples its own target samples this copy instead. It is kept while its size fits.
    std::shared_ptr<TextureStorage> mTargetCopy;

    // What a request must look at before it begins. One number, because each request tests it: 0 while the
    // context is attached, in deferred mode, with nothing to delete. GL cannot have changed then since the
    // last request, so there is nothing to prepare.
    static constexpr unsigned kDetached = 1;
    static constexpr unsigned kFlushesAtOnce = 2; // immediate mode, or mIsExternal
    static constexpr unsigned kHasDropped = 4;
    std::atomic<unsigned> mUnusual{kFlushesAtOnce};
    std::mutex mDroppedLock;
    std::vector<Dropped> mDropped;
};

// The attached recorder or, for the statistics, the last one. Callable on any thread.
std::shared_ptr<Recorder> GetRecorder();
// The attached recorder, or null. Render thread only: there it cannot be detached while it is used.
Recorder* GetAttachedRecorder();
void SetRecorder(std::shared_ptr<Recorder> recorder);

// Calls Begin and End around a request that may change the bound frame buffer.
class RequestScope {
public:
    explicit RequestScope(Recorder& recorder) : mRecorder(recorder), mLive(recorder.Begin()) {}
    ~RequestScope() {
        if (mLive) mRecorder.End();
    }
    RequestScope(RequestScope const&) = delete;
    RequestScope& operator=(RequestScope const&) = delete;

    // False if the context is detached; the request must then do nothing.
    explicit operator bool() const { return mLive; }

private:
    Recorder& mRecorder;
    bool const mLive;
};

} // namespace Moka::detail
