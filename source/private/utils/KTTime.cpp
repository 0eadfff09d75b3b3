// KTTime.cpp: counts, their comparison, and their way to local dates and texts.

#include "KTTime.h"

#include "OClock.h"

#include <utility>

namespace {

constexpr KTUInt64 kCountsPerSecond = 10'000'000;

// The system reads a count with the highest bit as a time before 1601 and has no date for it.
constexpr KTUInt64 kLastCount = 0x7FFF'FFFF'FFFF'FFFF;

bool IsWholeSecond(KTUInt64 count) { return count % kCountsPerSecond == 0; }

// The local date and hour of a valid count.
bool ToLocalFields(KTUInt64 count, OCalendarTime &fields) {
    KTUInt64 local = 0;
    return count != 0 && count <= kLastCount && OUtcToLocal(count, local) && local <= kLastCount &&
           OCountToCalendar(local, fields);
}

void Fill(int *place, int value) {
    if (place != nullptr) {
        *place = value;
    }
}

void Store(KTUnits const &units, KTString &out) { out.assign(units.data(), units.size()); }

} // namespace

KTTime::KTTime() = default;
KTTime::KTTime(KTUInt64 count) : m_Count(count) {}
KTTime::KTTime(KTTime const &other) = default;
KTTime &KTTime::operator=(KTTime const &other) = default;
KTTime::~KTTime() = default;

bool KTTime::IsValid() const { return m_Count != 0; }

KTUInt64 KTTime::GetInternalTime() const { return m_Count; }

void KTTime::SetTime(KTUInt64 count) { m_Count = count; }

bool KTTime::SetTime(int year, int month, int day, int hour, int minute, int second) {
    OCalendarTime fields;
    fields.year = year;
    fields.month = month;
    fields.day = day;
    fields.hour = hour;
    fields.minute = minute;
    fields.second = second;
    KTUInt64 local = 0;
    KTUInt64 utc = 0;
    // East of Greenwich the first hours of 1601 lie before the scale begins: the shift wraps around there.
    if (!OCalendarToCount(fields, local) || local > kLastCount || !OLocalToUtc(local, utc) || utc > kLastCount) {
        return false;
    }
    m_Count = utc;
    return true;
}

bool KTTime::GetTime(int *year, int *month, int *day, int *hour, int *minute, int *second, int *weekday) const {
    OCalendarTime fields;
    if (!ToLocalFields(m_Count, fields)) {
        return false;
    }
    Fill(year, fields.year);
    Fill(month, fields.month);
    Fill(day, fields.day);
    Fill(hour, fields.hour);
    Fill(minute, fields.minute);
    Fill(second, fields.second);
    Fill(weekday, fields.weekday + 1);
    return true;
}

bool KTTime::DateToString(KTString &out, bool shortForm) const {
    out.clear();
    OCalendarTime fields;
    KTUnits text;
    if (!ToLocalFields(m_Count, fields) || !OFormatDate(fields, shortForm, text)) {
        return false;
    }
    Store(text, out);
    return true;
}

bool KTTime::TimeToString(KTString &out) const {
    out.clear();
    OCalendarTime fields;
    KTUnits text;
    if (!ToLocalFields(m_Count, fields) || !OFormatTime(fields, text)) {
        return false;
    }
    Store(text, out);
    return true;
}

bool KTTime::operator<(KTTime const &other) const { return m_Count < other.m_Count; }

bool KTTime::operator>(KTTime const &other) const { return m_Count > other.m_Count; }

bool KTTime::Equals(KTTime const &other) const {
    if (IsWholeSecond(m_Count) == IsWholeSecond(other.m_Count)) {
        return m_Count == other.m_Count;
    }
    return m_Count / kCountsPerSecond == other.m_Count / kCountsPerSecond;
}

void KTTime::Swap(KTTime &other) { std::swap(m_Count, other.m_Count); }

KTUInt64 KTTime::CurrentTime() { return OSystemTimeNow(); }
