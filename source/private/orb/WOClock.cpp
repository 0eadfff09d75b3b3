// WOClock.cpp: the system's clock, by its own calls.

#include "OClock.h"

#include <windows.h>

#include <chrono>
#include <limits>

namespace {

constexpr int kTextSize = 256; // wide characters, the terminating zero included

constexpr KTUInt64 kCountOf1970 = 116'444'736'000'000'000;
constexpr KTUInt64 kCountsPerMicrosecond = 10;

KTUInt64 ToCount(FILETIME const &time) {
    return (static_cast<KTUInt64>(time.dwHighDateTime) << 32) | time.dwLowDateTime;
}

FILETIME ToFileTime(KTUInt64 count) { return {static_cast<DWORD>(count), static_cast<DWORD>(count >> 32)}; }

// The system's fields have 16 bits: what they cannot hold is refused, or the year 67562 would become 2026.
bool ToSystemTime(OCalendarTime const &fields, SYSTEMTIME &time) {
    for (int const field : {fields.year, fields.month, fields.day, fields.weekday, fields.hour, fields.minute,
                            fields.second, fields.milliseconds}) {
        if (field < 0 || field > std::numeric_limits<WORD>::max()) {
            return false;
        }
    }
    time.wYear = static_cast<WORD>(fields.year);
    time.wMonth = static_cast<WORD>(fields.month);
    time.wDay = static_cast<WORD>(fields.day);
    time.wDayOfWeek = static_cast<WORD>(fields.weekday);
    time.wHour = static_cast<WORD>(fields.hour);
    time.wMinute = static_cast<WORD>(fields.minute);
    time.wSecond = static_cast<WORD>(fields.second);
    time.wMilliseconds = static_cast<WORD>(fields.milliseconds);
    return true;
}

// Wine takes 29 February of every year and makes it 1 March where there is none; Windows refuses it.
bool IsMissingLeapDay(OCalendarTime const &fields) {
    return fields.month == 2 && fields.day == 29 && !std::chrono::year(fields.year).is_leap();
}

// `format` writes into its buffer of kTextSize and returns the length with the terminating zero, or 0.
template <typename Format> bool FormatFields(OCalendarTime const &fields, KTUnits &text, Format const &format) {
    SYSTEMTIME time{};
    wchar_t buffer[kTextSize];
    if (!ToSystemTime(fields, time)) {
        return false;
    }
    int const size = format(time, buffer);
    if (size <= 0) {
        return false;
    }
    text.assign(reinterpret_cast<unsigned short const *>(buffer), static_cast<std::size_t>(size) - 1);
    return true;
}

} // namespace

KTUInt64 OSystemTimeNow() {
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    return ToCount(now);
}

KTUInt64 OUtcMicroseconds() { return (OSystemTimeNow() - kCountOf1970) / kCountsPerMicrosecond; }

bool OCalendarToCount(OCalendarTime const &fields, KTUInt64 &count) {
    SYSTEMTIME time{};
    FILETIME converted{};
    if (!ToSystemTime(fields, time) || IsMissingLeapDay(fields) || SystemTimeToFileTime(&time, &converted) == FALSE) {
        return false;
    }
    count = ToCount(converted);
    return true;
}

bool OCountToCalendar(KTUInt64 count, OCalendarTime &fields) {
    FILETIME const time = ToFileTime(count);
    SYSTEMTIME converted{};
    if (FileTimeToSystemTime(&time, &converted) == FALSE) {
        return false;
    }
    fields = {converted.wYear, converted.wMonth,  converted.wDay,    converted.wDayOfWeek,
              converted.wHour, converted.wMinute, converted.wSecond, converted.wMilliseconds};
    return true;
}

bool OLocalToUtc(KTUInt64 local, KTUInt64 &utc) {
    FILETIME const time = ToFileTime(local);
    FILETIME converted{};
    if (LocalFileTimeToFileTime(&time, &converted) == FALSE) {
        return false;
    }
    utc = ToCount(converted);
    return true;
}

bool OUtcToLocal(KTUInt64 utc, KTUInt64 &local) {
    FILETIME const time = ToFileTime(utc);
    FILETIME converted{};
    if (FileTimeToLocalFileTime(&time, &converted) == FALSE) {
        return false;
    }
    local = ToCount(converted);
    return true;
}

bool OFormatDate(OCalendarTime const &fields, bool shortForm, KTUnits &text) {
    return FormatFields(fields, text, [shortForm](SYSTEMTIME const &time, wchar_t *buffer) {
        return GetDateFormatW(LOCALE_USER_DEFAULT, shortForm ? DATE_SHORTDATE : DATE_LONGDATE, &time, nullptr, buffer,
                              kTextSize);
    });
}

bool OFormatTime(OCalendarTime const &fields, KTUnits &text) {
    return FormatFields(fields, text, [](SYSTEMTIME const &time, wchar_t *buffer) {
        return GetTimeFormatW(LOCALE_USER_DEFAULT, TIME_NOSECONDS, &time, nullptr, buffer, kTextSize);
    });
}
