#include "moka/graphics/math/Matrix4.h"

#include "tests/unit/math/Elements.h"

#include <gmock/gmock.h>

#include <cmath>
#include <limits>

namespace Moka {
namespace {

using Testing::Distance;
using ::testing::Each;
using ::testing::ElementsAre;
using Testing::ElementsOf;

constexpr float kHalfPi = 1.5707964f;
Matrix4f const kCounting(0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15);

Vector4<float> Map(Matrix4f const& m, Vector4<float> const& p) {
    auto const at = [&](int i) { return m(i, 0) * p.x + m(i, 1) * p.y + m(i, 2) * p.z + m(i, 3) * p.w; };
    return {at(0), at(1), at(2), at(3)};
}

void ExpectNear(Vector4<float> const& p, float x, float y, float z) {
    EXPECT_NEAR(p.x / p.w, x, 1e-6);
    EXPECT_NEAR(p.y / p.w, y, 1e-6);
    EXPECT_NEAR(p.z / p.w, z, 1e-6);
}

TEST(Matrix4Test, StorageIsColumnMajor) {
    EXPECT_EQ(kCounting(0, 1), 4);
    EXPECT_EQ(kCounting.row(1), Vector4<float>(1, 5, 9, 13));
    EXPECT_EQ(kCounting.column(2), Vector4<float>(8, 9, 10, 11));
    EXPECT_FALSE(kCounting.isRowMajor());
    EXPECT_EQ(Matrix4f(kCounting.data()), kCounting);
    Matrix4f m(2.5f);
    EXPECT_THAT(ElementsOf(m), Each(2.5f));
    m(2, 3) = 1;
    EXPECT_EQ(m[14], 1);
    m.identitySelf();
    EXPECT_EQ(m, Matrix4f());
    m[9] = -0.0f;
    EXPECT_NE(m, Matrix4f());
    Matrix4f const nan(std::numeric_limits<float>::quiet_NaN());
    EXPECT_EQ(nan, Matrix4f(nan));
    m.zeroSelf();
    EXPECT_THAT(ElementsOf(m), Each(0.0f));
}

TEST(Matrix4Test, OrthoWithYDownMapsTheCornersOfTheImage) {
    float const w = 640, h = 480;
    Matrix4f const m = Matrix4f::orthoMatrix(0, w, h, 0, -1, 1);
    EXPECT_EQ(Map(m, {0, 0, 0, 1}), Vector4<float>(-1, 1, 0, 1));
    EXPECT_EQ(Map(m, {w, h, 0, 1}), Vector4<float>(1, -1, 0, 1));
    EXPECT_EQ(m, Matrix4f(2 / w, 0, 0, 0, 0, 2 / -h, 0, 0, 0, 0, -1, 0, -1, 1, -0.0f, 1));
    // An off-centre box, against its own corners.
    Matrix4f const box = Matrix4f::orthoMatrix(-3, 5, 2, 10, 1, 9);
    EXPECT_EQ(Map(box, {-3, 2, -1, 1}), Vector4<float>(-1, -1, -1, 1));
    EXPECT_EQ(Map(box, {5, 10, -9, 1}), Vector4<float>(1, 1, 1, 1));
    EXPECT_TRUE(std::isinf(Matrix4f::orthoMatrix(1, 1, 0, 1, 0, 1)[0]));
}

TEST(Matrix4Test, PerspectiveTakesDegreesAndHalvesThem) {
    float const top = std::tan(90.0f * 0.008726646f) * 1.0f;
    Matrix4f const m = Matrix4f::perspectiveMatrix(90, 1, 1, 100);
    EXPECT_EQ(m, Matrix4f(2 / (2 * top), 0, 0, 0, 0, 2 / (2 * top), 0, 0, 0, 0, -101.0f / 99.0f, -1, 0, 0,
                          -200.0f / 99.0f, 0));
    // The near plane's upper right corner and the far plane's centre.
    Matrix4f const wide = Matrix4f::perspectiveMatrix(60, 2, 0.5f, 10);
    float const y = 0.5f * std::tan(60.0f * 0.008726646f);
    ExpectNear(Map(wide, {2 * y, y, -0.5f, 1}), 1, 1, -1);
    ExpectNear(Map(wide, {0, 0, -10, 1}), 0, 0, 1);
}

TEST(Matrix4Test, TranslationAndScaleByNumbersAndByVector) {
    EXPECT_EQ(Matrix4f::translateMatrix(1, 2, 3), Matrix4f(1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 1, 2, 3, 1));
    EXPECT_EQ(Matrix4f::translateMatrix(Vector3<float>(1, 2, 3)), Matrix4f::translateMatrix(1, 2, 3));
    EXPECT_EQ(Matrix4f::scaleMatrix(1, 2, 3), Matrix4f(1, 0, 0, 0, 0, 2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1));
    EXPECT_EQ(Matrix4f::scaleMatrix(Vector3<float>(1, 2, 3)), Matrix4f::scaleMatrix(1, 2, 3));
}

TEST(Matrix4Test, EulerRotationIsXTimesYTimesZInRadians) {
    Matrix4f const product = Matrix4f::rotateMatrix(0.3f, 0, 0) * Matrix4f::rotateMatrix(0, 1.1f, 0) *
                             Matrix4f::rotateMatrix(0, 0, -2);
    EXPECT_LT(Distance(product, Matrix4f::rotateMatrix(0.3f, 1.1f, -2)), 1e-6f);
    int const ofSine[] = {6, 8, 1}; // a right angle turns y to z, z to x, x to y
    for (int axis = 0; axis < 3; ++axis) {
        auto const angle = [&](int i) { return i == axis ? kHalfPi : 0.0f; };
        EXPECT_EQ(Matrix4f::rotateMatrix(angle(0), angle(1), angle(2))[ofSine[axis]], 1);
    }
}

TEST(Matrix4Test, AxisAngleRotationTurnsTheOtherWay) {
    for (int axis = 0; axis < 3; ++axis) {
        auto const on = [&](int i, float value) { return i == axis ? value : 0.0f; };
        Vector3<float> const v(on(0, 4), on(1, 4), on(2, 4)); // of any length
        Matrix4f const euler = Matrix4f::rotateMatrix(on(0, -0.7f), on(1, -0.7f), on(2, -0.7f));
        EXPECT_LT(Distance(euler, Matrix4f::rotateMatrix(0.7f, v)), 1e-6f) << axis;
    }
    Matrix4f const skew = Matrix4f::rotateMatrix(1.25f, Vector3<float>(1, -2, 2));
    ExpectNear(Map(skew, {1, -2, 2, 1}), 1, -2, 2);
    EXPECT_LT(Distance(skew * skew.transpose(), Matrix4f()), 1e-6f);
    EXPECT_TRUE(std::isnan(Matrix4f::rotateMatrix(1, Vector3<float>())[0]));
}

TEST(Matrix4Test, BasisRotationStandsItsColumnsOnDirectionAndUp) {
    Matrix4f const m = Matrix4f::rotateMatrix(Vector3<float>(0, 0, 2), Vector3<float>(0, 3, 1));
    EXPECT_EQ(m, Matrix4f(-1, 0, 0, 0, 0, 1, -0.0f, 0, 0, 0, 1, 0, 0, 0, 0, 1));
    EXPECT_TRUE(std::isnan(Matrix4f::rotateMatrix(Vector3<float>(1, 0, 0), Vector3<float>(2, 0, 0))[0]));
}

TEST(Matrix4Test, ProductIsLeftTimesRightRoundedFromLeftToRight) {
    EXPECT_THAT(ElementsOf(kCounting * kCounting),
                ElementsAre(56, 62, 68, 74, 152, 174, 196, 218, 248, 286, 324, 362, 344, 398, 452, 506));
    EXPECT_THAT(ElementsOf(kCounting * Matrix4f::scaleMatrix(1, 2, 3)),
                ElementsAre(0, 1, 2, 3, 8, 10, 12, 14, 24, 27, 30, 33, 12, 13, 14, 15));
    float const big = 16777216.0f; // adding 1 to it is lost, adding 2 is not
    Matrix4f ones(1.0f);
    ones[0] = big;
    EXPECT_EQ((ones * Matrix4f(1.0f))[0], big); // ((big + 1) + 1) + 1
    ones[0] = 1;
    ones[8] = big;
    EXPECT_EQ((ones * Matrix4f(1.0f))[0], big + 4); // ((1 + 1) + big) + 1, a tie that goes to even
}

// With a determinant of 1, so that the adjugate is the inverse, and both are exact.
TEST(Matrix4Test, TheInverseIsTheAdjugateOverTheDeterminant) {
    Matrix4f const m(1, 2, -2, 1, 1, 3, -4, 3, -1, -4, 7, -4, 2, 6, -6, 9);
    std::vector<float> const inverse{15, -36, -12, 5, -11, 29, 10, -4, -3, 8, 3, -1, 2, -6, -2, 1};
    double terms[16];
    m.calculaeMatrix(terms);
    EXPECT_EQ(ElementsOf(m.inverse()), inverse);
    EXPECT_EQ(std::vector<float>(terms, terms + 16), inverse);
    EXPECT_EQ(ElementsOf(Matrix4f::scaleMatrix(2, 4, 8).inverse()),
              ElementsOf(Matrix4f::scaleMatrix(0.5f, 0.25f, 0.125f)));
}

TEST(Matrix4Test, ASingularMatrixStaysAsItIs) {
    Matrix4f zeroRow = kCounting;
    for (int column = 0; column < 4; ++column) zeroRow(2, column) = 0;
    for (Matrix4f const& singular : {zeroRow, kCounting, Matrix4f(0.0f)}) {
        EXPECT_EQ(singular.inverse(), singular);
    }
    // 1e-40 is no zero in double precision.
    Matrix4f const tiny = Matrix4f::scaleMatrix(1e-20f, 1e-20f, 1);
    EXPECT_NEAR(tiny.inverse()[0] * 1e-20f, 1, 1e-6);
}

TEST(Matrix4Test, TransposeIsExact) {
    EXPECT_THAT(ElementsOf(kCounting.transpose()),
                ElementsAre(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15));
}

TEST(Matrix4Test, RotateResetsWhatRotateSelfKeeps) {
    Matrix4f m(2.0f);
    EXPECT_THAT(ElementsOf(m.rotation()), ElementsAre(2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 2, 0, 0, 0, 2));
    EXPECT_EQ(m.translation(), Matrix4f::translateMatrix(2, 2, 2));

    Matrix4f const euler = Matrix4f::rotateMatrix(0.1f, 0.2f, 0.3f);
    Matrix4f const rotated = m.rotate(0.1f, 0.2f, 0.3f);
    m.rotateSelf(0.1f, 0.2f, 0.3f);
    for (int i = 0; i < 16; ++i) {
        bool const fromEuler = i % 4 < 3 && i < 12;
        bool const translation = i >= 12 && i < 15;
        EXPECT_EQ(rotated[i], translation ? 2 : euler[i]) << i;
        EXPECT_EQ(m[i], fromEuler ? euler[i] : 2) << i;
    }
}

TEST(Matrix4Test, APlaneTransformWidensWithItsPerspective) {
    Matrix3f const plane(1, 2, 3, 4, 5, 6, 7, 8, 9);
    Matrix4f const space = FromMatrix3(plane);
    EXPECT_THAT(ElementsOf(space), ElementsAre(1, 2, 0, 3, 4, 5, 0, 6, 0, 0, 1, 0, 7, 8, 0, 9));
    // (10 + 80 + 7, 20 + 100 + 8) over a w of 30 + 120 + 9.
    EXPECT_EQ(Map(space, {10, 20, 5, 1}), Vector4<float>(97, 128, 5, 159));
}

} // namespace
} // namespace Moka
