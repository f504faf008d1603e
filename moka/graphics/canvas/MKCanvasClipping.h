// MKCanvasClipping: the clip rectangles of one canvas. It applies them around each draw: by the scissor test
// if the allowed area is one rectangle, else by the stencil test.
// Owner:  the render side of the canvas.
// Thread: render thread.
// Cost:   nothing without clips, a few state changes with the scissor. A stencil clip is requested again for
//         each draw, which can be slow and logs a warning each time.
// Only texture bitmaps have a stencil buffer: clips that need one do not work on other targets.
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
    // The bitmap must outlive this object. Exceptions of the shader's constructor pass through.
    explicit MKCanvasClipping(IMKBitmap* bitmap);
    virtual ~MKCanvasClipping();

    bool HasClips() const { return !mClips.empty(); }
    void AddClipRectRT(ClipInfo const& info);
    // Keeps the first `count` clips. A count above the current one adds empty clips, which hide everything.
    // Compat: removed-clips
    void RemoveClipRectRT(int count);

    // Applies the clips for the next draw into a strip; -1 means the target as one frame buffer. Activates
    // the frame buffer if there are clips.
    void EnableClipRT(int frameBuffer);
    // Undoes the last EnableClipRT; the frame buffer stays active.
    void DisableClipRT();

private:
    enum class Mode { Stencil = 0, Scissor = 1, None = 2 };

    void EnableScissor();
    void EnableStencil();
    void DisableScissor();
    void DisableStencil();

    // Return null if there is no such frame buffer.
    IMKSubBitmap* FindStrip(int frameBuffer) const;
    IMKBitmapWritable* FindWritable(int frameBuffer) const;
    ScissorRect InFrameBuffer(ScissorRect const& rect, int frameBuffer) const;
    void ApplyPlainState();
    bool CarriesStencil(int frameBuffer) const;
    void AttachStencil(int frameBuffer);
    void DetachStencil(int frameBuffer);

    IMKBitmap* const mBitmap; // not owned
    detail::ClipList mClips;
    bool mDirty = true; // mMode and mScissor do not match the list
    Mode mMode = Mode::None;
    bool mSavedScissorEnabled = false;
    ScissorRect mSavedScissor;
    ScissorRect mScissor; // the allowed rectangle, in pixels of the target
    int mActiveFrameBuffer = -1;
    std::vector<bool> mStencilAttached; // by strip
    detail::StencilClip mStencil;
    detail::RendererPtr<IDepthStencilState> mPlainState;
};

} // namespace Moka
