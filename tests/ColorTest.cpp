// ColorTest.cpp: document colours, their two ARGB forms, and the stops of gradients.

#include "KTColor.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <string>
#include <type_traits>
#include <vector>

namespace {

using Lines = std::vector<std::string>;
using Components = std::vector<KTReal>;

constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr auto kOtherSpace = static_cast<KTColor::ColorSpaceEnum>(3);

KTARGB Stored(KTColor const &color) {
    KTARGB argb{7, 7, 7, 7};
    color.GetARGB(argb);
    return argb;
}

KTARGB Resultant(KTColor const &color) {
    KTARGB argb{7, 7, 7, 7};
    color.GetResultantARGB(argb);
    return argb;
}

KTColor Color(Components const &components, KTReal const &alpha = 1.0) {
    KTColor color;
    color.SetColorData(components);
    color.SetAlpha(alpha);
    return color;
}

} // namespace

TEST(Color, IsOpaqueBlackAtFirst) {
    KTColor color;
    EXPECT_EQ(Stored(color), (KTARGB{1, 0, 0, 0}));
    EXPECT_EQ(color.GetColorSpace(), KTColor::kColorSpaceRGB);
    EXPECT_EQ(static_cast<int>(KTColor::kColorSpaceRGB), 0);
    EXPECT_EQ(color.GetNumComponents(), 3);
    EXPECT_EQ(color.GetTransparencyFactor(), 1.0);
    EXPECT_EQ(color.GetColorAsUInt(), 0xFF000000U);
}

TEST(Color, ComesFromAnIntegerByteByByte) {
    KTColor color(0x80FF3300U);
    EXPECT_EQ(color.GetAlpha(), 128 / 255.0);
    EXPECT_EQ(color.GetColorData(), (Components{255 / 255.0, 51 / 255.0, 0.0}));
    EXPECT_EQ(color.GetNumComponents(), 3);
    EXPECT_EQ(color.GetNthComponent(0), 1.0);
    EXPECT_EQ(color.GetNthComponent(1), 0.2);
    EXPECT_EQ(color.GetNthComponent(2), 0.0);
    EXPECT_EQ(color.GetColorSpace(), KTColor::kColorSpaceRGB);
    EXPECT_EQ(color.GetTransparencyFactor(), 1.0);
}

TEST(Color, EveryByteGoesToAnIntegerAndBack) {
    LogLines log;
    for (KTUInt32 byte = 0; byte < 256; ++byte) {
        KTUInt32 const argb = byte << 24 | (255 - byte) << 16 | byte << 8 | (byte ^ 0x55U);
        EXPECT_EQ(KTColor(argb).GetColorAsUInt(), argb);
    }
    EXPECT_EQ(log.Take(), Lines{});
}

// ---- both ARGB forms ----

TEST(Color, StoredFormIgnoresTheFactor) {
    KTColor color = Color({0.25, 0.5, 0.75}, 0.8);
    color.SetTransparencyFactor(0.5);
    EXPECT_EQ(Stored(color), (KTARGB{0.8, 0.25, 0.5, 0.75}));
}

// Wanted as it is: the channels are scaled and the alpha is not.
TEST(Color, ResultantFormScalesTheChannelsAndNotTheAlpha) {
    KTColor color = Color({0.25, 0.5, 0.75}, 0.8);
    color.SetTransparencyFactor(0.5);
    EXPECT_EQ(Resultant(color), (KTARGB{0.8, 0.125, 0.25, 0.375}));
    EXPECT_EQ(color.GetResultantAlpha(), 0.4);
    EXPECT_EQ(color.GetAlpha(), 0.8);
    color.SetTransparencyFactor(0.0);
    EXPECT_EQ(Resultant(color), (KTARGB{0.8, 0, 0, 0}));
    EXPECT_EQ(color.GetResultantAlpha(), 0.0);
}

TEST(Color, RecordIsAlphaRedGreenBlue) {
    KTARGB const argb{1, 2, 3, 4};
    EXPECT_EQ(argb.alpha, 1);
    EXPECT_EQ(argb.red, 2);
    EXPECT_EQ(argb.green, 3);
    EXPECT_EQ(argb.blue, 4);
    EXPECT_EQ(KTARGB(), (KTARGB{0, 0, 0, 0}));
}

TEST(Color, MissingComponentsCountAsZero) {
    EXPECT_EQ(Stored(Color({})), (KTARGB{1, 0, 0, 0}));
    EXPECT_EQ(Resultant(Color({})), (KTARGB{1, 0, 0, 0}));
    EXPECT_EQ(Stored(Color({0.5})), (KTARGB{1, 0.5, 0, 0}));
    EXPECT_EQ(Resultant(Color({0.5, 0.25})), (KTARGB{1, 0.5, 0.25, 0}));
    EXPECT_EQ(Stored(Color({0.5, 0.25, 0.125, 0.75})), (KTARGB{1, 0.5, 0.25, 0.125})) << "a fourth one is left out";
}

// ---- setters ----

