// Recorder: one attached context: the requested state, the draw list, when the list is flushed, and the names
// that wait for their deletion.
// Owner:   the factory from attach to detach, and every object made in it until that object goes, so that a
//          late release finds a recorder that knows that its context is gone.
// Thread:  the render thread, except where a line says otherwise.
//
// Deferred, requests reach the device at a flush; in between nothing of ours is bound and nothing of the host's
// is known to change. Immediate, every request but a draw flushes, a deactivation returns the frame buffer to
// the host, and outside of an active target the host may have called GL since the last request.
#pragma once

#include "moka/base/Check.h"
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

// Objects that any thread may drop.
enum class DroppedKind { Texture, FrameBuffer, Program };

class Recorder : public std::enable_shared_from_this<Recorder> {
public:
    // On the render thread, which is the calling one. Null, with one error line, without a usable context.
    static std::shared_ptr<Recorder> Create(RendererLimits const& limits, RendererProcLoader loader);
    Recorder() = default;
    ~Recorder();
    Recorder(Recorder const&) = delete;
    Recorder& operator=(Recorder const&) = delete;

    // Flushes, then deletes pooled and dropped names and the device. Names that are dropped later go down with
    // the GL context.
    void Detach();

    // Any thread.
    bool IsAttached() const { return mAttached; }
    bool IsRenderThread() const { return std::this_thread::get_id() == mRenderThread; }

    // At the beginning of each request. False: the context is detached.
    bool Begin() {
        if (!mAttached) return false;
        MOKA_CHECK(IsRenderThread(), "the renderer is used on the thread that attached it");
        // Between the library's own draws nothing can have happened.
        if (mFlushesAtOnce || mHasDropped) Prepare();
        return true;
    }
    // At the end of a request that may have bound something: the target is bound that the caller expects.
    void End();

    // Between Begin and End.
    Device& GetDevice() { return *mDevice; }
    // Draws count of the object's vertices, from the first one on, with the requested state. False when nothing
    // can be drawn. Throws bad_alloc.
    bool Draw(GraphicsObject& object, int format, PrimitiveType primitive, int first, int count);
    // Adds anything but a draw to the list, which is then flushed if it has to be.
    template <class Other>
    void Add(Other const& command) {
        list.Add(command);
        if (mFlushesAtOnce || list.IsFull()) Flush();
    }
    void AddStencilClear(DepthStencilClear const& clear);
    // Around draws that the list gets in another way: clears that are drawn.
    void BeforeDraw(RunState const& state, DrawBounds const& bounds) {
        if (state.depthStencil.IsStencil()) mStencils.BeforeDraw(state, bounds);
    }
    void AfterDraw();
    // Before the texture is sampled. True: its levels are made first, by a command of the list.
    bool UpdateMipmaps(TextureRef const& texture);
    bool FlushesAtOnce() const { return mFlushesAtOnce; }
    // The contents of the buffer are lost.
    void ForgetStencil(DeviceName depthStencil) { mStencils.Forget(depthStencil); }
    void Flush();
    // Before a texture is changed or read at once.
    void FlushIfUsed(DeviceName texture);
    // Immediate, a request that changed a state lets commit(StateCommit&) add it to what GL gets at once, unless
    // draws before it wait in the list.
    template <class Commit>
    void CommitAtOnce(Commit commit) {
        if (IsThrough()) CommitNow(commit);
    }
    bool IsThrough() const { return mFlushesAtOnce && list.IsEmpty(); }

    void Activate(RenderTarget& target);
    void Deactivate(RenderTarget const& target);
    RenderTarget* GetActive() const { return mActive; }
    // The active target, or the frame buffer of the host's with a viewport of its own.
    TargetRef GetCurrentTarget();

    // The object's vertices are copied from the list before it is cleared.
    void AddHolder(GraphicsObject& object) { mHolders.push_back(&object); }
    void RemoveHolder(GraphicsObject const& object);

    // Around external GL. Each is a request of its own.
    void FlushForHost();
    void CommitForExternal();
    void InvalidateState();
    void SetDeferred(bool on);

    // Any thread: deletes the name now, or once the list no longer uses it and the render thread runs.
    void Drop(DroppedKind kind, DeviceName name);
    void DropProgram(ProgramState const& program, DeviceName name);
    // Any thread: the last texture object takes the sampling states with it.
    void DropTextureObject();

    Counters counters;
    DrawListBuilder list{counters};
    DepthStencilPool depthStencilPool{*this};
    Fill fill;
    Mipmaps mipmaps;
    // Present while attached.
    std::optional<RequestedState> requested;

private:
    struct Dropped {
        DroppedKind kind;
        DeviceName name;
    };

    template <class Commit>
    void CommitNow(Commit commit) {
        StateCommit state;
        commit(state);
        mDevice->Commit(state);
    }
    void SetFlushesAtOnce() { mFlushesAtOnce = mIsExternal || !mIsDeferred; }
    // Nothing that waits refers to a name.
    bool IsIdle() const { return list.IsEmpty() && !mStencils.IsPending(); }
    bool MayDeleteNow() const { return mAttached && IsRenderThread() && IsIdle(); }
    void Prepare();
    void Delete(Dropped const& dropped);
    void DeleteDropped();
    bool TakeForStencil(RunState const& state, GraphicsObject& object, int first, int count);
    void SampleCopyOfTarget(RunState& state);
    void ForgetMipmapsOfTarget();
    void CommitStates();
    // Before the stencil of the active target is left to others, or what draws it goes. Throws bad_alloc.
    void CompleteStencils();
    void TryToCompleteStencils() noexcept;

    std::unique_ptr<Device> mDevice;
    std::thread::id const mRenderThread = std::this_thread::get_id();
    RenderTarget* mActive = nullptr;
    bool mIsDeferred = false;
    bool mIsExternal = false;   // between a commit and the invalidation, while GL belongs to external code
    bool mFlushesAtOnce = true; // immediate or external
    std::vector<GraphicsObject*> mHolders;
    StencilPreparations mStencils{list};
    // A draw that samples its own target samples this copy; kept while the same size is needed.
    std::shared_ptr<TextureStorage> mTargetCopy;

    std::atomic<bool> mAttached{true};
    std::atomic<bool> mHasDropped{false};
    std::mutex mDroppedLock;
    std::vector<Dropped> mDropped;
};

// The recorder attached now or, for the statistics, the last one. Any thread.
std::shared_ptr<Recorder> GetRecorder();
// For the render thread, where it cannot go meanwhile: the one that is attached, or null.
Recorder* GetAttachedRecorder();
void SetRecorder(std::shared_ptr<Recorder> recorder);

// A request that may change what is bound: Begin and End.
class RequestScope {
public:
    explicit RequestScope(Recorder& recorder) : mRecorder(recorder), mLive(recorder.Begin()) {}
    ~RequestScope() {
        if (mLive) mRecorder.End();
    }
    RequestScope(RequestScope const&) = delete;
    RequestScope& operator=(RequestScope const&) = delete;

    // False when the context is gone: the object is inert.
    explicit operator bool() const { return mLive; }

private:
    Recorder& mRecorder;
    bool const mLive;
};

} // namespace Moka::detail
