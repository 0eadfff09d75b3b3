// InterpolationTest.cpp: the process-wide mode, numbers in both precisions bit by bit, and what is interpolated
// component by component.

#include "InterpolationMode.h"

#include "KTGraphicsStructs.h"
#include "KTInterpolator.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr float kInfinityF = std::numeric_limits<float>::infinity();
constexpr float kNanF = std::numeric_limits<float>::quiet_NaN();

std::uint32_t Bits(float value) { return std::bit_cast<std::uint32_t>(value); }
std::uint64_t Bits(double value) { return std::bit_cast<std::uint64_t>(value); }

float Way(float from, float to, float t) { return KTInterpolator::Interpolate(from, to, t); }
double Way(double from, double to, double t) { return KTInterpolator::Interpolate(from, to, t); }

} // namespace

// Tests run in one process, yet this holds in any order: every other test puts the mode back.
TEST(InterpolationMode, IsEasedAtFirst) {
    EXPECT_EQ(KTInterpolator::GetInterpolationMode(), kKTInterpolationEaseInEaseOut);
    EXPECT_EQ(static_cast<int>(kKTInterpolationLinear), 0);
    EXPECT_EQ(static_cast<int>(kKTInterpolationEaseInEaseOut), 1);
}

TEST(InterpolationMode, IsOneValueThatTheReferenceFollows) {
    KTInterpolationModeEnum const &mode = KTInterpolator::GetInterpolationMode();
    {
        ScopedInterpolationMode const linear(kKTInterpolationLinear);
        EXPECT_EQ(mode, kKTInterpolationLinear);
        EXPECT_EQ(&mode, &KTInterpolator::GetInterpolationMode());
        KTInterpolator::SetInterpolationMode(mode);
        EXPECT_EQ(mode, kKTInterpolationLinear);
        KTInterpolator::SetInterpolationMode(kUnknownMode);
        EXPECT_EQ(mode, kUnknownMode) << "any value is stored";
    }
    EXPECT_EQ(mode, kKTInterpolationEaseInEaseOut);
}

TEST(InterpolationMode, UnknownOnesThrow) {
    for (int const value : {-1, 2, std::numeric_limits<int>::max(), std::numeric_limits<int>::min()}) {
        ScopedInterpolationMode const unknown(static_cast<KTInterpolationModeEnum>(value));
        ExpectInternalError(47, [] { Way(0.0F, 1.0F, 0.5F); });
        ExpectInternalError(47, [] { Way(0.0, 1.0, 0.5); });
        ExpectInternalError(47, [] { Way(0.0, 1.0, 7.0); });
        ExpectInternalError(47, [] { KTTransform::Interpolate({}, {}, 0.5F); });
    }
}

// ---- linear ----

TEST(LinearInterpolation, FollowsTheFormula) {
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    EXPECT_EQ(Bits(Way(0.0F, 1.0F, 0.1F)), 0x3DCCCCCDU);
    EXPECT_EQ(Bits(Way(10.0F, -7.3F, 0.3F)), 0x4099EB85U);
    EXPECT_EQ(Bits(Way(3.0F, 200.0F, 0.77F)), 0x431AB0A4U);
    EXPECT_EQ(Bits(Way(0.0, 1.0, 0.1)), 0x3FB999999999999AU);
    EXPECT_EQ(Bits(Way(10.0, -7.3, 0.3)), 0x40133D70A3D70A3DU);
    EXPECT_EQ(Bits(Way(3.0, 200.0, 0.77)), 0x406356147AE147AEU);
}

TEST(LinearInterpolation, BothEndsOfTheWayBelongToIt) {
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    EXPECT_EQ(Way(2.0F, 6.0F, 0.0F), 2.0F);
    EXPECT_EQ(Way(2.0F, 6.0F, 1.0F), 6.0F);
    EXPECT_EQ(Way(2.0F, 6.0F, -0.0F), 2.0F);
    EXPECT_EQ(Way(2.0, 6.0, 0.0), 2.0);
    EXPECT_EQ(Way(2.0, 6.0, 1.0), 6.0);
    // What is not near each other: the end is the formula's, (1 - 1e20) * 1 + 1e20.
    EXPECT_EQ(Way(1e20F, 1.0F, 1.0F), 0.0F);
}

