// GlTargetSwitch: which frame buffer is bound: the active target's, one that an operation needs for a moment,
// or the host's, which is remembered when it is first taken away and given back.
// Thread: render thread.
// While deferred, the host gets its frame buffer back in GiveBack() only; otherwise whenever no target is
// active at the end of an operation.
#pragma once

#include "moka/renderer/gles/GlState.h"

#include <optional>

namespace Moka::detail {

class GlRenderTarget;
struct GlStatistics;

class GlTargetSwitch {
public:
    GlTargetSwitch(GlState& state, GlStatistics& statistics) : mState(state), mStatistics(statistics) {}

    void SetDeferred(bool on) { mDeferred = on; }
    // Whether nothing of ours is in force, so that the host may have called GL since the last operation.
    bool IsHostsTurn() const { return !mActive && !mDeferred; }

    void Activate(GlRenderTarget& target);
    // Does nothing for a target that is not the active one.
    void Deactivate(GlRenderTarget const& target);
    GlRenderTarget* GetActive() const { return mActive; }

    // For the operation in progress; Settle ends it, with the active target or the host's frame buffer.
    void BindDraw(GLuint frameBuffer);
    void BindRead(GLuint frameBuffer);
    void Bind(GlFrameBuffers const& wanted);
    void Settle();

    // What a draw would go to.
    GLuint GetCurrent();
    // What the host has bound, now or beneath our own.
    GLuint GetHosts();

    // Frame buffer, viewport, samplers and what obstructs drawing are the host's again. An active target
    // stays the active one: the next operation binds it anew.
    void GiveBack();
    // The same for good: no target is active any more.
    void Detach();

private:
    void PrepareForDrawing();
    void GiveBackFrameBuffers();

    GlState& mState;
    GlStatistics& mStatistics;
    GlRenderTarget* mActive = nullptr;
    bool mDeferred = false;
    // Known while something of ours is in their place.
    std::optional<GlFrameBuffers> mHostFrameBuffers;
    std::optional<GlViewport> mHostViewport;
    std::optional<unsigned> mHostObstacles;
};

} // namespace Moka::detail
