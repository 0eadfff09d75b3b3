// OClock_posix.cpp: clock, local time and English date texts for the native developer build.

#include "OClock.h"

#include "OTestClock.h"

#include <atomic>
#include <chrono>
#include <cstdio>
#include <ctime>
#include <limits>
#include <string>

namespace {

using Counts = std::chrono::duration<std::int64_t, std::ratio<1, 10'000'000>>;

constexpr std::chrono::sys_days kBegin = std::chrono::year{1601} / 1 / 1;

// Local time minus UTC, as it is now.
KTUInt64 OffsetNow() {
    std::time_t const now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    return static_cast<KTUInt64>(std::int64_t{local.tm_gmtoff} * 10'000'000);
}

bool IsWithin(int value, int least, int greatest) { return value >= least && value <= greatest; }

// The time that a test has set; 0 while the system's clock counts.
std::atomic<KTUInt64> testClock{0};
std::atomic<unsigned int> readings{0};

KTUnits Widen(std::string const &text) { return {text.begin(), text.end()}; }

} // namespace

KTUInt64 OSystemTimeNow() {
    auto const since = std::chrono::time_point_cast<Counts>(std::chrono::system_clock::now()) - kBegin;
    return static_cast<KTUInt64>(Counts(since).count());
}

void OSetTestClock(KTUInt64 microseconds) { testClock = microseconds; }

unsigned int OTestClockReadings() { return readings; }

KTUInt64 OUtcMicroseconds() {
    KTUInt64 const set = testClock;
    ++readings;
    auto const now = std::chrono::system_clock::now().time_since_epoch();
    return set != 0 ? set : static_cast<KTUInt64>(std::chrono::duration_cast<std::chrono::microseconds>(now).count());
}

bool OCalendarToCount(OCalendarTime const &fields, KTUInt64 &count) {
    if (!IsWithin(fields.year, 1601, 30827) || !IsWithin(fields.month, 1, 12) || !IsWithin(fields.day, 1, 31) ||
        !IsWithin(fields.hour, 0, 23) || !IsWithin(fields.minute, 0, 59) || !IsWithin(fields.second, 0, 59)) {
        return false;
    }
    std::chrono::year_month_day const date = std::chrono::year{fields.year} / fields.month / fields.day;
    if (!date.ok()) {
        return false;
    }
    Counts const since = std::chrono::sys_days(date) - kBegin + std::chrono::hours(fields.hour) +
                         std::chrono::minutes(fields.minute) + std::chrono::seconds(fields.second) +
                         std::chrono::milliseconds(fields.milliseconds);
    count = static_cast<KTUInt64>(since.count());
    return true;
}

bool OCountToCalendar(KTUInt64 count, OCalendarTime &fields) {
    if (count > static_cast<KTUInt64>(std::numeric_limits<std::int64_t>::max())) {
        return false;
    }
    Counts const since(static_cast<std::int64_t>(count));
    auto const days = std::chrono::floor<std::chrono::days>(since);
    std::chrono::year_month_day const date(kBegin + days);
    std::chrono::hh_mm_ss const hours(std::chrono::floor<std::chrono::milliseconds>(since - days));
    fields.year = static_cast<int>(date.year());
    fields.month = static_cast<int>(static_cast<unsigned int>(date.month()));
    fields.day = static_cast<int>(static_cast<unsigned int>(date.day()));
    fields.weekday = static_cast<int>(std::chrono::weekday(kBegin + days).c_encoding());
    fields.hour = static_cast<int>(hours.hours().count());
    fields.minute = static_cast<int>(hours.minutes().count());
    fields.second = static_cast<int>(hours.seconds().count());
    fields.milliseconds = static_cast<int>(hours.subseconds().count());
    return true;
}

bool OLocalToUtc(KTUInt64 local, KTUInt64 &utc) {
    utc = local - OffsetNow();
    return true;
}

bool OUtcToLocal(KTUInt64 utc, KTUInt64 &local) {
    local = utc + OffsetNow();
    return true;
}

bool OFormatDate(OCalendarTime const &fields, bool shortForm, KTUnits &text) {
    static constexpr char const *kDays[] = {"Sunday",   "Monday", "Tuesday", "Wednesday",
                                            "Thursday", "Friday", "Saturday"};
    static constexpr char const *kMonths[] = {"January", "February", "March",     "April",   "May",      "June",
                                              "July",    "August",   "September", "October", "November", "December"};
    char buffer[256];
    if (shortForm) {
        std::snprintf(buffer, sizeof buffer, "%d/%d/%d", fields.month, fields.day, fields.year);
    } else {
        std::snprintf(buffer, sizeof buffer, "%s, %s %d, %d", kDays[fields.weekday], kMonths[fields.month - 1],
                      fields.day, fields.year);
    }
    text = Widen(buffer);
    return true;
}

bool OFormatTime(OCalendarTime const &fields, KTUnits &text) {
    char buffer[256];
    std::snprintf(buffer, sizeof buffer, "%d:%02d %s", fields.hour % 12 == 0 ? 12 : fields.hour % 12, fields.minute,
                  fields.hour < 12 ? "AM" : "PM");
    text = Widen(buffer);
    return true;
}
