// BareShapes.h: what the benchmarks have the library draw, drawn by bare GL: the vertices are computed from
// the same shapes and uploaded in each frame, because a frame's shapes are new.
// Thread: render thread, from construction to destruction.
#pragma once

#include "bench/canvas/BareGl.h"
#include "bench/canvas/BenchCanvas.h"

#include <vector>

namespace Moka::Bench {

class BareRects {
public:
    BareRects();
    // One draw call each, with the colour as the uniform that changes.
    void DrawEach(int count, int size);
    // All in one call, with a colour in each vertex.
    void DrawTogether(int count, int size);

private:
    BareImage mTarget{kSide, kSide};
    BareProgram mEachProgram;
    BareProgram mTogetherProgram;
    GLint mColor;
    BareVertices mPlain{2};
    BareVertices mColored{2, 4};
    std::vector<float> mFloats;
};

class BareQuads {
public:
    explicit BareQuads(int size);
    void Draw(std::vector<RectF> const& dsts);

private:
    BareImage mTarget{kSide, kSide};
    BareImage mSource;
    BareProgram mProgram;
    BareVertices mVertices{3, 2};
    std::vector<float> mFloats;
};

// Shapes of one kind and of distinct colours in one call. Each vertex has all that its shape's program needs.
class BareBatch {
public:
    // A covered rectangle has a coverage in each vertex, as the library's have.
    enum class Shape { Rect, CoveredRect, Bitmap, Circle, Line };

    BareBatch(Shape shape, int size);
    void Draw(int count, int size);

private:
    Shape const mShape;
    BareImage mTarget{kSide, kSide};
    BareImage mSource; // of bitmaps
    BareProgram mProgram;
    BareVertices mVertices{2, 4, 4};
    std::vector<float> mFloats;
};

class BareLines {
public:
    BareLines();
    // Points in pairs.
    void Draw(std::vector<PointF> const& points, float width, bool antiAliased);

private:
    BareImage mTarget{kSide, kSide};
    BareProgram mProgram;
    BareVertices mVertices{3};
    std::vector<float> mFloats;
};

// Across and then down, nine samples each.
class BareBlur {
public:
    BareBlur();
    void Draw();

private:
    BareImage mSource{kSide, kSide};
    BareImage mBetween{kSide, kSide};
    BareImage mTarget{kSide, kSide};
    BareProgram mProgram;
    GLint mStep;
    BareVertices mVertices{2};
};

} // namespace Moka::Bench
