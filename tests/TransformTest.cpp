// TransformTest.cpp: the renderer's vectors, planes, quads, matrices and transforms, and where lines meet planes.

#include "KTGraphicsStructs.h"
#include "KTGraphicsUtils.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <cstddef>
#include <limits>
#include <numbers>
#include <random>
#include <type_traits>

namespace {

constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
constexpr float kMax = std::numeric_limits<float>::max();
constexpr float kPi = std::numbers::pi_v<float>;
constexpr float kHalfRoot = 0.70710678F;

void ExpectNear(KTVector3f const &actual, KTVector3f const &expected, float tolerance = 1e-6F) {
    EXPECT_NEAR(actual.x, expected.x, tolerance);
    EXPECT_NEAR(actual.y, expected.y, tolerance);
    EXPECT_NEAR(actual.z, expected.z, tolerance);
}

void ExpectNear(KTMatrix4x4f const &actual, KTMatrix4x4f const &expected, float tolerance) {
    for (std::size_t i = 0; i < 16; ++i) {
        EXPECT_NEAR(actual.elements[i], expected.elements[i], tolerance) << i;
    }
}

KTMatrix4x4f Sequence() { return KTMatrix4x4f({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16}); }

KTVector3f Meet(KTVector3f const &a, KTVector3f const &b, KTPlanef const &plane) {
    return KTGraphicsUtils::GetIntersectionOfLineWithPlane(a, b, plane);
}

bool IsNoPoint(KTVector3f const &point) { return std::isnan(point.x) && std::isnan(point.y) && std::isnan(point.z); }

} // namespace

// ---- KTVector3f, KTColor4f ----

TEST(Vector, IsZeroAtFirst) {
    EXPECT_EQ(KTVector3f(), KTVector3f(0, 0, 0));
    EXPECT_EQ(KTVector3f(1, 2, 3).y, 2);
    EXPECT_NE(KTVector3f(1, 2, 3), KTVector3f(1, 2, 3.000001F));
    EXPECT_NE(KTVector3f(kNan, 0, 0), KTVector3f(kNan, 0, 0));
}

TEST(Vector, ArithmeticActsByComponent) {
    KTVector3f const a(6, -4, 2);
    KTVector3f const b(2, 1, -1);
    EXPECT_EQ(a + b, KTVector3f(8, -3, 1));
    EXPECT_EQ(a - b, KTVector3f(4, -5, 3));
    EXPECT_EQ(a * 2, KTVector3f(12, -8, 4));
    EXPECT_EQ(2 * a, KTVector3f(12, -8, 4));
    EXPECT_EQ(a / 2, KTVector3f(3, -2, 1));
    EXPECT_EQ(-a, KTVector3f(-6, 4, -2));
    KTVector3f c = a;
    c += b;
    EXPECT_EQ(c, KTVector3f(8, -3, 1));
    c -= b;
    EXPECT_EQ(c, a);
    c *= 2;
    EXPECT_EQ(c, KTVector3f(12, -8, 4));
    c /= 4;
    EXPECT_EQ(c, KTVector3f(3, -2, 1));
}

