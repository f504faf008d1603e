/// Matrix3: a 3x3 transform of points in the plane, perspective included. A value: nine numbers, nothing else.
/// Layout:  column-major; the element at row r, column c is storage element c * 3 + r. Below, m0 ... m8 are
///          storage elements.
/// Points:  columns (x, y, 1), mapped as M * p: w = m2 x + m5 y + m8, x' = (m0 x + m3 y + m6) / w,
///          y' = (m1 x + m4 y + m7) / w. "pre" multiplies on the right (acts on points first), "post" on the
///          left (acts last).
/// Angles:  degrees; a positive one rotates +x towards +y. (Matrix4 takes radians.)
/// Numbers: single precision, operation by operation in a fixed order, so that every platform gives the same
///          bits. Nothing is guarded: a division by zero gives what IEEE 754 gives.
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

    /// Not bounds-checked.
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

    /// By value: -0 off the diagonal is still the identity.
    bool isIdentity() const;

    /// Sets the identity, or all elements to 0.
    void identitySelf();
    void zeroSelf();

    /// A translation, a rotation, a scale.
    static Matrix3 translateMatrix(T tx, T ty);
    static Matrix3 rotateMatrix(T degrees);
    static Matrix3 scaleMatrix(T sx, T sy);

    /// These overwrite all nine elements. (px, py) is the point that stays where it is.
    void setScale(T sx, T sy);
    void setScale(T sx, T sy, T px, T py);
    void setRotate(T degrees);
    void setRotate(T degrees, T px, T py);
    void setTranslate(T tx, T ty);

    /// The argument may be this matrix.
    void preConcat(Matrix3 const& right); ///< this = this * right
    void postConcat(Matrix3 const& left); ///< this = left * this

    /// this = this * the scale, rotation or translation.
    void preScale(T sx, T sy);
    void preScale(T sx, T sy, T px, T py);
    void preRotate(T degrees);
    void preRotate(T degrees, T px, T py);
    void preTranslate(T tx, T ty);

    /// this = the scale or rotation * this.
    void postScale(T sx, T sy);
    void postScale(T sx, T sy, T px, T py);
    void postRotate(T degrees);
    void postRotate(T degrees, T px, T py);
    /// The translation times this, except that m1 becomes m1 + m1 * ty. It equals the product only if m1 is 0
    /// and row 2 is (0, 0, 1).
    // Compat: post-translate
    void postTranslate(T tx, T ty);

    /// A determinant of exactly 0 leaves the matrix, or the copy, unchanged; there is no tolerance.
    void inverseSelf();
    Matrix3 inverse() const;
    /// The nine terms of the adjugate, not divided by the determinant, in storage order.
    void calculateMatrix(double* terms) const;

    void transposeSelf(); ///< exact
    /// Exact except for element 2, which is m5 (m6 is lost).
    // Compat: transpose-copy
    Matrix3 transpose() const;

    /// The bounding box of the four mapped corners; the integer form rounds it outwards. result may be source.
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
