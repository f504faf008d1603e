#include "moka/renderer/gles/GlContext.h"

#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlPlayer.h"
#include "moka/renderer/gles/GlRenderTarget.h"
#include "moka/renderer/gles/GlTextureStorage.h"
#include "moka/renderer/gles/GlUniforms.h"

namespace Moka::detail {
namespace {

std::atomic<GlContext*> theAttached{nullptr};

} // namespace

GlContext::GlContext(RendererProcLoader loader) {
    debug.Attach(loader);
    theAttached = this;
}

GlContext::~GlContext() = default;

GlContext* GlContext::GetAttached() { return theAttached; }

void GlContext::Detach() {
    MOKA_CHECK(IsRenderThread(), "the renderer is detached on the thread that attached it");
    theAttached = nullptr;
    targets.Deactivate();
    Flush();
    current.SetProgram(nullptr);
    current.LetGo();
    mTargetCopy.reset();
    fill.Clear();
    vertexFormats.Clear();
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
        ClearIdleSamplers();
    } else {
        mHasOrphans = true;
    }
}

// The list names samplers too; playing it comes back here.
void GlContext::ClearIdleSamplers() {
    if (statistics.textureObjects == 0 && list.IsEmpty()) samplers.Clear();
}

// The host, or foreign code between a commit and the invalidation, may have changed it.
void GlContext::ForgetState() {
    if (!mIsForeign) current.Forget();
    state.Invalidate();
}

// Foreign code, or the host, finds what it expects.
void GlContext::Settle() {
    if (targets.GetActive()) {
        BindActive();
    } else if (!targets.IsDeferred()) {
        targets.GiveBackFrameBuffers();
    }
}

void GlContext::BindActive() {
    GlTargetUse const& use = targets.GetActive()->GetUse();
    targets.BindTarget(use);
    depthStencilPool.Attach(use);
}

bool GlContext::Draw(GlVertices const& vertices) {
    std::shared_ptr<GlUniforms> const& program = current.GetProgram();
    if (!program || !program->CanDraw()) return false;
    if (vertices.count <= 0) return true;
    ++statistics.drawRequests;
    GlRenderTarget const* const active = targets.GetActive();
    GlTargetUse hosts;
    if (!active) hosts = PrepareHosts();
    GlDrawState& drawState =
        current.Resolve(active ? active->GetUse() : hosts, vertices.format, vertices.primitive);
    CopySampledTarget(drawState);
    list.AddDraw(drawState, !current.IsChanged(), vertices.data, vertices.count, vertices.floatsPerVertex);
    current.SetUnchanged();
    // A draw into the host's frame buffer uses the host's viewport, which the next activation takes away.
    if (!active || mIsForeign || list.IsFull()) Play();
    return true;
}

GlTargetUse GlContext::PrepareHosts() {
    Play();
    targets.GiveBack();
    GlTargetUse hosts;
    hosts.frameBuffer = GlFrameBuffer::OfHost(targets.GetHosts());
    return hosts;
}

// Sampling what is drawn into is undefined: drivers show the old texels, the new ones, or neither.
void GlContext::CopySampledTarget(GlDrawState& drawState) {
    GlTextureStorage const* const target = drawState.target.frameBuffer->GetStorage();
    if (!target) return;
    for (GlTextureUse& texture : drawState.textures) {
        if (texture.storage.get() != target) continue;
        bool const fits = mTargetCopy && mTargetCopy->GetWidth() == target->GetWidth() &&
                          mTargetCopy->GetHeight() == target->GetHeight();
        if (!fits) {
            mTargetCopy = GlTextureStorage::Create(target->GetContext(), target->GetWidth(),
                                                   target->GetHeight(), PixelSource{});
        }
        if (mTargetCopy) list.Add(GlTargetCopy{drawState.target, mTargetCopy});
        texture.storage = mTargetCopy;
        current.SetChanged();
    }
}

void GlContext::AfterAdding() {
    if (mIsForeign || !targets.IsDeferred() || list.IsFull()) Play();
}

void GlContext::Play() {
    if (list.IsEmpty()) return;
    GlPlayer(*this).Play(list);
    list.Clear();
    current.LetGo();
    ClearIdleSamplers();
    statistics.listBytes.Set(list.GetBytes());
}

void GlContext::PlayIfUsed(GlTextureStorage const& storage) {
    if (list.Uses(storage)) Play();
}

void GlContext::LetGo(GlUniforms const& program) {
    if (list.Uses(program)) Play();
    if (current.GetProgram().get() == &program) current.SetProgram(nullptr);
}

void GlContext::Activate(GlRenderTarget& target) {
    // What was drawn into another one is complete there before foreign code sees this one bound.
    if (!targets.IsDeferred() && targets.GetActive() != &target) Play();
    targets.Activate(target);
}

void GlContext::Deactivate(GlRenderTarget const& target) {
    if (targets.GetActive() != &target) return;
    targets.Deactivate();
    if (targets.IsDeferred()) return;
    Play();
    current.CommitStates(state);
    targets.GiveBack();
}

void GlContext::Flush() {
    if (!Enter()) return;
    Play();
    mTargetCopy.reset();
    current.CommitStates(state);
    targets.GiveBack();
}

void GlContext::Commit() {
    if (!Enter()) return;
    Play();
    if (targets.GetActive()) BindActive();
    current.CommitAll(state);
    targets.GiveBackVertexInput();
    mIsForeign = true;
}

void GlContext::InvalidateState() {
    mIsForeign = false;
    if (!Enter()) return;
    state.Invalidate();
    current.Forget();
}

void GlContext::SetDeferred(bool on) {
    if (!Enter()) return;
    Play();
    targets.SetDeferred(on);
    if (targets.GetActive()) return;
    current.CommitStates(state);
    targets.GiveBack();
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
    ClearIdleSamplers();
}

} // namespace Moka::detail
