// RectTest.cpp: points, and the sizes and sets of rectangles; inverted, empty, NaN and infinite ones too.

#include "KTIntRect.h"
#include "KTPoint.h"
#include "KTRect.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <limits>
#include <numbers>
#include <type_traits>

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr double kHuge = 1e300;
constexpr double kPi = std::numbers::pi;

void ExpectNear(KTPoint const &actual, KTPoint const &expected, double tolerance = 1e-12) {
    EXPECT_NEAR(actual.x, expected.x, tolerance);
    EXPECT_NEAR(actual.y, expected.y, tolerance);
}

KTRect Inset(KTRect rect, double dx, double dy) {
    rect.Inset(dx, dy);
    return rect;
}

KTIntRect Inset(KTIntRect rect, KTInt32 dx, KTInt32 dy) {
    rect.Inset(dx, dy);
    return rect;
}

template <typename Rect> Rect Normalized(Rect rect) {
    rect.Normalize();
    return rect;
}

template <typename Rect, typename Number> Rect Moved(Rect rect, Number dx, Number dy) {
    rect.Offset(dx, dy);
    return rect;
}

} // namespace

// ---- KTPoint ----

TEST(Point, IsTheOriginAtFirst) {
    EXPECT_EQ(KTPoint(), KTPoint(0, 0));
    EXPECT_EQ(KTPoint(3, -4).x, 3);
    EXPECT_EQ(KTPoint(3, -4).y, -4);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTPoint>);
}

TEST(Point, ArithmeticActsByCoordinate) {
    KTPoint const a(6, -4);
    KTPoint const b(2, 1);
    EXPECT_EQ(a + b, KTPoint(8, -3));
    EXPECT_EQ(a - b, KTPoint(4, -5));
    EXPECT_EQ(a * 2, KTPoint(12, -8));
    EXPECT_EQ(2 * a, KTPoint(12, -8));
    EXPECT_EQ(a / 2, KTPoint(3, -2));
    EXPECT_EQ(-a, KTPoint(-6, 4));
    KTPoint c = a;
    c += b;
    EXPECT_EQ(c, KTPoint(8, -3));
    c -= b;
    EXPECT_EQ(c, a);
    c *= 2;
    EXPECT_EQ(c, KTPoint(12, -8));
    c /= 4;
    EXPECT_EQ(c, KTPoint(3, -2));
    EXPECT_EQ((a / 0).x, kInfinity);
    EXPECT_NE(KTPoint(kNan, 0), KTPoint(kNan, 0));
    EXPECT_NE(KTPoint(1, 2), KTPoint(1, 2.0000001));
}

TEST(Point, LengthsAndProducts) {
    EXPECT_EQ(KTPoint(3, -4).Length(), 5);
    EXPECT_EQ(KTPoint(1, 1).DistanceTo(KTPoint(4, 5)), 5);
    EXPECT_DOUBLE_EQ(KTPoint(3 * kHuge, 4 * kHuge).Length(), 5 * kHuge);
    EXPECT_DOUBLE_EQ(KTPoint(3 / kHuge, 4 / kHuge).Length(), 5 / kHuge);
    EXPECT_EQ(KTPoint(-kInfinity, 1).Length(), kInfinity);
    EXPECT_EQ(KTPoint(2, 3).Dot(KTPoint(5, -7)), -11);
    EXPECT_EQ(KTPoint(2, 3).Cross(KTPoint(5, -7)), -29);
    EXPECT_EQ(KTPoint(1, 0).Cross(KTPoint(0, 1)), 1) << "down is at a positive angle from right";
}

