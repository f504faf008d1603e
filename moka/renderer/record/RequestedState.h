// RequestedState: the state requested for the next draw. The device tracks the actual GL state; submitting
// and committing apply this one.
// Thread: render thread.
// After external GL may have run, a state is unknown until it is set again. An unknown scissor is queried
// from the device, unknown blending and depth-stencil tests count as off, and a commit does not set unknown
// states.
#pragma once

#include "moka/base/Likely.h"
#include "moka/renderer/device/RunState.h"

#include <memory>
#include <vector>

namespace Moka::detail {

class Device;
class ProgramState;
class TextureStorage;
struct StateCommit;

class RequestedState {
public:
    RequestedState(Device& device, int samplingUnits);

    void SetScissorEnabled(bool on) {
        mKnowsScissorTest = true;
        Change(mDraw.scissor.on, on);
    }
    // Negative sizes become 0.
    void SetScissorRect(ScissorRect const& rect);
    bool IsScissorEnabled();
    ScissorRect const& GetScissorRect();
    ScissorState const& GetScissor();

    void SetBlend(BlendStateDescriptor const& blend) {
        mKnowsBlend = true;
        Change(mDraw.blend, blend);
    }
    // While a stencil clip is on, a state without a stencil test is ignored.
    void SetDepthStencil(DepthStencilStateDescriptor const& depthStencil) {
        if (MOKA_UNLIKELY(mStencilClip) && !depthStencil.IsStencil()) return;
        mKnowsDepthStencil = true;
        Change(mDraw.depthStencil, depthStencil);
    }
    void SetStencilClip(bool on) { mStencilClip = on; }
    BlendStateDescriptor const& GetBlend() const { return mDraw.blend; }
    DepthStencilStateDescriptor const& GetDepthStencil() const { return mDraw.depthStencil; }
    bool IsStencilClip() const { return mStencilClip; }

    void SetProgram(std::shared_ptr<ProgramState> const& program);
    std::shared_ptr<ProgramState> const& GetProgram() const { return mProgram; }

    int GetUnitCount() const { return static_cast<int>(mUnits.size()); }
    void SetTexture(int unit, std::shared_ptr<TextureStorage> const& storage, Sampling const& sampling);

    // Returns the state of a draw into target, with the textures that the program samples. The reference is
    // valid until the next call.
    RunState& Resolve(TargetRef const& target, int format, PrimitiveType primitive);
    // True if the state differs from that of the last draw.
    bool IsChanged() const { return mChanged; }
    void SetChanged(bool changed) { mChanged = changed; }

    // Adds the known scissor, blend and depth-stencil states. commit then points into this object.
    void AddStatesTo(StateCommit& commit) const;
    // The textures bound to the units, for a commit.
    std::vector<TextureRef> const& GetTextures();

    // Makes the states unknown, because external GL may have changed them.
    void Forget();

private:
    struct Unit {
        std::weak_ptr<TextureStorage> storage;
        Sampling sampling;
    };

    template <class T>
    void Change(T& kept, T const& value) {
        if (MOKA_LIKELY(kept == value)) return;
        kept = value;
        mChanged = true;
    }
    TextureRef GetTexture(int unit) const;
    void ResolveTextures();

    Device& mDevice;
    RunState mDraw;
    std::shared_ptr<ProgramState> mProgram;
    std::vector<Unit> mUnits;
    std::vector<TextureRef> mBound;
    bool mSamples = false; // the last resolved draw sampled textures
    bool mChanged = true;
    bool mStencilClip = false;
    bool mKnowsScissorTest = false;
    bool mKnowsScissorRect = false;
    bool mKnowsBlend = false;
    bool mKnowsDepthStencil = false;
};

} // namespace Moka::detail
