// One number for thousands of results, the same on every processor: a product that one fuses with a sum, a
// rounding that another does differently, and the number is another one. NaN counts as one value, since
// processors choose different bits for it.
#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix3.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/math/Vector.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <gtest/gtest.h>
#include <limits>

namespace Moka::Testing {
namespace {

constexpr int kRounds = 20000;

class Digest {
public:
    template <class Float>
    void Add(Float value) {
        if (std::isnan(value)) value = std::numeric_limits<Float>::quiet_NaN();
        std::uint64_t bits = 0;
        std::memcpy(&bits, &value, sizeof value);
        AddBits(bits);
    }
    void Add(RectF const& r) {
        for (float edge : {r.left, r.top, r.right, r.bottom}) Add(edge);
    }
    void Add(Rect const& r) {
        for (int edge : {r.left, r.top, r.right, r.bottom}) AddBits(static_cast<std::uint32_t>(edge));
    }
    template <class Matrix>
    void AddMatrix(Matrix const& m) {
        for (int i = 0; i < m.storageSize() / 4; ++i) Add(m[i]);
    }
    std::uint64_t Get() const { return mHash; }

private:
    void AddBits(std::uint64_t bits) {
        mHash = (mHash ^ bits) * 0x100000001b3;
        mHash ^= mHash >> 29;
    }
    std::uint64_t mHash = 0xcbf29ce484222325;
};

// The same numbers everywhere, by integers alone. One a statement: the order of arguments is the compiler's.
class Numbers {
public:
    // Mostly within 2^-12 ... 2^12, with many digits; now and then anything that a float can be.
    float Next() {
        std::uint32_t bits = NextBits();
        if (NextBits() % 64 != 0) bits = (bits & 0x807fffff) | (115 + NextBits() % 24) << 23;
        float value;
        std::memcpy(&value, &bits, sizeof value);
        return value;
    }
    template <class Matrix>
    Matrix NextMatrix() {
        Matrix m;
        for (int i = 0; i < m.storageSize() / 4; ++i) m[i] = Next();
        return m;
    }
    RectF NextRect() {
        float const l = Next(), t = Next(), r = Next(), b = Next();
        return RectF(l, t, r, b);
    }

private:
    std::uint32_t NextBits() {
        mState = mState * 6364136223846793005u + 1442695040888963407u;
        return static_cast<std::uint32_t>(mState >> 33) << 1 ^ static_cast<std::uint32_t>(mState >> 20);
    }
    std::uint64_t mState = 1;
};

// Of as many rounds of what add does with the numbers.
template <class Add>
void ExpectDigest(std::uint64_t expected, Add const& add) {
    Numbers numbers;
    Digest digest;
    for (int i = 0; i < kRounds; ++i) add(numbers, digest);
    EXPECT_EQ(digest.Get(), expected);
}

TEST(ArithmeticDigest, Matrix3) {
    ExpectDigest(0x8a900a57d492a392u, [](Numbers& numbers, Digest& digest) {
        auto m = numbers.NextMatrix<Matrix3f>();
        float const a = numbers.Next(), b = numbers.Next(), c = numbers.Next(), d = numbers.Next();
        digest.AddMatrix(m.inverse());
        digest.AddMatrix(m.transpose());
        m.preConcat(numbers.NextMatrix<Matrix3f>());
        m.postScale(a, b, c, d);
        m.preTranslate(c, d);
        m.postConcat(numbers.NextMatrix<Matrix3f>());
        m.preScale(d, c, b, a);
        m.postTranslate(a, b);
        digest.AddMatrix(m);
        double terms[9];
        m.calculateMatrix(terms);
        for (double term : terms) digest.Add(term);
        RectF mapped;
        m.mapRect(&mapped, numbers.NextRect());
        digest.Add(mapped);
        Rect rounded;
        m.mapRect(&rounded, Rect(1, 2, 300, 400));
        digest.Add(rounded);
    });
}

TEST(ArithmeticDigest, Matrix4) {
    ExpectDigest(0xae6ae3643eb169cdu, [](Numbers& numbers, Digest& digest) {
        auto const m = numbers.NextMatrix<Matrix4f>();
        auto const right = numbers.NextMatrix<Matrix4f>();
        auto const plane = numbers.NextMatrix<Matrix3f>();
        float const a = numbers.Next(), b = numbers.Next(), c = numbers.Next(), d = numbers.Next();
        digest.AddMatrix(m.inverse());
        auto const product = m * right * Matrix4f::translateMatrix(a, b, c) * Matrix4f::scaleMatrix(c, b, a);
        digest.AddMatrix(product);
        digest.AddMatrix(product.transpose());
        digest.AddMatrix(product.rotation());
        digest.AddMatrix(product.translation());
        double terms[16];
        product.calculaeMatrix(terms);
        for (double term : terms) digest.Add(term);
        digest.AddMatrix(Matrix4f::orthoMatrix(a, b, c, d, -1, 1) * FromMatrix3(plane));
        digest.AddMatrix(Matrix4f::rotateMatrix(Vector3<float>{a, b, c}, Vector3<float>{c, a, b}));
    });
}

TEST(ArithmeticDigest, Rectangles) {
    ExpectDigest(0x71d6a806567188c1u, [](Numbers& numbers, Digest& digest) {
        RectF r = numbers.NextRect();
        RectF const other = numbers.NextRect();
        float const a = numbers.Next(), b = numbers.Next();
        digest.Add(Rect(r));
        r.IncreaseRect(a, b);
        r.MakeRect(b, a);
        digest.Add(r);
        digest.Add(r.IsIntersect(other) ? 1.0f : 0.0f);
        digest.Add(Rect(r).Intersect(Rect(other)));
        r.ExtendRect();
        digest.Add(r);
    });
}

// With the C library's sine and cosine, which its versions for the processors agree about. About the tangent
// they do not (the last bit, once in 150 values), so what takes it, the perspective, is left out.
TEST(ArithmeticDigest, Angles) {
    ExpectDigest(0x1dcd91930b41b9c2u, [](Numbers& numbers, Digest& digest) {
        float const a = numbers.Next(), b = numbers.Next(), c = numbers.Next();
        auto m = Matrix3f::rotateMatrix(a);
        m.preRotate(b, c, a);
        m.postRotate(c, a, b);
        digest.AddMatrix(m);
        m.setRotate(b, c, a);
        digest.AddMatrix(m);
        auto space = Matrix4f::rotateMatrix(a, b, c);
        digest.AddMatrix(space.rotate(c, b, a));
        space.rotateSelf(b, c, a);
        digest.AddMatrix(space);
        digest.AddMatrix(Matrix4f::rotateMatrix(a, Vector3<float>{b, c, a}));
    });
}

} // namespace
} // namespace Moka::Testing
