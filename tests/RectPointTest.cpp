// RectPointTest.cpp: the nine reference points of rectangles, every one of them with every answer.

#include "KTRect.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <limits>
#include <random>
#include <string>
#include <type_traits>
#include <vector>

namespace {

using Lines = std::vector<std::string>;
using Points = std::array<KTRect::RefPoint, 9>;

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr Points kAll = {KTRect::kTopCenter,   KTRect::kLeftCenter, KTRect::kBottomCenter,
                         KTRect::kRightCenter, KTRect::kTopLeft,    KTRect::kTopRight,
                         KTRect::kBottomRight, KTRect::kBottomLeft, KTRect::kCenter};
constexpr int kNoPoints[] = {-1, 9, -2147483647 - 1, 2147483647};

constexpr char kInvalid[] = "Assert failed: Invalid RefPoint at source/private/utils/KTRect:248";
constexpr char kOutOfRange[] = "Assert failed: RefPoint out of range at source/private/utils/KTRect:563";
constexpr char kNoIndex[] = "Assert failed: RefPoint index out of range at source/private/utils/KTRect:590";
constexpr char kNoPlace[] = "Assert failed: RefPoint out of range at source/private/utils/KTRect:158";
constexpr char kNotOnOutline[] = "Assert failed: KTRect::IsCorner - whichPoint >= kFirstPoint && whichPoint <= "
                                 "kLastPoint at source/public/includes/KTRect:622";

KTRect::RefPoint Point(int value) { return static_cast<KTRect::RefPoint>(value); }

// What dragging a point of (0, 0, 10, 10) to a position leaves.
struct Dragged {
    KTRect::RefPoint point = KTRect::kNoPoint;
    KTPoint to;
    KTRect rect;
    int result = -1;
};

} // namespace

TEST(RectPoint, ValuesAreFixed) {
    for (std::size_t i = 0; i < kAll.size(); ++i) {
        EXPECT_EQ(static_cast<std::size_t>(kAll[i]), i);
    }
    EXPECT_EQ(static_cast<int>(KTRect::kFirstPoint), 0);
    EXPECT_EQ(static_cast<int>(KTRect::kLastPoint), 7);
    EXPECT_EQ(static_cast<int>(KTRect::kNoPoint), -1);
    EXPECT_EQ(sizeof(KTRect::RefPoint), 4U);
}

TEST(RectPoint, EachHasItsPlace) {
    LogLines log;
    KTRect const rect(1, 2, 5, 12);
    EXPECT_EQ(rect.GetPoint(KTRect::kTopCenter), KTPoint(3, 2));
    EXPECT_EQ(rect.GetPoint(KTRect::kLeftCenter), KTPoint(1, 7));
    EXPECT_EQ(rect.GetPoint(KTRect::kBottomCenter), KTPoint(3, 12));
    EXPECT_EQ(rect.GetPoint(KTRect::kRightCenter), KTPoint(5, 7));
    EXPECT_EQ(rect.GetPoint(KTRect::kTopLeft), KTPoint(1, 2));
    EXPECT_EQ(rect.GetPoint(KTRect::kTopRight), KTPoint(5, 2));
    EXPECT_EQ(rect.GetPoint(KTRect::kBottomRight), KTPoint(5, 12));
    EXPECT_EQ(rect.GetPoint(KTRect::kBottomLeft), KTPoint(1, 12));
    EXPECT_EQ(rect.GetPoint(KTRect::kCenter), KTPoint(3, 7));
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(RectPoint, InvertedEmptyAndInfiniteOnesHavePointsToo) {
    KTRect const inverted(10, 20, 0, 0);
    EXPECT_EQ(inverted.GetPoint(KTRect::kTopLeft), KTPoint(10, 20));
    EXPECT_EQ(inverted.GetPoint(KTRect::kCenter), KTPoint(5, 10));
    EXPECT_EQ(KTRect(3, 4, 3, 4).GetPoint(KTRect::kRightCenter), KTPoint(3, 4));
    KTRect const endless(-kInfinity, kNan, kInfinity, 1);
    EXPECT_TRUE(std::isnan(endless.GetPoint(KTRect::kCenter).x));
    EXPECT_EQ(endless.GetPoint(KTRect::kBottomRight), KTPoint(kInfinity, 1));
    double const huge = std::numeric_limits<double>::max();
    EXPECT_EQ(KTRect(huge, -huge, huge, huge).GetPoint(KTRect::kCenter), KTPoint(huge, 0)) << "no overflow";
}

TEST(RectPoint, NoPointHasNoPlace) {
    LogLines log;
    for (int const value : kNoPoints) {
        EXPECT_EQ(KTRect(1, 2, 5, 12).GetPoint(Point(value)), KTPoint(0, 0)) << value;
        EXPECT_EQ(log.Take(), Lines{kNoPlace}) << value;
    }
}

// ---- finding a point ----

TEST(RectPoint, IsFoundAtItsPlace) {
    KTRect const rect(0, 0, 10, 10);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(5, 0)), KTRect::kTopCenter);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(3, 3)), KTRect::kNoPoint);
    for (KTRect::RefPoint const point : kAll) {
        EXPECT_EQ(rect.GetRefPoint(rect.GetPoint(point)), point);
    }
}

