#include "moka/graphics/math/Matrix3.h"

#include "moka/base/Rect.h"
#include "tests/unit/math/Reference.h"

#include <gmock/gmock.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <random>

namespace Moka {
namespace {

using Testing::Bits;
using ::testing::ElementsAre;
using Testing::ElementsOf;
using Testing::Reference;
using Testing::Sample;

constexpr float kInfinity = std::numeric_limits<float>::infinity();
Matrix3f const kCounting(0, 1, 2, 3, 4, 5, 6, 7, 8);

Matrix3f RandomMatrix(Sample& sample) {
    Matrix3f m;
    for (int i = 0; i < 9; ++i) m[i] = sample.Next();
    return m;
}

TEST(Matrix3Test, StorageIsColumnMajor) {
    EXPECT_EQ(kCounting(0, 1), 3);
    EXPECT_EQ(kCounting(2, 0), 2);
    EXPECT_EQ(kCounting(1, 2), 7);
    EXPECT_THAT(
        (std::vector<float>{kCounting.getScaleX(), kCounting.getScaleY(), kCounting.getSkewX(),
                            kCounting.getSkewY(), kCounting.getTranslateX(), kCounting.getTranslateY()}),
        ElementsAre(0, 4, 3, 1, 6, 7));
    EXPECT_EQ(kCounting.storageSize(), 36);
    EXPECT_FALSE(kCounting.isRowMajor());
    EXPECT_EQ(Matrix3f(kCounting.data()), kCounting);
    Matrix3f m(3.5f);
    EXPECT_THAT(ElementsOf(m), ::testing::Each(3.5f));
    m(1, 2) = 9;
    EXPECT_EQ(m[7], 9);
    m.zeroSelf();
    EXPECT_THAT(ElementsOf(m), ::testing::Each(0.0f));
    m.identitySelf();
    EXPECT_EQ(m, Matrix3f());
}

TEST(Matrix3Test, EqualityIsByBitsIdentityByValue) {
    Matrix3f m;
    m[3] = -0.0f;
    EXPECT_TRUE(m.isIdentity());
    EXPECT_NE(m, Matrix3f());
    EXPECT_TRUE(Matrix3f::rotateMatrix(0).isIdentity());
    EXPECT_NE(Matrix3f::rotateMatrix(0), Matrix3f()); // its m3 is -0
    Matrix3f const nan(std::numeric_limits<float>::quiet_NaN());
    EXPECT_EQ(nan, Matrix3f(nan));
    EXPECT_FALSE(nan.isIdentity());
    for (int i = 0; i < 9; ++i) {
        Matrix3f off;
        off[i] = std::nextafter(off[i], 2.0f);
        EXPECT_FALSE(off.isIdentity()) << i;
        EXPECT_NE(off, Matrix3f()) << i;
    }
}

TEST(Matrix3Test, RotationTakesDegreesThroughTheSinglePrecisionFactor) {
    for (float const degrees : {90.0f, 30.0f, -45.0f, 359.5f, 1e6f}) {
        float const radians = degrees * 0.017453292f;
        float const c = std::cos(radians);
        float const s = std::sin(radians);
        EXPECT_EQ(Matrix3f::rotateMatrix(degrees), Matrix3f(c, s, 0, -s, c, 0, 0, 0, 1)) << degrees;
        Matrix3f m(5.0f);
        m.setRotate(degrees, 3.25f, -7.5f);
        float const tx = s * -7.5f - c * 3.25f + 3.25f;
        float const ty = -s * 3.25f - c * -7.5f + -7.5f;
        EXPECT_EQ(m, Matrix3f(c, s, 0, -s, c, 0, tx, ty, 1)) << degrees;
        m.setRotate(degrees);
        EXPECT_EQ(m, Matrix3f::rotateMatrix(degrees));
    }
    // The factor is rounded: a right angle leaves a little cosine.
    EXPECT_EQ(Bits(Matrix3f::rotateMatrix(90)[0]), 0xB33BBD2Eu);
    EXPECT_EQ(Matrix3f::rotateMatrix(90)[1], 1.0f); // +x turns towards +y
}

TEST(Matrix3Test, SettersOverwriteEverythingAndPivotsStay) {
    Matrix3f m(7.0f);
    m.setScale(2, 3);
    EXPECT_EQ(m, Matrix3f::scaleMatrix(2, 3));
    EXPECT_THAT(ElementsOf(m), ElementsAre(2, 0, 0, 0, 3, 0, 0, 0, 1));
    m = Matrix3f(7.0f);
    m.setTranslate(4, 5);
    EXPECT_EQ(m, Matrix3f::translateMatrix(4, 5));
    EXPECT_THAT(ElementsOf(m), ElementsAre(1, 0, 0, 0, 1, 0, 4, 5, 1));
    m = Matrix3f(7.0f);
    m.setScale(2, 3, 10, 20);
    EXPECT_THAT(ElementsOf(m), ElementsAre(2, 0, 0, 0, 3, 0, -10, -40, 1));
    // Rounded once in the product and once in the difference, never fused.
    m.setScale(0.1f, 1, 0.3f, 0);
    float const volatile product = 0.1f * 0.3f;
    EXPECT_EQ(Bits(m[6]), Bits(0.3f - product));
}

// Each concatenating shorthand against the explicit product with the matrix of its setter.
TEST(Matrix3Test, ShorthandsAgreeWithTheProductsTheyStandFor) {
    Sample sample(3);
    for (int round = 0; round < 200; ++round) {
        Matrix3f const start = RandomMatrix(sample);
        float const a = sample.Next(), b = sample.Next(), px = sample.Next(), py = sample.Next();
        auto const check = [&](char const* name, auto set, auto pre, auto post) {
            Matrix3f factor;
            set(factor);
            Matrix3f m = start;
            pre(m);
            EXPECT_LT(Reference<3>(start).Times(Reference<3>(factor)).Distance(m), 1e-3) << name << " pre";
            m = start;
            post(m);
            EXPECT_LT(Reference<3>(factor).Times(Reference<3>(start)).Distance(m), 1e-3) << name << " post";
        };
        check(
            "scale", [&](Matrix3f& m) { m.setScale(a, b); }, [&](Matrix3f& m) { m.preScale(a, b); },
            [&](Matrix3f& m) { m.postScale(a, b); });
        check(
            "scale about", [&](Matrix3f& m) { m.setScale(a, b, px, py); },
            [&](Matrix3f& m) { m.preScale(a, b, px, py); }, [&](Matrix3f& m) { m.postScale(a, b, px, py); });
        check(
            "rotate", [&](Matrix3f& m) { m.setRotate(a); }, [&](Matrix3f& m) { m.preRotate(a); },
            [&](Matrix3f& m) { m.postRotate(a); });
        check(
            "rotate about", [&](Matrix3f& m) { m.setRotate(a, px, py); },
            [&](Matrix3f& m) { m.preRotate(a, px, py); }, [&](Matrix3f& m) { m.postRotate(a, px, py); });
        Matrix3f const other = RandomMatrix(sample);
        check(
            "concat", [&](Matrix3f& m) { m = other; }, [&](Matrix3f& m) { m.preConcat(other); },
            [&](Matrix3f& m) { m.postConcat(other); });
        Matrix3f translated = start;
        translated.preTranslate(a, b);
        Matrix3f const translation = Matrix3f::translateMatrix(a, b);
        EXPECT_LT(Reference<3>(start).Times(Reference<3>(translation)).Distance(translated), 1e-3);
    }
}

// What the order of the operations decides: inputs whose sums round differently in any other grouping.
TEST(Matrix3Test, SumsAreRoundedInTheStatedOrder) {
    float const big = 16777216.0f; // adding 1 to it is lost, adding 2 is not
    Matrix3f m(big, 1, 0, 1, 1, 0, 1, 1, 1);
    m.preConcat(Matrix3f(1, 1, 1, 0, 0, 0, 0, 0, 0));
    EXPECT_EQ(m[0], big); // (big + 1) + 1
    m = Matrix3f(1, 1, 0, 1, 1, 0, big, 1, 1);
    m.preConcat(Matrix3f(1, 1, 1, 0, 0, 0, 0, 0, 0));
    EXPECT_EQ(m[0], big + 2); // (1 + 1) + big

    m = Matrix3f(1, 0, 0, 1, 0, 0, big, 0, 1);
    m.preTranslate(1, 1);
    EXPECT_EQ(m[6], big + 2); // big + (1 + 1)
    m = Matrix3f(1, 0, 0, 1, 0, 0, big, 0, 1);
    m.preScale(2, 2, -1, -1);
    EXPECT_EQ(m[6], big + 2);
    EXPECT_EQ(m[0], 2);
    EXPECT_EQ(m[3], 2);

    m = Matrix3f();
    m.postScale(1, 1);
    m.setRotate(0, big, 1);
    EXPECT_EQ(m[6], 0); // (0 - big) + big
    EXPECT_EQ(m[7], 0);
}

TEST(Matrix3Test, AMatrixMayBeConcatenatedWithItself) {
    Matrix3f m = kCounting;
    m.preConcat(m);
    EXPECT_THAT(ElementsOf(m), ElementsAre(15, 18, 21, 42, 54, 66, 69, 90, 111));
    m = kCounting;
    m.postConcat(m);
    EXPECT_THAT(ElementsOf(m), ElementsAre(15, 18, 21, 42, 54, 66, 69, 90, 111));
}

TEST(Matrix3Test, PostTranslateScalesItsSkewByItself) {
    Matrix3f m;
    m.postTranslate(10, 20);
    EXPECT_EQ(m, Matrix3f::translateMatrix(10, 20));
    m = Matrix3f();
    m[1] = 1;
    m.postTranslate(10, 20);
    EXPECT_THAT(ElementsOf(m), ElementsAre(1, 21, 0, 0, 1, 0, 10, 20, 1));
    m = kCounting;
    m.postTranslate(10, 100);
    EXPECT_THAT(ElementsOf(m), ElementsAre(20, 101, 2, 53, 504, 5, 86, 807, 8));
}

TEST(Matrix3Test, OnlyTheCopyingTransposeRepeatsAnElement) {
    EXPECT_THAT(ElementsOf(kCounting.transpose()), ElementsAre(0, 3, 5, 1, 4, 7, 2, 5, 8));
    Matrix3f m = kCounting;
    m.transposeSelf();
    EXPECT_THAT(ElementsOf(m), ElementsAre(0, 3, 6, 1, 4, 7, 2, 5, 8));
}

TEST(Matrix3Test, TheInverseUndoesAndTheAdjugateIsItsNumerator) {
    Sample sample(5);
    for (int round = 0; round < 500; ++round) {
        Matrix3f const m = RandomMatrix(sample);
        double const determinant = Reference<3>(m).Determinant();
        if (std::abs(determinant) < 10) continue;
        EXPECT_LT(Reference<3>(m).Times(Reference<3>(m.inverse())).Distance(Matrix3f()), 1e-3);
        double terms[9];
        m.calculateMatrix(terms);
        for (int i = 0; i < 9; ++i) {
            EXPECT_NEAR(terms[i], determinant * double(m.inverse()[i]), 1e-3 + std::abs(terms[i]) * 1e-4);
            EXPECT_EQ(terms[i], double(float(terms[i]))); // computed in single precision
        }
    }
    EXPECT_EQ(Matrix3f().inverse(), Matrix3f());
}

TEST(Matrix3Test, TheDeterminantIsExactlyZeroOrItDivides) {
    for (Matrix3f const& singular : {Matrix3f(0.0f), Matrix3f(2.0f), kCounting}) {
        Matrix3f m = singular;
        m.inverseSelf();
        EXPECT_EQ(m, singular);
        EXPECT_EQ(singular.inverse(), singular);
    }
    // The determinant is 1e-60: not 0 in double precision, though it would be in single.
    Matrix3f const tiny(1e-20f, 0, 0, 0, 1e-20f, 0, 0, 0, 1e-20f);
    EXPECT_NE(tiny.inverse(), tiny);
    // Both blocks below have the determinant e * e, which single precision loses. As the upper left one it is
    // formed in double precision; as the lower right one it is a cofactor, in single and not fused.
    float const e = std::ldexp(1.0f, -12);
    Matrix3f const upper(1 + e, 1, 0, 1 + 2 * e, 1 + e, 0, 0, 0, 1);
    EXPECT_EQ(upper.inverse()[8], 0.0f); // this element's own cofactor is in single precision
    EXPECT_EQ(upper.inverse()[0], (1 + e) / (e * e));
    Matrix3f const lower(1, 0, 0, 0, 1 + e, 1 + 2 * e, 0, 1, 1 + e);
    EXPECT_EQ(lower.inverse(), lower);
}

TEST(Matrix3Test, MapRectIsTheBoxOfTheCorners) {
    RectF box;
    Matrix3f::rotateMatrix(90).mapRect(&box, RectF(0, 0, 10, 20));
    EXPECT_NEAR(box.left, -20, 1e-4);
    EXPECT_NEAR(box.top, 0, 1e-4);
    EXPECT_NEAR(box.right, 0, 1e-4);
    EXPECT_NEAR(box.bottom, 10, 1e-4);

    Matrix3f::translateMatrix(3, 4).mapRect(&box, RectF(1, 2, 1, 2));
    EXPECT_EQ(box, RectF(4, 6, 4, 6));
    Matrix3f::scaleMatrix(-1, 2).mapRect(&box, RectF(1, 2, 3, 4));
    EXPECT_EQ(box, RectF(-3, 4, -1, 8));
    box = RectF(1, 2, 3, 4);
    Matrix3f::scaleMatrix(2, 2).mapRect(&box, box);
    EXPECT_EQ(box, RectF(2, 4, 6, 8));

    Rect pixels;
    Matrix3f::scaleMatrix(0.5f, -0.5f).mapRect(&pixels, Rect(1, 1, 4, 5));
    EXPECT_EQ(pixels, Rect(0, -3, 2, 0));
    Matrix3f::translateMatrix(0.25f, 0).mapRect(&pixels, Rect(5, 5, 5, 5));
    EXPECT_EQ(pixels, Rect(5, 5, 6, 5));
}

TEST(Matrix3Test, MapRectDividesByW) {
    Matrix3f perspective;
    perspective[2] = 0.5f;
    perspective[5] = 0.25f;
    RectF box;
    perspective.mapRect(&box, RectF(0, 0, 2, 4));
    // The corners: (0, 0) with w 1, (2, 4) with 3, (2, 0) with 2, (0, 4) with 2.
    EXPECT_EQ(box, RectF(0, 0, 1, 2));
    perspective[8] = -1; // w is 0 at (2, 0) and (0, 4), -1 and 1 at the others
    perspective.mapRect(&box, RectF(0, 0, 2, 4));
    EXPECT_EQ(box.right, kInfinity);
    EXPECT_EQ(box.bottom, kInfinity);
}

TEST(Matrix3Test, MapRectEnclosesTheMappedCorners) {
    Sample sample(9);
    for (int round = 0; round < 500; ++round) {
        Matrix3f m = RandomMatrix(sample);
        m[2] *= 0.01f;
        m[5] *= 0.01f;
        RectF const source(sample.Next(), sample.Next(), sample.Next(), sample.Next());
        RectF box;
        m.mapRect(&box, source);
        double left = 1e30, top = 1e30, right = -1e30, bottom = -1e30;
        for (float const x : {source.left, source.right}) {
            for (float const y : {source.top, source.bottom}) {
                auto const [mx, my] = Reference<3>(m).MapPoint(x, y);
                left = std::min(left, mx);
                right = std::max(right, mx);
                top = std::min(top, my);
                bottom = std::max(bottom, my);
            }
        }
        double const tolerance =
            1e-3 * (1 + std::abs(left) + std::abs(right) + std::abs(top) + std::abs(bottom));
        EXPECT_NEAR(box.left, left, tolerance);
        EXPECT_NEAR(box.top, top, tolerance);
        EXPECT_NEAR(box.right, right, tolerance);
        EXPECT_NEAR(box.bottom, bottom, tolerance);
    }
}

} // namespace
} // namespace Moka
