// TimeTest.cpp: points in time: counts, local dates, the ends of the scale, and how times compare.
//
// The tests hold in every time zone; the build runs the program in several. What they need to know of the zone, its offset
// now, they read from a conversion of a known count. KT_OFFSETS, when set, lists the offsets (minutes east of UTC, winter
// and summer) of which that must be one.

#include "KTTime.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <climits>
#include <cstdlib>
#include <iterator>
#include <sstream>
#include <string>
#include <vector>

namespace {

constexpr KTUInt64 kSecond = 10'000'000;
constexpr KTUInt64 kMinute = 60 * kSecond;
constexpr KTUInt64 kHour = 60 * kMinute;
constexpr KTUInt64 kDay = 24 * kHour;
constexpr KTUInt64 kUnixEpoch = 116444736000000000;                    // 1970-01-01 00:00 UTC
constexpr KTUInt64 kNoon = kUnixEpoch + 20468 * kDay + 12 * kHour;     // 2026-01-15 12:00 UTC, a Thursday
constexpr KTUInt64 kJulyNoon = kUnixEpoch + 20649 * kDay + 12 * kHour; // 2026-07-15 12:00 UTC
constexpr KTUInt64 kLastCount = 0x7FFFFFFFFFFFFFFF;

using Fields = std::array<int, 7>; // year, month, day, hour, minute, second, weekday

bool Get(KTTime const &time, Fields &fields) {
    return time.GetTime(&fields[0], &fields[1], &fields[2], &fields[3], &fields[4], &fields[5], &fields[6]);
}

Fields FieldsOf(KTTime const &time) {
    Fields fields{};
    EXPECT_TRUE(Get(time, fields));
    return fields;
}

// Local time minus UTC, now, in minutes; noon stays within a day of its date in every zone.
int OffsetAt(KTUInt64 noon, int day) {
    Fields const fields = FieldsOf(KTTime(noon));
    return (fields[2] - day) * 24 * 60 + (fields[3] - 12) * 60 + fields[4];
}

int Offset() { return OffsetAt(kNoon, 15); }

KTUInt64 ToUtc(KTUInt64 local) { return local - static_cast<KTUInt64>(static_cast<KTInt64>(Offset())) * kMinute; }

KTUInt64 CountOf(int year, int month, int day, int hour, int minute) {
    KTTime time;
    EXPECT_TRUE(time.SetTime(year, month, day, hour, minute, 0));
    return time.GetInternalTime();
}

} // namespace

// ---- the count ----

TEST(Time, NoTimeIsTheCountZero) {
    EXPECT_FALSE(KTTime().IsValid());
    EXPECT_EQ(KTTime().GetInternalTime(), 0U);
    EXPECT_FALSE(KTTime(0).IsValid());
    EXPECT_TRUE(KTTime(1).IsValid());
    EXPECT_TRUE(KTTime(0xFFFFFFFFFFFFFFFF).IsValid());
    KTTime time(5);
    time.SetTime(0);
    EXPECT_FALSE(time.IsValid());
}

TEST(Time, CountsAreKeptAsTheyAre) {
    for (KTUInt64 const count : {KTUInt64{1}, kNoon + 3, kLastCount, kLastCount + 1, KTUInt64{0xFFFFFFFFFFFFFFFF}}) {
        EXPECT_EQ(KTTime(count).GetInternalTime(), count);
        KTTime time;
        time.SetTime(count);
        EXPECT_EQ(time.GetInternalTime(), count);
        KTTime const copy(time);
        EXPECT_EQ(copy.GetInternalTime(), count);
        KTTime assigned(7);
        assigned = copy;
        EXPECT_EQ(assigned.GetInternalTime(), count);
    }
}

TEST(Time, CurrentTimeIsTheSystemsTime) {
    auto const now = [] {
        auto const since = std::chrono::system_clock::now().time_since_epoch();
        auto const microseconds = std::chrono::duration_cast<std::chrono::microseconds>(since).count();
        return kUnixEpoch + static_cast<KTUInt64>(microseconds) * 10;
    };
    // The system's coarse clock ticks up to 64 times a second only.
    KTUInt64 const before = now() - kSecond / 10;
    KTUInt64 const current = KTTime::CurrentTime();
    EXPECT_GE(current, before);
    EXPECT_LE(current, now() + kSecond / 10);
    EXPECT_GE(KTTime::CurrentTime(), current);
}

TEST(Time, IsDestroyedThroughItsBase) {
    static_assert(std::has_virtual_destructor_v<KTTime>);
    EXPECT_EQ(sizeof(KTTime), 16U);
}

// ---- local dates ----