TEST(Vector, LengthsAndProducts) {
    EXPECT_EQ(KTVector3f(2, -3, 6).Length(), 7);
    EXPECT_EQ(KTVector3f(1, 1, 1).DistanceTo(KTVector3f(3, 4, 7)), 7);
    EXPECT_EQ(KTVector3f(0, kMax, 0).Length(), kMax) << "no overflow on the way";
    EXPECT_EQ(KTVector3f(3e-30F, 4e-30F, 0).Length(), 5e-30F) << "nor underflow";
    EXPECT_EQ(KTVector3f(1, 2, 3).Dot(KTVector3f(4, -5, 6)), 12);
    EXPECT_EQ(KTVector3f(1, 0, 0).Cross(KTVector3f(0, 1, 0)), KTVector3f(0, 0, 1)) << "right-handed";
    EXPECT_EQ(KTVector3f(1, 2, 3).Cross(KTVector3f(4, 5, 6)), KTVector3f(-3, 6, -3));
    EXPECT_EQ(KTVector3f(0, 3, -4).Normalized(), KTVector3f(0, 0.6F, -0.8F));
    EXPECT_EQ(KTVector3f(0, 3e-38F, 0).Normalized(), KTVector3f(0, 1, 0));
    EXPECT_EQ(KTVector3f().Normalized(), KTVector3f());
    EXPECT_TRUE(KTVector3f(kMax, 0, 0).IsFinite());
    EXPECT_FALSE(KTVector3f(kInfinity, 0, 0).IsFinite());
    EXPECT_FALSE(KTVector3f(0, -kInfinity, 0).IsFinite());
    EXPECT_FALSE(KTVector3f(0, 0, kNan).IsFinite());
}

TEST(Color4f, IsRedGreenBlueAlpha) {
    EXPECT_EQ(KTColor4f(), KTColor4f(0, 0, 0, 1));
    KTColor4f const color(0.1F, 0.2F, 0.3F, 0.4F);
    EXPECT_EQ(color.red, 0.1F);
    EXPECT_EQ(color.green, 0.2F);
    EXPECT_EQ(color.blue, 0.3F);
    EXPECT_EQ(color.alpha, 0.4F);
    EXPECT_EQ(KTColor4f(0.1F, 0.2F, 0.3F).alpha, 1.0F);
    EXPECT_NE(color, KTColor4f(0.1F, 0.2F, 0.3F, 0.5F));
}

// ---- planes and quads ----

TEST(Plane, GoesThroughAPointAcrossANormal) {
    KTPlanef const plane = KTPlanef::FromPointAndNormal({1, 2, 3}, {0, 0, 5});
    EXPECT_EQ(plane, KTPlanef({0, 0, 1}, -3));
    EXPECT_EQ(plane.DistanceTo({7, 7, 10}), 7);
    EXPECT_EQ(plane.DistanceTo({7, 7, -1}), -4);
    EXPECT_EQ(KTPlanef({0, 0, 2}, -6).DistanceTo({0, 0, 10}), 7) << "normals of other lengths count as well";
    EXPECT_TRUE(plane.IsValid());
}

TEST(Plane, SeesItsPointsCounterClockwise) {
    EXPECT_EQ(KTPlanef::FromPoints({0, 0, 4}, {1, 0, 4}, {0, 1, 4}), KTPlanef({0, 0, 1}, -4));
    EXPECT_EQ(KTPlanef::FromPoints({0, 0, 4}, {0, 1, 4}, {1, 0, 4}), KTPlanef({0, 0, -1}, 4));
    KTPlanef const slanted = KTPlanef::FromPoints({1, 0, 0}, {0, 1, 0}, {0, 0, 1});
    ExpectNear(slanted.normal, KTVector3f(1, 1, 1).Normalized());
    EXPECT_NEAR(slanted.DistanceTo({}), -std::sqrt(1.0F / 3), 1e-6F);
}

TEST(Plane, ThereIsNoneWithoutANormal) {
    EXPECT_EQ(KTPlanef(), KTPlanef({0, 0, 0}, 0));
    EXPECT_FALSE(KTPlanef().IsValid());
    EXPECT_EQ(KTPlanef::FromPointAndNormal({1, 2, 3}, {}), KTPlanef());
    EXPECT_EQ(KTPlanef::FromPoints({0, 0, 0}, {1, 1, 1}, {2, 2, 2}), KTPlanef()) << "on one line";
    EXPECT_EQ(KTPlanef::FromPoints({1, 1, 1}, {1, 1, 1}, {2, 2, 5}), KTPlanef());
    EXPECT_FALSE(KTPlanef({kNan, 0, 1}, 0).IsValid());
    EXPECT_FALSE(KTPlanef({0, 0, kInfinity}, 0).IsValid());
    EXPECT_FALSE(KTPlanef({0, 0, 1}, kNan).IsValid());
    EXPECT_TRUE(std::isnan(KTPlanef().DistanceTo({1, 2, 3})));
    EXPECT_FALSE(KTPlanef::FromPointAndNormal({kNan, 0, 0}, {0, 0, 1}).IsValid() ||
                 KTPlanef::FromPointAndNormal({0, 0, 0}, {0, kInfinity, 1}).IsValid());
}

