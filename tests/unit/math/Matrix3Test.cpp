#include "moka/graphics/math/Matrix3.h"

#include "moka/base/Rect.h"
#include "tests/unit/math/Elements.h"

#include <gmock/gmock.h>

#include <cmath>
#include <limits>

namespace Moka {
namespace {

using Testing::Distance;
using ::testing::ElementsAre;
using Testing::ElementsOf;
using Testing::Sample;

constexpr float kInfinity = std::numeric_limits<float>::infinity();
Matrix3f const kCounting(0, 1, 2, 3, 4, 5, 6, 7, 8);

TEST(Matrix3Test, StorageIsColumnMajor) {
    EXPECT_EQ(kCounting(0, 1), 3);
    EXPECT_THAT(
        (std::vector<float>{kCounting.getScaleX(), kCounting.getScaleY(), kCounting.getSkewX(),
                            kCounting.getSkewY(), kCounting.getTranslateX(), kCounting.getTranslateY()}),
        ElementsAre(0, 4, 3, 1, 6, 7));
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
}

TEST(Matrix3Test, RotationTakesDegreesThroughTheSinglePrecisionFactor) {
    float const radians = 30 * 0.017453292f;
    float const c = std::cos(radians);
    float const s = std::sin(radians);
    EXPECT_EQ(Matrix3f::rotateMatrix(30), Matrix3f(c, s, 0, -s, c, 0, 0, 0, 1));
    Matrix3f m(5.0f);
    m.setRotate(30, 3.25f, -7.5f);
    EXPECT_EQ(m[6], s * -7.5f - c * 3.25f + 3.25f);
    EXPECT_EQ(m[7], -s * 3.25f - c * -7.5f + -7.5f);
    m.setRotate(30);
    EXPECT_EQ(m, Matrix3f::rotateMatrix(30));
    // The factor is rounded: a right angle leaves a little cosine.
    EXPECT_EQ(Matrix3f::rotateMatrix(90)[0], -4.37113883e-8f);
    EXPECT_EQ(Matrix3f::rotateMatrix(90)[1], 1.0f); // +x turns towards +y
}

// Each concatenating shorthand against the product with the matrix of its setter.
TEST(Matrix3Test, ShorthandsAgreeWithTheProductsTheyStandFor) {
    using M = Matrix3f;
    struct {
        void (*set)(M&, float, float, float, float);
        void (*pre)(M&, float, float, float, float);
        void (*post)(M&, float, float, float, float);
    } const cases[] = {
        {[](M& m, float a, float b, float, float) { m.setScale(a, b); },
         [](M& m, float a, float b, float, float) { m.preScale(a, b); },
         [](M& m, float a, float b, float, float) { m.postScale(a, b); }},
        {[](M& m, float a, float b, float x, float y) { m.setScale(a, b, x, y); },
         [](M& m, float a, float b, float x, float y) { m.preScale(a, b, x, y); },
         [](M& m, float a, float b, float x, float y) { m.postScale(a, b, x, y); }},
        {[](M& m, float a, float, float, float) { m.setRotate(a); },
         [](M& m, float a, float, float, float) { m.preRotate(a); },
         [](M& m, float a, float, float, float) { m.postRotate(a); }},
        {[](M& m, float a, float, float x, float y) { m.setRotate(a, x, y); },
         [](M& m, float a, float, float x, float y) { m.preRotate(a, x, y); },
         [](M& m, float a, float, float x, float y) { m.postRotate(a, x, y); }},
        {[](M& m, float a, float b, float, float) { m.setTranslate(a, b); },
         [](M& m, float a, float b, float, float) { m.preTranslate(a, b); },
         nullptr}, // postTranslate is none
    };
    Sample sample;
    for (int round = 0; round < 100; ++round) {
        M start;
        for (int i = 0; i < 9; ++i) start[i] = sample.Next();
        float const a = sample.Next(), b = sample.Next(), x = sample.Next(), y = sample.Next();
        for (auto const& each : cases) {
            SCOPED_TRACE(&each - cases);
            M factor, product = start, shorthand = start;
            each.set(factor, a, b, x, y);
            each.pre(shorthand, a, b, x, y);
            product.preConcat(factor);
            EXPECT_LT(Distance(product, shorthand), 1e-3f);
            if (!each.post) continue;
            product = shorthand = start;
            each.post(shorthand, a, b, x, y);
            product.postConcat(factor);
            EXPECT_LT(Distance(product, shorthand), 1e-3f);
        }
    }
}

// Inputs whose sums round differently in any other grouping.
TEST(Matrix3Test, SumsAreRoundedFromLeftToRight) {
    float const big = 16777216.0f; // adding 1 to it is lost, adding 2 is not
    Matrix3f m(big, 1, 0, 1, 1, 0, 1, 1, 1);
    m.preConcat(Matrix3f(1, 1, 1, 0, 0, 0, 0, 0, 0));
    EXPECT_EQ(m[0], big); // (big + 1) + 1
    m = Matrix3f(1, 0, 0, 1, 0, 0, big, 0, 1);
    m.preTranslate(1, 1);
    EXPECT_EQ(m[6], big + 2); // big + (1 + 1)
    m.setRotate(0, big, 1);
    EXPECT_EQ(m[6], 0); // (0 - big) + big
}

TEST(Matrix3Test, AMatrixMayBeConcatenatedWithItself) {
    Matrix3f before = kCounting, after = kCounting;
    before.preConcat(before);
    after.postConcat(after);
    EXPECT_THAT(ElementsOf(before), ElementsAre(15, 18, 21, 42, 54, 66, 69, 90, 111));
    EXPECT_EQ(before, after);
}

TEST(Matrix3Test, PostTranslateScalesItsSkewByItself) {
    Matrix3f m = kCounting;
    m.postTranslate(10, 100);
    EXPECT_THAT(ElementsOf(m), ElementsAre(20, 101, 2, 53, 504, 5, 86, 807, 8));
}

TEST(Matrix3Test, OnlyTheCopyingTransposeRepeatsAnElement) {
    EXPECT_THAT(ElementsOf(kCounting.transpose()), ElementsAre(0, 3, 5, 1, 4, 7, 2, 5, 8));
    Matrix3f m = kCounting;
    m.transposeSelf();
    EXPECT_THAT(ElementsOf(m), ElementsAre(0, 3, 6, 1, 4, 7, 2, 5, 8));
}

// With a determinant of 1, so that the adjugate is the inverse, and both are exact.
TEST(Matrix3Test, TheInverseIsTheAdjugateOverTheDeterminant) {
    Matrix3f const m(1, 2, -1, 2, 5, -4, -2, -6, 7);
    std::vector<float> const inverse{11, -8, -3, -6, 5, 2, -2, 2, 1};
    double terms[9];
    m.calculateMatrix(terms);
    EXPECT_EQ(ElementsOf(m.inverse()), inverse);
    EXPECT_EQ(std::vector<float>(terms, terms + 9), inverse);
    Matrix3f(0.1f, 0.2f, 0.3f, 0.4f, 0.5f, 0.6f, 0.7f, 0.8f, 1).calculateMatrix(terms);
    for (double const term : terms) EXPECT_EQ(term, double(float(term))) << "computed in single precision";
    EXPECT_THAT(ElementsOf(Matrix3f(2, 0, 0, 0, 4, 0, 1, 1, 1).inverse()),
                ElementsAre(0.5f, 0, 0, 0, 0.25f, 0, -0.5f, -0.25f, 1));
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
    Matrix3f(0, 1, 0, -1, 0, 0, 0, 0, 1).mapRect(&box, RectF(0, 0, 10, 20));
    EXPECT_EQ(box, RectF(-20, 0, 0, 10));
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

} // namespace
} // namespace Moka
