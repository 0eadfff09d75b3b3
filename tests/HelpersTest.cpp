// HelpersTest.cpp: the date of HTTP and the bounded random number.

#include "KTPublicUtils.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <ctime>
#include <set>
#include <sstream>
#include <string>

namespace {

// The seconds that a date of HTTP stands for, taken apart by the positions of its fixed-length form.
std::time_t Seconds(std::string const &date) {
    std::string const months = "JanFebMarAprMayJunJulAugSepOctNovDec";
    auto const number = [&date](std::size_t at, std::size_t size) { return std::stoi(date.substr(at, size)); };
    std::chrono::year_month_day const day =
        std::chrono::year(number(12, 4)) / static_cast<int>(months.find(date.substr(8, 3)) / 3 + 1) / number(5, 2);
    std::chrono::sys_days const days(day);
    std::string const weekdays = "SunMonTueWedThuFriSat";
    EXPECT_EQ(weekdays.substr(std::size_t{3} * std::chrono::weekday(days).c_encoding(), 3), date.substr(0, 3));
    EXPECT_EQ(date.substr(3, 2) + date[7] + date[11] + date[16] + date[19] + date[22] + date.substr(25), ",    :: GMT");
    auto const time = days + std::chrono::hours(number(17, 2)) + std::chrono::minutes(number(20, 2)) +
                      std::chrono::seconds(number(23, 2));
    return std::chrono::system_clock::to_time_t(time);
}

} // namespace

TEST(HttpTime, IsTheTimeNow) {
    std::time_t const before = std::time(nullptr);
    std::string const date = KTPublicUtils::GetRFC2616GMTTime().GetUTF8String();
    std::time_t const after = std::time(nullptr);
    ASSERT_EQ(date.size(), 29U) << date;
    EXPECT_LE(before, Seconds(date)) << date;
    EXPECT_GE(after, Seconds(date)) << date;
}

TEST(RandomNumber, LiesBetweenZeroAndTheMaximum) {
    std::set<unsigned int> seen;
    for (int i = 0; i < 1000; ++i) {
        ASSERT_EQ(KTPublicUtils::GetARandomNumber(0), 0U);
        unsigned int const number = KTPublicUtils::GetARandomNumber(5);
        ASSERT_LE(number, 5U);
        seen.insert(number);
        ASSERT_LE(KTPublicUtils::GetARandomNumber(0xFFFFFFFE), static_cast<unsigned int>(RAND_MAX));
    }
    EXPECT_EQ(seen.size(), 6U);
}
