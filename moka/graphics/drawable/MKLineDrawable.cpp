#include "moka/graphics/drawable/MKLineDrawable.h"

#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"
#include "moka/graphics/drawable/ProjectedBounds.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <memory>
#include <new>

namespace Moka {

using namespace detail;

namespace {

// Thinner lines are not drawn.
constexpr float kLeastWidth = 1.0f;

// Two fringes and the body between them.
constexpr int kMostSegmentVertices = 3 * kQuadVertices;

struct LineVertex {
    float x;
    float y;
    float along;
    float across;
};

float Distance(PointF const& a, PointF const& b) {
    float const x = b.x - a.x;
    float const y = b.y - a.y;
    return std::sqrt(x * x + y * y);
}

void Include(RectF& hull, PointF const& point) {
    hull.left = std::min(hull.left, point.x);
    hull.top = std::min(hull.top, point.y);
    hull.right = std::max(hull.right, point.x);
    hull.bottom = std::max(hull.bottom, point.y);
}

void WriteLine(LineVertex* at, PointF const& start, PointF const& end, float length, float reach) {
    float const x = (end.x - start.x) / length * reach;
    float const y = (end.y - start.y) / length * reach;
    WriteQuad(at, {start.x - x + y, start.y - y - x, -reach, -reach},
              {start.x - x - y, start.y - y + x, -reach, reach},
              {end.x + x + y, end.y + y - x, length + reach, -reach},
              {end.x + x - y, end.y + y + x, length + reach, reach});
}

void SetDashes(MKLineShader& shader, Vector4<float> const& lengths) {
    bool const dashed = lengths.x > -1.0f;
    shader.uIsDashedLine = dashed ? 1 : 0;
    if (!dashed) return;
    float const second = lengths.x + lengths.y;
    float const third = second + lengths.z;
    float const fourth = third + lengths.w;
    shader.uDashedLinePattern = Vector4<float>(lengths.x, second, third, fourth);
    shader.uDashedLinePatternLength = fourth;
}

// A line parallel to a segment, at a signed distance, with one coverage.
struct Rail {
    float offset;
    float coverage;
};

class SegmentWriter {
public:
    explicit SegmentWriter(MKPaint const& paint)
        : mHalfWidth(paint.GetLineWidth() * 0.5f), mAntiAliased(paint.IsAntiAliasing()) {}

    int CountVertices() const { return mAntiAliased ? kMostSegmentVertices : kQuadVertices; }

    CoverageVertex* Write(CoverageVertex* at, PointF const& p, PointF const& q) const {
        float const length = Distance(p, q);
        Segment const segment{p, q, {(q.y - p.y) / length, (p.x - q.x) / length}};
        if (!mAntiAliased) return WriteStrip(at, segment, {-mHalfWidth, 1}, {mHalfWidth, 1});
        Rail const left{-(mHalfWidth - 0.5f), 1};
        Rail const right{mHalfWidth - 0.5f, 1};
        at = WriteStrip(at, segment, {-(mHalfWidth + 0.5f), 0}, left);
        at = WriteStrip(at, segment, left, right);
        return WriteStrip(at, segment, right, {mHalfWidth + 0.5f, 0});
    }

private:
    struct Segment {
        PointF p;
        PointF q;
        PointF normal;
    };

    static CoverageVertex At(PointF const& point, PointF const& normal, Rail const& rail) {
        return {point.x + rail.offset * normal.x, point.y + rail.offset * normal.y, rail.coverage};
    }

    static CoverageVertex* WriteStrip(CoverageVertex* at, Segment const& s, Rail const& from,
                                      Rail const& to) {
        return WriteQuad(at, At(s.p, s.normal, from), At(s.p, s.normal, to), At(s.q, s.normal, from),
                         At(s.q, s.normal, to));
    }

    float mHalfWidth;
    bool mAntiAliased;
};

} // namespace

MKLineDrawable::MKLineDrawable()
    : mLineGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({4}))),
      mSimpleGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({3}))),
      mLineShader(GetShader<MKLineShader>()),
      mRectShader(GetShader<MKRectShader>()) {}

