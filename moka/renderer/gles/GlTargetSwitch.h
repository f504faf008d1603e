// GlTargetSwitch: which frame buffer is bound: a target's that is drawn into, one that an operation needs for
// a moment, or the host's, which is remembered when it is first taken away and given back. The same for the
// viewport, the vertex input and what obstructs drawing.
// Thread: render thread.
// While deferred, the host gets its own back in GiveBack() only; otherwise whenever no target is active at
// the end of an operation.
#pragma once

#include "moka/renderer/gles/GlState.h"

#include <optional>

namespace Moka::detail {

class GlRenderTarget;
struct GlTargetUse;

class GlTargetSwitch {
public:
    explicit GlTargetSwitch(GlState& state) : mState(state) {}

    void SetDeferred(bool on) { mDeferred = on; }
    bool IsDeferred() const { return mDeferred; }
    // Whether nothing of ours is in force, so that the host may have called GL since the last operation.
    bool IsHostsTurn() const { return !mActive && !mDeferred; }

    // Nothing of it reaches GL yet.
    void Activate(GlRenderTarget& target) { mActive = &target; }
    void Deactivate() { mActive = nullptr; }
    GlRenderTarget* GetActive() const { return mActive; }

    // For the operation in progress.
    void BindDraw(GLuint frameBuffer);
    void BindRead(GLuint frameBuffer);
    void Bind(GlFrameBuffers const& wanted);
    // With its viewport, and nothing in the way of drawing.
    void BindTarget(GlTargetUse const& target);
    // Vertex array and buffer are ours to change.
    void TakeVertexInput();

    // What a draw would go to.
    GLuint GetCurrent();
    // What the host has bound, now or beneath our own.
    GLuint GetHosts();

    // Everything is the host's again, and no sampler is bound. An active target stays the active one.
    void GiveBack();
    // The parts of it that an operation may need alone.
    void GiveBackFrameBuffers();
    void GiveBackVertexInput();

private:
    GlState& mState;
    GlRenderTarget* mActive = nullptr;
    bool mDeferred = false;
    // Known while something of ours is in their place.
    std::optional<GlFrameBuffers> mHostFrameBuffers;
    std::optional<GlBox> mHostViewport;
    std::optional<unsigned> mHostObstacles;
    std::optional<GLuint> mHostVertexArray;
    std::optional<GLuint> mHostArrayBuffer;
};

} // namespace Moka::detail
