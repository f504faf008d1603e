#include "moka/graphics/math/Matrix4.h"

#include "tests/unit/math/Reference.h"

#include <gmock/gmock.h>

#include <cmath>
#include <limits>

namespace Moka {
namespace {

using Testing::Bits;
using ::testing::Each;
using ::testing::ElementsAre;
using Testing::ElementsOf;
using Testing::Reference;
using Testing::Sample;

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

void ExpectRotation(Matrix4f const& m) {
    EXPECT_LT(Reference<4>(m).Times(Reference<4>(m.transpose())).Distance(Matrix4f()), 1e-6);
}

// The rotation about one axis (0, 1, 2) in the plane of the two that follow it.
Reference<4> AxisRotation(int axis, double angle) {
    Reference<4> m((Matrix4f()));
    int const a = (axis + 1) % 3;
    int const b = (axis + 2) % 3;
    m.at[a][a] = m.at[b][b] = std::cos(angle);
    m.at[b][a] = std::sin(angle);
    m.at[a][b] = -std::sin(angle);
    return m;
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
    EXPECT_EQ(Bits(0.008726646f), 0x3C0EFA35u); // pi / 360, rounded once
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
    Sample sample(11);
    for (int round = 0; round < 100; ++round) {
        float const ax = sample.Next(), ay = sample.Next(), az = sample.Next();
        Reference<4> const expected =
            AxisRotation(0, ax).Times(AxisRotation(1, ay)).Times(AxisRotation(2, az));
        EXPECT_LT(expected.Distance(Matrix4f::rotateMatrix(ax, ay, az)), 1e-6);
    }
    Matrix4f const quarter = Matrix4f::rotateMatrix(0, 0, kHalfPi);
    EXPECT_EQ(quarter[1], 1);
    EXPECT_EQ(quarter[4], -1);
}

TEST(Matrix4Test, AxisAngleRotationTurnsTheOtherWay) {
    Matrix4f const quarter = Matrix4f::rotateMatrix(kHalfPi, Vector3<float>(0, 0, 1));
    EXPECT_EQ(quarter[1], -1);
    EXPECT_EQ(quarter[4], 1);
    for (int axis = 0; axis < 3; ++axis) {
        Vector3<float> const v(axis == 0 ? 4.0f : 0, axis == 1 ? 4.0f : 0, axis == 2 ? 4.0f : 0);
        EXPECT_LT(AxisRotation(axis, -0.7).Distance(Matrix4f::rotateMatrix(0.7f, v)), 1e-6) << axis;
    }
    // A skew axis stays, whatever its length; the matrix is a rotation; the trace tells the angle.
    Matrix4f const m = Matrix4f::rotateMatrix(1.25f, Vector3<float>(1, -2, 2));
    ExpectNear(Map(m, {1, -2, 2, 1}), 1, -2, 2);
    ExpectRotation(m);
    EXPECT_NEAR(m[0] + m[5] + m[10], 1 + 2 * std::cos(1.25), 1e-6);
    EXPECT_LT(m[1] - m[4], 0); // 2 s z has the other sign in the usual convention
    EXPECT_TRUE(std::isnan(Matrix4f::rotateMatrix(1, Vector3<float>())[0]));
}

TEST(Matrix4Test, BasisRotationStandsItsColumnsOnDirectionAndUp) {
    Matrix4f const m = Matrix4f::rotateMatrix(Vector3<float>(0, 0, 2), Vector3<float>(0, 3, 1));
    EXPECT_EQ(m, Matrix4f(-1, 0, 0, 0, 0, 1, -0.0f, 0, 0, 0, 1, 0, 0, 0, 0, 1));
    Matrix4f const skew = Matrix4f::rotateMatrix(Vector3<float>(1, 2, 3), Vector3<float>(0, 5, -1));
    ExpectRotation(skew);
    EXPECT_NEAR(skew[9] / skew[8], 2, 1e-6);
    EXPECT_NEAR(skew[10] / skew[8], 3, 1e-6);
    EXPECT_GT(skew[5], 0); // the up column leans the way up does
    EXPECT_TRUE(std::isnan(Matrix4f::rotateMatrix(Vector3<float>(1, 0, 0), Vector3<float>(2, 0, 0))[0]));
}

TEST(Matrix4Test, ProductIsLeftTimesRightRoundedInOrder) {
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
