// GlCurrent: what has been asked to be in force for the next draw. GL may have something else: that is
// GlState's to know, and a play's or a commit's to change.
// Thread: render thread.
// A part that was not set since foreign code may have run is unknown: for the scissor GL is asked, the other
// states count as off, and a commit leaves unknown parts alone.
#pragma once

#include "moka/renderer/gles/GlDrawState.h"

#include <optional>
#include <vector>

namespace Moka::detail {

class GlRenderTarget;
class GlState;

class GlCurrent {
public:
    explicit GlCurrent(GlState& state);

    void SetScissorEnabled(bool on);
    void SetScissorRect(ScissorRect const& rect);
    GlScissor const& GetScissor();
    bool IsScissorEnabled();
    ScissorRect const& GetScissorRect();

    void SetBlend(BlendStateDescriptor const& blend);
    // Ignored without a stencil test while a clip is in force.
    void SetDepthStencil(DepthStencilStateDescriptor const& depthStencil);
    void SetStencilClip(bool on) { mStencilClip = on; }
    DepthStencilStateDescriptor const& GetDepthStencil() const { return mDraw.depthStencil; }

    void SetProgram(std::shared_ptr<GlUniforms> const& program);
    std::shared_ptr<GlUniforms> const& GetProgram() const { return mDraw.program; }
    void SetTexture(int unit, std::shared_ptr<GlTextureStorage> const& storage, GLuint sampler);

    // The state of a draw that goes to target now, with the textures that the program samples. Valid until
    // the next call; isChanged says whether it differs from the one before.
    GlDrawState& Resolve(GlTargetUse const& target, int format, PrimitiveType primitive);
    bool IsChanged() const { return mChanged; }
    void SetUnchanged() { mChanged = false; }
    // The last draw in the list is not one of this state.
    void SetChanged() { mChanged = true; }

    // Makes GL have what is known of scissor, blend and depth-stencil state.
    void CommitStates(GlState& state) const;
    // The same with the program, its values, and the textures.
    void CommitAll(GlState& state) const;

    // Foreign code may have changed the states.
    void Forget();
    // Nothing that was drawn with is kept alive. The next draw counts as changed.
    void LetGo();

private:
    struct Unit {
        std::weak_ptr<GlTextureStorage> storage;
        GLuint sampler = 0;
    };

    template <class T>
    void Change(T& kept, T const& value) {
        if (kept == value) return;
        kept = value;
        mChanged = true;
    }
    void ResolveTextures();

    GlState& mState;
    GlDrawState mDraw;
    std::vector<Unit> mUnits;
    bool mChanged = true;
    bool mStencilClip = false;
    bool mKnowsScissorTest = false;
    bool mKnowsScissorRect = false;
    bool mKnowsBlend = false;
    bool mKnowsDepthStencil = false;
};

} // namespace Moka::detail
