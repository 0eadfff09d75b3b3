// WTimeTest.cpp: points in time and the system: FILETIME, the zone, the locale's texts, and what the library asks for.
//
// The system's zone cannot be set from a program here, so a change of the offset and failing conversions are played by
// replaced system calls; the zones themselves come from the build, which runs the program in several.

#include "KTTime.h"
#include "Units.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <string>
#include <vector>

namespace {

constexpr KTUInt64 kSecond = 10'000'000;
constexpr KTUInt64 kHour = 3600 * kSecond;
constexpr KTUInt64 kNoon = 134129520000000000; // 2026-01-15 12:00 UTC
constexpr wchar_t kLibrary[] = L"KTPublic.dll";

using Fields = std::array<int, 7>;

KTUInt64 Join(FILETIME const &time) { return (static_cast<KTUInt64>(time.dwHighDateTime) << 32) | time.dwLowDateTime; }

FILETIME Split(KTUInt64 count) { return {static_cast<DWORD>(count), static_cast<DWORD>(count >> 32)}; }

bool Get(KTTime const &time, Fields &fields) {
    return time.GetTime(&fields[0], &fields[1], &fields[2], &fields[3], &fields[4], &fields[5], &fields[6]);
}

SYSTEMTIME LocalFields(KTUInt64 count) {
    FILETIME const utc = Split(count);
    FILETIME local{};
    SYSTEMTIME fields{};
    EXPECT_TRUE(FileTimeToLocalFileTime(&utc, &local));
    EXPECT_TRUE(FileTimeToSystemTime(&local, &fields));
    return fields;
}

std::wstring DateText(KTUInt64 count, DWORD flags) {
    SYSTEMTIME const fields = LocalFields(count);
    wchar_t buffer[256] = L"";
    GetDateFormatW(LOCALE_USER_DEFAULT, flags, &fields, nullptr, buffer, 256);
    return buffer;
}

std::wstring HourText(KTUInt64 count) {
    SYSTEMTIME const fields = LocalFields(count);
    wchar_t buffer[256] = L"";
    GetTimeFormatW(LOCALE_USER_DEFAULT, TIME_NOSECONDS, &fields, nullptr, buffer, 256);
    return buffer;
}

} // namespace

TEST(SystemTime, FileTimesAreTheTwoHalves) {
    FILETIME const time = KTTime::InternalTimeToFILETIME(0x0123456789ABCDEF);
    EXPECT_EQ(time.dwHighDateTime, 0x01234567U);
    EXPECT_EQ(time.dwLowDateTime, 0x89ABCDEFU);
    for (KTUInt64 const count :
         {KTUInt64{0}, KTUInt64{1}, KTUInt64{0xFFFFFFFF}, KTUInt64{0x100000000}, kNoon, KTUInt64{0xFFFFFFFFFFFFFFFF}}) {
        FILETIME halves = KTTime::InternalTimeToFILETIME(count);
        EXPECT_EQ(KTTime::FILETIMEToInternalTime(halves), count);
        EXPECT_EQ(Join(halves), count) << "not changed by reading";
    }
}

TEST(SystemTime, CurrentTimeIsBetweenTwoReadings) {
    FILETIME before;
    FILETIME after;
    GetSystemTimeAsFileTime(&before);
    KTUInt64 const current = KTTime::CurrentTime();
    GetSystemTimeAsFileTime(&after);
    EXPECT_GE(current, Join(before));
    EXPECT_LE(current, Join(after));
}

TEST(SystemTime, TheZoneIsTheSystems) {
    TIME_ZONE_INFORMATION zone;
    DWORD const kind = GetTimeZoneInformation(&zone);
    LONG const bias = zone.Bias + (kind == TIME_ZONE_ID_DAYLIGHT ? zone.DaylightBias : 0) +
                      (kind == TIME_ZONE_ID_STANDARD ? zone.StandardBias : 0);
    KTTime time;
    ASSERT_TRUE(time.SetTime(2026, 1, 15, 12, 0, 0));
    EXPECT_EQ(time.GetInternalTime(), kNoon + static_cast<KTUInt64>(static_cast<KTInt64>(bias)) * 60 * kSecond);
}