TEST(LinearInterpolation, OutsideOfTheWayThrows) {
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    for (double const t : {1.5, -0.5, kInfinity, -kInfinity, kNan, std::nextafter(1.0, 2.0),
                           -std::numeric_limits<double>::denorm_min()}) {
        ExpectInternalError(87, [t] { Way(0.0, 1.0, t); });
    }
    for (float const t : {1.5F, -0.5F, kInfinityF, -kInfinityF, kNanF, std::nextafter(1.0F, 2.0F),
                          -std::numeric_limits<float>::denorm_min()}) {
        ExpectInternalError(87, [t] { Way(0.0F, 1.0F, t); });
    }
}

TEST(LinearInterpolation, CarriesNanAndInfinity) {
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    EXPECT_TRUE(std::isnan(Way(kNan, 1.0, 0.5)));
    EXPECT_EQ(Way(0.0, kInfinity, 0.5), kInfinity);
    EXPECT_TRUE(std::isnan(Way(0.0F, kInfinityF, 0.0F))) << "infinity times 0";
    EXPECT_EQ(Way(-std::numeric_limits<double>::max(), std::numeric_limits<double>::max(), 0.5), kInfinity);
}

// ---- eased ----

namespace {

struct FloatCase {
    float from;
    float to;
    float t;
    std::uint32_t bits;
};

struct DoubleCase {
    double from;
    double to;
    double t;
    std::uint64_t bits;
};

// Computed apart from the library, with every operation rounded as it stands in the definition of the curve. The ways
// that start at 10 and 3 come out otherwise with the floats nearest to 0.21 and 0.4, or with 0.7 - 0.3 for 0.4.
constexpr FloatCase kFloatCases[] = {
    {0.0F, 1.0F, 0.1F, 0x3CC30C31U},    {0.0F, 1.0F, 0.15F, 0x3D5B6DB8U},    {0.0F, 1.0F, 0.25F, 0x3E186186U},
    {0.0F, 1.0F, 0.3F, 0x3E5B6DB8U},    {0.0F, 1.0F, 0.45F, 0x3EDB6DB6U},    {0.0F, 1.0F, 0.5F, 0x3F000000U},
    {0.0F, 1.0F, 0.6F, 0x3F24924AU},    {0.0F, 1.0F, 0.69F, 0x3F457C58U},    {0.0F, 1.0F, 0.7F, 0x3F492492U},
    {0.0F, 1.0F, 0.75F, 0x3F59E79FU},   {0.0F, 1.0F, 0.9F, 0x3F79E79EU},     {0.0F, 1.0F, 0.95F, 0x3F7E79E6U},
    {0.0F, 1.0F, 0.999F, 0x3F7FFFD7U},  {10.0F, -7.3F, 0.1F, 0x411968D7U},   {10.0F, -7.3F, 0.15F, 0x41112BE3U},
    {10.0F, -7.3F, 0.25F, 0x40ED9E7AU}, {10.0F, -7.3F, 0.3F, 0x40C95F16U},   {10.0F, -7.3F, 0.45F, 0x40257C5BU},
    {10.0F, -7.3F, 0.5F, 0x3FACCCD0U},  {10.0F, -7.3F, 0.6F, 0xBF8F8AF8U},   {10.0F, -7.3F, 0.69F, 0xC056202CU},
    {10.0F, -7.3F, 0.7F, 0xC065F15CU},  {10.0F, -7.3F, 0.75F, 0xC0973812U},  {10.0F, -7.3F, 0.9F, 0xC0DC6B46U},
    {10.0F, -7.3F, 0.95F, 0xC0E64E02U}, {10.0F, -7.3F, 0.999F, 0xC0E99940U}, {3.0F, 200.0F, 0.1F, 0x40F61862U},
    {3.0F, 200.0F, 0.15F, 0x4158DB6FU}, {3.0F, 200.0F, 0.25F, 0x4201430CU},  {3.0F, 200.0F, 0.3F, 0x4234DB6FU},
    {3.0F, 200.0F, 0.45F, 0x42AEDB6EU}, {3.0F, 200.0F, 0.5F, 0x42CB0000U},   {3.0F, 200.0F, 0.6F, 0x4301A493U},
    {3.0F, 200.0F, 0.69F, 0x431AF8B0U}, {3.0F, 200.0F, 0.7F, 0x431DC925U},   {3.0F, 200.0F, 0.75F, 0x432AAF3DU},
    {3.0F, 200.0F, 0.9F, 0x43434F3EU},  {3.0F, 200.0F, 0.95F, 0x4346D3D0U},  {3.0F, 200.0F, 0.999F, 0x4347FFE2U},
};

constexpr DoubleCase kDoubleCases[] = {
    {0.0, 1.0, 0.1, 0x3F98618618618619U},     {0.0, 1.0, 0.15, 0x3FAB6DB6DB6DB6DBU},
    {0.0, 1.0, 0.25, 0x3FC30C30C30C30C3U},    {0.0, 1.0, 0.3, 0x3FCB6DB6DB6DB6DBU},
    {0.0, 1.0, 0.45, 0x3FDB6DB6DB6DB6DCU},    {0.0, 1.0, 0.5, 0x3FE0000000000000U},
    {0.0, 1.0, 0.6, 0x3FE4924924924924U},     {0.0, 1.0, 0.69, 0x3FE8AF8AF8AF8AF8U},
    {0.0, 1.0, 0.7, 0x3FE924924924924AU},     {0.0, 1.0, 0.75, 0x3FEB3CF3CF3CF3D1U},
    {0.0, 1.0, 0.9, 0x3FEF3CF3CF3CF3D0U},     {0.0, 1.0, 0.95, 0x3FEFCF3CF3CF3CF5U},
    {0.0, 1.0, 0.999, 0x3FEFFFFB01BC6582U},   {10.0, -7.3, 0.1, 0x40232D1AD1AD1AD2U},
    {10.0, -7.3, 0.15, 0x4022257C57C57C58U},  {10.0, -7.3, 0.25, 0x401DB3CF3CF3CF3CU},
    {10.0, -7.3, 0.3, 0x40192BE2BE2BE2BEU},   {10.0, -7.3, 0.45, 0x4004AF8AF8AF8AF6U},
    {10.0, -7.3, 0.5, 0x3FF5999999999994U},   {10.0, -7.3, 0.6, 0xBFF1F15F15F15F1CU},
    {10.0, -7.3, 0.69, 0xC00AC405D9F73910U},  {10.0, -7.3, 0.7, 0xC00CBE2BE2BE2BE8U},
    {10.0, -7.3, 0.75, 0xC012E70270270275U},  {10.0, -7.3, 0.9, 0xC01B8D68D68D68DCU},
    {10.0, -7.3, 0.95, 0xC01CC9C09C09C0A0U},  {10.0, -7.3, 0.999, 0xC01D332866F4351CU},
    {3.0, 200.0, 0.1, 0x401EC30C30C30C31U},   {3.0, 200.0, 0.15, 0x402B1B6DB6DB6DB6U},
    {3.0, 200.0, 0.25, 0x4040286186186186U},  {3.0, 200.0, 0.3, 0x40469B6DB6DB6DB6U},
    {3.0, 200.0, 0.45, 0x4055DB6DB6DB6DB6U},  {3.0, 200.0, 0.5, 0x40595FFFFFFFFFFFU},
    {3.0, 200.0, 0.6, 0x4060349249249248U},   {3.0, 200.0, 0.69, 0x40635F15F15F15F0U},
    {3.0, 200.0, 0.7, 0x4063B92492492492U},   {3.0, 200.0, 0.75, 0x406555E79E79E79FU},
    {3.0, 200.0, 0.9, 0x406869E79E79E79EU},   {3.0, 200.0, 0.95, 0x4068DA79E79E79E6U},
    {3.0, 200.0, 0.999, 0x4068FFFC2855FA1BU},
};

} // namespace

