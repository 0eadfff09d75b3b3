// ValuesTest.cpp: real numbers, durations and range checks.

#include "KTColor.h"
#include "KTDataValidator.h"
#include "KTDuration.h"
#include "KTReal.h"
#include "KTTime.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <bit>
#include <climits>
#include <cmath>
#include <cstdint>
#include <limits>
#include <ostream>
#include <random>
#include <string>
#include <type_traits>
#include <vector>

namespace {

using Lines = std::vector<std::string>;

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr auto kOtherUnit = static_cast<KTDurationUnitOfMeasure>(7);

KTInt32 ToInt(double value) { return static_cast<KTInt32>(KTReal(value)); }

std::uint64_t Bits(KTReal const &value) { return std::bit_cast<std::uint64_t>(value.AsDouble()); }

KTDuration Seconds(double amount) { return {amount, kKTDurationSeconds}; }

} // namespace

// ---- KTReal: the checked conversion ----

TEST(RealConversion, TruncatesTowardZero) {
    LogLines log;
    EXPECT_EQ(ToInt(2.9), 2);
    EXPECT_EQ(ToInt(-2.9), -2);
    EXPECT_EQ(ToInt(0.999), 0);
    EXPECT_EQ(ToInt(-0.999), 0);
    EXPECT_EQ(ToInt(kNan), 0);
    KTInt32 const implicit = KTReal(41.5);
    EXPECT_EQ(implicit, 41);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(RealConversion, BothLimitsAreWithin) {
    LogLines log;
    EXPECT_EQ(ToInt(2147483647.0), INT_MAX);
    EXPECT_EQ(ToInt(-2147483648.0), INT_MIN);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(RealConversion, TooLargeIsReported) {
    LogLines log;
    EXPECT_EQ(ToInt(3e9), INT_MAX);
    EXPECT_EQ(ToInt(2147483647.5), INT_MAX);
    EXPECT_EQ(log.Take(), (Lines{"Assert failed: Value 3000000000.0000 is too large to convert to KTInt32 at "
                                 "source/public/includes/KTReal:432",
                                 "Assert failed: Value 2147483647.5000 is too large to convert to KTInt32 at "
                                 "source/public/includes/KTReal:432"}));
    EXPECT_EQ(ToInt(std::nextafter(2147483647.0, 1e10)), INT_MAX);
    EXPECT_EQ(ToInt(kInfinity), INT_MAX);
    EXPECT_EQ(log.Take().size(), 2U);
}

TEST(RealConversion, TooSmallIsReported) {
    LogLines log;
    EXPECT_EQ(ToInt(-3e9), INT_MIN);
    EXPECT_EQ(ToInt(-2147483648.5), INT_MIN);
    EXPECT_EQ(log.Take(), (Lines{"Assert failed: Value -3000000000.0000 is too small to convert to KTInt32 at "
                                 "source/public/includes/KTReal:431",
                                 "Assert failed: Value -2147483648.5000 is too small to convert to KTInt32 at "
                                 "source/public/includes/KTReal:431"}));
    EXPECT_EQ(ToInt(std::nextafter(-2147483648.0, -1e10)), INT_MIN);
    EXPECT_EQ(ToInt(-kInfinity), INT_MIN);
    EXPECT_EQ(log.Take().size(), 2U);
}

TEST(RealConversion, FloatingPointTypesGetTheNumberItself) {
    LogLines log;
    double const asDouble = KTReal(3e9 + 0.5);
    float const asFloat = KTReal(1.26);
    EXPECT_EQ(asDouble, 3e9 + 0.5);
    EXPECT_EQ(asFloat, 1.26F);
    EXPECT_EQ(log.Take(), Lines{}) << "the conversion to an integer is not involved";
}

// ---- KTReal: what does not compile, because it would lose the fraction ----

namespace {

enum Count { kTwo = 2 };
enum class Scoped { kTwo = 2 };

template <typename T>
concept HasRemainder = requires(T a) { a % 2; };
template <typename T>
concept HasShift = requires(T a) { a << 1; };
template <typename T>
concept HasBitwise = requires(T a) { a & 1; };
template <typename T>
concept HasComplement = requires(T a) { ~a; };
template <typename T>
concept HasNot = requires(T a) { !a; };
template <typename T>
concept HasAnd = requires(T a) { a && true; };
template <typename T>
concept IsIndex = requires(T a, int const *numbers) { numbers[a]; };
template <typename T>
concept MovesPointer = requires(T a, int const *numbers) { numbers + a; };
template <typename T>
concept AddsToInt = requires(T a, int number) { number += a; };
template <typename T>
concept DividesInt = requires(T a, int number) { number /= a; };
template <typename T>
concept CutsInt = requires(T a, int number) { number %= a; };
template <typename T>
concept IsCut = requires(T a, int number) { a %= number; };
template <typename T>
concept Shifts = requires(T a, int number) { number << a; };
template <typename T>
concept IsWritten = requires(T a, std::ostream &out) { out << a; };
template <typename A, typename B>
concept Adds = requires(A a, B b) { a + b; };
template <typename A, typename B>
concept Compares = requires(A a, B b) { a == b; };

static_assert(HasRemainder<int> && HasShift<int> && HasBitwise<int> && HasComplement<int> && HasNot<int> &&
              HasAnd<int> && IsIndex<int> && MovesPointer<int> && AddsToInt<int> && DividesInt<int> && CutsInt<int> &&
              IsCut<int> && Shifts<int> && IsWritten<int>);
static_assert(!HasRemainder<KTReal>);
static_assert(!HasShift<KTReal>);
static_assert(!HasBitwise<KTReal>);
static_assert(!HasComplement<KTReal>);
static_assert(!HasNot<KTReal>);
static_assert(!HasAnd<KTReal>);
static_assert(!IsIndex<KTReal>);
static_assert(!MovesPointer<KTReal>);
static_assert(!AddsToInt<KTReal>);
static_assert(!DividesInt<KTReal>);
static_assert(!CutsInt<KTReal>);
static_assert(!IsCut<KTReal>);
static_assert(!Shifts<KTReal>);
static_assert(!IsWritten<KTReal>);

static_assert(std::is_convertible_v<KTReal, KTInt32>);
static_assert(std::is_convertible_v<KTReal, double>);
static_assert(std::is_convertible_v<KTReal, float>);
static_assert(!std::is_convertible_v<KTReal, bool>);
static_assert(!std::is_constructible_v<bool, KTReal>);
static_assert(!std::is_convertible_v<KTReal, char>);
static_assert(!std::is_convertible_v<KTReal, short>);
static_assert(!std::is_convertible_v<KTReal, unsigned short>);
static_assert(!std::is_convertible_v<KTReal, unsigned int>);
static_assert(!std::is_convertible_v<KTReal, long>);
static_assert(!std::is_convertible_v<KTReal, long long>);
static_assert(!std::is_convertible_v<KTReal, unsigned long long>);

static_assert(!Adds<KTReal, Scoped> && !Adds<Scoped, KTReal>);
static_assert(!Compares<KTReal, Scoped> && !Compares<KTReal, char const *>);
static_assert(!Adds<KTString, KTReal>, "a real is no character");

} // namespace

// ---- KTReal: arithmetic and comparison ----

TEST(RealArithmetic, CompoundOperatorsActOnTheDouble) {
    KTReal value(3.0);
    value += KTReal(2.5);
    EXPECT_EQ(value.AsDouble(), 5.5);
    value -= KTReal(0.25);
    EXPECT_EQ(value.AsDouble(), 5.25);
    value *= KTReal(-2.0);
    EXPECT_EQ(value.AsDouble(), -10.5);
    value /= KTReal(4.0);
    EXPECT_EQ(value.AsDouble(), -2.625);
    EXPECT_EQ(&(value += value), &value);
    EXPECT_EQ(value.AsDouble(), -5.25);
    value += 1;
    value *= 0.5F;
    EXPECT_EQ(value.AsDouble(), -2.125);
    EXPECT_EQ(KTReal().AsDouble(), 0.0);
}

TEST(RealArithmetic, DivisionByZeroIsAsIeeeSays) {
    KTReal value(1.0);
    EXPECT_EQ((value / 0).AsDouble(), kInfinity);
    EXPECT_EQ((-1 / KTReal()).AsDouble(), -kInfinity);
    value /= KTReal();
    EXPECT_EQ(value.AsDouble(), kInfinity);
    EXPECT_TRUE(std::isnan((KTReal() / KTReal()).AsDouble()));
}

namespace {

// Every operator with `number` on either side of a real; 4.5 and 2 are exact in every type.
template <typename T> void ExpectAllOperators(T number) {
    KTReal const real(4.5);
    EXPECT_EQ(Bits(real + number), Bits(6.5));
    EXPECT_EQ(Bits(number + real), Bits(6.5));
    EXPECT_EQ(Bits(real - number), Bits(2.5));
    EXPECT_EQ(Bits(number - real), Bits(-2.5));
    EXPECT_EQ(Bits(real * number), Bits(9.0));
    EXPECT_EQ(Bits(number * real), Bits(9.0));
    EXPECT_EQ(Bits(real / number), Bits(2.25));
    EXPECT_EQ(Bits(number / real), Bits(2.0 / 4.5));
    static_assert(std::is_same_v<decltype(real + number), KTReal>);
    static_assert(std::is_same_v<decltype(number / real), KTReal>);

    KTReal const fraction(2.5); // as an integer it would equal the number
    EXPECT_FALSE(fraction == number);
    EXPECT_FALSE(number == fraction);
    EXPECT_TRUE(fraction != number);
    EXPECT_TRUE(number != fraction);
    EXPECT_TRUE(fraction > number);
    EXPECT_TRUE(number < fraction);
    EXPECT_FALSE(fraction < number);
    EXPECT_FALSE(number > fraction);
    EXPECT_TRUE(fraction >= number);
    EXPECT_TRUE(number <= fraction);
    EXPECT_FALSE(fraction <= number);
    EXPECT_FALSE(number >= fraction);
    EXPECT_TRUE(KTReal(2.0) == number);
    EXPECT_TRUE(number == KTReal(2.0));
    EXPECT_TRUE(number <= KTReal(2.0));
}

} // namespace

TEST(RealArithmetic, EveryKindOfNumberMayStandOnEitherSide) {
    LogLines log;
    ExpectAllOperators(KTReal(2.0));
    ExpectAllOperators(2.0);
    ExpectAllOperators(2.0F);
    ExpectAllOperators(2.0L);
    ExpectAllOperators(2);
    ExpectAllOperators(2U);
    ExpectAllOperators(2L);
    ExpectAllOperators(2ULL);
    ExpectAllOperators(KTBool16{2});
    ExpectAllOperators(static_cast<unsigned char>(2));
    ExpectAllOperators(kTwo);
    EXPECT_EQ(Bits(KTReal(3e9) + 1), Bits(3e9 + 1));
    EXPECT_EQ(log.Take(), Lines{}) << "the conversion to an integer is not involved";
}

TEST(RealArithmetic, SignsAndFloatingPointVariables) {
    EXPECT_EQ(Bits(-KTReal(2.5)), Bits(-2.5));
    EXPECT_EQ(Bits(+KTReal(2.5)), Bits(2.5));
    EXPECT_TRUE(std::signbit((-KTReal(0.0)).AsDouble()));
    double number = 1.5;
    number += KTReal(2.25);
    EXPECT_EQ(number, 3.75);
    number -= KTReal(0.5);
    number *= KTReal(2.0);
    number /= KTReal(4.0);
    EXPECT_EQ(number, 1.625);
    float single = 1.0F;
    single += KTReal(0.1);
    EXPECT_EQ(single, static_cast<float>(1.1));
}

TEST(RealComparison, NanIsUnequalToEverythingAndUnordered) {
    KTReal const nan(kNan);
    for (KTReal const &other : {nan, KTReal(0.0), KTReal(kInfinity)}) {
        EXPECT_FALSE(nan == other);
        EXPECT_TRUE(nan != other);
        EXPECT_FALSE(nan < other);
        EXPECT_FALSE(nan <= other);
        EXPECT_FALSE(nan > other);
        EXPECT_FALSE(nan >= other);
    }
    EXPECT_FALSE(nan == 0.0);
    EXPECT_FALSE(0 == nan) << "as an integer it would be 0";
    EXPECT_TRUE((nan <=> nan) == std::partial_ordering::unordered);
    EXPECT_TRUE(KTReal(0.0) == KTReal(-0.0));
    EXPECT_TRUE(KTReal(-kInfinity) < KTReal(kInfinity));
}

// ---- KTDuration ----

TEST(Duration, StartsAsNoSeconds) {
    KTDuration const duration;
    EXPECT_EQ(duration.GetDurationUnitOfMeasure(), kKTDurationSeconds);
    EXPECT_EQ(duration.GetTimeWithFullPrecision().AsDouble(), 0.0);
    EXPECT_EQ(static_cast<int>(kKTDurationSeconds), 0);
    EXPECT_EQ(sizeof(KTDurationUnitOfMeasure), 4U);
}

TEST(Duration, KeepsAmountAndUnit) {
    KTDuration duration(1.23456789, kOtherUnit);
    EXPECT_EQ(Bits(duration.GetTimeWithFullPrecision()), Bits(1.23456789));
    EXPECT_EQ(duration.GetDurationUnitOfMeasure(), kOtherUnit);
    EXPECT_EQ(duration.SetTime(KTReal(-9.87654321)), kKTErrorNone);
    EXPECT_EQ(Bits(duration.GetTimeWithFullPrecision()), Bits(-9.87654321));
    EXPECT_EQ(duration.GetDurationUnitOfMeasure(), kOtherUnit);
    EXPECT_EQ(duration.SetDurationUnitOfMeasure(kKTDurationSeconds), kKTErrorNone);
    EXPECT_EQ(duration.GetDurationUnitOfMeasure(), kKTDurationSeconds);
    EXPECT_EQ(Bits(duration.GetTimeWithFullPrecision()), Bits(-9.87654321)) << "not rounded, not converted";

    KTDuration const copy(duration);
    EXPECT_EQ(copy, duration);
    KTDuration assigned(3.0, kOtherUnit);
    EXPECT_EQ(&(assigned = copy), &assigned);
    EXPECT_EQ(Bits(assigned.GetTimeWithFullPrecision()), Bits(-9.87654321));
    EXPECT_EQ(assigned.GetDurationUnitOfMeasure(), kKTDurationSeconds);
}

TEST(Duration, SumsTakeTheAmountsOnly) {
    KTDuration duration(1.5, kKTDurationSeconds);
    EXPECT_EQ(&(duration += KTDuration(2.25, kOtherUnit)), &duration);
    EXPECT_EQ(duration.GetTimeWithFullPrecision().AsDouble(), 3.75);
    EXPECT_EQ(duration.GetDurationUnitOfMeasure(), kKTDurationSeconds);
    EXPECT_EQ(&(duration -= Seconds(4.0)), &duration);
    EXPECT_EQ(duration.GetTimeWithFullPrecision().AsDouble(), -0.25);
}

TEST(Duration, TenthsAreRoundedHalfAwayFromZero) {
    struct Row {
        double seconds;
        int tenths;
    };
    for (Row const &row :
         {Row{0.0, 0}, Row{-0.0, 0}, Row{0.04, 0}, Row{0.05, 1}, Row{-0.04, 0}, Row{-0.05, -1}, Row{-0.06, -1},
          Row{1.26, 13}, Row{1.24, 12}, Row{-1.26, -13}, Row{-1.24, -12}, Row{0.5, 5}, Row{2.25, 23}, Row{-2.25, -23},
          Row{3600.0, 36000}, Row{-0.00001, 0}, Row{-0.000011, 0}, Row{100000000.0, 1000000000}}) {
        EXPECT_EQ(Seconds(row.seconds).GetTimeInDeciSeconds(), row.tenths) << row.seconds;
    }
}

TEST(Duration, TenthsBeyondAnIntGiveTheNearerLimit) {
    LogLines log;
    EXPECT_EQ(Seconds(214748364.7).GetTimeInDeciSeconds(), INT_MAX);
    EXPECT_EQ(Seconds(214748364.75).GetTimeInDeciSeconds(), INT_MAX);
    EXPECT_EQ(Seconds(-214748364.8).GetTimeInDeciSeconds(), INT_MIN);
    EXPECT_EQ(Seconds(-214748364.9).GetTimeInDeciSeconds(), INT_MIN);
    EXPECT_EQ(Seconds(214748364.6).GetTimeInDeciSeconds(), INT_MAX - 1);
    for (double const far : {1e300, std::numeric_limits<double>::max(), kInfinity}) {
        EXPECT_EQ(Seconds(far).GetTimeInDeciSeconds(), INT_MAX);
        EXPECT_EQ(Seconds(-far).GetTimeInDeciSeconds(), INT_MIN);
        EXPECT_EQ(Bits(Seconds(far).GetTime()), Bits(static_cast<double>(2147483648.0F / 10.0F)));
    }
    EXPECT_EQ(Seconds(kNan).GetTimeInDeciSeconds(), 0);
    EXPECT_EQ(Seconds(kNan).GetTime().AsDouble(), 0.0);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Duration, TimeIsRoundedThroughSinglePrecision) {
    EXPECT_EQ(Bits(Seconds(1.26).GetTime()), Bits(static_cast<double>(1.3F)));
    EXPECT_NE(Bits(Seconds(1.26).GetTime()), Bits(1.3));
    EXPECT_EQ(Bits(Seconds(-0.04).GetTime()), Bits(0.0)) << "an integer has no negative zero";
    EXPECT_EQ(Bits(Seconds(-0.06).GetTime()), Bits(static_cast<double>(-0.1F)));
    EXPECT_EQ(Bits(Seconds(0.5).GetTime()), Bits(0.5));
    // Beyond 2^24 tenths a float has no room for the last digit.
    EXPECT_EQ(Bits(Seconds(1677721.7).GetTime()), Bits(static_cast<double>(16777216.0F / 10.0F)));
}

TEST(Duration, TimeIsBitForBitTheFormula) {
    auto const formula = [](double seconds) {
        double const moved = seconds >= -0.00001 ? seconds + 0.05 : seconds - 0.05;
        float const tenths = static_cast<float>(static_cast<int>(moved * 10));
        return static_cast<double>(tenths / 10.0F);
    };
    for (int hundredths = -100000; hundredths <= 100000; ++hundredths) {
        double const seconds = hundredths / 100.0;
        ASSERT_EQ(Bits(Seconds(seconds).GetTime()), Bits(formula(seconds))) << seconds;
    }
    std::mt19937_64 random(20260105);
    std::uniform_real_distribution<double> amounts(-2e8, 2e8);
    for (int i = 0; i < 100000; ++i) {
        double const seconds = amounts(random);
        ASSERT_EQ(Bits(Seconds(seconds).GetTime()), Bits(formula(seconds))) << seconds;
    }
}

TEST(Duration, OtherUnitsAreNotRounded) {
    LogLines log;
    for (double const amount : {1.26, -0.04, 1e300, -kInfinity}) {
        EXPECT_EQ(Bits(KTDuration(amount, kOtherUnit).GetTime()), Bits(amount));
    }
    EXPECT_TRUE(std::isnan(KTDuration(kNan, kOtherUnit).GetTime().AsDouble()));
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Duration, TenthsOfOtherUnitsAreReported) {
    LogLines log;
    EXPECT_EQ(KTDuration(1.26, kOtherUnit).GetTimeInDeciSeconds(), 0);
    EXPECT_EQ(log.Take(), Lines{"Assert failed:  at source/private/utils/KTDuration:112"});
    EXPECT_EQ(KTDuration(1.26, static_cast<KTDurationUnitOfMeasure>(-1)).GetTimeInDeciSeconds(), 0);
    EXPECT_EQ(log.Take().size(), 1U);
    EXPECT_EQ(Seconds(1.26).GetTimeInDeciSeconds(), 13);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Duration, EqualWithinTheTolerance) {
    static_assert(std::is_same_v<decltype(KTDuration() == KTDuration()), KTBool16>);
    EXPECT_EQ(Seconds(1.0) == Seconds(1.0), 1);
    EXPECT_EQ(Seconds(1.0) == Seconds(1.000009), 1);
    EXPECT_EQ(Seconds(1.000009) == Seconds(1.0), 1);
    EXPECT_EQ(Seconds(1.0) == Seconds(1.000011), 0);
    EXPECT_EQ(Seconds(1.000011) == Seconds(1.0), 0);
    EXPECT_EQ(Seconds(0.0) == Seconds(0.00001), 0) << "the tolerance itself is too much";
    EXPECT_EQ(Seconds(0.0) == Seconds(-0.00001), 0);
    EXPECT_EQ(Seconds(0.0) == Seconds(std::nextafter(0.00001, 0.0)), 1);
    EXPECT_EQ(Seconds(1.0) != Seconds(1.0), 0);
    EXPECT_EQ(Seconds(1.0) != Seconds(2.0), 1);
}

TEST(Duration, EqualInTheSameUnitOnly) {
    EXPECT_EQ(Seconds(1.0) == KTDuration(1.0, kOtherUnit), 0);
    EXPECT_EQ(KTDuration(1.0, kOtherUnit) == KTDuration(1.0, kOtherUnit), 1);
    EXPECT_EQ(Seconds(1.0) != KTDuration(1.0, kOtherUnit), 1);
}

TEST(Duration, NanAndInfiniteAmountsEqualNothing) {
    EXPECT_EQ(Seconds(kNan) == Seconds(kNan), 0);
    EXPECT_EQ(Seconds(kInfinity) == Seconds(kInfinity), 0);
    EXPECT_EQ(Seconds(kInfinity) != Seconds(kInfinity), 1);
}

namespace {

class HostDuration : public KTDuration {
  public:
    explicit HostDuration(bool &destroyed) : m_Destroyed(destroyed) {}
    HostDuration(HostDuration const &) = delete;
    HostDuration &operator=(HostDuration const &) = delete;
    ~HostDuration() override { m_Destroyed = true; }
    KTReal GetTime() const override { return 42.5; }

  private:
    bool &m_Destroyed;
};

} // namespace

TEST(Duration, HostsMayDerive) {
    bool destroyed = false;
    KTDuration const *const duration = new HostDuration(destroyed);
    EXPECT_EQ(duration->GetTime().AsDouble(), 42.5);
    EXPECT_EQ(duration->GetTimeInDeciSeconds(), 0);
    delete duration;
    EXPECT_TRUE(destroyed);
}

// ---- KTDataValidator ----

namespace {

int CheckInt(int value, int least, int greatest) {
    return KTDataValidator::ValidateKTInt32(value, least, greatest, "field", "owner", 0);
}

int CheckUInt(unsigned int value, unsigned int least, unsigned int greatest) {
    return KTDataValidator::ValidateKTUInt32(value, least, greatest, "field", "owner", 0);
}

int CheckDouble(double value, double least, double greatest) {
    return KTDataValidator::ValidateDouble(value, least, greatest, "field", "owner", 0);
}

} // namespace

TEST(DataValidator, SignedNumbers) {
    EXPECT_EQ(CheckInt(5, 5, 5), 0);
    EXPECT_EQ(CheckInt(6, 5, 5), 1);
    EXPECT_EQ(CheckInt(4, 5, 5), 1);
    EXPECT_EQ(CheckInt(-1, -1, 1), 0);
    EXPECT_EQ(CheckInt(-2, -1, 1), 1);
    EXPECT_EQ(CheckInt(INT_MIN, INT_MIN, INT_MAX), 0);
    EXPECT_EQ(CheckInt(INT_MAX, INT_MIN, INT_MAX), 0);
    EXPECT_EQ(CheckInt(5, 6, 4), 1) << "an empty range";
}

TEST(DataValidator, UnsignedNumbers) {
    EXPECT_EQ(CheckUInt(5, 5, 5), 0);
    EXPECT_EQ(CheckUInt(6, 5, 5), 1);
    EXPECT_EQ(CheckUInt(4, 5, 5), 1);
    EXPECT_EQ(CheckUInt(UINT_MAX, 0, INT_MAX), 1) << "not compared as -1";
    EXPECT_EQ(CheckUInt(UINT_MAX, 0, UINT_MAX), 0);
}

TEST(DataValidator, Doubles) {
    EXPECT_EQ(CheckDouble(0.5, 0.0, 1.0), 0);
    EXPECT_EQ(CheckDouble(0.0, 0.0, 1.0), 0);
    EXPECT_EQ(CheckDouble(1.0, 0.0, 1.0), 0);
    EXPECT_EQ(CheckDouble(std::nextafter(1.0, 2.0), 0.0, 1.0), 1);
    EXPECT_EQ(CheckDouble(-1e-300, 0.0, 1.0), 1);
    EXPECT_EQ(CheckDouble(kInfinity, 0.0, kInfinity), 0);
    EXPECT_EQ(CheckDouble(kNan, 0.0, 1.0), 1);
    EXPECT_EQ(CheckDouble(0.5, kNan, 1.0), 1);
    EXPECT_EQ(CheckDouble(0.5, 0.0, kNan), 1);
    EXPECT_EQ(CheckDouble(kNan, kNan, kNan), 1);
}

TEST(DataValidator, NoTimePasses) {
    KTTime const time(100);
    EXPECT_EQ(KTDataValidator::ValidateTimeData(time, KTTime(0), KTTime(200), "field", "owner", 0), 1);
    EXPECT_EQ(KTDataValidator::ValidateTimeData(time, time, time, "field", "owner", 0), 1);
}

TEST(DataValidator, NoColorPasses) {
    KTColor const color(0xFF102030U);
    EXPECT_EQ(KTDataValidator::ValidateColor(color, color, color, "field", "owner", 0), 1);
}