TEST(Point, AngleGrowsFromRightToDown) {
    EXPECT_EQ(KTPoint(2, 0).VectorAngle(), 0);
    EXPECT_DOUBLE_EQ(KTPoint(0, 2).VectorAngle(), kPi / 2);
    EXPECT_DOUBLE_EQ(KTPoint(3, 3).VectorAngle(), kPi / 4);
    EXPECT_DOUBLE_EQ(KTPoint(-2, 0).VectorAngle(), kPi);
    EXPECT_DOUBLE_EQ(KTPoint(-2, -0.0).VectorAngle(), kPi) << "one angle for the negative axis";
    EXPECT_DOUBLE_EQ(KTPoint(0, -2).VectorAngle(), -kPi / 2);
    EXPECT_EQ(KTPoint(0, 0).VectorAngle(), 0);
    EXPECT_EQ(KTPoint(-0.0, -0.0).VectorAngle(), 0);
    EXPECT_TRUE(std::isnan(KTPoint(kNan, 1).VectorAngle()));
}

TEST(Point, AngleBetweenVectorsHasASign) {
    EXPECT_DOUBLE_EQ(KTPoint(5, 0).VectorAngle(KTPoint(0, 3)), kPi / 2);
    EXPECT_DOUBLE_EQ(KTPoint(0, 3).VectorAngle(KTPoint(5, 0)), -kPi / 2);
    EXPECT_EQ(KTPoint(1, 1).VectorAngle(KTPoint(7, 7)), 0);
    EXPECT_DOUBLE_EQ(KTPoint(1, 0).VectorAngle(KTPoint(-1, 0)), kPi);
    EXPECT_DOUBLE_EQ(KTPoint(-1, -1).VectorAngle(KTPoint(-1, 1)), -kPi / 2) << "through the negative axis";
    EXPECT_EQ(KTPoint(0, 0).VectorAngle(KTPoint(-5, 3)), 0);
    EXPECT_EQ(KTPoint(-5, 3).VectorAngle(KTPoint(0, 0)), 0);
    EXPECT_DOUBLE_EQ(KTPoint(kHuge, 0).VectorAngle(KTPoint(0, kHuge)), kPi / 2) << "no overflow";
    EXPECT_DOUBLE_EQ(KTPoint(1 / kHuge, 0).VectorAngle(KTPoint(0, 1 / kHuge)), kPi / 2) << "no underflow";
    double const most = std::numeric_limits<double>::max();
    EXPECT_EQ(KTPoint(most, most).VectorAngle(KTPoint(most, most)), 0) << "no overflow in sums either";
    EXPECT_DOUBLE_EQ(KTPoint(most, most).VectorAngle(KTPoint(-most, most)), kPi / 2);
}

TEST(Point, RotatesAboutACentre) {
    ExpectNear(KTPoint(10, 0).RotateAbout(KTPoint(0, 0), kPi / 2), KTPoint(0, 10));
    ExpectNear(KTPoint(3, 1).RotateAbout(KTPoint(1, 1), kPi), KTPoint(-1, 1));
    ExpectNear(KTPoint(3, 1).RotateAbout(KTPoint(1, 1), -kPi / 2), KTPoint(1, -1));
    ExpectNear(KTPoint(2, 1).RotateAbout(KTPoint(1, 1), kPi / 4), KTPoint(1 + std::sqrt(0.5), 1 + std::sqrt(0.5)));
    EXPECT_EQ(KTPoint(3, 1).RotateAbout(KTPoint(1, 1), 0), KTPoint(3, 1));
    EXPECT_EQ(KTPoint(0.1, 0.7).RotateAbout(KTPoint(0.1, 0.7), 1.234), KTPoint(0.1, 0.7)) << "exactly";
    EXPECT_TRUE(std::isnan(KTPoint(1, 0).RotateAbout(KTPoint(), kInfinity).x));
}