TEST(SystemTime, FieldsAreTheSystems) {
    for (KTUInt64 count = kHour * 24; count < 0x7FFF000000000000; count += 0x00123456789ABCDE) {
        SYSTEMTIME const expected = LocalFields(count);
        Fields fields{};
        ASSERT_TRUE(Get(KTTime(count), fields));
        EXPECT_EQ(fields, (Fields{expected.wYear, expected.wMonth, expected.wDay, expected.wHour, expected.wMinute,
                                  expected.wSecond, expected.wDayOfWeek + 1}));
    }
}

TEST(SystemTime, TextsAreTheLocales) {
    for (KTUInt64 const count : {kNoon, kNoon + 13 * kHour + 5 * kSecond, kNoon + 4800 * kHour, kHour * 240}) {
        KTString text;
        EXPECT_TRUE(KTTime(count).DateToString(text, true));
        EXPECT_EQ(text.GetWstring(), DateText(count, DATE_SHORTDATE));
        EXPECT_TRUE(KTTime(count).DateToString(text, false));
        EXPECT_EQ(text.GetWstring(), DateText(count, DATE_LONGDATE));
        EXPECT_TRUE(KTTime(count).TimeToString(text));
        EXPECT_EQ(text.GetWstring(), HourText(count));
        EXPECT_FALSE(text.empty());
    }
    EXPECT_NE(DateText(kNoon, DATE_SHORTDATE), DateText(kNoon, DATE_LONGDATE));
}

// ---- what the library asks the system for ----

namespace {

struct FormatCall {
    LCID locale;
    DWORD flags;
    SYSTEMTIME time;
    bool hasPicture;
    int size;
};

std::vector<FormatCall> g_Calls;
std::wstring g_Answer; // as many wide characters as the system would write; empty: it fails

int AnswerFormat(LCID locale, DWORD flags, SYSTEMTIME const *time, wchar_t const *picture, wchar_t *buffer, int size) {
    g_Calls.push_back({locale, flags, *time, picture != nullptr, size});
    if (g_Answer.empty() || g_Answer.size() >= static_cast<std::size_t>(size)) {
        return 0;
    }
    std::copy_n(g_Answer.c_str(), g_Answer.size() + 1, buffer);
    return static_cast<int>(g_Answer.size()) + 1;
}

int WINAPI AnswerFormatCall(LCID locale, DWORD flags, SYSTEMTIME const *time, wchar_t const *picture, wchar_t *buffer,
                            int size) {
    return AnswerFormat(locale, flags, time, picture, buffer, size);
}

class FormatHooks {
  public:
    FormatHooks() { g_Calls.clear(); }
    bool AreActive() const { return m_Date.IsActive() && m_Time.IsActive(); }

  private:
    WImportHook m_Date{kLibrary, "GetDateFormatW", &AnswerFormatCall};
    WImportHook m_Time{kLibrary, "GetTimeFormatW", &AnswerFormatCall};
};

} // namespace

TEST(TimeCalls, FormatsForTheUsersLocaleInto256Characters) {
    SYSTEMTIME const expected = LocalFields(kNoon + 5 * kSecond);
    FormatHooks const hooks;
    ASSERT_TRUE(hooks.AreActive());
    g_Answer = L"answer";
    KTTime const time(kNoon + 5 * kSecond);
    KTString text;
    EXPECT_TRUE(time.DateToString(text, true));
    EXPECT_EQ(text, "answer");
    EXPECT_TRUE(time.DateToString(text, false));
    EXPECT_TRUE(time.TimeToString(text));
    ASSERT_EQ(g_Calls.size(), 3U);
    EXPECT_EQ(g_Calls[0].flags, static_cast<DWORD>(DATE_SHORTDATE));
    EXPECT_EQ(g_Calls[1].flags, static_cast<DWORD>(DATE_LONGDATE));
    EXPECT_EQ(g_Calls[2].flags, static_cast<DWORD>(TIME_NOSECONDS));
    for (FormatCall const &call : g_Calls) {
        EXPECT_EQ(call.locale, static_cast<LCID>(LOCALE_USER_DEFAULT));
        EXPECT_FALSE(call.hasPicture);
        EXPECT_EQ(call.size, 256);
        EXPECT_EQ(std::memcmp(&call.time, &expected, sizeof expected), 0);
    }
}