TEST(Quad, FacesWhoSeesItsCornersCounterClockwise) {
    KTQuad3D const quad({-2, -1, 3}, {2, -1, 3}, {2, 1, 3}, {-2, 1, 3});
    EXPECT_EQ(quad.GetPlane(), KTPlanef({0, 0, 1}, -3));
    KTQuad3D const seenFromBehind(quad.bottomRight, quad.bottomLeft, quad.topLeft, quad.topRight);
    EXPECT_EQ(seenFromBehind.GetPlane(), KTPlanef({0, 0, -1}, 3));
    KTQuad3D const upright({0, 0, 1}, {0, 0, -1}, {0, 2, -1}, {0, 2, 1});
    EXPECT_EQ(upright.GetPlane(), KTPlanef({1, 0, 0}, 0));
    KTQuad3D const slanted({0, 0, 0}, {1, 0, 0}, {1, 1, 1}, {0, 1, 1});
    ExpectNear(slanted.GetPlane().normal, {0, -kHalfRoot, kHalfRoot});
    KTQuad3D const thin({0, 0, 0}, {1e7F, 0, 0}, {1e7F, 1, 0}, {0, 1, 0});
    EXPECT_EQ(thin.GetPlane(), KTPlanef({0, 0, 1}, 0));
}

TEST(Quad, WithoutAreaHasNoPlane) {
    EXPECT_EQ(KTQuad3D().GetPlane(), KTPlanef());
    EXPECT_EQ(KTQuad3D({0, 0, 0}, {1, 0, 0}, {2, 0, 0}, {3, 0, 0}).GetPlane(), KTPlanef());
}

TEST(Quad, OutOfOnePlaneHasTheMiddleOne) {
    // Two corners raised by as much as the two others are lowered.
    KTQuad3D const saddle({-1, -1, 1}, {1, -1, -1}, {1, 1, 1}, {-1, 1, -1});
    EXPECT_EQ(saddle.GetPlane(), KTPlanef({0, 0, 1}, 0));
    // A triangle: two corners in one place.
    EXPECT_EQ(KTQuad3D({0, 0, 2}, {1, 0, 2}, {0, 1, 2}, {0, 1, 2}).GetPlane(), KTPlanef({0, 0, 1}, -2));
}

TEST(Quad, KnowsItsExtents) {
    KTQuad3D const quad({-2, 5, 3}, {4, -1, 7}, {2, 9, -6}, {1, 1, 0});
    EXPECT_EQ(quad.MinX(), -2);
    EXPECT_EQ(quad.MaxX(), 4);
    EXPECT_EQ(quad.MinY(), -1);
    EXPECT_EQ(quad.MaxY(), 9);
    EXPECT_EQ(quad.MinZ(), -6);
    EXPECT_EQ(quad.MaxZ(), 7);
    EXPECT_EQ(quad.Width(), 6);
    EXPECT_EQ(quad.Height(), 10);
    EXPECT_EQ(quad.Depth(), 13);
    // Each corner takes its turn.
    for (std::size_t corner = 0; corner < 4; ++corner) {
        std::array<KTVector3f, 4> corners{};
        corners[corner] = {5, -6, 7};
        KTQuad3D const one(corners[0], corners[1], corners[2], corners[3]);
        EXPECT_EQ(one.MaxX(), 5);
        EXPECT_EQ(one.MinY(), -6);
        EXPECT_EQ(one.MaxZ(), 7);
    }
    KTQuad3D const holes({kNan, 1, kNan}, {2, kNan, kNan}, {3, 4, kNan}, {kNan, 5, kNan});
    EXPECT_EQ(holes.MinX(), 2);
    EXPECT_EQ(holes.MaxX(), 3);
    EXPECT_EQ(holes.MinY(), 1);
    EXPECT_EQ(holes.MaxY(), 5);
    EXPECT_TRUE(std::isnan(holes.MinZ()));
    EXPECT_EQ(KTQuad3D({-kInfinity, 0, 0}, {}, {}, {}).Width(), kInfinity);
}

