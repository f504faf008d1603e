// BareShapes.h: draws the shapes of the benchmarks with bare GL. The vertices are computed from the same
// shapes and uploaded in each frame, as for new shapes.
// Thread: render thread, from construction to destruction.
#pragma once

#include "bench/canvas/BareGl.h"
#include "bench/canvas/BenchCanvas.h"

#include <vector>

namespace Moka::Bench {

class BareRects {
public:
    BareRects();
    // Draws each rectangle with one draw call. The colour is a uniform.
    void DrawEach(int count, int size);
    // Draws all rectangles with one call. Each vertex has a colour.
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

// Draws shapes of one kind and of different colours with one call. Each vertex has all values that the
// program needs.
class BareBatch {
public:
    // The vertices of a CoveredRect have a coverage, like the vertices of the library.
    enum class Shape { Rect, CoveredRect, Bitmap, Circle, Line };

    BareBatch(Shape shape, int size);
    void Draw(int count, int size);

private:
    Shape const mShape;
    BareImage mTarget{kSide, kSide};
    BareImage mSource; // the texture of Shape::Bitmap
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

// Blurs horizontally, then vertically, with nine samples each.
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
