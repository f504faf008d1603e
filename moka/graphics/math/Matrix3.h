/// Matrix3: a 3x3 transformation of points in the plane, including perspective. A value of nine numbers.
/// Layout:  column-major; the element at row r, column c is storage element c * 3 + r. Below, m0 ... m8 are
///          storage elements.
/// Points:  columns (x, y, 1), mapped as M * p: w = m2 x + m5 y + m8, x' = (m0 x + m3 y + m6) / w,
///          y' = (m1 x + m4 y + m7) / w. "pre" multiplies on the right (acts on points first), "post" on the
///          left (acts last).
/// Angles:  degrees; a positive one rotates +x towards +y. (Matrix4 takes radians.)
/// Numbers: single precision, operation by operation in a fixed order, so that every platform gives the same
///          bits. There are no checks: a division by zero gives the IEEE 754 result.
/// Instantiated for float only.
// Compat: angle-units
#pragma once

#include "moka/base/Export.h"

#include <type_traits>

namespace Moka {

class Rect;
class RectF;

template <class T>
class MOKA_API Matrix3 {
public:
    Matrix3() : Matrix3(1, 0, 0, 0, 1, 0, 0, 0, 1) {} ///< identity
    explicit Matrix3(T const& value);                 ///< every element
    explicit Matrix3(T const* elements);              ///< nine, in storage order
    /// In storage order: the first three are column 0.
    Matrix3(T const& m0, T const& m1, T const& m2, T const& m3, T const& m4, T const& m5, T const& m6,
            T const& m7, T const& m8)
        : mElements{m0, m1, m2, m3, m4, m5, m6, m7, m8} {}

    /// Access an element by row and column, or by storage index. Indices are not checked.
    T& operator()(int row, int column) { return mElements[column * 3 + row]; }
    T const& operator()(int row, int column) const { return mElements[column * 3 + row]; }
    T& operator[](int index) { return mElements[index]; }
    T const& operator[](int index) const { return mElements[index]; }

    /// The elements in storage order.
    T const* data() const { return mElements; }
    int storageSize() const { return sizeof(mElements); } ///< bytes
    /// Always false.
    bool isRowMajor() const { return false; }

    /// Elements 0, 4, 3, 1, 6 and 7.
    T getScaleX() const { return mElements[0]; }
    T getScaleY() const { return mElements[4]; }
    T getSkewX() const { return mElements[3]; }
    T getSkewY() const { return mElements[1]; }
    T getTranslateX() const { return mElements[6]; }
    T getTranslateY() const { return mElements[7]; }

    /// Compares bits, not values: 0 and -0 differ, a NaN equals itself.
    // Compat: bitwise-equality
    bool operator==(Matrix3 const& other) const;
    bool operator!=(Matrix3 const& other) const { return !(*this == other); }

    /// Compares values, so -0 off the diagonal is still the identity.
    bool isIdentity() const;

    /// Sets the identity, or all elements to 0.
    void identitySelf();
    void zeroSelf();

    /// Return a translation, a rotation, a scale.
    static Matrix3 translateMatrix(T tx, T ty);
    static Matrix3 rotateMatrix(T degrees);
    static Matrix3 scaleMatrix(T sx, T sy);

    /// Set all nine elements to a scale, a rotation or a translation. (px, py) is the fixed point; the
    /// default is the origin.
    void setScale(T sx, T sy);
    void setScale(T sx, T sy, T px, T py);
    void setRotate(T degrees);
    void setRotate(T degrees, T px, T py);
    void setTranslate(T tx, T ty);

    /// Multiply by another matrix, which may be this one.
    void preConcat(Matrix3 const& right); ///< this = this * right
    void postConcat(Matrix3 const& left); ///< this = left * this

    /// this = this * a scale, rotation or translation. It acts on points before this matrix.
    void preScale(T sx, T sy);
    void preScale(T sx, T sy, T px, T py);
    void preRotate(T degrees);
    void preRotate(T degrees, T px, T py);
    void preTranslate(T tx, T ty);

    /// this = a scale or rotation * this. It acts on points after this matrix.
    void postScale(T sx, T sy);
    void postScale(T sx, T sy, T px, T py);
    void postRotate(T degrees);
    void postRotate(T degrees, T px, T py);
    /// The translation times this, except that m1 becomes m1 + m1 * ty. It equals the product only if m1 is 0
    /// and row 2 is (0, 0, 1).
    // Compat: post-translate
    void postTranslate(T tx, T ty);

    /// Invert this matrix, or a copy. If the determinant is exactly 0, the matrix stays unchanged; there is
    /// no tolerance.
    void inverseSelf();
    Matrix3 inverse() const;
    /// Writes the nine elements of the adjugate (not divided by the determinant) to terms, in storage order.
    void calculateMatrix(double* terms) const;

    /// Transposes this matrix correctly, unlike transpose().
    void transposeSelf();
    /// Returns the transposed matrix, except that element 2 is m5 instead of m6.
    // Compat: transpose-copy
    Matrix3 transpose() const;

    /// Sets result to the bounding box of the four mapped corners of source. The integer function rounds it
    /// outwards. result may be the same object as source.
    void mapRect(Rect* result, Rect const& source) const;
    void mapRect(RectF* result, RectF const& source) const;

private:
    T mElements[9];
};

extern template class Matrix3<float>;

/// The matrix of canvases.
using Matrix3f = Matrix3<float>;

static_assert(sizeof(Matrix3f) == 36 && std::is_trivially_copyable_v<Matrix3f>);

} // namespace Moka