TEST(Quad, IsComparedCornerByCorner) {
    KTQuad3D const quad({0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0});
    EXPECT_EQ(quad, KTQuad3D({0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}));
    EXPECT_NE(quad, KTQuad3D({1, 0, 0}, {1, 1, 0}, {0, 1, 0}, {0, 0, 0}));
    EXPECT_EQ(KTQuad3D(), KTQuad3D({}, {}, {}, {}));
}

// ---- where a line meets a plane ----

TEST(LineAndPlane, MeetInAPoint) {
    KTPlanef const plane({0, 0, 1}, -3);
    EXPECT_EQ(Meet({1, 2, 0}, {1, 2, 1}, plane), KTVector3f(1, 2, 3));
    EXPECT_EQ(Meet({0, 0, 5}, {1, 1, 4}, plane), KTVector3f(2, 2, 3));
    EXPECT_EQ(Meet({0, 0, 0}, {1, 2, -1}, plane), KTVector3f(-3, -6, 3)) << "the line has no ends";
    EXPECT_EQ(Meet({7, 8, 3}, {1, 2, 9}, plane), KTVector3f(7, 8, 3));
    EXPECT_EQ(Meet({1, 2, 0}, {1, 2, 1}, KTPlanef({0, 0, -10}, 30)), KTVector3f(1, 2, 3)) << "any normal's length";
    KTPlanef const slanted = KTPlanef::FromPoints({1, 0, 0}, {0, 1, 0}, {0, 0, 1});
    ExpectNear(Meet({0, 0, 0}, {1, 1, 1}, slanted), {1.0F / 3, 1.0F / 3, 1.0F / 3});
    ExpectNear(Meet({5, 5, 5}, {-1, -2, 7}, slanted), KTVector3f(5, 5, 5) + KTVector3f(-6, -7, 2) * (14.0F / 11),
               1e-5F);
    EXPECT_EQ(Meet({0, 0, -1}, {1e4F, 0, 0}, plane), KTVector3f(4e4F, 0, 3)) << "nearly parallel";
}

TEST(LineAndPlane, ParallelsDoNotMeet) {
    KTPlanef const plane({0, 0, 1}, -3);
    EXPECT_TRUE(IsNoPoint(Meet({0, 0, 4}, {1, 1, 4}, plane)));
    EXPECT_TRUE(IsNoPoint(Meet({0, 0, -4}, {1, 1, -4}, plane)));
    // Not exactly across the normal, but as near as floats come.
    KTVector3f const normal = KTVector3f(0.3F, -0.7F, 0.55F).Normalized();
    KTVector3f const along = normal.Cross({0.2F, 0.9F, -0.4F}).Normalized();
    KTPlanef const slanted = KTPlanef::FromPointAndNormal({1, 2, 3}, normal);
    EXPECT_NE(double{along.x} * double{normal.x} + double{along.y} * double{normal.y} +
                  double{along.z} * double{normal.z},
              0.0);
    EXPECT_TRUE(IsNoPoint(Meet(normal * 9, normal * 9 + along, slanted)));
}