TEST(Point, ProjectsOnLines) {
    ExpectNear(KTPoint(3, 7).ProjectOnLine(KTPoint(0, 0), KTPoint(10, 0)), KTPoint(3, 0));
    ExpectNear(KTPoint(0, 2).ProjectOnLine(KTPoint(0, 0), KTPoint(5, 5)), KTPoint(1, 1));
    ExpectNear(KTPoint(-4, 9).ProjectOnLine(KTPoint(1, 1), KTPoint(2, 1)), KTPoint(-4, 1));
    ExpectNear(KTPoint(5, 5).ProjectOnLine(KTPoint(0, 0), KTPoint(1, 1)), KTPoint(5, 5));
    EXPECT_EQ(KTPoint(3, 7).ProjectOnLine(KTPoint(1, 2), KTPoint(1, 2)), KTPoint(1, 2)) << "no line";
    ExpectNear(KTPoint(3, 7).ProjectOnLine(KTPoint(0, 0), KTPoint(1e-200, 0)), KTPoint(3, 0));
    KTPoint const far = KTPoint(3, 7).ProjectOnLine(KTPoint(0, 0), KTPoint(kHuge, 0));
    ExpectNear(far, KTPoint(3, 0));
    EXPECT_TRUE(std::isnan(KTPoint(kNan, 7).ProjectOnLine(KTPoint(0, 0), KTPoint(1, 0)).x));
}

TEST(Point, IsConstrainedToARectangle) {
    KTRect const bounds(0, 10, 20, 30);
    EXPECT_EQ(KTPoint(5, 15).ConstrainTo(bounds), KTPoint(5, 15));
    EXPECT_EQ(KTPoint(-5, 15).ConstrainTo(bounds), KTPoint(0, 15));
    EXPECT_EQ(KTPoint(25, 35).ConstrainTo(bounds), KTPoint(20, 30));
    EXPECT_EQ(KTPoint(20, 10).ConstrainTo(bounds), KTPoint(20, 10));
    EXPECT_EQ(KTPoint(-kInfinity, kInfinity).ConstrainTo(bounds), KTPoint(0, 30));
    EXPECT_EQ(KTPoint(5, 5).ConstrainTo(KTRect(20, 30, 0, 10)), KTPoint(5, 10)) << "inverted";
    EXPECT_EQ(KTPoint(5, 5).ConstrainTo(KTRect(3, 4, 3, 4)), KTPoint(3, 4)) << "empty";
    EXPECT_TRUE(std::isnan(KTPoint(kNan, 5).ConstrainTo(bounds).x));
    EXPECT_EQ(KTPoint(kNan, 5).ConstrainTo(bounds).y, 10);
    EXPECT_EQ(KTPoint(7, 50).ConstrainTo(KTRect(kNan, 0, kNan, 10)), KTPoint(7, 10)) << "NaN constrains nothing";
}

// ---- KTRect ----

TEST(Rect, IsMadeOfEdgesCornersOrPixels) {
    EXPECT_EQ(KTRect(), KTRect(0, 0, 0, 0));
    KTRect const rect(1, 2, 3, 4);
    EXPECT_EQ(rect.left, 1);
    EXPECT_EQ(rect.top, 2);
    EXPECT_EQ(rect.right, 3);
    EXPECT_EQ(rect.bottom, 4);
    EXPECT_EQ(KTRect(KTPoint(5, 1), KTPoint(2, 7)), KTRect(2, 1, 5, 7));
    EXPECT_EQ(KTRect(KTIntRect(INT_MIN, 2, INT_MAX, -4)), KTRect(-2147483648.0, 2, 2147483647.0, -4));
    EXPECT_NE(rect, KTRect(1, 2, 3, 4.0000001));
    EXPECT_NE(KTRect(kNan, 0, 0, 0), KTRect(kNan, 0, 0, 0));
}

