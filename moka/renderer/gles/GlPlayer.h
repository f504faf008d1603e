// GlPlayer: makes GL do what a draw list says, in its order, with as few calls as the shadows allow.
// Thread: render thread, inside an operation.
#pragma once

#include "moka/renderer/gles/GlDrawList.h"

namespace Moka::detail {

class GlContext;

class GlPlayer {
public:
    explicit GlPlayer(GlContext& context) : mContext(context) {}

    void Play(GlDrawList const& list);

private:
    void Do(GlRun const& run);
    void Do(GlColorClear const& clear);
    void Do(GlDepthStencilClear const& clear);
    void Do(GlDiscard const& discard);
    void Do(GlTargetCopy const& copy);

    void PutInForce(GlDrawState const& state);
    void BindAlone(GlTargetUse const& target);
    void SetScissor(GlScissor const& scissor);

    GlContext& mContext;
    GlDrawList const* mList = nullptr;
    GlDrawState const* mState = nullptr; // in force since the last run; null after anything else
};

} // namespace Moka::detail
