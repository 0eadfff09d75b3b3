// LoggerTest.cpp: the log file's lines, the variadic forms, the switch, and several threads at once.

#include "KTLogger.h"
#include "KTPublicUtils.h"
#include "KTUserEventUtil.h"
#include "LogLines.h"
#include "Units.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <algorithm>
#include <ctime>
#include <map>
#include <regex>
#include <sstream>
#include <string>

namespace {

using Lines = std::vector<std::string>;

Lines g_Events;

void RecordEvent(char const *first, char const *second, char const *third) {
    g_Events.push_back(std::string(first) + '|' + second + '|' + third);
}

void RecordReversed(char const *first, char const *second, char const *third) {
    g_Events.push_back(std::string(third) + '|' + second + '|' + first);
}

// The number before a line: milliseconds as a double, cut to an integer.
long long Milliseconds(std::clock_t clock) {
    volatile double seconds = static_cast<double>(clock) / 1000.0;
    return static_cast<long long>(seconds * 1000.0);
}

} // namespace

TEST(Logger, WritesNumberColonBlankMessageAndLineFeed) {
    std::size_t const start = ReadLogFile().size();
    long long const before = Milliseconds(std::clock());
    gKTLogger->Log(std::string("one message"));
    long long const after = Milliseconds(std::clock());
    std::smatch match;
    std::string const line = ReadLogFile().substr(start);
    ASSERT_TRUE(std::regex_match(line, match, std::regex("(\\d+): one message\n"))) << line;
    long long const number = std::stoll(match[1]);
    EXPECT_GE(number, before);
    EXPECT_LE(number, after);
}

TEST(Logger, WritesBytesAsTheyAre) {
    LogLines log;
    gKTLogger->Log(std::string("\xE9\x80\xFF\r\tend"));
    EXPECT_EQ(log.Take(), Lines{"\xE9\x80\xFF\r\tend"});
    gKTLogger->Log(std::string());
    EXPECT_EQ(log.Take(), Lines{""});
}

TEST(Logger, NarrowsWideTextToLowBytes) {
    LogLines log;
    gKTLogger->Log(std::wstring(L"\u20AC \u00E9 A"));
    EXPECT_EQ(log.Take(), Lines{"\xAC \xE9 A"});
}

TEST(Logger, FormatsBytes) {
    LogLines log;
    gKTLogger->Log("%d %s %5.1f%%", 7, "text", 2.5);
    std::string const longText(100000, 'q');
    gKTLogger->Log("%s", longText.c_str());
    EXPECT_TRUE(log.Take() == (Lines{"7 text   2.5%", longText}));
}

TEST(Logger, FormatsWideText) {
    LogLines log;
    gKTLogger->Log(L"%d|%c", 7, 'c');
    std::wstring const longText(100000, L'q');
    gKTLogger->Log(L"%ls", longText.c_str());
    EXPECT_TRUE(log.Take() == (Lines{"7|c", std::string(100000, 'q')}));
}

TEST(Logger, WithoutPerCentSignTheFormatIsTheMessage) {
    LogLines log;
    gKTLogger->Log("verbatim \\n {}", 1, 2, 3);
    gKTLogger->Log(L"wide verbatim", 1, 2, 3);
    gKTLogger->Log("%%");
    EXPECT_EQ(log.Take(), (Lines{"verbatim \\n {}", "wide verbatim", "%"}));
}

TEST(Logger, ANullFormatIsWrittenAsTheRunTimeWritesNullTexts) {
    LogLines log;
    gKTLogger->Log(static_cast<char const *>(nullptr));
    gKTLogger->Log(static_cast<wchar_t const *>(nullptr), 1);
    EXPECT_EQ(log.Take(), (Lines{"(null)", "(null)"}));
}