TEST(LineAndPlane, ALineInThePlaneGivesItsFirstPoint) {
    KTPlanef const plane({0, 0, 1}, -3);
    EXPECT_EQ(Meet({5, 6, 3}, {1, 1, 3}, plane), KTVector3f(5, 6, 3));
    KTVector3f const normal = KTVector3f(0.3F, -0.7F, 0.55F).Normalized();
    KTVector3f const along = normal.Cross({0.2F, 0.9F, -0.4F}).Normalized();
    KTVector3f const point(1, 2, 3);
    EXPECT_EQ(Meet(point, point + along, KTPlanef::FromPointAndNormal(point, normal)), point);
}

TEST(LineAndPlane, ThereMayBeNoLineOrNoPlane) {
    KTPlanef const plane({0, 0, 1}, -3);
    EXPECT_EQ(Meet({5, 6, 3}, {5, 6, 3}, plane), KTVector3f(5, 6, 3));
    EXPECT_TRUE(IsNoPoint(Meet({5, 6, 4}, {5, 6, 4}, plane)));
    EXPECT_TRUE(IsNoPoint(Meet({5, 6, 4}, {5, 6, 2}, KTPlanef())));
    EXPECT_TRUE(IsNoPoint(Meet({5, 6, 4}, {5, 6, 2}, KTPlanef({0, 0, kInfinity}, 0))));
    EXPECT_TRUE(IsNoPoint(Meet({5, kNan, 4}, {5, 6, 2}, plane)));
    EXPECT_TRUE(IsNoPoint(Meet({5, 6, 4}, {5, 6, -kInfinity}, plane)));
}

// ---- KTMatrix4x4f ----

TEST(Matrix, IsStoredColumnByColumn) {
    KTMatrix4x4f matrix = Sequence();
    EXPECT_EQ(matrix(0, 0), 1);
    EXPECT_EQ(matrix(3, 0), 4);
    EXPECT_EQ(matrix(0, 1), 5);
    EXPECT_EQ(matrix(2, 3), 15);
    matrix(1, 3) = 77;
    EXPECT_EQ(matrix.elements[13], 77);
    KTMatrix4x4f const moved = KTMatrix4x4f::Translation({5, 6, 7});
    EXPECT_EQ(moved.elements, (std::array<float, 16>{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 5, 6, 7, 1}));
}

TEST(Matrix, IsTheIdentityAtFirst) {
    KTMatrix4x4f const identity;
    EXPECT_EQ(identity.elements, (std::array<float, 16>{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1}));
    EXPECT_EQ(identity * Sequence(), Sequence());
    EXPECT_EQ(Sequence() * identity, Sequence());
    EXPECT_EQ(identity.TransformPoint({1, 2, 3}), KTVector3f(1, 2, 3));
}

TEST(Matrix, ProductAppliesTheRightOneFirst) {
    KTMatrix4x4f const move = KTMatrix4x4f::Translation({10, 0, 0});
    KTMatrix4x4f const grow = KTMatrix4x4f::Scaling({2, 3, 4});
    EXPECT_EQ((move * grow).TransformPoint({1, 1, 1}), KTVector3f(12, 3, 4));
    EXPECT_EQ((grow * move).TransformPoint({1, 1, 1}), KTVector3f(22, 3, 4));
    KTMatrix4x4f product = move;
    product *= grow;
    EXPECT_EQ(product, move * grow);
    // The columns 1..4, 5..8, 9..12, 13..16 squared, worked out by hand.
    EXPECT_EQ((Sequence() * Sequence()).elements,
              (std::array<float, 16>{90, 100, 110, 120, 202, 228, 254, 280, 314, 356, 398, 440, 426, 484, 542, 600}));
}

TEST(Matrix, DirectionsAreNotMoved) {
    KTMatrix4x4f const matrix = KTMatrix4x4f::Translation({10, 20, 30}) * KTMatrix4x4f::Scaling({2, 3, 4});
    EXPECT_EQ(matrix.TransformVector({1, 1, 1}), KTVector3f(2, 3, 4));
    EXPECT_EQ(matrix.TransformPoint({1, 1, 1}), KTVector3f(12, 23, 34));
}