TEST(Color, SettersStoreWhatTheyGetAndSucceed) {
    KTColor color;
    EXPECT_EQ(color.SetAlpha(1.5), kKTErrorNone);
    EXPECT_EQ(color.GetAlpha(), 1.5);
    EXPECT_EQ(color.SetTransparencyFactor(-2), kKTErrorNone);
    EXPECT_EQ(color.GetTransparencyFactor(), -2);
    EXPECT_EQ(color.SetColorSpace(kOtherSpace), kKTErrorNone);
    EXPECT_EQ(color.GetColorSpace(), kOtherSpace);
    EXPECT_EQ(color.GetNumComponents(), 3) << "not converted";
    EXPECT_EQ(color.SetColorData(Components{1, 2, 3, 4, 5}), kKTErrorNone);
    EXPECT_EQ(color.GetColorData(), (Components{1, 2, 3, 4, 5}));
    EXPECT_EQ(color.GetNthComponent(4), 5);
    EXPECT_EQ(color.GetColorSpace(), kOtherSpace);
    EXPECT_EQ(color.SetColorData(KTColor::kColorSpaceRGB, {}), kKTErrorNone);
    EXPECT_EQ(color.GetColorSpace(), KTColor::kColorSpaceRGB);
    EXPECT_EQ(color.GetNumComponents(), 0);
    color.SetColorData(Components{0.5});
    color.SetColorData(color.GetColorData());
    EXPECT_EQ(color.GetColorData(), Components{0.5}) << "its own components";
    color.SetAlpha(kNan);
    EXPECT_TRUE(std::isnan(color.GetAlpha().AsDouble()));
}

TEST(Color, CopiesHoldAllFourFields) {
    KTColor color = Color({0.1, 0.2}, 0.3);
    color.SetTransparencyFactor(0.4);
    color.SetColorSpace(kOtherSpace);
    KTColor const copy(color);
    KTColor assigned;
    assigned = color;
    color = KTColor();
    for (KTColor one : {copy, assigned}) {
        EXPECT_EQ(one.GetColorData(), (Components{0.1, 0.2}));
        EXPECT_EQ(one.GetAlpha(), 0.3);
        EXPECT_EQ(one.GetTransparencyFactor(), 0.4);
        EXPECT_EQ(one.GetColorSpace(), kOtherSpace);
    }
}

// ---- equality ----

TEST(Color, IsEqualComparesSpaceAndComponents) {
    KTColor const color = Color({0.1, 0.2, 0.3});
    auto const isEqual = [&](KTColor const &other) { return color.IsEqual(&other); };
    EXPECT_EQ(isEqual(color), 1);
    EXPECT_EQ(isEqual(Color({0.1, 0.2, 0.3 + 0.9e-5})), 1);
    EXPECT_EQ(isEqual(Color({0.1 - 0.9e-5, 0.2, 0.3})), 1);
    EXPECT_EQ(isEqual(Color({0.1, 0.2, 0.3 + 1.1e-5})), 0);
    EXPECT_EQ(isEqual(Color({0.1, 0.2 - 1.1e-5, 0.3})), 0);
    EXPECT_EQ(isEqual(Color({0.1, 0.2})), 0);
    EXPECT_EQ(isEqual(Color({0.1, 0.2, 0.3, 0.4})), 0);
    KTColor otherSpace = color;
    otherSpace.SetColorSpace(kOtherSpace);
    EXPECT_EQ(isEqual(otherSpace), 0);
    EXPECT_EQ(color.IsEqual(nullptr), 0);
    EXPECT_TRUE((std::is_same_v<decltype(color.IsEqual(nullptr)), KTBool16>));
    KTColor const zero = Color({0.0});
    KTColor const tolerance = Color({1e-5});
    EXPECT_EQ(zero.IsEqual(&tolerance), 0) << "less than the tolerance, not equal to it";
    EXPECT_EQ(Color({}).IsEqual(&otherSpace), 0);
    KTColor const none = Color({});
    EXPECT_EQ(Color({}).IsEqual(&none), 1);
}

TEST(Color, IsEqualLeavesAlphaAndFactorOut) {
    KTColor const color = Color({0.1, 0.2, 0.3});
    KTColor other = Color({0.1, 0.2, 0.3}, 0.5);
    other.SetTransparencyFactor(0.5);
    EXPECT_EQ(color.IsEqual(&other), 1);
    EXPECT_EQ(color == other, 0) << "these count for ==";
    EXPECT_EQ(color != other, 1);
}

TEST(Color, NanEqualsNothing) {
    KTColor const color = Color({0.1, kNan, 0.3});
    EXPECT_EQ(color.IsEqual(&color), 0);
    KTColor const endless = Color({kInfinity});
    EXPECT_EQ(endless.IsEqual(&endless), 0) << "infinity less infinity";
}