TEST(Rect, SizeOfNormalAndInvertedOnes) {
    KTRect const rect(1, 2, 5, 4);
    EXPECT_EQ(rect.Width(), 4);
    EXPECT_EQ(rect.Height(), 2);
    EXPECT_EQ(rect.Area(), 8);
    EXPECT_EQ(rect.AspectRatio(), 2);
    KTRect const inverted(5, 2, 1, 4);
    EXPECT_EQ(inverted.Width(), -4);
    EXPECT_EQ(inverted.Area(), 8);
    EXPECT_EQ(inverted.AspectRatio(), 2);
    EXPECT_EQ(KTRect(1, 2, 5, 2).AspectRatio(), 0) << "no height";
    EXPECT_EQ(KTRect(1, 2, 1, 4).AspectRatio(), 0) << "no width";
    EXPECT_EQ(KTRect().AspectRatio(), 0);
    EXPECT_TRUE(std::isnan(KTRect(kNan, 2, 5, 4).AspectRatio()));
    EXPECT_EQ(KTRect(0, 0, kInfinity, 4).AspectRatio(), kInfinity);
}

TEST(Rect, NormalizeSwapsWhatIsInverted) {
    EXPECT_EQ(Normalized(KTRect(1, 2, 3, 4)), KTRect(1, 2, 3, 4));
    EXPECT_EQ(Normalized(KTRect(3, 2, 1, 4)), KTRect(1, 2, 3, 4));
    EXPECT_EQ(Normalized(KTRect(1, 4, 3, 2)), KTRect(1, 2, 3, 4));
    EXPECT_EQ(Normalized(KTRect(3, 4, 1, 2)), KTRect(1, 2, 3, 4));
    EXPECT_EQ(Normalized(KTRect(kInfinity, 4, -kInfinity, 2)), KTRect(-kInfinity, 2, kInfinity, 4));
    KTRect const unordered = Normalized(KTRect(5, 4, kNan, 2));
    EXPECT_EQ(unordered.left, 5);
    EXPECT_TRUE(std::isnan(unordered.right));
    EXPECT_EQ(unordered.top, 2);
    EXPECT_TRUE(KTRect(1, 2, 1, 2).IsNormalized());
    EXPECT_FALSE(KTRect(2, 2, 1, 2).IsNormalized());
    EXPECT_FALSE(KTRect(1, 3, 1, 2).IsNormalized());
    EXPECT_FALSE(unordered.IsNormalized());
}

TEST(Rect, EmptyOnesHaveNoInside) {
    EXPECT_FALSE(KTRect(0, 0, 1, 1).IsEmpty());
    EXPECT_TRUE(KTRect().IsEmpty());
    EXPECT_TRUE(KTRect(0, 0, 1, 0).IsEmpty());
    EXPECT_TRUE(KTRect(0, 0, 0, 1).IsEmpty());
    EXPECT_TRUE(KTRect(1, 0, 0, 1).IsEmpty());
    EXPECT_TRUE(KTRect(0, 1, 1, 0).IsEmpty());
    EXPECT_TRUE(KTRect(kNan, 0, 1, 1).IsEmpty());
    EXPECT_TRUE(KTRect(0, 0, 1, kNan).IsEmpty());
    EXPECT_FALSE(KTRect(-kInfinity, -kInfinity, kInfinity, kInfinity).IsEmpty());
}

TEST(Rect, OffsetMovesAllEdges) {
    EXPECT_EQ(Moved(KTRect(1, 2, 3, 4), 10.0, -1.0), KTRect(11, 1, 13, 3));
    EXPECT_EQ(Moved(KTRect(3, 4, 1, 2), 10.0, -1.0), KTRect(13, 3, 11, 1));
}

