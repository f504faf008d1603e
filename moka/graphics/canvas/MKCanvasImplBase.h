// MKCanvasImplBase: the common base of the render sides of canvas and pen canvas: the target, its clip, and
// clearing.
// Owner:  a front end, which posts its deletion to the render thread. Holds two references on the target: its
//         own and that of the attachment.
// Thread: render thread. The constructor without onRenderThread may run on any thread.
// Fails:  silently. If the clipping could not be created, because memory ran out or its task was refused,
//         draws are not clipped.
#pragma once

#include "moka/base/Likely.h"
#include "moka/base/NonAssignable.h"
#include "moka/base/Rect.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/ClipInfo.h"
#include "moka/graphics/canvas/MKCanvasClipping.h"
#include "moka/graphics/math/Vector.h"

#include <memory>

namespace Moka {

class IMKBitmapCanvasAttachable;

class MKCanvasImplBase : NonAssignable {
public:
    virtual ~MKCanvasImplBase();

    IMKBitmap* GetBitmap() const { return mTarget.bitmap; }

    void createClippingRT();
    // Clears within the clip.
    void ClearRT(Vector4<float> const& rgba);
    // Clears everything, regardless of clip and scissor. Keeps the scissor rectangle and switches the scissor
    // test off.
    void ClearAllRT(Vector4<float> const& rgba);
    void AddClipRectRT(ClipInfo const& info);
    void RemoveClipRectRT(int count);

protected:
    struct FrameBuffer {
        IMKBitmapWritable* writable; // null if the frame buffer does not exist
        RectF bounds;                // its part of the target
        int index;                   // the strip, or -1 for a target that is one frame buffer
    };

    // Calls action(FrameBuffer const&) for each existing frame buffer of the target.
    template <class Action>
    void ForEachFrameBuffer(Action const& action) const {
        int const count = mTarget.strips ? mTarget.strips->GetSubBitmapCount() : 1;
        for (int i = 0; i < count; ++i) {
            FrameBuffer const frame = mTarget.strips ? GetStrip(i) : GetWhole();
            if (MOKA_LIKELY(frame.writable)) action(frame);
        }
    }

    // Activates a frame buffer and its clip for a scope.
    class Drawing {
    public:
        Drawing(MKCanvasClipping* clipping, IMKBitmapWritable* writable, int index);
        ~Drawing();
        Drawing(Drawing const&) = delete;
        Drawing& operator=(Drawing const&) = delete;

    private:
        MKCanvasClipping* mClipping;
        IMKBitmapWritable* mWritable;
    };

    MKCanvasImplBase(IGLMsgQueue* queue, IMKBitmap* bitmap, bool onRenderThread);

    MKCanvasClipping* GetClipping() const { return mClipping.get(); }
    void DeleteClipping() { mClipping.reset(); }

    // True if the strip has a frame buffer; -1 asks for the target as one. Draws without a frame buffer are
    // dropped, because they would go to the one that the host has bound.
    bool HasFrameBuffer(int index) const;

private:
    // The bitmap and its interfaces, which never change.
    struct Target {
        Target(IMKBitmap* target, bool onRenderThread);
        ~Target();
        Target(Target const&) = delete;
        Target& operator=(Target const&) = delete;

        IMKBitmap* const bitmap;
        IMKTextureBitmap* const strips;              // null for a target that is one frame buffer
        IMKBitmapCanvasAttachable* const attachable; // may be null
    };

    FrameBuffer GetStrip(int index) const;
    FrameBuffer GetWhole() const;

    Target mTarget;
    std::unique_ptr<MKCanvasClipping> mClipping;
};

} // namespace Moka
