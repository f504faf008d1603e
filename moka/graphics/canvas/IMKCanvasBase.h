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
    /// The values that Save saves. With another number it saves neither of them.
    enum SaveFlag : int { SaveAll = 0, SaveMatrix = 1, SaveClip = 2 };

    /// How a clip rectangle R changes the allowed area A. Another number does not change it.
    enum ClipOp : int {
        Intersect = 0,         ///< A and R
        Replace = 1,           ///< R
        Union = 2,             ///< A or R
        Xor = 3,               ///< either, not both
        Difference = 4,        ///< A without R
        ReverseDifference = 5, ///< R without A
    };

    virtual ~IMKCanvasBase() = default;

    /// Fill the clipped area with a colour, 0xAARRGGBB or components 0 ... 1, ignoring what was there.
    virtual void Clear(int argb) = 0;
    virtual void Clear(float r, float g, float b, float a) = 0;
    /// Fill the whole target with a colour, regardless of the clip.
    virtual void ClearAll(int argb) = 0;
    virtual void ClearAll(float r, float g, float b, float a) = 0;

    /// Saves the matrix, the clip, or both, and returns the index of the new level. The first one is 0.
    virtual int Save(SaveFlag flag) = 0;
    /// Restores matrix and clip of a level, and removes it and all levels above. -1 means the last level.
    /// Unknown levels are ignored.
    virtual void Restore(int level) = 0;

    /// Adds a clip rectangle, in the coordinates of the current matrix. Later changes of the matrix do not
    /// affect it.
    virtual void SetClipRect(int x, int y, int width, int height, ClipOp op) = 0;

    /// The current matrix, which maps coordinates to pixels of the target. A "pre" function applies its
    /// transformation to points before the current matrix, a "post" function after it. Rotations are about
    /// (px, py), or else the origin.
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

    /// A label for logs. The first 126 bytes are kept; null is ignored.
    virtual void SetTag(char const* tag) = 0;
    virtual char const* GetTag() = 0;
    /// The queue and the target bitmap; both may be null. The caller gets no reference.
    virtual IGLMsgQueue* GetMsgQueue() = 0;
    virtual IMKBitmap* GetBitmap() = 0;

    /// Take or drop a reference, and return the count afterwards. The last Unref deletes the canvas.
    virtual int Ref() = 0;
    virtual int Unref() = 0;
};

} // namespace Moka
