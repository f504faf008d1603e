// MKCanvasClipping: the clip rectangles of one canvas. Around each draw it switches the GPU to where only the
// clipped area is written: through the scissor test where a rectangle will do, else through the stencil.
// Owner:  the render-side canvas.
// Thread: render thread.
// Cost:   nothing without clips, a few state changes with the scissor. The stencil is drawn anew for each
//         draw, which is slow and announces itself in the log each time.
// A target that is no texture bitmap has no stencil of ours: clips that need one do not work there.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/graphics/canvas/ScissorClip.h"
#include "moka/graphics/canvas/StencilClip.h"

#include <vector>

namespace Moka {

class IMKBitmap;
class IMKSubBitmap;

class MKCanvasClipping : NonAssignable {
public:
    // The bitmap outlives this. Passes exceptions of the shader's constructor on.
    explicit MKCanvasClipping(IMKBitmap* bitmap);
    virtual ~MKCanvasClipping();

    bool HasClips() const { return !mClips.empty(); }
    void AddClipRectRT(ClipInfo const& info);
    // Keeps the first ones. A count above the current one adds empty clips, which hide everything.
    // Compat: removed-clips
    void RemoveClipRectRT(int count);

    // For the draw that follows, into a strip, or with -1 into the target as one frame buffer. Activates it
    // when there are clips.
    void EnableClipRT(int frameBuffer);
    // Undoes the last EnableClipRT; the frame buffer stays active.
    void DisableClipRT();

private:
    enum class Mode { Stencil = 0, Scissor = 1, None = 2 };

    void EnableScissor();
    void EnableStencil();
    void DisableScissor();
    void DisableStencil();

    // Null for a frame buffer that is not there.
    IMKSubBitmap* FindStrip(int frameBuffer) const;
    IMKBitmapWritable* FindWritable(int frameBuffer) const;
    ScissorRect InFrameBuffer(ScissorRect const& rect, int frameBuffer) const;
    void ApplyPlainState();
    bool CarriesStencil(int frameBuffer) const;
    void AttachStencil(int frameBuffer);
    void DetachStencil(int frameBuffer);

    IMKBitmap* const mBitmap; // not owned
    detail::ClipList mClips;
    bool mDirty = true; // the state in force is not that of the list
    Mode mMode = Mode::None;
    bool mSavedScissorEnabled = false;
    ScissorRect mSavedScissor;
    ScissorRect mScissor; // of the list, in the target
    int mActiveFrameBuffer = -1;
    std::vector<bool> mStencilAttached; // by strip
    detail::StencilClip mStencil;
    detail::RendererPtr<IDepthStencilState> mPlainState;
};

} // namespace Moka
