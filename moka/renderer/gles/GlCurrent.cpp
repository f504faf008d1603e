#include "moka/renderer/gles/GlCurrent.h"

#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlTables.h"
#include "moka/renderer/gles/GlTextureStorage.h"
#include "moka/renderer/gles/GlUniforms.h"

#include <algorithm>

namespace Moka::detail {

GlCurrent::GlCurrent(GlState& state)
    : mState(state), mUnits(static_cast<std::size_t>(state.GetSamplingUnitCount())) {}

void GlCurrent::SetScissorEnabled(bool on) {
    mKnowsScissorTest = true;
    Change(mDraw.scissor.on, on);
}

void GlCurrent::SetScissorRect(ScissorRect const& rect) {
    mKnowsScissorRect = true;
    Change(mDraw.scissor.rect, {rect.x, rect.y, std::max(rect.width, 0), std::max(rect.height, 0)});
}

bool GlCurrent::IsScissorEnabled() {
    if (!mKnowsScissorTest) SetScissorEnabled(mState.scissorTest.Get());
    return mDraw.scissor.on;
}

ScissorRect const& GlCurrent::GetScissorRect() {
    if (!mKnowsScissorRect) {
        GlBox const& box = mState.scissorRect.Get();
        SetScissorRect({box.x, box.y, box.width, box.height});
    }
    return mDraw.scissor.rect;
}

// The rectangle is of no interest, and not asked for, while the test is off.
GlScissor const& GlCurrent::GetScissor() {
    if (IsScissorEnabled()) GetScissorRect();
    return mDraw.scissor;
}

void GlCurrent::SetBlend(BlendStateDescriptor const& blend) {
    mKnowsBlend = true;
    Change(mDraw.blend, blend);
}

void GlCurrent::SetDepthStencil(DepthStencilStateDescriptor const& depthStencil) {
    if (mStencilClip && !depthStencil.IsStencil()) return;
    mKnowsDepthStencil = true;
    Change(mDraw.depthStencil, depthStencil);
}

void GlCurrent::SetProgram(std::shared_ptr<GlUniforms> const& program) { Change(mDraw.program, program); }

void GlCurrent::SetTexture(int unit, std::shared_ptr<GlTextureStorage> const& storage, GLuint sampler) {
    mUnits[static_cast<std::size_t>(unit)] = {storage, sampler};
}

GlDrawState& GlCurrent::Resolve(GlTargetUse const& target, int format, PrimitiveType primitive) {
    GetScissor();
    Change(mDraw.target, target);
    Change(mDraw.format, format);
    Change(mDraw.primitive, primitive);
    ResolveTextures();
    return mDraw;
}

// A unit that the program names and that has nothing bound samples what GL has there.
void GlCurrent::ResolveTextures() {
    int const count = mDraw.program->GetSamplerCount();
    for (int i = 0; i < kMaxSamplers; ++i) {
        GlTextureUse use;
        if (i < count) {
            use.unit = mDraw.program->GetSamplerUnit(i);
            bool const isUnit = use.unit >= 0 && use.unit < static_cast<int>(mUnits.size());
            if (isUnit) {
                Unit const& unit = mUnits[static_cast<std::size_t>(use.unit)];
                use.storage = unit.storage.lock();
                use.sampler = unit.sampler;
            }
        } else if (!mDraw.textures[static_cast<std::size_t>(i)].storage) {
            return;
        }
        Change(mDraw.textures[static_cast<std::size_t>(i)], use);
    }
}

void GlCurrent::CommitStates(GlState& state) const {
    if (mKnowsScissorTest) state.SetScissorTest(mDraw.scissor.on);
    if (mKnowsScissorRect) state.SetScissorRect(ToGlBox(mDraw.scissor.rect));
    if (mKnowsBlend) state.SetBlend(mDraw.blend);
    if (mKnowsDepthStencil) state.SetDepthStencil(mDraw.depthStencil);
}

void GlCurrent::CommitAll(GlState& state) const {
    CommitStates(state);
    if (mDraw.program) mDraw.program->PutInForce(mDraw.program->GetValues());
    for (std::size_t i = 0; i < mUnits.size(); ++i) {
        std::shared_ptr<GlTextureStorage> const storage = mUnits[i].storage.lock();
        if (storage) state.BindTexture(static_cast<int>(i), storage->GetName(), mUnits[i].sampler);
    }
}

void GlCurrent::Forget() {
    mKnowsScissorTest = mKnowsScissorRect = mKnowsBlend = mKnowsDepthStencil = false;
    Change(mDraw.blend, GlDrawState::WithoutBlending());
    if (!mStencilClip) Change(mDraw.depthStencil, DepthStencilStateDescriptor(false, false));
}

void GlCurrent::LetGo() {
    mDraw.target = {};
    mDraw.textures = {};
    mChanged = true;
}

} // namespace Moka::detail