TEST(LocalTime, FieldsAreThoseOfTheZone) {
    int const offset = Offset();
    if (char const *const known = std::getenv("KT_OFFSETS")) {
        std::istringstream words(known);
        std::vector<int> const offsets{std::istream_iterator<int>(words), {}};
        EXPECT_NE(std::find(offsets.begin(), offsets.end(), offset), offsets.end()) << offset;
    }
    // The same instant, moved so that the local fields are known.
    EXPECT_EQ(FieldsOf(KTTime(ToUtc(kNoon))), (Fields{2026, 1, 15, 12, 0, 0, 5}));
    EXPECT_EQ(FieldsOf(KTTime(ToUtc(kNoon) + 59 * kMinute + 59 * kSecond + kSecond - 1)),
              (Fields{2026, 1, 15, 12, 59, 59, 5}));
    KTTime time;
    EXPECT_TRUE(time.SetTime(2026, 1, 15, 12, 34, 56));
    EXPECT_EQ(time.GetInternalTime(), ToUtc(kNoon) + 34 * kMinute + 56 * kSecond) << "milliseconds are 0";
}

TEST(LocalTime, TheOffsetOfTodayServesEveryDate) { EXPECT_EQ(OffsetAt(kJulyNoon, 15), Offset()); }

TEST(LocalTime, WeekdaysCountFromSunday) {
    for (int day = 0; day < 14; ++day) { // 2026-11-01 is a Sunday
        EXPECT_EQ(FieldsOf(KTTime(CountOf(2026, 11, 1 + day, 12, 0)))[6], day % 7 + 1) << day;
    }
}

TEST(LocalTime, LeapDays) {
    KTTime time;
    EXPECT_TRUE(time.SetTime(2000, 2, 29, 0, 0, 0));
    EXPECT_EQ(FieldsOf(time), (Fields{2000, 2, 29, 0, 0, 0, 3}));
    EXPECT_TRUE(time.SetTime(2028, 2, 29, 23, 59, 59));
    EXPECT_EQ(FieldsOf(time), (Fields{2028, 2, 29, 23, 59, 59, 3}));
    EXPECT_FALSE(time.SetTime(1900, 2, 29, 0, 0, 0));
    EXPECT_FALSE(time.SetTime(2026, 2, 29, 0, 0, 0));
    EXPECT_EQ(FieldsOf(time), (Fields{2028, 2, 29, 23, 59, 59, 3}));
}

TEST(LocalTime, SkippedAndRepeatedHoursKeepTheirFields) {
    struct Change {
        int month, day, hour;
    };
    // 2026 in Central Europe, on the Pacific coast and in New Zealand: the hour left out, then the hour repeated.
    for (Change const &change :
         {Change{3, 29, 2}, Change{10, 25, 2}, Change{3, 8, 2}, Change{11, 1, 1}, Change{9, 27, 2}, Change{4, 5, 2}}) {
        KTUInt64 const before = CountOf(2026, change.month, change.day, change.hour - 1, 30);
        KTUInt64 const within = CountOf(2026, change.month, change.day, change.hour, 30);
        KTUInt64 const after = CountOf(2026, change.month, change.day, change.hour + 1, 30);
        EXPECT_EQ(within - before, kHour) << change.month;
        EXPECT_EQ(after - within, kHour) << change.month;
        EXPECT_EQ(FieldsOf(KTTime(within)), (Fields{2026, change.month, change.day, change.hour, 30, 0, 1}));
    }
}

TEST(LocalTime, WhatIsSetIsReadAgain) {
    for (int year : {1602, 1752, 1969, 1970, 2026, 9999, 30827}) {
        for (int month = 1; month <= 12; ++month) {
            KTTime time;
            ASSERT_TRUE(time.SetTime(year, month, 28, month, 3 * month, 59));
            Fields fields = FieldsOf(time);
            fields[6] = 0;
            EXPECT_EQ(fields, (Fields{year, month, 28, month, 3 * month, 59, 0}));
        }
    }
}

TEST(LocalTime, NullPlacesArePassedOver) {
    KTTime const time(ToUtc(kNoon) + 34 * kMinute + 56 * kSecond);
    Fields const expected{2026, 1, 15, 12, 34, 56, 5};
    ASSERT_EQ(FieldsOf(time), expected);
    for (std::size_t left = 0; left <= expected.size(); ++left) {
        Fields fields;
        fields.fill(-1);
        std::array<int *, 7> places{};
        for (std::size_t i = 0; i < places.size(); ++i) {
            places[i] = i == left ? nullptr : &fields[i];
        }
        EXPECT_TRUE(time.GetTime(places[0], places[1], places[2], places[3], places[4], places[5], places[6]));
        for (std::size_t i = 0; i < places.size(); ++i) {
            EXPECT_EQ(fields[i], i == left ? -1 : expected[i]) << left << ' ' << i;
        }
    }
    EXPECT_TRUE(time.GetTime(nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr));
    EXPECT_FALSE(KTTime().GetTime(nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr));
}