TEST(Matrix, PointsAreDividedByW) {
    KTMatrix4x4f perspective;
    perspective(3, 2) = -1;
    perspective(3, 3) = 0;
    EXPECT_EQ(perspective.TransformPoint({4, 6, -2}), KTVector3f(2, 3, -1));
    EXPECT_TRUE(std::isinf(perspective.TransformPoint({4, 6, 0}).x)) << "a point at infinity";
}

TEST(Matrix, RotatesCounterClockwise) {
    ExpectNear(KTMatrix4x4f::Rotation({0, 0, 1}, kPi / 2).TransformPoint({1, 0, 0}), {0, 1, 0});
    ExpectNear(KTMatrix4x4f::Rotation({1, 0, 0}, kPi / 2).TransformPoint({0, 1, 0}), {0, 0, 1});
    ExpectNear(KTMatrix4x4f::Rotation({0, 1, 0}, kPi / 2).TransformPoint({0, 0, 1}), {1, 0, 0});
    ExpectNear(KTMatrix4x4f::Rotation({0, 0, 25}, kPi / 4).TransformPoint({1, 0, 5}), {kHalfRoot, kHalfRoot, 5});
    ExpectNear(KTMatrix4x4f::Rotation({1, 1, 1}, 2 * kPi / 3).TransformPoint({1, 2, 3}), {3, 1, 2});
    EXPECT_EQ(KTMatrix4x4f::Rotation({1, 2, 3}, 0), KTMatrix4x4f::Rotation({}, 1)) << "no turn, no axis";
    EXPECT_EQ(KTMatrix4x4f::Rotation({}, 1), KTMatrix4x4f());
}

TEST(Matrix, TransposeSwapsRowsAndColumns) {
    KTMatrix4x4f const transposed = Sequence().Transposed();
    EXPECT_EQ(transposed(0, 3), 4);
    EXPECT_EQ(transposed(3, 0), 13);
    EXPECT_EQ(transposed.Transposed(), Sequence());
}

TEST(Matrix, Determinants) {
    EXPECT_EQ(KTMatrix4x4f().Determinant(), 1);
    EXPECT_EQ(Sequence().Determinant(), 0);
    EXPECT_EQ(KTMatrix4x4f::Scaling({2, -3, 4}).Determinant(), -24);
    EXPECT_EQ(KTMatrix4x4f({0, 0, 0, 1, 0, 0, 1, 0, 0, 1, 0, 0, 1, 0, 0, 0}).Determinant(), 1);
    EXPECT_EQ(KTMatrix4x4f({2, 0, 1, 3, 1, 1, 0, 2, 0, 4, 1, 1, 3, 1, 2, 0}).Determinant(), -28);
    EXPECT_NEAR(KTMatrix4x4f::Rotation({1, 2, 3}, 1.2F).Determinant(), 1, 1e-6F);
}

TEST(Matrix, InversesUndo) {
    KTMatrix4x4f inverse;
    ASSERT_TRUE((KTMatrix4x4f::Translation({1, 2, 3}) * KTMatrix4x4f::Scaling({2, 4, 8})).GetInverse(inverse));
    EXPECT_EQ(inverse, KTMatrix4x4f::Scaling({0.5F, 0.25F, 0.125F}) * KTMatrix4x4f::Translation({-1, -2, -3}));
    unsigned const seed = std::random_device{}();
    std::mt19937 random(seed);
    std::uniform_real_distribution<float> element(-10, 10);
    int inverted = 0;
    for (int i = 0; i < 1000; ++i) {
        KTMatrix4x4f matrix;
        for (float &value : matrix.elements) {
            value = element(random);
        }
        if (std::fabs(matrix.Determinant()) < 100) {
            continue; // the rounding of the inverse to floats shows too much there
        }
        ++inverted;
        ASSERT_TRUE(matrix.GetInverse(inverse)) << "seed " << seed;
        ExpectNear(matrix * inverse, KTMatrix4x4f(), 1e-3F);
        ExpectNear(inverse * matrix, KTMatrix4x4f(), 1e-3F);
    }
    EXPECT_GT(inverted, 500);
}