TEST(TimeCalls, TextsOf255CharactersFit) {
    FormatHooks const hooks;
    KTString text;
    g_Answer.assign(255, L'\x4E00');
    EXPECT_TRUE(KTTime(kNoon).DateToString(text, false));
    EXPECT_EQ(text.GetWstring(), g_Answer);
    EXPECT_TRUE(KTTime(kNoon).TimeToString(text));
    EXPECT_EQ(text.GetWstring(), g_Answer);
    g_Answer.assign(256, L'\x4E00');
    EXPECT_FALSE(KTTime(kNoon).DateToString(text, false));
    EXPECT_EQ(text, "");
    text = "old";
    EXPECT_FALSE(KTTime(kNoon).TimeToString(text));
    EXPECT_EQ(text, "");
}

TEST(TimeCalls, FailedFormatsLeaveTheTextEmpty) {
    FormatHooks const hooks;
    g_Answer.clear();
    for (bool const shortForm : {false, true}) {
        KTString text("old");
        EXPECT_FALSE(KTTime(kNoon).DateToString(text, shortForm));
        EXPECT_EQ(text, "");
    }
    KTString text("old");
    EXPECT_FALSE(KTTime(kNoon).TimeToString(text));
    EXPECT_EQ(text, "");
    EXPECT_EQ(g_Calls.size(), 3U);
}

namespace {

SYSTEMTIME g_Asked;
int g_Refused = 0;

BOOL WINAPI RecordSystemTime(SYSTEMTIME const *time, FILETIME *converted) {
    g_Asked = *time;
    *converted = Split(kNoon);
    return TRUE;
}

BOOL WINAPI RefuseToFileTime(SYSTEMTIME const * /*time*/, FILETIME *converted) {
    *converted = Split(1);
    ++g_Refused;
    return FALSE;
}

BOOL WINAPI RefuseToSystemTime(FILETIME const * /*time*/, SYSTEMTIME * /*converted*/) {
    ++g_Refused;
    return FALSE;
}

BOOL WINAPI RefuseShift(FILETIME const *time, FILETIME *shifted) {
    *shifted = *time;
    ++g_Refused;
    return FALSE;
}

KTUInt64 g_Offset = 0; // local time minus UTC, as the replaced system has it

BOOL WINAPI ShiftToUtc(FILETIME const *local, FILETIME *utc) {
    *utc = Split(Join(*local) - g_Offset);
    return TRUE;
}

BOOL WINAPI ShiftToLocal(FILETIME const *utc, FILETIME *local) {
    *local = Split(Join(*utc) + g_Offset);
    return TRUE;
}

void WINAPI FixedSystemTime(FILETIME *time) { *time = Split(0x0123456789ABCDEF); }

} // namespace

TEST(TimeCalls, CurrentTimeIsTheSystemsCount) {
    WImportHook const hook(kLibrary, "GetSystemTimeAsFileTime", &FixedSystemTime);
    ASSERT_TRUE(hook.IsActive());
    EXPECT_EQ(KTTime::CurrentTime(), 0x0123456789ABCDEFU);
}

TEST(TimeCalls, FieldsGoToTheSystemWithoutMilliseconds) {
    WImportHook const hook(kLibrary, "SystemTimeToFileTime", &RecordSystemTime);
    ASSERT_TRUE(hook.IsActive());
    KTTime time;
    EXPECT_TRUE(time.SetTime(2026, 10, 25, 2, 30, 59));
    EXPECT_EQ(g_Asked.wYear, 2026);
    EXPECT_EQ(g_Asked.wMonth, 10);
    EXPECT_EQ(g_Asked.wDay, 25);
    EXPECT_EQ(g_Asked.wHour, 2);
    EXPECT_EQ(g_Asked.wMinute, 30);
    EXPECT_EQ(g_Asked.wSecond, 59);
    EXPECT_EQ(g_Asked.wMilliseconds, 0);
}

TEST(TimeCalls, EitherFailedConversionKeepsTheOldTime) {
    KTTime time(kNoon + 3);
    g_Refused = 0;
    {
        WImportHook const hook(kLibrary, "SystemTimeToFileTime", &RefuseToFileTime);
        EXPECT_FALSE(time.SetTime(2026, 1, 1, 0, 0, 0));
    }
    EXPECT_EQ(g_Refused, 1);
    {
        WImportHook const hook(kLibrary, "LocalFileTimeToFileTime", &RefuseShift);
        EXPECT_FALSE(time.SetTime(2026, 1, 1, 0, 0, 0));
    }
    EXPECT_EQ(g_Refused, 2);
    EXPECT_EQ(time.GetInternalTime(), kNoon + 3);
}

