#include "moka/graphics/math/Matrix3.h"

#include "moka/base/Rect.h"
#include "moka/base/SameBits.h"
#include "moka/graphics/math/SinCos.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <utility>

// Every expression below is in the order that fixes its rounding: do not regroup, factor out or contract.

namespace Moka {
namespace {

detail::SinCos OfDegrees(float degrees) { return detail::SinCos(degrees * 0.017453292f); }

template <class T>
Matrix3<T> Product(Matrix3<T> const& left, Matrix3<T> const& right) {
    Matrix3<T> result;
    for (int column = 0; column < 3; ++column) {
        for (int row = 0; row < 3; ++row) {
            result(row, column) = left(row, 0) * right(0, column) + left(row, 1) * right(1, column) +
                                  left(row, 2) * right(2, column);
        }
    }
    return result;
}

// Computes the adjugate in single precision.
template <class T>
void Adjugate(T const* m, T (&a)[9]) {
    a[0] = m[4] * m[8] - m[7] * m[5];
    a[1] = m[7] * m[2] - m[8] * m[1];
    a[2] = m[5] * m[1] - m[4] * m[2];
    a[3] = m[5] * m[6] - m[8] * m[3];
    a[4] = m[8] * m[0] - m[2] * m[6];
    a[5] = m[2] * m[3] - m[5] * m[0];
    a[6] = m[7] * m[3] - m[4] * m[6];
    a[7] = m[1] * m[6] - m[7] * m[0];
    a[8] = m[4] * m[0] - m[1] * m[3];
}

template <class T>
bool IsScaleAndTranslation(T const* m) {
    return m[1] == 0 && m[2] == 0 && m[3] == 0 && m[5] == 0 && m[8] == 1;
}

// Infinity and NaN minus themselves are NaN, which does not equal 0.
template <class T>
bool AreFinite(T a, T b, T c, T d) {
    return (a - a) + (b - b) + (c - c) + (d - d) == 0;
}

template <class T>
void MapCorners(T const* m, T left, T top, T right, T bottom, RectF& box) {
    // The products with zero elements can be left out, except that 0 times infinity is NaN.
    if (IsScaleAndTranslation(m) && AreFinite(left, top, right, bottom)) {
        T const x0 = m[0] * left + m[6];
        T const x1 = m[0] * right + m[6];
        T const y0 = m[4] * top + m[7];
        T const y1 = m[4] * bottom + m[7];
        box.left = std::min(x0, x1);
        box.right = std::max(x0, x1);
        box.top = std::min(y0, y1);
        box.bottom = std::max(y0, y1);
        return;
    }
    T const xs[] = {left, right, right, left};
    T const ys[] = {top, bottom, top, bottom};
    T mappedX[4];
    T mappedY[4];
    T w[4];
    // Loops over four points, which compilers vectorise.
    for (int i = 0; i < 4; ++i) w[i] = m[2] * xs[i] + m[5] * ys[i] + m[8];
    for (int i = 0; i < 4; ++i) mappedX[i] = m[0] * xs[i] + m[3] * ys[i] + m[6];
    for (int i = 0; i < 4; ++i) mappedY[i] = m[1] * xs[i] + m[4] * ys[i] + m[7];
    // Skips divisions by 1, which cost time and change nothing.
    if (w[0] != 1 || w[1] != 1 || w[2] != 1 || w[3] != 1) {
        for (int i = 0; i < 4; ++i) mappedX[i] /= w[i];
        for (int i = 0; i < 4; ++i) mappedY[i] /= w[i];
    }
    // The comparisons skip NaN, except in the first corner.
    box = RectF(mappedX[0], mappedY[0], mappedX[0], mappedY[0]);
    for (int i = 1; i < 4; ++i) {
        box.left = mappedX[i] < box.left ? mappedX[i] : box.left;
        box.right = mappedX[i] > box.right ? mappedX[i] : box.right;
        box.top = mappedY[i] < box.top ? mappedY[i] : box.top;
        box.bottom = mappedY[i] > box.bottom ? mappedY[i] : box.bottom;
    }
}

} // namespace

template <class T>
Matrix3<T>::Matrix3(T const& value) {
    std::fill(std::begin(mElements), std::end(mElements), value);
}

template <class T>
Matrix3<T>::Matrix3(T const* elements) {
    std::copy_n(elements, 9, mElements);
}

template <class T>
inline bool Matrix3<T>::operator==(Matrix3 const& other) const {
    constexpr std::size_t kLast = 8;
    return detail::HasSameBits<kLast * sizeof(T)>(mElements, other.mElements) &&
           std::memcmp(mElements + kLast, other.mElements + kLast, sizeof(T)) == 0;
}

template <class T>
bool Matrix3<T>::isIdentity() const {
    static constexpr T kIdentity[] = {1, 0, 0, 0, 1, 0, 0, 0, 1};
    return std::equal(std::begin(mElements), std::end(mElements), kIdentity);
}

template <class T>
void Matrix3<T>::identitySelf() {
    *this = Matrix3();
}

template <class T>
void Matrix3<T>::zeroSelf() {
    *this = Matrix3(T(0));
}

template <class T>
Matrix3<T> Matrix3<T>::translateMatrix(T tx, T ty) {
    return {1, 0, 0, 0, 1, 0, tx, ty, 1};
}

template <class T>
Matrix3<T> Matrix3<T>::rotateMatrix(T degrees) {
    auto const [s, c] = OfDegrees(degrees);
    return {c, s, 0, -s, c, 0, 0, 0, 1};
}

template <class T>
Matrix3<T> Matrix3<T>::scaleMatrix(T sx, T sy) {
    return {sx, 0, 0, 0, sy, 0, 0, 0, 1};
}

template <class T>
void Matrix3<T>::setScale(T sx, T sy) {
    *this = scaleMatrix(sx, sy);
}

template <class T>
void Matrix3<T>::setScale(T sx, T sy, T px, T py) {
    *this = {sx, 0, 0, 0, sy, 0, px - sx * px, py - sy * py, 1};
}

template <class T>
void Matrix3<T>::setRotate(T degrees) {
    *this = rotateMatrix(degrees);
}

template <class T>
void Matrix3<T>::setRotate(T degrees, T px, T py) {
    auto const [s, c] = OfDegrees(degrees);
    *this = {c, s, 0, -s, c, 0, s * py - c * px + px, -s * px - c * py + py, 1};
}

template <class T>
void Matrix3<T>::setTranslate(T tx, T ty) {
    *this = translateMatrix(tx, ty);
}

template <class T>
void Matrix3<T>::preConcat(Matrix3 const& right) {
    *this = Product(*this, right);
}

template <class T>
void Matrix3<T>::postConcat(Matrix3 const& left) {
    *this = Product(left, *this);
}

template <class T>
void Matrix3<T>::preScale(T sx, T sy) {
    for (int row = 0; row < 3; ++row) {
        mElements[row] *= sx;
        mElements[row + 3] *= sy;
    }
}

template <class T>
void Matrix3<T>::preScale(T sx, T sy, T px, T py) {
    preTranslate(px - sx * px, py - sy * py);
    preScale(sx, sy);
}

template <class T>
void Matrix3<T>::preRotate(T degrees) {
    auto const [s, c] = OfDegrees(degrees);
    for (int row = 0; row < 3; ++row) {
        T const a = mElements[row];
        T const b = mElements[row + 3];
        mElements[row] = c * a + s * b;
        mElements[row + 3] = -s * a + c * b;
    }
}

template <class T>
void Matrix3<T>::preRotate(T degrees, T px, T py) {
    auto const [s, c] = OfDegrees(degrees);
    preTranslate(s * py - c * px + px, -s * px - c * py + py);
    preRotate(degrees);
}

template <class T>
void Matrix3<T>::preTranslate(T tx, T ty) {
    for (int row = 0; row < 3; ++row) {
        mElements[row + 6] += mElements[row] * tx + mElements[row + 3] * ty;
    }
}

template <class T>
void Matrix3<T>::postScale(T sx, T sy) {
    for (int first = 0; first < 9; first += 3) {
        mElements[first] *= sx;
        mElements[first + 1] *= sy;
    }
}

template <class T>
void Matrix3<T>::postScale(T sx, T sy, T px, T py) {
    T const dx = px - sx * px;
    T const dy = py - sy * py;
    for (int first = 0; first < 9; first += 3) {
        T const w = mElements[first + 2];
        mElements[first] = sx * mElements[first] + dx * w;
        mElements[first + 1] = sy * mElements[first + 1] + dy * w;
    }
}

template <class T>
void Matrix3<T>::postRotate(T degrees) {
    auto const [s, c] = OfDegrees(degrees);
    for (int first = 0; first < 9; first += 3) {
        T const a = mElements[first];
        T const b = mElements[first + 1];
        mElements[first] = c * a - s * b;
        mElements[first + 1] = s * a + c * b;
    }
}

template <class T>
void Matrix3<T>::postRotate(T degrees, T px, T py) {
    auto const [s, c] = OfDegrees(degrees);
    T const tx = s * py - c * px + px;
    T const ty = -s * px - c * py + py;
    for (int first = 0; first < 9; first += 3) {
        T const a = mElements[first];
        T const b = mElements[first + 1];
        T const w = mElements[first + 2];
        mElements[first] = c * a - s * b + tx * w;
        mElements[first + 1] = s * a + c * b + ty * w;
    }
}

template <class T>
void Matrix3<T>::postTranslate(T tx, T ty) {
    T* const m = mElements;
    m[0] += m[2] * tx;
    m[1] += m[1] * ty; // not m[2] * ty; see the header
    m[3] += m[5] * tx;
    m[4] += m[5] * ty;
    m[6] += m[8] * tx;
    m[7] += m[8] * ty;
}

template <class T>
void Matrix3<T>::inverseSelf() {
    T a[9];
    Adjugate(mElements, a);
    T const* const m = mElements;
    double const determinant =
        double(a[0]) * double(m[0]) + double(a[1]) * double(m[3]) + double(a[2]) * double(m[6]);
    if (determinant == 0.0) return;
    double const inverted = 1.0 / determinant;
    for (int i = 0; i < 9; ++i) mElements[i] = static_cast<T>(inverted * double(a[i]));
}

template <class T>
Matrix3<T> Matrix3<T>::inverse() const {
    Matrix3 result = *this;
    result.inverseSelf();
    return result;
}

template <class T>
void Matrix3<T>::calculateMatrix(double* terms) const {
    T a[9];
    Adjugate(mElements, a);
    std::copy_n(a, 9, terms);
}

template <class T>
void Matrix3<T>::transposeSelf() {
    std::swap(mElements[1], mElements[3]);
    std::swap(mElements[2], mElements[6]);
    std::swap(mElements[5], mElements[7]);
}

template <class T>
Matrix3<T> Matrix3<T>::transpose() const {
    T const* const m = mElements;
    return {m[0], m[3], m[5], m[1], m[4], m[7], m[2], m[5], m[8]}; // m[5] twice; see the header
}

template <class T>
void Matrix3<T>::mapRect(Rect* result, Rect const& source) const {
    RectF box;
    MapCorners(mElements, static_cast<T>(source.left), static_cast<T>(source.top),
               static_cast<T>(source.right), static_cast<T>(source.bottom), box);
    box.ExtendRect();
    *result = box;
}

template <class T>
void Matrix3<T>::mapRect(RectF* result, RectF const& source) const {
    // result may point to source: the sides are passed by value.
    MapCorners(mElements, source.left, source.top, source.right, source.bottom, *result);
}

template class Matrix3<float>;

} // namespace Moka