TEST(LocalTime, RefusedDatesLeaveTheOldTime) {
    KTTime time(kNoon + 1);
    for (auto const &[year, month, day, hour, minute, second] : std::vector<std::array<int, 6>>{
             {2026, 13, 1, 0, 0, 0},    {2026, 0, 1, 0, 0, 0},      {2026, 2, 30, 0, 0, 0},
             {2026, 4, 31, 0, 0, 0},    {2026, 1, 0, 0, 0, 0},      {2026, 1, 32, 0, 0, 0},
             {1600, 1, 1, 0, 0, 0},     {1600, 12, 31, 23, 59, 59}, {0, 1, 1, 0, 0, 0},
             {2026, 1, 1, 24, 0, 0},    {2026, 1, 1, 0, 60, 0},     {2026, 1, 1, 0, 0, 60},
             {-1, 1, 1, 0, 0, 0},       {2026, -1, 1, 0, 0, 0},     {2026, 1, -1, 0, 0, 0},
             {2026, 1, 1, -1, 0, 0},    {2026, 1, 1, 0, -1, 0},     {2026, 1, 1, 0, 0, -1},
             {30829, 1, 1, 0, 0, 0},    {65535, 1, 1, 0, 0, 0},     {67562, 1, 1, 0, 0, 0},
             {2026, 65537, 1, 0, 0, 0}, {2026, 1, 65537, 0, 0, 0},  {2026, 1, 1, 65536, 0, 0},
             {2026, 1, 1, 0, 65536, 0}, {2026, 1, 1, 0, 0, 65536},  {INT_MAX, 1, 1, 0, 0, 0},
             {INT_MIN, 1, 1, 0, 0, 0}}) {
        EXPECT_FALSE(time.SetTime(year, month, day, hour, minute, second)) << year << '-' << month << '-' << day;
        EXPECT_EQ(time.GetInternalTime(), kNoon + 1);
    }
}

// ---- the ends of the scale ----

TEST(TimeLimits, TheScaleBeginsIn1601Utc) {
    KTTime time(kNoon);
    bool const set = time.SetTime(1601, 1, 1, 0, 0, 0);
    if (Offset() > 0) {
        EXPECT_FALSE(set) << "local midnight is before the scale";
        EXPECT_EQ(time.GetInternalTime(), kNoon);
    } else {
        EXPECT_TRUE(set);
        EXPECT_EQ(time.GetInternalTime(), ToUtc(0));
        EXPECT_EQ(time.IsValid(), Offset() != 0) << "midnight UTC is the count that means no time";
    }
    EXPECT_TRUE(time.SetTime(1601, 1, 2, 0, 0, 0));
    EXPECT_EQ(FieldsOf(time), (Fields{1601, 1, 2, 0, 0, 0, 3}));

    Fields fields{};
    EXPECT_EQ(Get(KTTime(1), fields), Offset() >= 0) << "west of Greenwich it was still 1600";
    if (Offset() >= 0) {
        EXPECT_EQ(fields, (Fields{1601, 1, 1, Offset() / 60, Offset() % 60, 0, 2}));
    }
}

TEST(TimeLimits, TheScaleEndsIn30828) {
    Fields fields{};
    EXPECT_EQ(Get(KTTime(kLastCount), fields), Offset() <= 0) << "east of Greenwich it is later already";
    EXPECT_TRUE(Get(KTTime(kLastCount - kDay), fields));
    EXPECT_EQ(fields[0], 30828);
    EXPECT_EQ(fields[1], 9);

    KTTime time(kNoon);
    EXPECT_TRUE(time.SetTime(30827, 12, 31, 23, 59, 59));
    EXPECT_LE(time.GetInternalTime(), kLastCount);
    Fields const last = FieldsOf(time);
    EXPECT_FALSE(time.SetTime(30828, 12, 31, 0, 0, 0));
    EXPECT_EQ(FieldsOf(time), last);
}

