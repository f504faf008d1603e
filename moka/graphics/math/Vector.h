/// Vector.h: two, three and four packed numbers, for positions, directions, colours and matrix rows.
/// Plain values: no padding, no hidden state, compared as numbers.
#pragma once

namespace Moka {

/// Two numbers.
template <class T>
struct Vector2 {
    /// The components.
    T x = 0;
    T y = 0;

    constexpr Vector2() = default;
    /// From its components.
    constexpr Vector2(T xValue, T yValue) : x(xValue), y(yValue) {}

    /// Compares numbers; a NaN differs from itself.
    friend constexpr bool operator==(Vector2 const& a, Vector2 const& b) { return a.x == b.x && a.y == b.y; }
    friend constexpr bool operator!=(Vector2 const& a, Vector2 const& b) { return !(a == b); }
};

/// Three numbers.
template <class T>
struct Vector3 {
    /// The components.
    T x = 0;
    T y = 0;
    T z = 0;

    constexpr Vector3() = default;
    /// From its components.
    constexpr Vector3(T xValue, T yValue, T zValue) : x(xValue), y(yValue), z(zValue) {}

    /// Compares numbers; a NaN differs from itself.
    friend constexpr bool operator==(Vector3 const& a, Vector3 const& b) {
        return a.x == b.x && a.y == b.y && a.z == b.z;
    }
    friend constexpr bool operator!=(Vector3 const& a, Vector3 const& b) { return !(a == b); }
};

/// Four numbers; a colour is r, g, b, a.
template <class T>
struct Vector4 {
    /// The components.
    T x = 0;
    T y = 0;
    T z = 0;
    T w = 0;

    constexpr Vector4() = default;
    /// From its components.
    constexpr Vector4(T xValue, T yValue, T zValue, T wValue) : x(xValue), y(yValue), z(zValue), w(wValue) {}

    /// Compares numbers; a NaN differs from itself.
    friend constexpr bool operator==(Vector4 const& a, Vector4 const& b) {
        return a.x == b.x && a.y == b.y && a.z == b.z && a.w == b.w;
    }
    friend constexpr bool operator!=(Vector4 const& a, Vector4 const& b) { return !(a == b); }
};

/// They are handed to the GPU as arrays of floats.
static_assert(sizeof(Vector2<float>) == 8);
static_assert(sizeof(Vector3<float>) == 12);
static_assert(sizeof(Vector4<float>) == 16);

} // namespace Moka
