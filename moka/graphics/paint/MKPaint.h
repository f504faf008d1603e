/// MKPaint: the drawing attributes of a primitive: colour, tint, blending, fill or stroke, line, dashes,
/// texture tiling. A value without resources. A draw call copies it.
/// Thread: one at a time, like any value.
/// Units:  colour components 0 ... 1, not premultiplied; lengths in pixels before the canvas's matrix.
///         Setters do not check their arguments.
/// A new paint is opaque white, source-over, filled, one pixel wide, not anti-aliased and not dashed.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/math/Vector.h"

namespace Moka {

class MOKA_API MKPaint {
public:
    /// The transfer modes, which combine source and destination. The numbers of all four enumerations are
    /// ABI.
    enum XFermode : int {
        Add = 0,
        Clear = 1,
        Dst = 2,
        DstAtop = 3,
        DstIn = 4,
        DstOut = 5,
        DstOver = 6,
        Modulate = 7,
        Src = 8,
        SrcAtop = 9,
        SrcIn = 10,
        SrcOut = 11,
        SrcOver = 12, ///< premultiplied; also used for all numbers that are not listed
        SrcKeepDstAlpha = 13,
        SrcNonPremultiplied = 14,
        SrcOverNonPremultiplied = 15,
        Darken = 16,  ///< for bitmaps; other shapes as Src
        Lighten = 17, ///< for bitmaps; other shapes as Src
        BlendingOff = 18,
    };

    /// With both, the stroke is drawn over the fill. Any other number draws nothing.
    enum Style : int { Fill = 0, FillAndStroke = 1, Stroke = 2 };

    /// The ends of a line, and of each dash.
    enum LineCapType : int {
        Butt = 0,   ///< the line ends at its end point
        Round = 1,  ///< half a disc around the end point
        Square = 2, ///< extended by half the width; any other number means this
    };

    /// The content outside a texture. The value Default means Clamp.
    enum TileMode : int { Default = 0, Clamp = 1, Mirror = 2, Repeat = 3 };

    MKPaint() = default;
    /// Copies all values.
    MKPaint(MKPaint const&) = default;
    MKPaint& operator=(MKPaint const&) = default;
    virtual ~MKPaint();

    /// The colour, not premultiplied. With three components the alpha does not change.
    void SetColor(int argb); ///< 0xAARRGGBB
    void SetColor(float r, float g, float b) { mColor = {r, g, b, mColor.w}; }
    void SetColor(float r, float g, float b, float a) { mColor = {r, g, b, a}; }
    Vector4<float> GetColor() const { return mColor; }

    /// The tint replaces the colours of a bitmap or shape and keeps its alpha.
    void SetTintColor(int argb);
    void SetTintColor(float r, float g, float b, float a);
    Vector4<float> GetTintColor() const { return mTintColor; }
    void ClearTintColor();
    bool HasTintColor() const { return mHasTintColor; }

    /// The alpha of the colour. There is no separate opacity.
    void SetAlpha(float alpha) { mColor.w = alpha; }
    float GetAlpha() const { return mColor.w; }

    /// The transfer mode.
    void SetXFermode(XFermode mode) { mXFermode = mode; }
    XFermode GetXFermode() const { return mXFermode; }

    /// Fill, stroke, or both.
    void SetStyle(Style style) { mStyle = style; }
    Style GetStyle() const { return mStyle; }

    /// The width of lines and strokes, in pixels.
    void SetLineWidth(float width) { mLineWidth = width; }
    float GetLineWidth() const { return mLineWidth; }

    /// Soft edges of rectangles, simple lines and bitmaps; other shapes always have them.
    void SetAntiAliasing(bool on) { mAntiAliasing = on; }
    bool IsAntiAliasing() const { return mAntiAliasing; }

    /// The lengths of a dash, a gap, a dash and a gap, repeated along the line. Two numbers are used twice.
    /// If the first length is not greater than -1, the line has no dashes.
    void SetDashedLinePattern(Vector2<float> const& pattern) {
        mDashedLinePattern = {pattern.x, pattern.y, pattern.x, pattern.y};
    }
    void SetDashedLinePattern(Vector4<float> const& pattern) { mDashedLinePattern = pattern; }
    Vector4<float> GetDashedLinePattern() const { return mDashedLinePattern; }
    void ClearDashedLinePattern() { mDashedLinePattern = kNoDashes; }

    /// The ends of lines drawn by DrawLine.
    void SetLineCapType(LineCapType type) { mLineCapType = type; }
    LineCapType GetLineCapType() const { return mLineCapType; }

    /// The tile mode of bitmaps, for both axes or for each.
    void SetTileMode(TileMode mode) { SetTileMode(mode, mode); }
    void SetTileMode(TileMode x, TileMode y);
    TileMode GetTileModeX() const { return mTileModeX; }
    TileMode GetTileModeY() const { return mTileModeY; }

private:
    static constexpr Vector4<float> kNoDashes{-1, -1, -1, -1};

    Vector4<float> mColor{1, 1, 1, 1};
    Vector4<float> mTintColor;
    bool mHasTintColor = false;
    XFermode mXFermode = SrcOver;
    Style mStyle = Fill;
    float mLineWidth = 1;
    bool mAntiAliasing = false;
    Vector4<float> mDashedLinePattern = kNoDashes;
    LineCapType mLineCapType = Butt;
    TileMode mTileModeX = Default;
    TileMode mTileModeY = Default;
};

} // namespace Moka
