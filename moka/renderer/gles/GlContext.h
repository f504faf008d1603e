// GlContext: one attached GL context: everything the renderer keeps beside the objects it handed out.
// Owner:   the factory from attach to detach, and every object made in it until that object goes, so that a
//          late release finds a context that knows it is gone.
// Thread:  the render thread, except where a line says otherwise.
#pragma once

#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlDepthStencilPool.h"
#include "moka/renderer/gles/GlSamplers.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlStatistics.h"
#include "moka/renderer/gles/GlTargetSwitch.h"

#include <atomic>
#include <mutex>
#include <thread>
#include <vector>

namespace Moka::detail {

// What may be dropped on any thread.
enum class GlNameKind { Texture, FrameBuffer, Program };

class GlContext {
public:
    // On the render thread, which is the calling one, with the context current.
    explicit GlContext(RendererProcLoader loader);

    // Deletes pooled and dropped names. What is dropped later goes down with the GL context.
    void Detach();

    // Any thread.
    bool IsAttached() const { return mAttached; }
    bool IsRenderThread() const { return std::this_thread::get_id() == mRenderThread; }

    // Any thread: deletes the name, now on the render thread, elsewhere when that next runs an operation.
    void Drop(GlNameKind kind, GLuint name);
    // Any thread: the last texture object takes the samplers with it.
    void DropTextureObject();

    // What GlOperation does. False: the context is detached, GL must not be called.
    bool Enter();
    void Leave() { targets.Settle(); }

    // Before foreign GL and after it.
    void Flush();
    void InvalidateState();
    void SetDeferred(bool on);

    GlStatistics statistics;
    GlState state;
    GlDebug debug{statistics};
    GlTargetSwitch targets{state, statistics};
    GlSamplers samplers{state, statistics};
    GlDepthStencilPool depthStencilPool{state, debug, statistics};

private:
    struct Orphan {
        GlNameKind kind;
        GLuint name;
    };

    void Delete(Orphan const& orphan);
    void DeleteOrphans();

    std::thread::id const mRenderThread = std::this_thread::get_id();
    std::atomic<bool> mAttached{true};
    std::atomic<bool> mHasOrphans{false};
    std::mutex mOrphanLock;
    std::vector<Orphan> mOrphans;
};

// GlOperation: the frame of every operation that may call GL: checks the thread, deletes what was dropped
// elsewhere, and at the end leaves the frame buffer bound that the caller expects. Not nested.
class GlOperation {
public:
    explicit GlOperation(GlContext& context) : mContext(context), mLive(context.Enter()) {}
    ~GlOperation() {
        if (mLive) mContext.Leave();
    }
    GlOperation(GlOperation const&) = delete;
    GlOperation& operator=(GlOperation const&) = delete;

    // False when the context is gone: the object is inert.
    explicit operator bool() const { return mLive; }

private:
    GlContext& mContext;
    bool const mLive;
};

} // namespace Moka::detail