TEST(Rect, InsetMovesEdgesTowardsTheCentreAndNoFurther) {
    EXPECT_EQ(Inset(KTRect(0, 0, 10, 20), 1, 2), KTRect(1, 2, 9, 18));
    EXPECT_EQ(Inset(KTRect(0, 0, 10, 20), 5, 10), KTRect(5, 10, 5, 10));
    EXPECT_EQ(Inset(KTRect(0, 0, 10, 20), 6, 2), KTRect(5, 2, 5, 18)) << "they meet in the middle";
    EXPECT_EQ(Inset(KTRect(0, 0, 10, 20), -1, -2), KTRect(-1, -2, 11, 22));
    EXPECT_EQ(Inset(KTRect(10, 20, 0, 0), 1, 2), KTRect(9, 18, 1, 2)) << "inverted";
    EXPECT_EQ(Inset(KTRect(10, 20, 0, 0), 6, 11), KTRect(5, 10, 5, 10));
    EXPECT_EQ(Inset(KTRect(3, 4, 3, 4), -1, 5), KTRect(2, 4, 4, 4));
    EXPECT_TRUE(std::isnan(Inset(KTRect(0, 0, 10, 20), kNan, 0).left));
    EXPECT_EQ(Inset(KTRect(-kInfinity, 0, kInfinity, 20), 1, 1), KTRect(-kInfinity, 1, kInfinity, 19));
    KTRect expanded(0, 0, 10, 20);
    expanded.Expand(1, -2);
    EXPECT_EQ(expanded, KTRect(-1, 2, 11, 18));
}

TEST(Rect, ContainsPointsOnItsEdges) {
    KTRect const rect(0, 0, 10, 20);
    EXPECT_TRUE(rect.Contains(KTPoint(5, 5)));
    EXPECT_TRUE(rect.Contains(KTPoint(0, 20)));
    EXPECT_TRUE(rect.Contains(KTPoint(10, 0)));
    EXPECT_FALSE(rect.Contains(KTPoint(10.001, 5)));
    EXPECT_FALSE(rect.Contains(KTPoint(-0.001, 5)));
    EXPECT_FALSE(rect.Contains(KTPoint(5, -0.001)));
    EXPECT_FALSE(rect.Contains(KTPoint(5, 20.001)));
    EXPECT_FALSE(rect.Contains(KTPoint(kNan, 5)));
    EXPECT_FALSE(KTRect(10, 0, 0, 20).Contains(KTPoint(5, 5)));
    EXPECT_TRUE(KTRect(3, 3, 3, 3).Contains(KTPoint(3, 3)));
}

TEST(Rect, ContainsRectanglesInside) {
    KTRect const rect(0, 0, 10, 20);
    EXPECT_TRUE(rect.Contains(rect));
    EXPECT_TRUE(rect.Contains(KTRect(1, 1, 9, 19)));
    EXPECT_FALSE(rect.Contains(KTRect(-1, 1, 9, 19)));
    EXPECT_FALSE(rect.Contains(KTRect(1, -1, 9, 19)));
    EXPECT_FALSE(rect.Contains(KTRect(1, 1, 11, 19)));
    EXPECT_FALSE(rect.Contains(KTRect(1, 1, 9, 21)));
    EXPECT_FALSE(rect.Contains(KTRect(kNan, 1, 9, 19)));
}

TEST(Rect, IntersectsWhereInsidesMeet) {
    KTRect const rect(0, 0, 10, 20);
    EXPECT_TRUE(rect.Intersects(KTRect(5, 5, 15, 25)));
    EXPECT_EQ(rect.Intersection(KTRect(5, -5, 15, 15)), KTRect(5, 0, 10, 15));
    EXPECT_EQ(rect.Intersection(KTRect(-5, 5, 5, 25)), KTRect(0, 5, 5, 20));
    for (KTRect const &apart : {KTRect(10, 0, 20, 20), KTRect(-5, 0, 0, 20), KTRect(0, 20, 10, 30),
                                KTRect(0, -5, 10, 0), KTRect(5, 5, 5, 6), KTRect(8, 2, 2, 8), KTRect(2, kNan, 3, 4)}) {
        EXPECT_FALSE(rect.Intersects(apart));
        EXPECT_FALSE(apart.Intersects(rect));
        EXPECT_EQ(rect.Intersection(apart), KTRect());
    }
}

