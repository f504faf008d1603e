#include "moka/renderer/record/RequestedState.h"

#include "moka/base/Likely.h"
#include "moka/renderer/device/Device.h"
#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/TextureStorage.h"

#include <algorithm>
#include <utility>

namespace Moka::detail {

RequestedState::RequestedState(Device& device, int samplingUnits)
    : mDevice(device), mUnits(static_cast<std::size_t>(samplingUnits)) {
    mBound.reserve(mUnits.size());
}

void RequestedState::SetScissorRect(ScissorRect const& rect) {
    mKnowsScissorRect = true;
    Change(mDraw.scissor.rect, {rect.x, rect.y, std::max(rect.width, 0), std::max(rect.height, 0)});
}

bool RequestedState::IsScissorEnabled() {
    if (!mKnowsScissorTest) SetScissorEnabled(mDevice.QueryScissorTest());
    return mDraw.scissor.on;
}

ScissorRect const& RequestedState::GetScissorRect() {
    if (!mKnowsScissorRect) SetScissorRect(mDevice.QueryScissorRect());
    return mDraw.scissor.rect;
}

// Does not query the rectangle while the scissor test is off.
ScissorState const& RequestedState::GetScissor() {
    if (IsScissorEnabled()) GetScissorRect();
    return mDraw.scissor;
}

void RequestedState::SetProgram(std::shared_ptr<ProgramState> const& program) { Change(mProgram, program); }

void RequestedState::SetTexture(int unit, std::shared_ptr<TextureStorage> const& storage,
                                Sampling const& sampling) {
    mUnits[static_cast<std::size_t>(unit)] = {storage, sampling};
}

RunState& RequestedState::Resolve(TargetRef const& target, int format, PrimitiveType primitive) {
    if (MOKA_UNLIKELY(!mKnowsScissorTest) || (mDraw.scissor.on && !mKnowsScissorRect)) GetScissor();
    DeviceName const program = mProgram->GetName();
    bool const isSame = mDraw.target == target && mDraw.format == format && mDraw.primitive == primitive &&
                        mDraw.program == program;
    if (MOKA_UNLIKELY(!isSame)) {
        mDraw.target = target;
        mDraw.format = format;
        mDraw.primitive = primitive;
        mDraw.program = program;
        mChanged = true;
    }
    if (mSamples || mProgram->GetSamplerCount() > 0) ResolveTextures();
    return mDraw;
}

TextureRef RequestedState::GetTexture(int unit) const {
    TextureRef texture;
    texture.unit = unit;
    if (unit < 0 || unit >= GetUnitCount()) return texture;
    Unit const& bound = mUnits[static_cast<std::size_t>(unit)];
    if (std::shared_ptr<TextureStorage> const storage = bound.storage.lock()) {
        texture.texture = storage->GetName();
        texture.sampling = bound.sampling;
    }
    return texture;
}

// If a sampler's unit has no texture of ours, the draw samples the texture that GL has bound there.
void RequestedState::ResolveTextures() {
    std::size_t const count = mProgram->GetSamplerCount();
    for (std::size_t i = 0; i < kMaxSamplers; ++i) {
        Change(mDraw.textures[i], i < count ? GetTexture(mProgram->GetSamplerUnit(i)) : TextureRef{});
    }
    mSamples = count > 0;
}

void RequestedState::AddStatesTo(StateCommit& commit) const {
    if (mKnowsScissorTest) commit.scissorTest = &mDraw.scissor.on;
    if (mKnowsScissorRect) commit.scissorRect = &mDraw.scissor.rect;
    if (mKnowsBlend) commit.blend = &mDraw.blend;
    if (mKnowsDepthStencil) commit.depthStencil = &mDraw.depthStencil;
}

std::vector<TextureRef> const& RequestedState::GetTextures() {
    mBound.clear();
    for (int i = 0; i < GetUnitCount(); ++i) {
        TextureRef const texture = GetTexture(i);
        if (texture.texture != 0) mBound.push_back(texture);
    }
    return mBound;
}

void RequestedState::Forget() {
    mKnowsScissorTest = mKnowsScissorRect = mKnowsBlend = mKnowsDepthStencil = false;
    Change(mDraw.blend, RunState::WithoutBlending());
    if (!mStencilClip) Change(mDraw.depthStencil, DepthStencilStateDescriptor(false, false));
}

} // namespace Moka::detail
