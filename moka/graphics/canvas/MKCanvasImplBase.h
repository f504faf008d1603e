// MKCanvasImplBase: the common base of the render sides of canvas and pen canvas: the target, its clip, and
// clearing.
// Owner:  a front end, which has it deleted on the render thread. Holds two references on the target, its own
//         and that of the attachment.
// Thread: render thread; the constructor, without onRenderThread, on any.
// Fails:  silently. Without a clip, for which memory ran out or its task was refused, everything is drawn.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/base/Rect.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/canvas/ClipInfo.h"
#include "moka/graphics/canvas/MKCanvasClipping.h"
#include "moka/graphics/math/Vector.h"

#include <memory>

namespace Moka {

class IMKBitmapCanvasAttachable;
class IMKTextureBitmap;

class MKCanvasImplBase : NonAssignable {
public:
    virtual ~MKCanvasImplBase();

    IMKBitmap* GetBitmap() const { return mTarget.bitmap; }

    void createClippingRT();
    // Within the clip.
    void ClearRT(Vector4<float> const& rgba);
    // Everything, whatever clip and scissor say; the scissor rectangle is as before, its test off.
    void ClearAllRT(Vector4<float> const& rgba);
    void AddClipRectRT(ClipInfo const& info);
    void RemoveClipRectRT(int count);

protected:
    // Walks the frame buffers that the target consists of, those that exist:
    //     for (FrameBuffers frame(bitmap); frame.Next();) frame.writable->...
    class FrameBuffers {
    public:
        explicit FrameBuffers(IMKBitmap* target);
        bool Next();

        IMKBitmapWritable* writable = nullptr;
        RectF bounds;
        int index = -1; // the strip, or -1 for a target that is one frame buffer

    private:
        IMKBitmap* const mTarget;
        IMKTextureBitmap* const mStrips; // null for a target that is one frame buffer
        int const mStripCount;
        IMKBitmapCanvasAttachable* const mAttachable;
        bool mIsDone = false; // with the one frame buffer
    };

    // A frame buffer ready to be drawn into under the clip, for the scope.
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

    // Of a strip, or with -1 of the target as one. Draws without one are dropped: they would reach the
    // frame buffer that the host has bound.
    bool HasFrameBuffer(int index) const;

private:
    struct Target {
        Target(IMKBitmap* target, bool onRenderThread);
        ~Target();
        Target(Target const&) = delete;
        Target& operator=(Target const&) = delete;

        IMKBitmap* const bitmap;
    };

    Target mTarget;
    std::unique_ptr<MKCanvasClipping> mClipping;
};

} // namespace Moka
