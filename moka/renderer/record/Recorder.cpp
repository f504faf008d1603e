#include "moka/renderer/record/Recorder.h"

#include "moka/renderer/record/Caps.h"
#include "moka/renderer/record/FlushTrace.h"
#include "moka/renderer/record/GraphicsObject.h"
#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/RenderTarget.h"
#include "moka/renderer/record/TextureStorage.h"

#include <algorithm>
#include <new>
#include <utility>

namespace Moka::detail {

std::shared_ptr<Recorder> Recorder::Create(RendererLimits const& limits, RendererProcLoader loader) {
    auto recorder = std::make_shared<Recorder>();
    recorder->mDevice = MakeDevice(loader, recorder->counters);
    if (!recorder->mDevice) return nullptr;
    DeviceCaps const caps = recorder->mDevice->GetCaps();
    RecorderCaps::Get().Set(caps, limits);
    recorder->list.SetMerging(limits.mergesDraws);
    recorder->requested.emplace(*recorder->mDevice, caps.samplingUnits);
    return recorder;
}

Recorder::~Recorder() = default;

void Recorder::Detach() {
    MOKA_CHECK(IsRenderThread(), "the renderer is detached on the thread that attached it");
    mActive = nullptr;
    FlushForHost();
    mHolders.clear();
    fill.Clear(*this);
    depthStencilPool.Clear();
    {
        // Names that another thread drops after this are not deleted: the GL context deletes them with
        // itself.
        std::lock_guard const lock(mDroppedLock);
        mUnusual |= kDetached;
        for (Dropped const& dropped : mDropped) Delete(dropped);
        mDropped.clear();
    }
    requested.reset();
    mDevice.reset();
}

bool Recorder::Prepare() {
    if (!IsAttached()) return false;
    MOKA_CHECK(IsRenderThread(), "the renderer is used on the thread that attached it");
    bool const isHostsTurn = !mActive && !mIsDeferred;
    if (isHostsTurn || mIsExternal) {
        if (!mIsExternal) requested->Forget();
        mDevice->InvalidateState();
    }
    if (Has(kHasDropped) && IsIdle()) DeleteDropped();
    return true;
}

void Recorder::BindExpected() {
    if (mActive) {
        StateCommit commit;
        commit.target = &mActive->GetRef();
        mDevice->Commit(commit);
    } else if (!mIsDeferred) {
        mDevice->RestoreHost(HostState::FrameBuffers);
    }
}

bool Recorder::Draw(GraphicsObject& object, int format, PrimitiveType primitive, int first, int count) {
    std::shared_ptr<ProgramState> const& program = requested->GetProgram();
    if (MOKA_UNLIKELY(!program || !program->CanDraw())) return false;
    if (MOKA_UNLIKELY(count <= 0)) return true;
    ++counters.drawRequests;
    // A draw into the host's frame buffer uses the host's viewport, which the next activation changes.
    bool const isHosts = !mActive;
    if (MOKA_UNLIKELY(isHosts)) {
        Flush();
        mDevice->RestoreHost(HostState::All);
    }
    RunState& state = requested->Resolve(mActive ? mActive->GetRef() : GetCurrentTarget(), format, primitive);
    if (program->GetSamplerCount() > 0) {
        if (state.target.texture != 0) SampleCopyOfTarget(state);
        for (TextureRef const& texture : state.textures) UpdateMipmaps(texture);
    }
    if (MOKA_UNLIKELY(mStencils.IsPending()) && TakeForStencil(state, object, first, count)) return true;
    BeforeDraw(state, object.GetBounds());
    mipmaps.Forget(state.target.texture);
    // PlaceVertices() must come last: a flush in the calls above would remove the vertices from the list.
    list.AddDraw(state, !requested->IsChanged(), *program,
                 {object.PlaceVertices(), first, count, object.GetBounds()});
    requested->SetChanged(false);
    if (MOKA_UNLIKELY(isHosts || mIsExternal) || list.IsFull()) Flush();
    return true;
}

bool Recorder::TakeForStencil(RunState const& state, GraphicsObject& object, int first, int count) {
    int const stride = object.GetStride();
    float const* const vertices = object.GetVertices() + static_cast<std::ptrdiff_t>(first) * stride;
    if (!mStencils.TakeDraw(state, *requested->GetProgram(), vertices, count, stride)) return false;
    requested->SetChanged(true);
    object.TakeBackVertices();
    return true;
}

TargetRef Recorder::GetCurrentTarget() {
    if (mActive) return mActive->GetRef();
    TargetRef hosts;
    hosts.frameBuffer = mDevice->GetHostFrameBuffer();
    return hosts;
}

// In GL, sampling the texture that is drawn into is undefined: drivers return old texels, new ones, or
// neither.
void Recorder::SampleCopyOfTarget(RunState& state) {
    for (TextureRef& texture : state.textures) {
        if (texture.texture != state.target.texture) continue;
        bool const fits = mTargetCopy && mTargetCopy->GetWidth() == state.target.width &&
                          mTargetCopy->GetHeight() == state.target.height;
        if (!fits) {
            mTargetCopy =
                TextureStorage::Create(shared_from_this(), state.target.width, state.target.height, {});
        }
        if (mTargetCopy) {
            TargetRef const copy = mTargetCopy->Describe(0);
            list.Add(TargetCopy{state.target, copy, copy.width, copy.height});
            mipmaps.Forget(copy.texture);
        }
        texture.texture = mTargetCopy ? mTargetCopy->GetName() : 0;
        requested->SetChanged(true);
    }
}

bool Recorder::UpdateMipmaps(TextureRef const& texture) {
    if (texture.sampling.minFilter != TextureFilterMipmapped || texture.texture == 0) return false;
    if (mipmaps.IsCurrent(texture.texture)) return false;
    list.Add(MipmapUpdate{texture.texture});
    mipmaps.SetCurrent(texture.texture);
    return true;
}

void Recorder::AfterDraw() {
    if (FlushesAtOnce() || list.IsFull()) Flush();
}

void Recorder::AddStencilClear(DepthStencilClear const& clear) {
    if (FlushesAtOnce()) {
        mStencils.Forget(clear.target.depthStencil);
    } else if (mStencils.TakeClear(clear)) {
        return;
    }
    Add(clear);
}

void Recorder::Flush() {
    if (list.IsEmpty()) return;
    FlushTrace const trace(counters);
    bool const isFull = list.IsFull();
    mDevice->Submit(list.Finish());
    ++counters.flushes;
    for (GraphicsObject* const holder : mHolders) holder->KeepVertices();
    mHolders.clear();
    list.Clear(isFull);
    counters.listBytes.Set(list.GetCapacityBytes());
    if (Has(kHasDropped) && IsIdle()) DeleteDropped();
}

void Recorder::FlushIfUsed(DeviceName texture) {
    if (list.UsesTexture(texture)) Flush();
}

void Recorder::RemoveHolder(GraphicsObject const& object) {
    mHolders.erase(std::remove(mHolders.begin(), mHolders.end(), &object), mHolders.end());
}

void Recorder::Activate(RenderTarget& target) {
    // External code may read the other target once this one is bound, so the draws into it are flushed first.
    if (MOKA_UNLIKELY(!mIsDeferred) && mActive != &target) Flush();
    mActive = &target;
    if (MOKA_UNLIKELY(FlushesAtOnce())) End();
}

void Recorder::Deactivate(RenderTarget const& target) {
    if (MOKA_UNLIKELY(mActive != &target)) return;
    mActive = nullptr;
    if (MOKA_LIKELY(mIsDeferred)) return;
    Flush();
    CommitStates();
    mDevice->RestoreHost(HostState::All);
}

void Recorder::CompleteStencils() {
    mStencils.Finish();
    if (mActive) mStencils.Complete(mActive->GetRef());
}

// External GL may draw into the active target.
void Recorder::ForgetMipmapsOfTarget() {
    if (mActive) mipmaps.Forget(mActive->GetRef().texture);
}

void Recorder::CommitStates() {
    StateCommit commit;
    requested->AddStatesTo(commit);
    mDevice->Commit(commit);
}

void Recorder::FlushForHost() {
    if (!Begin()) return;
    Flush();
    mTargetCopy.reset();
    CommitStates();
    mDevice->RestoreHost(HostState::All);
}

void Recorder::CommitForExternal() {
    if (!Begin()) return;
    CompleteStencils();
    std::vector<TextureRef> const& textures = requested->GetTextures();
    for (TextureRef const& texture : textures) UpdateMipmaps(texture);
    Flush();
    mStencils.ForgetAll();
    ForgetMipmapsOfTarget();
    StateCommit commit;
    requested->AddStatesTo(commit);
    if (mActive) commit.target = &mActive->GetRef();
    if (std::shared_ptr<ProgramState> const& program = requested->GetProgram()) {
        commit.program = program->GetName();
        commit.values = program->GetValues().data();
    }
    commit.textures = textures.data();
    commit.textureCount = textures.size();
    mDevice->Commit(commit);
    mDevice->RestoreHost(HostState::VertexInput);
    mIsExternal = true;
    SetFlushesAtOnce();
}

void Recorder::InvalidateState() {
    mIsExternal = false;
    SetFlushesAtOnce();
    if (!Begin()) return;
    CompleteStencils();
    mStencils.ForgetAll();
    ForgetMipmapsOfTarget();
    mDevice->InvalidateState();
    requested->Forget();
}

void Recorder::SetDeferred(bool on) {
    if (!Begin()) return;
    CompleteStencils();
    Flush();
    mStencils.ForgetAll();
    mIsDeferred = on;
    SetFlushesAtOnce();
    if (mActive) return;
    CommitStates();
    mDevice->RestoreHost(HostState::All);
}

void Recorder::SetFlushesAtOnce() {
    if (mIsExternal || !mIsDeferred)
        mUnusual |= kFlushesAtOnce;
    else
        mUnusual &= ~kFlushesAtOnce;
}

void Recorder::Drop(DroppedKind kind, DeviceName name) {
    if (!IsAttached() || name == 0) return;
    if (MayDeleteNow()) {
        Delete({kind, name});
        return;
    }
    std::lock_guard const lock(mDroppedLock);
    if (!IsAttached()) return;
    mDropped.push_back({kind, name});
    mUnusual |= kHasDropped;
}

void Recorder::DropProgram(ProgramState const& program, DeviceName name) {
    if (IsAttached() && IsRenderThread()) {
        if (requested->GetProgram().get() == &program) requested->SetProgram(nullptr);
        if (mStencils.Uses(name)) TryToCompleteStencils();
    }
    Drop(DroppedKind::Program, name);
}

// If memory runs out, the clip is lost, as a draw would be.
void Recorder::TryToCompleteStencils() noexcept {
    try {
        CompleteStencils();
    } catch (std::bad_alloc const&) {
        mStencils.ForgetAll();
    }
}

void Recorder::DropTextureObject() {
    bool const isLast = --counters.textureObjects == 0;
    if (!isLast || !IsAttached()) return;
    if (MayDeleteNow()) {
        mDevice->DeleteSamplers();
    } else {
        mUnusual |= kHasDropped;
    }
}

void Recorder::Delete(Dropped const& dropped) {
    switch (dropped.kind) {
    case DroppedKind::Texture:
        list.ForgetTexture(dropped.name);
        mipmaps.Forget(dropped.name);
        mDevice->DeleteTexture(dropped.name);
        --counters.textures;
        return;
    case DroppedKind::FrameBuffer:
        mDevice->DeleteFrameBuffer(dropped.name);
        --counters.frameBuffers;
        return;
    case DroppedKind::Program:
        mStencils.ForgetUses(dropped.name);
        mDevice->DeleteProgram(dropped.name);
        --counters.programs;
        return;
    }
}

void Recorder::DeleteDropped() {
    std::vector<Dropped> dropped;
    {
        std::lock_guard const lock(mDroppedLock);
        dropped.swap(mDropped);
        mUnusual &= ~kHasDropped;
    }
    for (Dropped const& one : dropped) Delete(one);
    if (counters.textureObjects == 0) mDevice->DeleteSamplers();
}

namespace {

std::mutex theRecorderLock;
std::shared_ptr<Recorder> theRecorder;
std::atomic<Recorder*> theAttached{nullptr};

} // namespace

std::shared_ptr<Recorder> GetRecorder() {
    std::lock_guard const lock(theRecorderLock);
    return theRecorder;
}

Recorder* GetAttachedRecorder() { return theAttached; }

void SetRecorder(std::shared_ptr<Recorder> recorder) {
    std::lock_guard const lock(theRecorderLock);
    theRecorder = std::move(recorder);
    theAttached = theRecorder && theRecorder->IsAttached() ? theRecorder.get() : nullptr;
}

} // namespace Moka::detail
