#include "moka/renderer/gles/GlContext.h"

#include "moka/base/Check.h"

namespace Moka::detail {

GlContext::GlContext(RendererProcLoader loader) { debug.Attach(loader); }

void GlContext::Detach() {
    MOKA_CHECK(IsRenderThread(), "the renderer is detached on the thread that attached it");
    targets.Detach();
    samplers.Clear();
    depthStencilPool.Clear();
    debug.Detach();
    // A name that another thread drops from here on is not ours to delete any more.
    std::lock_guard const lock(mOrphanLock);
    mAttached = false;
    for (Orphan const& orphan : mOrphans) Delete(orphan);
    mOrphans.clear();
}

void GlContext::Drop(GlNameKind kind, GLuint name) {
    if (!mAttached || name == 0) return;
    if (IsRenderThread()) {
        Delete({kind, name});
        return;
    }
    std::lock_guard const lock(mOrphanLock);
    if (!mAttached) return;
    mOrphans.push_back({kind, name});
    mHasOrphans = true;
}

void GlContext::DropTextureObject() {
    bool const last = --statistics.textureObjects == 0;
    if (!last || !mAttached) return;
    if (IsRenderThread()) {
        samplers.Clear();
    } else {
        mHasOrphans = true;
    }
}

bool GlContext::Enter() {
    if (!mAttached) return false;
    MOKA_CHECK(IsRenderThread(), "the renderer is used on the thread that attached it");
    if (targets.IsHostsTurn()) state.Invalidate();
    if (mHasOrphans) DeleteOrphans();
    return true;
}

void GlContext::Flush() {
    if (!Enter()) return;
    targets.GiveBack();
}

void GlContext::InvalidateState() {
    if (Enter()) state.Invalidate();
}

void GlContext::SetDeferred(bool on) {
    if (!Enter()) return;
    targets.SetDeferred(on);
    if (!targets.GetActive()) targets.GiveBack();
}

void GlContext::Delete(Orphan const& orphan) {
    switch (orphan.kind) {
    case GlNameKind::Texture:
        glDeleteTextures(1, &orphan.name);
        state.ForgetTexture(orphan.name);
        --statistics.textures;
        return;
    case GlNameKind::FrameBuffer:
        glDeleteFramebuffers(1, &orphan.name);
        state.ForgetFrameBuffer(orphan.name);
        --statistics.frameBuffers;
        return;
    case GlNameKind::Program:
        state.TakeOffProgram(orphan.name);
        glDeleteProgram(orphan.name);
        --statistics.programs;
        return;
    }
}

void GlContext::DeleteOrphans() {
    std::vector<Orphan> orphans;
    {
        std::lock_guard const lock(mOrphanLock);
        orphans.swap(mOrphans);
        mHasOrphans = false;
    }
    for (Orphan const& orphan : orphans) Delete(orphan);
    if (statistics.textureObjects == 0) samplers.Clear();
}

} // namespace Moka::detail