TEST(Matrix, InverseOfItself) {
    KTMatrix4x4f matrix = KTMatrix4x4f::Scaling({2, 4, 8});
    ASSERT_TRUE(matrix.GetInverse(matrix));
    EXPECT_EQ(matrix, KTMatrix4x4f::Scaling({0.5F, 0.25F, 0.125F}));
}

TEST(Matrix, WithoutInverseLeavesTheResultAlone) {
    KTMatrix4x4f inverse = Sequence();
    EXPECT_FALSE(Sequence().GetInverse(inverse));
    EXPECT_FALSE(KTMatrix4x4f::Scaling({1, 0, 1}).GetInverse(inverse));
    EXPECT_FALSE(KTMatrix4x4f::Scaling({1, kNan, 1}).GetInverse(inverse));
    EXPECT_FALSE(KTMatrix4x4f::Scaling({1, kInfinity, 1}).GetInverse(inverse));
    EXPECT_FALSE(KTMatrix4x4f::Scaling({1, 1e-40F, 1}).GetInverse(inverse)) << "1e40 is no float";
    EXPECT_EQ(inverse, Sequence());
}

// ---- KTTransform ----

TEST(Transform, ShowsObjectsAsTheyAreAtFirst) {
    EXPECT_EQ(KTTransform().matrix, KTMatrix4x4f());
    EXPECT_EQ(KTTransform().color, KTColor4f(1, 1, 1, 1));
    KTTransform const transform(Sequence(), {0.1F, 0.2F, 0.3F, 0.4F});
    EXPECT_EQ(transform.matrix, Sequence());
    EXPECT_EQ(transform.color, KTColor4f(0.1F, 0.2F, 0.3F, 0.4F));
    KTTransform const copy(transform);
    EXPECT_EQ(copy, transform);
    EXPECT_NE(copy, KTTransform());
    EXPECT_NE(KTTransform({}, {1, 1, 1, 1}), KTTransform({}, {1, 1, 1, 0.5F}));
}

TEST(Transform, ScalesThenTurnsThenMoves) {
    KTTransform const transform({10, 20, 30}, {2, 3, 4}, {0, 0, 1}, kPi / 2, {0.1F, 0.2F, 0.3F, 0.4F});
    ExpectNear(transform.matrix.TransformPoint({1, 0, 0}), {10, 22, 30});
    ExpectNear(transform.matrix.TransformPoint({0, 1, 0}), {7, 20, 30});
    ExpectNear(transform.matrix.TransformPoint({0, 0, 1}), {10, 20, 34});
    EXPECT_EQ(transform.color, KTColor4f(0.1F, 0.2F, 0.3F, 0.4F));
    EXPECT_EQ(KTTransform({1, 2, 3}, {1, 1, 1}, {}, 5, {}).matrix, KTMatrix4x4f::Translation({1, 2, 3}));
}

// ---- what hosts and renderers rely on ----

TEST(GraphicsValues, ArePlainBytes) {
    EXPECT_TRUE(std::is_trivially_copyable_v<KTVector3f>);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTColor4f>);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTPlanef>);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTQuad3D>);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTMatrix4x4f>);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTTransform>);
    EXPECT_EQ(sizeof(KTVector3f), 12U);
    EXPECT_EQ(sizeof(KTColor4f), 16U);
    EXPECT_EQ(sizeof(KTPlanef), 16U);
    EXPECT_EQ(sizeof(KTQuad3D), 48U);
    EXPECT_EQ(sizeof(KTMatrix4x4f), 64U);
    EXPECT_EQ(sizeof(KTTransform), 80U);
    EXPECT_EQ(offsetof(KTTransform, color), 64U);
}