TEST(EasedInterpolation, FloatsMatchBitByBit) {
    for (FloatCase const &one : kFloatCases) {
        EXPECT_EQ(Bits(Way(one.from, one.to, one.t)), one.bits) << one.from << " to " << one.to << " at " << one.t;
    }
}

TEST(EasedInterpolation, DoublesMatchBitByBit) {
    for (DoubleCase const &one : kDoubleCases) {
        EXPECT_EQ(Bits(Way(one.from, one.to, one.t)), one.bits) << one.from << " to " << one.to << " at " << one.t;
    }
}

TEST(EasedInterpolation, HasTheKnownPlaces) {
    EXPECT_NEAR(Way(0.0, 1.0, 0.3), 0.2142857, 1e-7);
    EXPECT_NEAR(Way(0.0F, 1.0F, 0.3F), 0.2142857F, 1e-7F);
    EXPECT_EQ(Way(0.0, 1.0, 0.5), 0.5);
    EXPECT_EQ(Way(0.0F, 1.0F, 0.5F), 0.5F);
    EXPECT_EQ(Way(0.0, 1.0, 1.0), 1.0);
    EXPECT_EQ(Way(0.0, 1.0, -0.5), 0.0);
}

TEST(EasedInterpolation, StaysAtItsEndsOutsideOfTheWay) {
    for (float const t : {1.0F, 1.5F, kInfinityF}) {
        EXPECT_EQ(Way(1e20F, 1.0F, t), 1.0F) << t;
    }
    for (float const t : {-0.001F, -1.5F, -kInfinityF}) {
        EXPECT_EQ(Way(1e20F, 1.0F, t), 1e20F) << t;
    }
    for (double const t : {1.0, 1.5, kInfinity}) {
        EXPECT_EQ(Way(kNan, 1.0, t), 1.0) << t << ": no computation takes part";
    }
    EXPECT_EQ(Way(3.0, kInfinity, -0.1), 3.0);
    EXPECT_EQ(Way(3.0, 9.0, 0.0), 3.0);
}