TEST(Logger, SwitchedOffNothingIsWrittenAndSwitchedOnTheFileGoesOn) {
    LogLines log;
    gKTLogger->Log("before");
    EXPECT_TRUE(gKTLogger->IsLogEnabled());
    gKTLogger->LogEnableAtRuntime(false);
    EXPECT_FALSE(gKTLogger->IsLogEnabled());
    gKTLogger->Log("silent");
    gKTLogger->Log("silent %d", 1);
    gKTLogger->Log(L"silent");
    gKTLogger->Log(L"silent %d", 1);
    gKTLogger->Log(std::string("silent"));
    gKTLogger->Log(std::wstring(L"silent"));
    gKTLogger->LogEnableAtRuntime(true);
    gKTLogger->Log("after");
    EXPECT_EQ(log.Take(), (Lines{"before", "after"}));
}

TEST(Logger, TheFileIsInTheTemporaryFolder) {
    KTString const path = gKTLogger->GetLogFilePath().GetPathAsKTString();
    std::filesystem::path const expected = std::filesystem::temp_directory_path() / "ktap_log.txt";
    std::u8string const utf8 = expected.u8string();
    KTString text(reinterpret_cast<char const *>(utf8.c_str()));
    EXPECT_EQ(KTString(path).ReplaceAll2("\\", "/"), text.ReplaceAll2("\\", "/"));
    EXPECT_EQ(&gKTLogger->GetLogFilePath(), &gKTLogger->GetLogFilePath());
}

TEST(Logger, LinesOfSeveralThreadsStayWhole) {
    LogLines log;
    constexpr int kThreads = 8;
    constexpr int kLines = 500;
    boost::thread_group threads;
    for (int thread = 0; thread < kThreads; ++thread) {
        threads.create_thread([thread] {
            for (int line = 0; line < kLines; ++line) {
                gKTLogger->Log("thread %d line %d %s", thread, line, "with a tail of some length to tear apart");
            }
        });
    }
    threads.join_all();
    Lines const lines = log.Take();
    ASSERT_EQ(lines.size(), static_cast<std::size_t>(kThreads * kLines));
    std::map<int, int> next;
    for (std::string const &line : lines) {
        int thread = -1;
        int number = -1;
        ASSERT_EQ(std::sscanf(line.c_str(), "thread %d line %d with a tail", &thread, &number), 2) << line;
        ASSERT_TRUE(line.ends_with("to tear apart")) << line;
        ASSERT_EQ(number, next[thread]++) << line;
    }
}

TEST(UserEvent, GoesToTheCallbackInOrder) {
    LogLines log;
    KTUserEventUtil::LogUserEvent("nobody", "listens", "yet");
    EXPECT_EQ(g_Events, Lines{});
    KTUserEventUtil::RegisterLogFunctionCallBack(&RecordEvent);
    KTUserEventUtil::LogUserEvent("open", U(u"\u20AC"), "");
    EXPECT_EQ(g_Events, Lines{"open|\xE2\x82\xAC|"});
    KTUserEventUtil::RegisterLogFunctionCallBack(nullptr);
    KTUserEventUtil::LogUserEvent("a", "b", "c");
    EXPECT_EQ(g_Events.back(), "a|b|c");
    KTUserEventUtil::RegisterLogFunctionCallBack(&RecordReversed);
    KTUserEventUtil::LogUserEvent("a", "b", "c");
    EXPECT_EQ(g_Events.back(), "c|b|a");
    EXPECT_EQ(g_Events.size(), 3U);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(PublicUtils, ConstructLogStrWritesSixSignificantDigits) {
    EXPECT_EQ(KTPublicUtils::ConstructLogStr("fps", 29.97F), "fps: 29.97");
    EXPECT_EQ(KTPublicUtils::ConstructLogStr("", 0.0F), ": 0");
    EXPECT_EQ(KTPublicUtils::ConstructLogStr("big", 12345678.0F), "big: 1.23457e+07");
    EXPECT_EQ(KTPublicUtils::ConstructLogStr("small", 0.00001F), "small: 1e-05");
    EXPECT_EQ(KTPublicUtils::ConstructLogStr("half", -2.5F), "half: -2.5");
}