MKLineDrawable::~MKLineDrawable() {
    mLineGraphics.reset();
    mSimpleGraphics.reset();
    mState.Release();
    mLineShader.reset();
    mRectShader.reset();
}

void MKLineDrawable::DrawLineRT(PointF const& start, PointF const& end, Matrix4<float> const& projection,
                                MKPaint const& paint) {
    float const width = paint.GetLineWidth();
    if (width < kLeastWidth) return;
    if (!mLineGraphics || !mState || !mLineShader) return;
    float const length = Distance(start, end);
    LineVertex vertices[kQuadVertices];
    WriteLine(vertices, start, end, length, width * 0.5f + 0.5f);

    mLineGraphics->SetVertices(0, vertices, kQuadVertices);
    // The corners of the quad lie at this distance from the end, both along the line and across it.
    constexpr float kDiagonal = 1.4143f;
    float const reach = (width * 0.5f + 0.5f) * kDiagonal;
    mLineGraphics->SetBounds(Project(Hull({start.x, start.y, end.x, end.y}, reach), projection));
    mState.Apply(paint.GetXFermode());
    UseShader(*mLineShader, projection, paint);
    mLineShader->uLineInfo = Vector2<float>(width * 0.5f, length);
    SetDashes(*mLineShader, paint.GetDashedLinePattern());
    mLineShader->uLineCapType = paint.GetLineCapType();
    DrawAll(*mLineGraphics);
}

void MKLineDrawable::DrawSimpleLineRT(PointF const& start, PointF const& end,
                                      Matrix4<float> const& projection, MKPaint const& paint) {
    if (paint.GetLineWidth() < kLeastWidth) return;
    CoverageVertex vertices[kMostSegmentVertices];
    SegmentWriter const writer(paint);
    writer.Write(vertices, start, end);
    DrawSimpleVertices(vertices, writer.CountVertices(), {start.x, start.y, end.x, end.y}, projection, paint);
}

void MKLineDrawable::DrawSimpleLinesRT(std::vector<PointF>* points, Matrix4<float> const& projection,
                                       MKPaint const& paint) {
    if (paint.GetLineWidth() < kLeastWidth) return;
    std::unique_ptr<std::vector<PointF> const> const owned(points);
    if (!points) return;
    SegmentWriter const writer(paint);
    std::size_t const segments = points->size() / 2;
    if (segments > static_cast<std::size_t>(INT_MAX / kMostSegmentVertices)) return;
    int const count = static_cast<int>(segments) * writer.CountVertices();
    std::unique_ptr<CoverageVertex[]> const vertices(new (std::nothrow)
                                                         CoverageVertex[static_cast<std::size_t>(count)]);
    if (!vertices) return;
    CoverageVertex* end = vertices.get();
    RectF hull;
    for (std::size_t i = 0; i < segments; ++i) {
        PointF const& from = (*points)[2 * i];
        PointF const& to = (*points)[2 * i + 1];
        end = writer.Write(end, from, to);
        if (i == 0) hull = {from.x, from.y, from.x, from.y};
        Include(hull, from);
        Include(hull, to);
    }
    DrawSimpleVertices(vertices.get(), count, hull, projection, paint);
}

void MKLineDrawable::DrawSimpleVertices(void const* vertices, int count, RectF const& points,
                                        Matrix4<float> const& projection, MKPaint const& paint) {
    if (!mSimpleGraphics || !mState || !mRectShader) return;
    mSimpleGraphics->SetVertices(0, vertices, count);
    float const reach = paint.GetLineWidth() * 0.5f + 0.5f;
    mSimpleGraphics->SetBounds(Project(Hull(points, reach), projection));
    mState.Apply(paint.GetXFermode());
    UseShader(*mRectShader, projection, paint);
    DrawAll(*mSimpleGraphics);
}

} // namespace Moka