TEST(TimeLimits, CountsWithTheHighestBitHaveNoDate) {
    for (KTUInt64 const count : {kLastCount + 1, kLastCount + kDay, KTUInt64{0xFFFFFFFFFFFFFFFF}}) {
        KTTime const time(count);
        EXPECT_TRUE(time.IsValid());
        Fields fields;
        fields.fill(-1);
        EXPECT_FALSE(Get(time, fields));
        EXPECT_EQ(fields, (Fields{-1, -1, -1, -1, -1, -1, -1}));
        KTString text("old");
        EXPECT_FALSE(time.DateToString(text, true));
        EXPECT_EQ(text, "");
        text = "old";
        EXPECT_FALSE(time.TimeToString(text));
        EXPECT_EQ(text, "");
    }
}

// ---- texts ----

TEST(TimeTexts, NoTimeHasNone) {
    Fields fields;
    fields.fill(-1);
    EXPECT_FALSE(Get(KTTime(), fields));
    EXPECT_EQ(fields, (Fields{-1, -1, -1, -1, -1, -1, -1}));
    for (bool const shortForm : {false, true}) {
        KTString text("old");
        EXPECT_FALSE(KTTime().DateToString(text, shortForm));
        EXPECT_EQ(text, "");
    }
    KTString text("old");
    EXPECT_FALSE(KTTime().TimeToString(text));
    EXPECT_EQ(text, "");
}

TEST(TimeTexts, ReplaceWhatWasThere) {
    KTTime const time(CountOf(2026, 1, 15, 13, 5));
    KTString shortText("old");
    KTString longText("old");
    KTString hourText("old");
    EXPECT_TRUE(time.DateToString(shortText, true));
    EXPECT_TRUE(time.DateToString(longText, false));
    EXPECT_TRUE(time.TimeToString(hourText));
    EXPECT_TRUE(shortText.Contains("15"));
    EXPECT_TRUE(longText.Contains("15"));
    EXPECT_TRUE(longText.Contains("2026"));
    EXPECT_TRUE(hourText.Contains("05"));
    EXPECT_GT(longText.size(), shortText.size());
    for (KTString const &text : {shortText, longText, hourText}) {
        EXPECT_FALSE(text.Contains("old"));
        EXPECT_EQ(text.find(static_cast<unsigned short>(0)), KTString::npos) << "no terminator inside";
    }
}

// ---- comparison ----

TEST(TimeComparison, OrderIsThatOfTheCounts) {
    EXPECT_TRUE(KTTime(1) < KTTime(2));
    EXPECT_FALSE(KTTime(2) < KTTime(1));
    EXPECT_FALSE(KTTime(2) < KTTime(2));
    EXPECT_TRUE(KTTime(2) > KTTime(1));
    EXPECT_FALSE(KTTime(1) > KTTime(2));
    EXPECT_FALSE(KTTime(2) > KTTime(2));
    EXPECT_TRUE(KTTime() < KTTime(1));
    EXPECT_TRUE(KTTime(kLastCount + 1) > KTTime(kLastCount)) << "unsigned";
}

TEST(TimeComparison, AWholeSecondEqualsEveryFractionOfIt) {
    KTTime const whole(kNoon);
    KTTime const half(kNoon + kSecond / 2);
    KTTime const fifth(kNoon + kSecond / 5);
    EXPECT_TRUE(whole.Equals(half));
    EXPECT_TRUE(half.Equals(whole));
    EXPECT_TRUE(whole.Equals(fifth));
    EXPECT_FALSE(fifth.Equals(half)) << "two fractions compare exactly";
    EXPECT_FALSE(half.Equals(fifth));
    EXPECT_TRUE(half.Equals(KTTime(kNoon + kSecond / 2)));
    EXPECT_TRUE(whole.Equals(KTTime(kNoon)));
    EXPECT_FALSE(whole.Equals(KTTime(kNoon + kSecond))) << "two whole seconds compare exactly";
    EXPECT_TRUE(whole.Equals(KTTime(kNoon + 1)));
    EXPECT_TRUE(whole.Equals(KTTime(kNoon + kSecond - 1)));
    EXPECT_FALSE(whole.Equals(KTTime(kNoon - 1))) << "truncated, not rounded";
    EXPECT_FALSE(whole.Equals(KTTime(kNoon + kSecond + 1)));
    EXPECT_TRUE(KTTime().Equals(KTTime()));
    EXPECT_TRUE(KTTime().Equals(KTTime(1))) << "0 is a whole second like any other";
}

TEST(TimeComparison, SwapExchangesTheCounts) {
    KTTime a(1);
    KTTime b(kNoon);
    a.Swap(b);
    EXPECT_EQ(a.GetInternalTime(), kNoon);
    EXPECT_EQ(b.GetInternalTime(), 1U);
    a.Swap(a);
    EXPECT_EQ(a.GetInternalTime(), kNoon);
}
