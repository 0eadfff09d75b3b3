// OClock.h: the system's clock, its local time, and dates as its locale writes them.
//
// Counts are 100-nanosecond intervals since 1601-01-01 00:00, in UTC or, where said, in local time. The functions do what
// the system's calls do and judge nothing: which counts make sense is the caller's business.

#pragma once

#include "KTTypes.h"
#include "KTUnitTraits.h"

/// A time in the fields of the calendar.
struct OCalendarTime {
    int year = 0;
    int month = 0;   ///< from 1
    int day = 0;     ///< from 1
    int weekday = 0; ///< from 0 for Sunday
    int hour = 0;
    int minute = 0;
    int second = 0;
    int milliseconds = 0;
};

/// The UTC time now. Any thread.
KTUInt64 OSystemTimeNow();

/// The UTC time now in whole microseconds since 1970-01-01 00:00. Every clock of the library that measures time spans
/// reads it, so tests drive them all here: on Windows by replacing GetSystemTimeAsFileTime in the library's import table,
/// natively through the stand-in (tests/support/TestClock.h does either). Any thread.
KTUInt64 OUtcMicroseconds();

/// The count of these fields, the weekday ignored. False, with `count` unchanged, when there is no such time. Any thread.
bool OCalendarToCount(OCalendarTime const &fields, KTUInt64 &count);

/// The fields of this count. False, with `fields` unchanged, when the system has no date for it. Any thread.
bool OCountToCalendar(KTUInt64 count, OCalendarTime &fields);

/// Shifts a local time to UTC, or the reverse, by the offset in force now. False, with the target unchanged, when the
/// system refuses; results outside the scale wrap around. Any thread.
bool OLocalToUtc(KTUInt64 local, KTUInt64 &utc);
bool OUtcToLocal(KTUInt64 utc, KTUInt64 &local);

/// The date as the user's locale writes it, in its short or its long form. False, with `text` unchanged, when the system
/// refuses or the text has 256 units or more. Any thread.
bool OFormatDate(OCalendarTime const &fields, bool shortForm, KTUnits &text);

/// The hour and minute as the user's locale writes them; the rest as OFormatDate.
bool OFormatTime(OCalendarTime const &fields, KTUnits &text);
