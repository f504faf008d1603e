#include "tests/support/reference/Plane.h"

#include <cmath>

namespace Moka::Testing {
namespace {

using Elements = std::array<double, 9>;

double Weigh(Elements const& m, PointD const& p) { return m[2] * p.x + m[5] * p.y + m[8]; }

PointD Apply(Elements const& m, PointD const& p) {
    double const w = Weigh(m, p);
    return {(m[0] * p.x + m[3] * p.y + m[6]) / w, (m[1] * p.x + m[4] * p.y + m[7]) / w};
}

double Minor(Elements const& m, std::size_t a, std::size_t b, std::size_t c, std::size_t d) {
    return m[a] * m[d] - m[b] * m[c];
}

// The adjugate: the inverse but for a factor, which the division by w takes out again.
Elements Adjugate(Elements const& m) {
    return {Minor(m, 4, 5, 7, 8), Minor(m, 2, 1, 8, 7), Minor(m, 1, 2, 4, 5),
            Minor(m, 5, 3, 8, 6), Minor(m, 0, 2, 6, 8), Minor(m, 2, 0, 5, 3),
            Minor(m, 3, 4, 6, 7), Minor(m, 1, 0, 7, 6), Minor(m, 0, 1, 3, 4)};
}

} // namespace

Transform::Transform(Matrix3f const& m) {
    for (std::size_t i = 0; i < 9; ++i) mElements[i] = static_cast<double>(m[static_cast<int>(i)]);
    mInverse = Adjugate(mElements);
    double const determinant =
        mElements[0] * mInverse[0] + mElements[3] * mInverse[1] + mElements[6] * mInverse[2];
    mInvertible = std::isfinite(determinant) && determinant != 0;
}

std::optional<PointD> Transform::Map(PointD const& p) const {
    if (!(Weigh(mElements, p) > 0)) return {};
    return Apply(mElements, p);
}

std::optional<PointD> Transform::Unmap(PointD const& p) const {
    if (!mInvertible) return {};
    PointD const source = Apply(mInverse, p);
    if (!(Weigh(mElements, source) > 0)) return {};
    return source;
}

std::optional<RectF> Transform::MapBox(RectF const& r) const {
    std::optional<RectF> box;
    for (float const x : {r.left, r.right}) {
        for (float const y : {r.top, r.bottom}) {
            auto const p = Map({static_cast<double>(x), static_cast<double>(y)});
            if (!p) return {};
            auto const px = static_cast<float>(p->x);
            auto const py = static_cast<float>(p->y);
            if (!box) box = RectF(px, py, px, py);
            box->MakeRect(px, py);
        }
    }
    return box;
}

} // namespace Moka::Testing