TEST(Rect, UnionLeavesEmptyOnesOut) {
    KTRect const rect(0, 0, 10, 20);
    EXPECT_EQ(rect.Union(KTRect(5, -5, 15, 15)), KTRect(0, -5, 15, 20));
    EXPECT_EQ(rect.Union(KTRect(-5, 30, 2, 40)), KTRect(-5, 0, 10, 40));
    EXPECT_EQ(rect.Union(KTRect(100, 100, 100, 200)), rect);
    EXPECT_EQ(KTRect(100, 100, 100, 200).Union(rect), rect);
    EXPECT_EQ(rect.Union(KTRect(kNan, 0, 1, 1)), rect);
    EXPECT_EQ(KTRect(9, 9, 9, 9).Union(KTRect(5, 5, 5, 5)), KTRect());
}

// ---- KTIntRect ----

TEST(IntRect, RoundsHalvesUp) {
    EXPECT_EQ(KTIntRect::Round(KTRect(2.5, -2.5, 2.4999999, -2.5000001)), KTIntRect(3, -2, 2, -3));
    EXPECT_EQ(KTIntRect::Round(KTRect(0.49999999999999994, -0.5, 0.5, -0.51)), KTIntRect(0, 0, 1, -1));
    EXPECT_EQ(KTIntRect::Round(KTRect(kNan, -kInfinity, kInfinity, 1e10)), KTIntRect(0, INT_MIN, INT_MAX, INT_MAX));
    EXPECT_EQ(KTIntRect::Round(KTRect(2147483646.5, -2147483648.5, 2147483647.5, -2147483649)),
              KTIntRect(INT_MAX, INT_MIN, INT_MAX, INT_MIN));
    EXPECT_EQ(KTIntRect::Round(KTRect(10, 5, 0, 0)), KTIntRect(10, 5, 0, 0)) << "inverted ones stay so";
}

TEST(IntRect, RoundsOutToWholePixels) {
    EXPECT_EQ(KTIntRect::RoundOut(KTRect(0.9, -0.1, 1.1, 0.1)), KTIntRect(0, -1, 2, 1));
    EXPECT_EQ(KTIntRect::RoundOut(KTRect(1, 2, 3, 4)), KTIntRect(1, 2, 3, 4));
    EXPECT_EQ(KTIntRect::RoundOut(KTRect(3.5, 4.5, 1.5, 2.5)), KTIntRect(1, 2, 4, 5)) << "inverted";
    EXPECT_EQ(KTIntRect::RoundOut(KTRect(kNan, -1e10, 1e10, kNan)), KTIntRect(0, INT_MIN, INT_MAX, 0));
}

TEST(IntRect, SizesDoNotOverflow) {
    KTIntRect const all(INT_MIN, INT_MIN, INT_MAX, INT_MAX);
    EXPECT_EQ(all.Width(), 4294967295LL);
    EXPECT_EQ(all.Height(), 4294967295LL);
    EXPECT_EQ(KTIntRect(INT_MAX, 0, INT_MIN, 0).Width(), -4294967295LL);
    EXPECT_EQ(KTIntRect(1, 2, 5, 4).Width(), 4);
    EXPECT_EQ(KTIntRect(1, 2, 5, 4).Height(), 2);
    EXPECT_EQ(KTIntRect(), KTIntRect(0, 0, 0, 0));
}

TEST(IntRect, EmptyAndInvertedOnes) {
    EXPECT_FALSE(KTIntRect(0, 0, 1, 1).IsEmpty());
    EXPECT_TRUE(KTIntRect(0, 0, 0, 1).IsEmpty());
    EXPECT_TRUE(KTIntRect(0, 0, 1, 0).IsEmpty());
    EXPECT_TRUE(KTIntRect(1, 0, 0, 1).IsEmpty());
    EXPECT_EQ(Normalized(KTIntRect(3, 4, 1, 2)), KTIntRect(1, 2, 3, 4));
    EXPECT_EQ(Normalized(KTIntRect(1, 2, 3, 4)), KTIntRect(1, 2, 3, 4));
}

