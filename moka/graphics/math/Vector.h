// Vector.h: two, three and four packed numbers, for positions, directions, colours and matrix rows.
// Plain values: no padding, no hidden state, compared as numbers.
#pragma once

namespace Moka {

template <class T>
struct Vector2 {
    T x = 0;
    T y = 0;

    constexpr Vector2() = default;
    constexpr Vector2(T xValue, T yValue) : x(xValue), y(yValue) {}

    friend constexpr bool operator==(Vector2 const& a, Vector2 const& b) { return a.x == b.x && a.y == b.y; }
    friend constexpr bool operator!=(Vector2 const& a, Vector2 const& b) { return !(a == b); }
};

template <class T>
struct Vector3 {
    T x = 0;
    T y = 0;
    T z = 0;

    constexpr Vector3() = default;
    constexpr Vector3(T xValue, T yValue, T zValue) : x(xValue), y(yValue), z(zValue) {}

    friend constexpr bool operator==(Vector3 const& a, Vector3 const& b) {
        return a.x == b.x && a.y == b.y && a.z == b.z;
    }
    friend constexpr bool operator!=(Vector3 const& a, Vector3 const& b) { return !(a == b); }
};

template <class T>
struct Vector4 {
    T x = 0;
    T y = 0;
    T z = 0;
    T w = 0;

    constexpr Vector4() = default;
    constexpr Vector4(T xValue, T yValue, T zValue, T wValue) : x(xValue), y(yValue), z(zValue), w(wValue) {}

    friend constexpr bool operator==(Vector4 const& a, Vector4 const& b) {
        return a.x == b.x && a.y == b.y && a.z == b.z && a.w == b.w;
    }
    friend constexpr bool operator!=(Vector4 const& a, Vector4 const& b) { return !(a == b); }
};

// They are handed to the GPU as arrays of floats.
static_assert(sizeof(Vector2<float>) == 8);
static_assert(sizeof(Vector3<float>) == 12);
static_assert(sizeof(Vector4<float>) == 16);

} // namespace Moka
