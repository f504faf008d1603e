/// Matrix4: a 4x4 transformation, for projections and shader uniforms. A value of sixteen numbers.
/// Layout:  column-major; the element at row r, column c is storage element c * 4 + r. Below, m0 ... m15 are
///          storage elements; m12, m13, m14 hold the translation.
/// Points:  columns, mapped as M * p.
/// Angles:  radians for every rotation, degrees for the perspective's field of view. (Matrix3 rotates by
///          degrees.)
/// Numbers: single precision, operation by operation in a fixed order; the determinant in double precision.
///          There are no checks: a division by zero gives the IEEE 754 result.
/// Instantiated for float only.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/math/Matrix3.h"
#include "moka/graphics/math/Vector.h"

#include <type_traits>

namespace Moka {

template <class T>
class MOKA_API Matrix4 {
public:
    Matrix4() : Matrix4(1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1) {} ///< identity
    explicit Matrix4(T const& value);                                      ///< every element
    explicit Matrix4(T const* elements);                                   ///< sixteen, in storage order
    /// In storage order: the first four are column 0.
    Matrix4(T const& m0, T const& m1, T const& m2, T const& m3, T const& m4, T const& m5, T const& m6,
            T const& m7, T const& m8, T const& m9, T const& m10, T const& m11, T const& m12, T const& m13,
            T const& m14, T const& m15)
        : mElements{m0, m1, m2, m3, m4, m5, m6, m7, m8, m9, m10, m11, m12, m13, m14, m15} {}

    /// Access an element by row and column, or by storage index. Indices are not checked.
    T& operator()(int row, int column) { return mElements[column * 4 + row]; }
    T const& operator()(int row, int column) const { return mElements[column * 4 + row]; }
    T& operator[](int index) { return mElements[index]; }
    T const& operator[](int index) const { return mElements[index]; }

    /// The elements in storage order.
    T const* data() const { return mElements; }
    int storageSize() const { return sizeof(mElements); } ///< bytes
    /// Always false.
    bool isRowMajor() const { return false; }

    /// Compares bits, not values: 0 and -0 differ, a NaN equals itself.
    // Compat: bitwise-equality
    bool operator==(Matrix4 const& other) const;
    bool operator!=(Matrix4 const& other) const { return !(*this == other); }

    /// Sets the identity, or all elements to 0.
    void identitySelf();
    void zeroSelf();

    /// Return a projection as in OpenGL, to -1 ... 1. The field of view is in degrees.
    static Matrix4 perspectiveMatrix(T fovyDegrees, T aspect, T zNear, T zFar);
    static Matrix4 orthoMatrix(T left, T right, T bottom, T top, T zNear, T zFar);
    /// Return a translation, or a scale.
    static Matrix4 translateMatrix(T x, T y, T z);
    static Matrix4 translateMatrix(Vector3<T> const& offset);
    static Matrix4 scaleMatrix(T x, T y, T z);
    static Matrix4 scaleMatrix(Vector3<T> const& factors);
    /// Returns Rx(ax) * Ry(ay) * Rz(az): the rotation about z acts first.
    static Matrix4 rotateMatrix(T ax, T ay, T az);
    /// Returns a rotation by minus the angle about the axis, which need not have unit length.
    // Compat: axis-angle-direction
    static Matrix4 rotateMatrix(T angle, Vector3<T> const& axis);
    /// Returns the matrix whose columns are the unit vectors along dir x up, (dir x up) x dir, and dir.
    static Matrix4 rotateMatrix(Vector3<T> dir, Vector3<T> up);

    /// this * right: right acts on points first.
    Matrix4 operator*(Matrix4 const& right) const;

    /// Invert this matrix, or a copy. If the determinant is exactly 0, the matrix stays unchanged; there is
    /// no tolerance.
    void inverseSelf();
    Matrix4 inverse() const;
    /// Writes the sixteen elements of the adjugate (not divided by the determinant) to terms, in storage
    /// order.
    // Compat: misspelt-names
    void calculaeMatrix(double* terms) const;

    /// Transpose this matrix, or a copy.
    void transposeSelf();
    Matrix4 transpose() const;

    /// Return a row or a column. index is 0 ... 3 and not checked.
    Vector4<T> row(int index) const;
    Vector4<T> column(int index) const;

    Matrix4 rotation() const;    ///< this matrix without its translation; m15 is kept
    Matrix4 translation() const; ///< the identity with the translation of this matrix

    /// Returns the rotation Rx * Ry * Rz with the translation of this matrix. The other elements of this
    /// matrix are discarded.
    Matrix4 rotate(T ax, T ay, T az) const;
    /// Sets the upper left 3x3 elements to that rotation. Unlike rotate() it keeps m3, m7, m11 and m15.
    ///
    // Compat: rotate-self
    void rotateSelf(T ax, T ay, T az);

private:
    T mElements[16];
};

extern template class Matrix4<float>;

/// The matrix of projections.
using Matrix4f = Matrix4<float>;

static_assert(sizeof(Matrix4f) == 64 && std::is_trivially_copyable_v<Matrix4f>);

/// Converts a transformation of the plane to one of space: the perspective row becomes the w row, and z is
/// unchanged.
MOKA_API Matrix4<float> FromMatrix3(Matrix3<float> const& m);

} // namespace Moka
