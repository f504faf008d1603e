// GlContext: one attached GL context: everything the renderer keeps beside the objects it handed out.
// Owner:   the factory from attach to detach, and every object made in it until that object goes, so that a
//          late release finds a context that knows it is gone.
// Thread:  the render thread, except where a line says otherwise.
#pragma once

#include "moka/base/Check.h"
#include "moka/renderer/gles/GlCurrent.h"
#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlDepthStencilPool.h"
#include "moka/renderer/gles/GlDrawList.h"
#include "moka/renderer/gles/GlFill.h"
#include "moka/renderer/gles/GlSamplers.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlStatistics.h"
#include "moka/renderer/gles/GlTargetSwitch.h"
#include "moka/renderer/gles/GlVertexFormats.h"
#include "moka/renderer/gles/GlWorkarounds.h"

#include <atomic>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

namespace Moka::detail {

// What may be dropped on any thread.
enum class GlNameKind { Texture, FrameBuffer, Program };

// Vertices to be drawn with what is current.
struct GlVertices {
    PrimitiveType primitive;
    int format;
    int floatsPerVertex;
    GLfloat const* data;
    GLsizei count;
};

class GlContext : public std::enable_shared_from_this<GlContext> {
public:
    // On the render thread, which is the calling one, with the context current.
    explicit GlContext(RendererProcLoader loader);
    ~GlContext();
    GlContext(GlContext const&) = delete;
    GlContext& operator=(GlContext const&) = delete;

    // Plays the list, deletes pooled and dropped names. What is dropped later goes down with the GL context.
    void Detach();

    // The one that is attached, or null. For the render thread, where it cannot go meanwhile.
    static GlContext* GetAttached();

    // Any thread.
    bool IsAttached() const { return mAttached; }
    bool IsRenderThread() const { return std::this_thread::get_id() == mRenderThread; }

    // Any thread: deletes the name, now on the render thread, elsewhere when that next runs an operation.
    void Drop(GlNameKind kind, GLuint name);
    // Any thread: the last texture object takes the samplers with it.
    void DropTextureObject();

    // What GlOperation does. False: the context is detached, GL must not be called.
    bool Enter() {
        if (!mAttached) return false;
        MOKA_CHECK(IsRenderThread(), "the renderer is used on the thread that attached it");
        if (targets.IsHostsTurn() || mIsForeign) ForgetState();
        if (mHasOrphans) DeleteOrphans();
        return true;
    }
    void Leave() {
        if (IsThrough()) Settle();
    }

    // Within an operation: adds a draw to the list. False when nothing can be drawn.
    bool Draw(GlVertices const& vertices);
    // Within an operation, after anything else was added to the list: it is played at once unless it waits
    // for more.
    void AfterAdding();
    void Play();
    // Within an operation: what the list does with it happens before what the caller is about to do.
    void PlayIfUsed(GlTextureStorage const& storage);
    // Within an operation: nothing refers to it any more.
    void LetGo(GlUniforms const& program);

    // Within an operation: whether what is asked for reaches GL at once, because nothing that comes first
    // waits in the list.
    bool IsThrough() const { return (mIsForeign || !targets.IsDeferred()) && list.IsEmpty(); }

    // Within an operation.
    void Activate(GlRenderTarget& target);
    void Deactivate(GlRenderTarget const& target);

    // Before foreign GL and after it.
    void Flush();
    void Commit();
    void InvalidateState();
    void SetDeferred(bool on);

    GlWorkarounds const workarounds;
    GlStatistics statistics;
    GlState state{statistics};
    GlDebug debug{statistics};
    GlTargetSwitch targets{state};
    GlSamplers samplers{state, statistics};
    GlDepthStencilPool depthStencilPool{state, targets, debug};
    GlVertexFormats vertexFormats{state};
    GlFill fill;
    GlCurrent current{state};
    GlDrawList list;

private:
    struct Orphan {
        GlNameKind kind;
        GLuint name;
    };

    void Delete(Orphan const& orphan);
    void DeleteOrphans();
    void ClearIdleSamplers();
    void ForgetState();
    void Settle();
    void BindActive();
    GlTargetUse PrepareHosts();
    void CopySampledTarget(GlDrawState& drawState);

    std::thread::id const mRenderThread = std::this_thread::get_id();
    std::atomic<bool> mAttached{true};
    std::atomic<bool> mHasOrphans{false};
    std::mutex mOrphanLock;
    std::vector<Orphan> mOrphans;
    // Between a commit and the invalidation, while GL is foreign code's.
    bool mIsForeign = false;
    // What a draw samples in the place of its own target; kept while the same size is asked for.
    std::shared_ptr<GlTextureStorage> mTargetCopy;
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
