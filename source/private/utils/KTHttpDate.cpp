// KTHttpDate.cpp: the date's fields by the standard calendar, the names in English whatever the locale.

#include "KTHttpDate.h"

#include <chrono>
#include <cstdio>

std::string KTHttpDate(std::int64_t secondsSince1970) {
    static constexpr char const *kDays[] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
    static constexpr char const *kMonths[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                              "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
    std::chrono::sys_seconds const time{std::chrono::seconds(secondsSince1970)};
    auto const day = std::chrono::floor<std::chrono::days>(time);
    std::chrono::year_month_day const date(day);
    std::chrono::hh_mm_ss const clock(time - day);
    char text[64];
    std::snprintf(text, sizeof text, "%s, %02u %s %d %02d:%02d:%02d GMT", kDays[std::chrono::weekday(day).c_encoding()],
                  static_cast<unsigned>(date.day()), kMonths[static_cast<unsigned>(date.month()) - 1],
                  static_cast<int>(date.year()), static_cast<int>(clock.hours().count()),
                  static_cast<int>(clock.minutes().count()), static_cast<int>(clock.seconds().count()));
    return text;
}
