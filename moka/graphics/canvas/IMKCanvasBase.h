/// IMKCanvasBase: the operations of every canvas: clearing, a matrix, clip rectangles, a save stack over
/// both, a tag.
/// Owner:  reference counted; a creating function returns one reference to its caller.
/// Thread: a caller-side canvas from one thread at a time, a render-thread canvas on the render thread.
/// Units:  pixels of the target, origin top left, y down; angles in degrees, positive rotates +x towards +y.
/// The vtable order is ABI.
#pragma once

#include "moka/graphics/math/Matrix3.h"

namespace Moka {

class IGLMsgQueue;
class IMKBitmap;

class IMKCanvasBase {
public:
    /// Other numbers are allowed: Save then saves neither part. A ClipOp without a name combines nothing.
    enum SaveFlag : int { SaveAll = 0, SaveMatrix = 1, SaveClip = 2 };

    /// How a clip rectangle R changes the allowed area A.
    enum ClipOp : int {
        Intersect = 0,         ///< A and R
        Replace = 1,           ///< R
        Union = 2,             ///< A or R
        Xor = 3,               ///< either, not both
        Difference = 4,        ///< A without R
        ReverseDifference = 5, ///< R without A
    };

    virtual ~IMKCanvasBase() = default;

    /// Within the clip; a colour is 0xAARRGGBB or components 0 ... 1.
    virtual void Clear(int argb) = 0;
    virtual void Clear(float r, float g, float b, float a) = 0;
    /// The whole target.
    virtual void ClearAll(int argb) = 0;
    virtual void ClearAll(float r, float g, float b, float a) = 0;

    /// Save returns a level. Restore(-1) restores the last level; unknown levels are ignored.
    virtual int Save(SaveFlag flag) = 0;
    virtual void Restore(int level) = 0;

    /// In the coordinates of the current matrix.
    virtual void SetClipRect(int x, int y, int width, int height, ClipOp op) = 0;

    /// Pre acts on points before the current matrix, post after it.
    virtual void SetMatrix(Matrix3<float> const& matrix) = 0;
    virtual Matrix3<float> GetMatrix() = 0;
    virtual void PreConcat(Matrix3<float> const& matrix) = 0;
    virtual void PostConcat(Matrix3<float> const& matrix) = 0;
    virtual void PreScale(float sx, float sy) = 0;
    virtual void PostScale(float sx, float sy) = 0;
    virtual void PreRotate(float degrees) = 0;
    virtual void PreRotate(float degrees, float px, float py) = 0;
    virtual void PostRotate(float degrees) = 0;
    virtual void PostRotate(float degrees, float px, float py) = 0;
    virtual void PreTranslate(float tx, float ty) = 0;
    virtual void PostTranslate(float tx, float ty) = 0;

    /// A label for logs; the first 126 bytes are kept, null is ignored.
    virtual void SetTag(char const* tag) = 0;
    virtual char const* GetTag() = 0;
    /// The queue and the target; may be null. No new reference.
    virtual IGLMsgQueue* GetMsgQueue() = 0;
    virtual IMKBitmap* GetBitmap() = 0;

    /// Takes or drops a reference; the count afterwards. The last Unref deletes the canvas.
    virtual int Ref() = 0;
    virtual int Unref() = 0;
};

} // namespace Moka