TEST(EasedInterpolation, NanGivesNan) {
    EXPECT_TRUE(std::isnan(Way(0.0F, 1.0F, kNanF)));
    EXPECT_TRUE(std::isnan(Way(0.0, 1.0, kNan)));
    EXPECT_TRUE(std::isnan(Way(kNan, 1.0, 0.5)));
    EXPECT_EQ(Way(0.0, kInfinity, 0.2), kInfinity);
}

TEST(EasedInterpolation, NeverTurnsBack) {
    double before = 0.0;
    for (int step = 0; step <= 10'000; ++step) {
        double const now = Way(0.0, 1.0, step / 10'000.0);
        ASSERT_GE(now, before) << step;
        before = now;
    }
    EXPECT_EQ(before, 1.0);
}

// ---- component by component ----

namespace {

float Part(float from, float to) { return Way(from, to, 0.2F); }

KTMatrix4x4f Ramp(float start, float step) {
    KTMatrix4x4f matrix;
    for (float &element : matrix.elements) {
        element = start;
        start += step;
    }
    return matrix;
}

void ExpectComponents() {
    EXPECT_EQ(KTVector3f::Interpolate({1, 2, 3}, {-4, 20, 0}, 0.2F), KTVector3f(Part(1, -4), Part(2, 20), Part(3, 0)));
    EXPECT_EQ(KTColor4f::Interpolate({0, 1, 0.5F, 0.25F}, {1, 0, 0.75F, 1}, 0.2F),
              KTColor4f(Part(0, 1), Part(1, 0), Part(0.5F, 0.75F), Part(0.25F, 1)));
    KTMatrix4x4f const a = Ramp(0, 1);
    KTMatrix4x4f const b = Ramp(100, -7);
    KTMatrix4x4f const between = KTMatrix4x4f::Interpolate(a, b, 0.2F);
    for (std::size_t i = 0; i < 16; ++i) {
        EXPECT_EQ(between.elements[i], Part(a.elements[i], b.elements[i])) << i;
    }
    KTTransform const transform = KTTransform::Interpolate({a, {0, 1, 0.5F, 0.25F}}, {b, {1, 0, 0.75F, 1}}, 0.2F);
    EXPECT_EQ(transform.matrix, between);
    EXPECT_EQ(transform.color, KTColor4f::Interpolate({0, 1, 0.5F, 0.25F}, {1, 0, 0.75F, 1}, 0.2F));
}

} // namespace

TEST(ComponentInterpolation, FollowsTheMode) {
    EXPECT_NE(Part(0, 1), 0.2F);
    ExpectComponents();
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    EXPECT_EQ(Part(0, 1), 0.2F);
    ExpectComponents();
}

TEST(ComponentInterpolation, ThrowsWhatTheNumbersThrow) {
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    ExpectInternalError(87, [] { KTVector3f::Interpolate({}, {}, 1.5F); });
    ExpectInternalError(87, [] { KTColor4f::Interpolate({}, {}, -0.5F); });
    ExpectInternalError(87, [] { KTMatrix4x4f::Interpolate({}, {}, kNanF); });
    ExpectInternalError(87, [] { KTTransform::Interpolate({}, {}, 1.5F); });
}
