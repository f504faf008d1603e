#include "moka/graphics/math/Matrix4.h"

#include "moka/base/SameBits.h"
#include "moka/graphics/math/SinCos.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <iterator>
#include <utility>

// Every expression below is in the order that fixes its rounding: do not regroup, factor out or contract.

namespace Moka {
namespace {

template <class T>
Vector3<T> Cross(Vector3<T> const& a, Vector3<T> const& b) {
    return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}

template <class T>
Vector3<T> Normalized(Vector3<T> const& v) {
    T const scale = 1 / std::sqrt(v.x * v.x + v.y * v.y + v.z * v.z);
    return {v.x * scale, v.y * scale, v.z * scale};
}

// Returns an element of the adjugate: the signed minor of the matrix without that column and row. The sign is
// applied to each term, so that a minor of zeros is +0, and the inverse of the identity equals the identity.
template <class T>
T AdjugateTerm(Matrix4<T> const& m, int row, int column) {
    int const r0 = column == 0 ? 1 : 0;
    int const r1 = column <= 1 ? 2 : 1;
    int const r2 = column <= 2 ? 3 : 2;
    int const c0 = row == 0 ? 1 : 0;
    int const c1 = row <= 1 ? 2 : 1;
    int const c2 = row <= 2 ? 3 : 2;
    T const a = m(r0, c0), b = m(r0, c1), c = m(r0, c2);
    T const d = m(r1, c0), e = m(r1, c1), f = m(r1, c2);
    T const g = m(r2, c0), h = m(r2, c1), k = m(r2, c2);
    if ((row + column) % 2 == 0) {
        return a * e * k - a * f * h - k * (d * b) + h * (d * c) + f * (b * g) - e * (c * g);
    }
    return a * f * h - a * e * k + k * (d * b) - h * (d * c) - f * (b * g) + e * (c * g);
}

} // namespace

template <class T>
Matrix4<T>::Matrix4(T const& value) {
    std::fill(std::begin(mElements), std::end(mElements), value);
}

template <class T>
Matrix4<T>::Matrix4(T const* elements) {
    std::copy_n(elements, 16, mElements);
}

template <class T>
bool Matrix4<T>::operator==(Matrix4 const& other) const {
    return detail::HasSameBits<sizeof(mElements)>(mElements, other.mElements);
}

template <class T>
void Matrix4<T>::identitySelf() {
    *this = Matrix4();
}

template <class T>
void Matrix4<T>::zeroSelf() {
    *this = Matrix4(T(0));
}

template <class T>
Matrix4<T> Matrix4<T>::perspectiveMatrix(T fovyDegrees, T aspect, T zNear, T zFar) {
    T const top = std::tan(fovyDegrees * T(0.008726646)) * zNear; // half the angle, in radians
    T const right = top * aspect;
    Matrix4 m(T(0));
    m[0] = (2 * zNear) / (2 * right);
    m[5] = (2 * zNear) / (2 * top);
    m[10] = -(zNear + zFar) / (zFar - zNear);
    m[11] = -1;
    m[14] = -(2 * zFar * zNear) / (zFar - zNear);
    return m;
}

template <class T>
Matrix4<T> Matrix4<T>::orthoMatrix(T left, T right, T bottom, T top, T zNear, T zFar) {
    Matrix4 m(T(0));
    m[0] = 2 / (right - left);
    m[5] = 2 / (top - bottom);
    m[10] = -2 / (zFar - zNear);
    m[12] = -(left + right) / (right - left);
    m[13] = -(bottom + top) / (top - bottom);
    m[14] = -(zNear + zFar) / (zFar - zNear);
    m[15] = 1;
    return m;
}

template <class T>
Matrix4<T> Matrix4<T>::translateMatrix(T x, T y, T z) {
    return {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, x, y, z, 1};
}

template <class T>
Matrix4<T> Matrix4<T>::translateMatrix(Vector3<T> const& offset) {
    return translateMatrix(offset.x, offset.y, offset.z);
}

template <class T>
Matrix4<T> Matrix4<T>::scaleMatrix(T x, T y, T z) {
    return {x, 0, 0, 0, 0, y, 0, 0, 0, 0, z, 0, 0, 0, 0, 1};
}

template <class T>
Matrix4<T> Matrix4<T>::scaleMatrix(Vector3<T> const& factors) {
    return scaleMatrix(factors.x, factors.y, factors.z);
}

template <class T>
Matrix4<T> Matrix4<T>::rotateMatrix(T ax, T ay, T az) {
    Matrix4 m;
    m.rotateSelf(ax, ay, az);
    return m;
}

template <class T>
Matrix4<T> Matrix4<T>::rotateMatrix(T angle, Vector3<T> const& axis) {
    auto const [s, c] = detail::SinCos(angle);
    T const t = 1 - c;
    auto const [x, y, z] = Normalized(axis);
    return {c + x * x * t,
            x * y * t - s * z,
            s * y + x * z * t,
            0, //
            s * z + y * x * t,
            c + y * y * t,
            y * z * t - s * x,
            0, //
            z * x * t - s * y,
            s * x + z * y * t,
            c + z * z * t,
            0, //
            0,
            0,
            0,
            1};
}

template <class T>
Matrix4<T> Matrix4<T>::rotateMatrix(Vector3<T> dir, Vector3<T> up) {
    Vector3<T> const side = Cross(dir, up);
    Vector3<T> const n = Normalized(side);
    Vector3<T> const u = Normalized(Cross(side, dir));
    Vector3<T> const d = Normalized(dir);
    return {n.x, n.y, n.z, 0, u.x, u.y, u.z, 0, d.x, d.y, d.z, 0, 0, 0, 0, 1};
}

// Computes a column at a time, which compilers vectorise. Each element is summed from the first term to the
// last.
template <class T>
Matrix4<T> Matrix4<T>::operator*(Matrix4 const& right) const {
    T const* const l = mElements;
    T product[16];
    for (int column = 0; column < 4; ++column) {
        T const* const r = right.mElements + 4 * column;
        for (int row = 0; row < 4; ++row)
            product[4 * column + row] =
                l[row] * r[0] + l[4 + row] * r[1] + l[8 + row] * r[2] + l[12 + row] * r[3];
    }
    return Matrix4(product);
}

template <class T>
void Matrix4<T>::inverseSelf() {
    double a[16];
    calculaeMatrix(a);
    T const* const m = mElements;
    double const determinant =
        double(m[0]) * a[0] + double(m[4]) * a[1] + double(m[8]) * a[2] + double(m[12]) * a[3];
    if (determinant == 0.0) return;
    double const inverted = 1.0 / determinant;
    for (int i = 0; i < 16; ++i) mElements[i] = static_cast<T>(a[i] * inverted);
}

template <class T>
Matrix4<T> Matrix4<T>::inverse() const {
    Matrix4 result = *this;
    result.inverseSelf();
    return result;
}

template <class T>
void Matrix4<T>::calculaeMatrix(double* terms) const {
    for (int i = 0; i < 16; ++i) terms[i] = double(AdjugateTerm(*this, i % 4, i / 4));
}

template <class T>
void Matrix4<T>::transposeSelf() {
    for (int column = 1; column < 4; ++column) {
        for (int row = 0; row < column; ++row) std::swap((*this)(row, column), (*this)(column, row));
    }
}

template <class T>
Matrix4<T> Matrix4<T>::transpose() const {
    Matrix4 result = *this;
    result.transposeSelf();
    return result;
}

template <class T>
Vector4<T> Matrix4<T>::row(int index) const {
    T const* const m = mElements + index;
    return {m[0], m[4], m[8], m[12]};
}

template <class T>
Vector4<T> Matrix4<T>::column(int index) const {
    T const* const m = mElements + 4 * index;
    return {m[0], m[1], m[2], m[3]};
}

template <class T>
Matrix4<T> Matrix4<T>::rotation() const {
    Matrix4 result = *this;
    result[12] = result[13] = result[14] = 0;
    return result;
}

template <class T>
Matrix4<T> Matrix4<T>::translation() const {
    return translateMatrix(mElements[12], mElements[13], mElements[14]);
}

template <class T>
Matrix4<T> Matrix4<T>::rotate(T ax, T ay, T az) const {
    Matrix4 result = translation();
    result.rotateSelf(ax, ay, az);
    return result;
}

template <class T>
void Matrix4<T>::rotateSelf(T ax, T ay, T az) {
    auto const [s1, c1] = detail::SinCos(ax);
    auto const [s2, c2] = detail::SinCos(ay);
    auto const [s3, c3] = detail::SinCos(az);
    T* const m = mElements;
    m[0] = c2 * c3;
    m[1] = s1 * s2 * c3 + c1 * s3;
    m[2] = s1 * s3 - c1 * s2 * c3;
    m[4] = -(c2 * s3);
    m[5] = c1 * c3 - s1 * s2 * s3;
    m[6] = c1 * s2 * s3 + s1 * c3;
    m[8] = s2;
    m[9] = -(s1 * c2);
    m[10] = c1 * c2;
}

template class Matrix4<float>;

Matrix4<float> FromMatrix3(Matrix3<float> const& matrix) {
    float const* const m = matrix.data();
    return {m[0], m[1], 0, m[2], m[3], m[4], 0, m[5], 0, 0, 1, 0, m[6], m[7], 0, m[8]};
}

} // namespace Moka