TEST(IntRect, MovingAndSizingStopsAtTheLimits) {
    EXPECT_EQ(Moved(KTIntRect(1, 2, 3, 4), 10, -1), KTIntRect(11, 1, 13, 3));
    EXPECT_EQ(Moved(KTIntRect(0, 0, INT_MAX - 1, 5), INT_MAX, INT_MIN),
              KTIntRect(INT_MAX, INT_MIN, INT_MAX, INT_MIN + 5));
    EXPECT_EQ(Inset(KTIntRect(0, 0, 10, 20), 1, 2), KTIntRect(1, 2, 9, 18));
    EXPECT_EQ(Inset(KTIntRect(0, 0, 10, 21), 5, 11), KTIntRect(5, 10, 5, 10)) << "an odd height";
    EXPECT_EQ(Inset(KTIntRect(10, 20, 0, 0), 1, 2), KTIntRect(9, 18, 1, 2)) << "inverted";
    EXPECT_EQ(Inset(KTIntRect(0, 0, 10, 20), INT_MAX, INT_MIN), KTIntRect(5, INT_MIN, 5, INT_MAX));
    KTIntRect expanded(0, 0, 10, 20);
    expanded.Expand(1, -2);
    EXPECT_EQ(expanded, KTIntRect(-1, 2, 11, 18));
    expanded.Expand(INT_MIN, INT_MAX);
    EXPECT_EQ(expanded, KTIntRect(5, INT_MIN + 3, 5, INT_MAX)) << "2 - 2147483647 and the upper limit";
}

TEST(IntRect, HoldsPixelsAndNotItsFarEdges) {
    KTIntRect const rect(0, 0, 10, 20);
    EXPECT_TRUE(rect.Contains(0, 0));
    EXPECT_TRUE(rect.Contains(9, 19));
    EXPECT_FALSE(rect.Contains(10, 5));
    EXPECT_FALSE(rect.Contains(5, 20));
    EXPECT_FALSE(rect.Contains(-1, 5));
    EXPECT_FALSE(rect.Contains(5, -1));
    EXPECT_TRUE(rect.Contains(rect));
    EXPECT_TRUE(rect.Contains(KTIntRect(50, 50, 50, 60))) << "no pixel is outside";
    EXPECT_FALSE(rect.Contains(KTIntRect(5, 5, 11, 6)));
    EXPECT_FALSE(rect.Contains(KTIntRect(5, 5, 6, 21)));
    EXPECT_FALSE(rect.Contains(KTIntRect(-1, 5, 6, 6)));
    EXPECT_FALSE(rect.Contains(KTIntRect(1, -5, 6, 6)));
}

TEST(IntRect, SetsOfPixels) {
    KTIntRect const rect(0, 0, 10, 20);
    EXPECT_EQ(rect.Intersection(KTIntRect(5, -5, 15, 15)), KTIntRect(5, 0, 10, 15));
    EXPECT_EQ(rect.Union(KTIntRect(5, -5, 15, 15)), KTIntRect(0, -5, 15, 20));
    for (KTIntRect const &apart : {KTIntRect(10, 0, 20, 20), KTIntRect(-5, 0, 0, 20), KTIntRect(0, 20, 10, 30),
                                   KTIntRect(0, -5, 10, 0), KTIntRect(5, 5, 5, 6), KTIntRect(8, 2, 2, 8)}) {
        EXPECT_FALSE(rect.Intersects(apart));
        EXPECT_FALSE(apart.Intersects(rect));
        EXPECT_EQ(rect.Intersection(apart), KTIntRect());
    }
    EXPECT_EQ(rect.Union(KTIntRect(50, 50, 50, 60)), rect);
    EXPECT_EQ(KTIntRect(50, 50, 50, 60).Union(rect), rect);
    EXPECT_EQ(KTIntRect(9, 9, 9, 9).Union(KTIntRect(5, 5, 5, 5)), KTIntRect());
}