TEST(RectPoint, IsFoundWithinTheTolerance) {
    KTRect const rect(0, 0, 10, 10);
    for (double const dx : {-1e-5, -9e-6, 0.0, 9e-6, 1e-5}) {
        for (double const dy : {-1e-5, 9e-6, 1e-5}) {
            EXPECT_EQ(rect.GetRefPoint(KTPoint(dx, dy)), KTRect::kTopLeft) << dx << " " << dy;
        }
    }
    EXPECT_EQ(rect.GetRefPoint(KTPoint(1.1e-5, 0)), KTRect::kNoPoint);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(0, -1.1e-5)), KTRect::kNoPoint);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(10.0000101, 10)), KTRect::kNoPoint);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(10.0000099, 9.9999901)), KTRect::kBottomRight);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(kNan, 0)), KTRect::kNoPoint);
    EXPECT_EQ(rect.GetRefPoint(KTPoint(0, kInfinity)), KTRect::kNoPoint);
}

TEST(RectPoint, TheFirstOfSeveralIsFound) {
    EXPECT_EQ(KTRect(3, 4, 3, 4).GetRefPoint(KTPoint(3, 4)), KTRect::kTopCenter);
    EXPECT_EQ(KTRect(0, 4, 10, 4).GetRefPoint(KTPoint(5, 4)), KTRect::kTopCenter);
    EXPECT_EQ(KTRect(0, 4, 10, 4).GetRefPoint(KTPoint(0, 4)), KTRect::kLeftCenter);
    EXPECT_EQ(KTRect(0, 4, 10, 4).GetRefPoint(KTPoint(10, 4)), KTRect::kRightCenter);
    EXPECT_EQ(KTRect(3, 0, 3, 10).GetRefPoint(KTPoint(3, 5)), KTRect::kLeftCenter);
    EXPECT_EQ(KTRect(3, 0, 3, 10).GetRefPoint(KTPoint(3, 10)), KTRect::kBottomCenter);
}

// ---- dragging a point ----