namespace {

void ExpectNothingToRead() {
    Fields fields;
    fields.fill(-1);
    EXPECT_FALSE(Get(KTTime(kNoon), fields));
    EXPECT_EQ(fields, (Fields{-1, -1, -1, -1, -1, -1, -1}));
    KTString date("old");
    EXPECT_FALSE(KTTime(kNoon).DateToString(date, true));
    EXPECT_EQ(date, "");
    KTString hour("old");
    EXPECT_FALSE(KTTime(kNoon).TimeToString(hour));
    EXPECT_EQ(hour, "");
}

} // namespace

TEST(TimeCalls, EitherFailedConversionHasNothingToRead) {
    g_Refused = 0;
    {
        WImportHook const hook(kLibrary, "FileTimeToLocalFileTime", &RefuseShift);
        ExpectNothingToRead();
    }
    EXPECT_EQ(g_Refused, 3);
    {
        WImportHook const hook(kLibrary, "FileTimeToSystemTime", &RefuseToSystemTime);
        ExpectNothingToRead();
    }
    EXPECT_EQ(g_Refused, 6);
}

// ---- a change of the clocks between setting and reading ----

namespace {

class ZoneHooks {
  public:
    bool AreActive() const { return m_ToUtc.IsActive() && m_ToLocal.IsActive(); }

  private:
    WImportHook m_ToUtc{kLibrary, "LocalFileTimeToFileTime", &ShiftToUtc};
    WImportHook m_ToLocal{kLibrary, "FileTimeToLocalFileTime", &ShiftToLocal};
};

} // namespace

TEST(TimeZoneChange, WhatWasSetInSummerReadsAnHourEarlierInWinter) {
    ZoneHooks const hooks;
    ASSERT_TRUE(hooks.AreActive());
    KTTime time;
    Fields fields{};
    g_Offset = 2 * kHour;
    EXPECT_TRUE(time.SetTime(2026, 10, 25, 2, 30, 0)); // the hour that comes twice
    EXPECT_EQ(time.GetInternalTime(), kNoon + 6792 * kHour - 11 * kHour - kHour / 2);
    EXPECT_TRUE(Get(time, fields));
    EXPECT_EQ(fields, (Fields{2026, 10, 25, 2, 30, 0, 1}));
    g_Offset = kHour;
    EXPECT_TRUE(Get(time, fields));
    EXPECT_EQ(fields, (Fields{2026, 10, 25, 1, 30, 0, 1}));

    EXPECT_TRUE(time.SetTime(2026, 3, 29, 2, 30, 0)); // the hour that is left out
    g_Offset = 2 * kHour;
    EXPECT_TRUE(Get(time, fields));
    EXPECT_EQ(fields, (Fields{2026, 3, 29, 3, 30, 0, 1}));
}

TEST(TimeZoneChange, ShiftsPastTheEndsOfTheScaleFail) {
    ZoneHooks const hooks;
    KTTime time(kNoon);
    Fields fields{};
    g_Offset = kHour;
    EXPECT_FALSE(time.SetTime(1601, 1, 1, 0, 59, 59));
    EXPECT_EQ(time.GetInternalTime(), kNoon);
    EXPECT_FALSE(Get(KTTime(0x7FFFFFFFFFFFFFFF), fields));
    EXPECT_TRUE(time.SetTime(1601, 1, 1, 1, 0, 0));
    EXPECT_FALSE(time.IsValid());
    EXPECT_TRUE(time.SetTime(1601, 1, 1, 1, 0, 1));
    EXPECT_EQ(time.GetInternalTime(), kSecond);

    g_Offset = 0 - kHour;
    EXPECT_FALSE(Get(KTTime(kHour - 1), fields));
    EXPECT_FALSE(Get(KTTime(0x8000000000000000), fields)) << "its local time alone would have a date";
    EXPECT_TRUE(Get(KTTime(kHour), fields));
    EXPECT_EQ(fields, (Fields{1601, 1, 1, 0, 0, 0, 2}));
}
