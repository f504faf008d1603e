// What the numbers of a matrix mean. The numbers themselves, to the last bit, are in the digests.
#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix4.h"

#include <gmock/gmock.h>

#include <cmath>
#include <limits>

namespace Moka {
namespace {

using ::testing::ElementsAre;

Matrix3f const kCounting(0, 1, 2, 3, 4, 5, 6, 7, 8);

template <class Matrix>
std::vector<float> ElementsOf(Matrix const& m) {
    return {m.data(), m.data() + sizeof(m) / sizeof(float)};
}

TEST(Matrix3Test, EqualityIsByBitsIdentityByValue) {
    Matrix3f m;
    m[3] = -0.0f;
    EXPECT_TRUE(m.isIdentity());
    EXPECT_NE(m, Matrix3f());
    Matrix3f const nan(std::numeric_limits<float>::quiet_NaN());
    EXPECT_EQ(nan, Matrix3f(nan));
    for (int i = 0; i < 9; ++i) {
        Matrix3f off;
        off[i] = std::nextafter(off[i], 2.0f);
        EXPECT_FALSE(off.isIdentity()) << i;
        EXPECT_NE(off, Matrix3f()) << i;
    }
}

TEST(Matrix3Test, PreActsOnPointsFirstAndPivotsStay) {
    RectF box;
    Matrix3f m = Matrix3f::translateMatrix(3, 4);
    m.preScale(-1, 2);
    m.mapRect(&box, RectF(1, 2, 3, 4));
    EXPECT_EQ(box, RectF(0, 8, 2, 12));
    m.postScale(2, 1);
    m.mapRect(&box, RectF(1, 2, 3, 4));
    EXPECT_EQ(box, RectF(0, 8, 4, 12));
    m.setScale(2, 3, 10, 20);
    EXPECT_THAT(ElementsOf(m), ElementsAre(2, 0, 0, 0, 3, 0, -10, -40, 1));
    EXPECT_EQ(Matrix3f::rotateMatrix(90)[1], 1.0f); // +x turns towards +y
    Matrix3f before = kCounting, after = kCounting; // with itself
    before.preConcat(before);
    after.postConcat(after);
    EXPECT_THAT(ElementsOf(before), ElementsAre(15, 18, 21, 42, 54, 66, 69, 90, 111));
    EXPECT_EQ(before, after);
}

TEST(Matrix3Test, OnlyTheCopyingTransposeRepeatsAnElement) {
    EXPECT_THAT(ElementsOf(kCounting.transpose()), ElementsAre(0, 3, 5, 1, 4, 7, 2, 5, 8));
    Matrix3f m = kCounting;
    m.transposeSelf();
    EXPECT_THAT(ElementsOf(m), ElementsAre(0, 3, 6, 1, 4, 7, 2, 5, 8));
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
    // With a determinant of 1 the adjugate is the inverse, and both are exact.
    EXPECT_THAT(ElementsOf(Matrix3f(1, 2, -1, 2, 5, -4, -2, -6, 7).inverse()),
                ElementsAre(11, -8, -3, -6, 5, 2, -2, 2, 1));
    Matrix4f const singular(0.0f);
    EXPECT_EQ(singular.inverse(), singular);
}

// Degrees, halved.
TEST(Matrix4Test, APerspectiveIsMadeOfTheTangentOfHalfItsAngle) {
    float const top = std::tan(90.0f * 0.008726646f);
    EXPECT_EQ(Matrix4f::perspectiveMatrix(90, 1, 1, 100),
              Matrix4f(2 / (2 * top), 0, 0, 0, 0, 2 / (2 * top), 0, 0, 0, 0, -101.0f / 99.0f, -1, 0, 0,
                       -200.0f / 99.0f, 0));
}

} // namespace
} // namespace Moka