TEST(RectPointDrag, MovesTheEdgesItStandsOn) {
    LogLines log;
    KTPoint const inside(4, 3);
    Dragged const cases[] = {
        {KTRect::kTopCenter, inside, {0, 3, 10, 10}, 0},   {KTRect::kLeftCenter, inside, {4, 0, 10, 10}, 1},
        {KTRect::kBottomCenter, inside, {0, 0, 10, 3}, 2}, {KTRect::kRightCenter, inside, {0, 0, 4, 10}, 3},
        {KTRect::kTopLeft, inside, {4, 3, 10, 10}, 4},     {KTRect::kTopRight, inside, {0, 3, 4, 10}, 5},
        {KTRect::kBottomRight, inside, {0, 0, 4, 3}, 6},   {KTRect::kBottomLeft, inside, {4, 0, 10, 3}, 7},
    };
    for (Dragged const &one : cases) {
        KTRect rect(0, 0, 10, 10);
        EXPECT_EQ(static_cast<int>(rect.MovePointTo(one.point, one.to)), one.result);
        EXPECT_EQ(rect, one.rect) << one.point;
    }
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(RectPointDrag, AcrossTheOppositeEdgesMirrorsIt) {
    KTPoint const right(20, 5);
    KTPoint const left(-20, 5);
    KTPoint const below(5, 20);
    KTPoint const above(5, -20);
    Dragged const cases[] = {
        // left to right
        {KTRect::kTopLeft, right, {10, 5, 20, 10}, 5},
        {KTRect::kTopRight, left, {-20, 5, 0, 10}, 4},
        {KTRect::kLeftCenter, right, {10, 0, 20, 10}, 3},
        {KTRect::kRightCenter, left, {-20, 0, 0, 10}, 1},
        {KTRect::kBottomLeft, right, {10, 0, 20, 5}, 6},
        {KTRect::kBottomRight, left, {-20, 0, 0, 5}, 7},
        // top to bottom
        {KTRect::kTopLeft, below, {5, 10, 10, 20}, 7},
        {KTRect::kBottomLeft, above, {5, -20, 10, 0}, 4},
        {KTRect::kTopCenter, below, {0, 10, 10, 20}, 2},
        {KTRect::kBottomCenter, above, {0, -20, 10, 0}, 0},
        {KTRect::kTopRight, below, {0, 10, 5, 20}, 6},
        {KTRect::kBottomRight, above, {0, -20, 5, 0}, 5},
        // both: the second mirror acts on what the first one made
        {KTRect::kTopLeft, {20, 20}, {10, 10, 20, 20}, 6},
        {KTRect::kTopRight, {-20, 20}, {-20, 10, 0, 20}, 7},
        {KTRect::kBottomRight, {-20, -20}, {-20, -20, 0, 0}, 4},
        {KTRect::kBottomLeft, {20, -20}, {10, -20, 20, 0}, 5},
        // the middle of an edge knows one direction
        {KTRect::kTopCenter, {77, 20}, {0, 10, 10, 20}, 2},
        {KTRect::kLeftCenter, {20, 77}, {10, 0, 20, 10}, 3},
    };
    for (Dragged const &one : cases) {
        KTRect rect(0, 0, 10, 10);
        EXPECT_EQ(static_cast<int>(rect.MovePointTo(one.point, one.to)), one.result) << one.point;
        EXPECT_EQ(rect, one.rect) << one.point;
    }
}

// Wanted as it is: a crossing by less than the tolerance swaps the edges and keeps the point's value.
TEST(RectPointDrag, ASmallCrossingSwapsTheEdgesWithoutMirroring) {
    double const little = 0.9e-5;
    Dragged const cases[] = {
        {KTRect::kTopLeft, {10 + little, 5}, {10, 5, 10 + little, 10}, 4},
        {KTRect::kRightCenter, {-little, 5}, {-little, 0, 0, 10}, 3},
        {KTRect::kTopCenter, {5, 10 + little}, {0, 10, 10, 10 + little}, 0},
        {KTRect::kBottomRight, {-little, -little}, {-little, -little, 0, 0}, 6},
        {KTRect::kTopLeft, {10 + little, 20}, {10, 10, 10 + little, 20}, 7},
        {KTRect::kTopLeft, {10, 10}, {10, 10, 10, 10}, 4},
    };
    for (Dragged const &one : cases) {
        KTRect rect(0, 0, 10, 10);
        EXPECT_EQ(static_cast<int>(rect.MovePointTo(one.point, one.to)), one.result) << one.point;
        EXPECT_EQ(rect, one.rect) << one.point;
    }
    KTRect rect(0, 0, 10, 10);
    EXPECT_EQ(rect.MovePointTo(KTRect::kTopLeft, {10 + 1.1e-5, 5}), KTRect::kTopRight);
}

TEST(RectPointDrag, TheCentreAndNoPointAreReportedAndMoveNothing) {
    LogLines log;
    for (int const value : {8, -1, 9, 2147483647}) {
        KTRect rect(1, 2, 5, 12);
        EXPECT_EQ(static_cast<int>(rect.MovePointTo(Point(value), {100, 100})), value);
        EXPECT_EQ(rect, KTRect(1, 2, 5, 12)) << value;
        EXPECT_EQ(log.Take(), Lines{kInvalid}) << value;
    }
}

TEST(RectPointDrag, TheCentreAndNoPointStillPutAnInvertedOneRight) {
    LogLines log;
    for (int const value : {8, -1, 9}) {
        KTRect rect(5, 12, 1, 2);
        EXPECT_EQ(static_cast<int>(rect.MovePointTo(Point(value), {100, 100})), value) << "has no mirror image";
        EXPECT_EQ(rect, KTRect(1, 2, 5, 12));
    }
    EXPECT_EQ(log.Take().size(), 3U);
}

TEST(RectPointDrag, AnInvertedOneIsMirroredToo) {
    KTRect rect(10, 0, 0, 10);
    EXPECT_EQ(rect.MovePointTo(KTRect::kTopCenter, {5, 4}), KTRect::kTopCenter);
    EXPECT_EQ(rect, KTRect(0, 4, 10, 10));
    rect = KTRect(10, 0, 0, 10);
    EXPECT_EQ(rect.MovePointTo(KTRect::kTopLeft, {8, 4}), KTRect::kTopRight);
    EXPECT_EQ(rect, KTRect(0, 4, 8, 10));
}

TEST(RectPointDrag, NanAndInfinityStayWhereTheyArePut) {
    KTRect rect(0, 0, 10, 10);
    EXPECT_EQ(rect.MovePointTo(KTRect::kLeftCenter, {kNan, 5}), KTRect::kLeftCenter);
    EXPECT_TRUE(std::isnan(rect.left));
    EXPECT_EQ(rect.right, 10);
    rect = KTRect(0, 0, 10, 10);
    EXPECT_EQ(rect.MovePointTo(KTRect::kTopLeft, {kInfinity, -kInfinity}), KTRect::kTopRight);
    EXPECT_EQ(rect, KTRect(10, -kInfinity, kInfinity, 10));
}

// Wherever it is dragged, the returned point is where it was put, and the opposite one where it was.
TEST(RectPointDrag, TheReturnedPointIsWhereItWasPut) {
    unsigned const seed = std::random_device{}();
    std::mt19937 random(seed);
    std::uniform_real_distribution<double> coordinate(-100, 100);
    for (int i = 0; i < 10'000; ++i) {
        KTRect rect(KTPoint(coordinate(random), coordinate(random)), KTPoint(coordinate(random), coordinate(random)));
        KTRect::RefPoint const corner = Point(4 + i % 4);
        KTPoint const to(coordinate(random), coordinate(random));
        KTPoint const opposite = rect.GetOppositePoint(corner);
        KTRect::RefPoint const now = rect.MovePointTo(corner, to);
        ASSERT_TRUE(rect.IsNormalized()) << "seed " << seed;
        ASSERT_LE((rect.GetPoint(now) - to).Length(), 1.5e-5) << "seed " << seed;
        ASSERT_LE((rect.GetOppositePoint(now) - opposite).Length(), 1.5e-5) << "seed " << seed;
    }
}

// ---- opposites, corners, indices ----

TEST(RectPoint, OppositesLieAcrossTheCentre) {
    LogLines log;
    KTRect const rect(0, 0, 10, 10);
    Points const opposites = {KTRect::kBottomCenter, KTRect::kRightCenter, KTRect::kTopCenter,
                              KTRect::kLeftCenter,   KTRect::kBottomRight, KTRect::kBottomLeft,
                              KTRect::kTopLeft,      KTRect::kTopRight,    KTRect::kCenter};
    for (std::size_t i = 0; i < kAll.size(); ++i) {
        EXPECT_EQ(rect.GetOppositeRefPoint(kAll[i]), opposites[i]) << i;
        EXPECT_EQ(rect.GetOppositePoint(kAll[i]), rect.GetPoint(opposites[i])) << i;
    }
    EXPECT_EQ(rect.GetOppositePoint(KTRect::kTopLeft), KTPoint(10, 10));
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(RectPoint, NoPointHasNoOpposite) {
    LogLines log;
    for (int const value : kNoPoints) {
        EXPECT_EQ(KTRect(0, 0, 10, 10).GetOppositeRefPoint(Point(value)), KTRect::kNoPoint) << value;
        EXPECT_EQ(log.Take(), Lines{kNotOnOutline}) << value;
        EXPECT_EQ(KTRect(1, 1, 10, 10).GetOppositePoint(Point(value)), KTPoint(0, 0)) << value;
        EXPECT_EQ(log.Take(), (Lines{kNotOnOutline, kNoPlace})) << value;
    }
}

TEST(RectPoint, CornersAreFourToSeven) {
    LogLines log;
    KTRect const rect;
    for (int value = 0; value <= 7; ++value) {
        EXPECT_EQ(rect.IsCorner(Point(value)), value >= 4 ? 1 : 0) << value;
    }
    EXPECT_TRUE((std::is_same_v<decltype(rect.IsCorner(KTRect::kTopLeft)), short>));
    EXPECT_EQ(log.Take(), Lines{});
    for (int const value : {8, 9, -1, 2147483647}) {
        EXPECT_EQ(rect.IsCorner(Point(value)), 0) << value;
        EXPECT_EQ(log.Take(), Lines{kNotOnOutline}) << value << " is not on the outline";
    }
}

TEST(RectPoint, IndicesCountBackwards) {
    LogLines log;
    int const indices[] = {7, 6, 5, 4, 3, 2, 1, 0, 8};
    for (int value = 0; value <= 8; ++value) {
        EXPECT_EQ(KTRect::RefPointToIndex(Point(value)), indices[value]) << value;
        EXPECT_EQ(static_cast<int>(KTRect::IndexToRefPoint(indices[value])), value) << value;
    }
    EXPECT_EQ(log.Take(), Lines{});
    for (int const value : kNoPoints) {
        EXPECT_EQ(KTRect::RefPointToIndex(Point(value)), -1) << value;
        EXPECT_EQ(log.Take(), Lines{kOutOfRange}) << value;
        EXPECT_EQ(KTRect::IndexToRefPoint(value), KTRect::kNoPoint) << value;
        EXPECT_EQ(log.Take(), Lines{kNoIndex}) << value;
    }
}