TEST(Color, OperatorsCompareEverything) {
    KTColor const color = Color({0.1, 0.2, 0.3}, 0.5);
    EXPECT_EQ(color == Color({0.1, 0.2, 0.3}, 0.5 + 0.9e-5), 1);
    EXPECT_EQ(color == Color({0.1, 0.2, 0.3}, 0.5 + 1.1e-5), 0);
    EXPECT_EQ(color == Color({0.1, 0.2, 0.4}, 0.5), 0);
    KTColor faded = color;
    faded.SetTransparencyFactor(0.999);
    EXPECT_EQ(color == faded, 0);
    EXPECT_EQ(color != faded, 1);
    EXPECT_EQ(color != color, 0);
}

namespace {

// A colour of the host that answers otherwise than it stores.
class HostColor : public KTColor {
  public:
    using KTColor::KTColor;
    ColorSpaceEnum GetColorSpace() const override { return kOtherSpace; }
    KTReal GetAlpha() const override { return 0.5; }
};

} // namespace

TEST(Color, TheOthersSpaceIsAskedFor) {
    KTColor const plain(0xFF102030U);
    HostColor const host(0xFF102030U);
    EXPECT_EQ(plain.IsEqual(&host), 0);
    EXPECT_EQ(host.IsEqual(&plain), 1) << "its own space is the stored one";
    KTColor inThatSpace = plain;
    inThatSpace.SetColorSpace(kOtherSpace);
    EXPECT_EQ(inThatSpace.IsEqual(&host), 1);
}

// ---- as an integer ----

TEST(Color, IntegerTruncates) {
    LogLines log;
    EXPECT_EQ(Color({0.999, 0.5, 0.002}, 0.5).GetColorAsUInt(), 0x7FFE7F00U);
    EXPECT_EQ(Color({0.999}, 0.5).GetColorAsUInt(), 0x7FFE0000U) << "missing components";
    EXPECT_EQ(Color({}, 0.5).GetColorAsUInt(), 0x7F000000U) << "no components: the alpha alone";
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Color, IntegerTakesTheAlphaThatTheVirtualOperationTells) {
    EXPECT_EQ(HostColor(0xFF102030U).GetColorAsUInt(), 0x7F102030U);
}

TEST(Color, IntegerLeavesTheFactorOut) {
    KTColor color(0xFF808080U);
    color.SetTransparencyFactor(0.5);
    EXPECT_EQ(color.GetColorAsUInt(), 0xFF808080U);
}

TEST(Color, IntegerOfAmountsOutsideWraps) {
    LogLines log;
    EXPECT_EQ(Color({2.0, -1.0, 0.0}, 2.0).GetColorAsUInt(), 0xFEFE0100U) << "510, 510 and -255 by their low bytes";
    EXPECT_EQ(Color({kNan, 0.0, 1.0}, kNan).GetColorAsUInt(), 0x000000FFU);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Color, IntegerReportsWhatNoIntegerHolds) {
    LogLines log;
    EXPECT_EQ(Color({1e9, 0.0, -1e9}, 2e9).GetColorAsUInt(), 0xFFFF0000U);
    EXPECT_EQ(log.Take(), (Lines{"Assert failed: Value 510000000000.0000 is too large to convert to KTInt32 at "
                                 "source/public/includes/KTReal:432",
                                 "Assert failed: Value 255000000000.0000 is too large to convert to KTInt32 at "
                                 "source/public/includes/KTReal:432",
                                 "Assert failed: Value -255000000000.0000 is too small to convert to KTInt32 at "
                                 "source/public/includes/KTReal:431"}));
}

// ---- stops of gradients ----

TEST(ColorStop, HoldsAColourAndAPosition) {
    EXPECT_EQ(KTColorStop().position, 0.0);
    EXPECT_EQ(KTColorStop().color == KTColor(), 1);
    KTColorStop const stop(KTColor(0x80FF0000U), 0.25);
    EXPECT_EQ(stop.position, 0.25);
    EXPECT_EQ(stop.color.GetColorAsUInt(), 0x80FF0000U);
    EXPECT_EQ(stop == KTColorStop(KTColor(0x80FF0000U), 0.25 + 0.9e-5), 1);
    EXPECT_EQ(stop == KTColorStop(KTColor(0x80FF0000U), 0.25 + 1.1e-5), 0);
    EXPECT_EQ(stop == KTColorStop(KTColor(0x70FF0000U), 0.25), 0);
    EXPECT_EQ(stop != KTColorStop(KTColor(0x70FF0000U), 0.25), 1);
}

TEST(ColorStop, SortsByPositionWithNanLast) {
    std::vector<KTColorStop> stops;
    for (double const position : {0.5, kNan, 0.0, kInfinity, 1.0, kNan, -1.0}) {
        stops.emplace_back(KTColor(), position);
    }
    std::sort(stops.begin(), stops.end());
    std::vector<double> positions;
    positions.reserve(stops.size());
    for (KTColorStop const &stop : stops) {
        positions.push_back(stop.position);
    }
    EXPECT_EQ((std::vector<double>{positions.begin(), positions.begin() + 5}),
              (std::vector<double>{-1.0, 0.0, 0.5, 1.0, kInfinity}));
    EXPECT_TRUE(std::isnan(positions[5]) && std::isnan(positions[6]));
}
