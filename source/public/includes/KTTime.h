// KTTime.h: a point in time.
//
// One count of 100-nanosecond intervals since 1601-01-01 00:00 UTC, the scale of the system's FILETIME. The count 0 means
// no time. Dates and hours go in and out in local time.
//
// Local time is UTC shifted by the offset that is in force now, whatever date is converted, as the system's plain
// file-time conversions do it. Hence
//
// - SetTime and GetTime give back the same fields, also for the hour that a spring change leaves out and the hour that
//   an autumn change repeats, as long as no change happens between the two calls;
// - a time set in summer reads one hour later or earlier in winter.
//
// The system's conversions take counts below 2^63 (the year 30828); beyond, and before 1601 in UTC, they fail.
//
// Any thread may use its own times; one time is not locked.

#pragma once

#include "KTString.h"
#include "KTTypes.h"

// The system's type, named here without the system's header; <windows.h> may come before or after.
struct _FILETIME;
using FILETIME = struct _FILETIME;

#include "KTBeginExports.h"

/// A point in time. See the top of this file for the scale, local time and threads.
class KT_PUBLIC_API KTTime {
  public:
    /// No time, the count 0.
    KTTime();

    /// The time `count`, in 100-nanosecond intervals since 1601 UTC. Every count is stored as it is.
    KTTime(KTUInt64 count);

    KTTime(KTTime const &other);
    KTTime &operator=(KTTime const &other);
    virtual ~KTTime();

    /// Whether there is a time at all: the count is not 0.
    bool IsValid() const;

    /// The count as it was stored.
    KTUInt64 GetInternalTime() const;

    /// Stores the count, in 100-nanosecond intervals since 1601 UTC.
    void SetTime(KTUInt64 count);

    /// Stores the local time of these fields: the year from 1601, month and day from 1, hour from 0 to 23, minute and
    /// second from 0 to 59. Returns false and keeps the old time when there is no such date or hour, or when it lies
    /// outside the range of the top of this file. Midnight UTC of 1601-01-01 is the count 0: stored, but not valid.
    bool SetTime(int year, int month, int day, int hour, int minute, int second);

    /// Fills the given places with the local year, month, day, hour, minute, second and day of the week, from 1 for
    /// Sunday to 7 for Saturday. A null place is passed over. Returns false, with nothing filled, when the time is not
    /// valid or lies outside the range of the top of this file.
    bool GetTime(int *year, int *month, int *day, int *hour, int *minute, int *second, int *weekday) const;

    /// Replaces `out` by the local date as the user's locale writes it, in its short form if `shortForm`, else in its
    /// long form. Returns false and leaves `out` empty when the time is not valid, lies outside the range of the top of
    /// this file, or the text has 256 characters or more. Throws std::bad_alloc when memory is short.
    bool DateToString(KTString &out, bool shortForm) const;

    /// Replaces `out` by the local hour and minute as the user's locale writes them. Returns false and leaves `out`
    /// empty as DateToString does. Throws std::bad_alloc when memory is short.
    bool TimeToString(KTString &out) const;

    /// Whether this time is earlier. A time that is not valid is earlier than every valid one.
    bool operator<(KTTime const &other) const;

    /// Whether this time is later.
    bool operator>(KTTime const &other) const;

    /// Whether both are the same time, as far as their sources can tell: when exactly one of them is a whole second
    /// (some file systems keep no more), the second decides; else the counts do. Therefore 12:00:00 equals
    /// 12:00:00.2 and 12:00:00.5, which are not equal to each other: do not use it to sort or to find.
    bool Equals(KTTime const &other) const;

    /// Exchanges the counts.
    void Swap(KTTime &other);

    /// The system's UTC time now, as a count. Any thread.
    static KTUInt64 CurrentTime();

    /// The count as the system's two halves; callers include <windows.h>. Any thread.
    static FILETIME InternalTimeToFILETIME(KTUInt64 count);

    /// The count of the system's two halves, which are not changed. Any thread.
    static KTUInt64 FILETIMEToInternalTime(FILETIME &time);

  private:
    KTUInt64 m_Count = 0;
};

#include "KTEndExports.h"
