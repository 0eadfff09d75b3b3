// AssertTest.cpp: assertion reports, the formatters' buffers, the switches that change nothing, the hook, the heap.

#include "KTAllocate.h"
#include "KTAssert.h"
#include "LogLines.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <limits>
#include <new>
#include <string>

namespace {

using Lines = std::vector<std::string>;

constexpr char kPath[] = "source/private/utils/KTSample";

// The line that reports a text cut at the formatters' cap.
Lines const kCapReport{"Assert failed: Buffer not sufficient at source/private/utils/KTAssert:141"};

void *FirstHook(char const *, char const *, char const *) { return nullptr; }

} // namespace

TEST(Assert, MessagePathAndLineMakeOneLogLine) {
    LogLines log;
    KTAssertFailed("value out of range", kPath, 42);
    EXPECT_EQ(log.Take(), Lines{"Assert failed: value out of range at source/private/utils/KTSample:42"});
}

TEST(Assert, NoMessageAndEmptyMessageDiffer) {
    LogLines log;
    KTAssertFailed(nullptr, kPath, 7);
    KTAssertFailed("", kPath, 7);
    EXPECT_EQ(log.Take(), (Lines{"Assert failed at source/private/utils/KTSample:7",
                                 "Assert failed:  at source/private/utils/KTSample:7"}));
}

TEST(Assert, TheMessageIsNoFormat) {
    LogLines log;
    KTAssertFailed("100 %s %d %n", kPath, -1);
    EXPECT_EQ(log.Take(), Lines{"Assert failed: 100 %s %d %n at source/private/utils/KTSample:-1"});
}

TEST(Assert, NothingIsReportedWhileLoggingIsDisabled) {
    LogLines log;
    gKTLogger->LogEnableAtRuntime(false);
    KTAssertFailed("silent", kPath, 1);
    KTAssertFailed(nullptr, kPath, 1);
    gKTLogger->LogEnableAtRuntime(true);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Assert, FailReadsNothing) {
    LogLines log;
    KTAssertFail("%s", reinterpret_cast<char const *>(1));
    KTAssertFail(nullptr);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Assert, TheSwitchesChangeNothing) {
    auto const expectOff = [] {
        EXPECT_FALSE(IsAssertsEnabled());
        EXPECT_TRUE(GetAssertionLogPath().empty());
    };
    expectOff();
    EnableAsserts(true);
    expectOff();
    SetAssertionLogPath("C:\\asserts.txt");
    expectOff();
    InitializeDefaultAssertionPath();
    expectOff();
    EnableAsserts(false);
    expectOff();
}

TEST(FormatArgs, ReturnsOneStaticBuffer) {
    char *const first = FORMAT_ARGS("%d %s", 12, "texts");
    EXPECT_STREQ(first, "12 texts");
    char *const second = FORMAT_ARGS("again");
    EXPECT_EQ(second, first);
    EXPECT_STREQ(first, "again");
    EXPECT_STREQ(FORMAT_ARGS("%s", ""), "");
}

TEST(FormatArgs, NullFormatGivesAnEmptyText) {
    EXPECT_STREQ(FORMAT_ARGS("before"), "before");
    EXPECT_STREQ(FORMAT_ARGS(nullptr), "");
}

TEST(FormatArgs, CutsSilentlyAt2047Bytes) {
    LogLines log;
    for (std::size_t const length : {2046U, 2047U, 2048U, 2049U, 10000U}) {
        std::string const text(length, 'x');
        EXPECT_EQ(std::strlen(FORMAT_ARGS("%s", text.c_str())), length < 2047 ? length : 2047U);
    }
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(FormatArgs2, NullFormatGivesAnEmptyString) { EXPECT_TRUE(FORMAT_ARGS2(nullptr).empty()); }

TEST(FormatArgs2, FormatsAndDecodes) {
    EXPECT_EQ(FORMAT_ARGS2("%d of %d", 3, 4), "3 of 4");
    EXPECT_EQ(UnitsOf(FORMAT_ARGS2("%s", "\xE2\x82\xAC\xC3\xBC")), (Units{0x20AC, 0xFC}));
}

TEST(FormatArgs2, ResultsAreIndependentOfTheBuffer) {
    KTString const first = FORMAT_ARGS2("first");
    KTString const second = FORMAT_ARGS2("second");
    EXPECT_EQ(first, "first");
    EXPECT_EQ(second, "second");
}

TEST(FormatArgs2, GrowsUntilTheTextFits) {
    LogLines log;
    for (std::size_t const length : {1U, 4095U, 4096U, 5000U, 8191U, 8192U, 100000U, 3U}) {
        std::string const text(length, 'y');
        EXPECT_EQ(FORMAT_ARGS2("%s", text.c_str()).GetUTF8String(), text) << length;
    }
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(FormatArgs2, TheLongestTextHas4100095Bytes) {
    LogLines log;
    std::string const longest(4'100'095, 'z');
    EXPECT_EQ(FORMAT_ARGS2("%s", longest.c_str()).size(), longest.size());
    EXPECT_EQ(log.Take(), Lines{});
    std::string const longer(4'100'096, 'z');
    EXPECT_EQ(FORMAT_ARGS2("%s", longer.c_str()).size(), longest.size());
    EXPECT_EQ(log.Take(), kCapReport);
    EXPECT_EQ(FORMAT_ARGS2("%sz", longer.c_str()).size(), longest.size());
    EXPECT_EQ(log.Take(), kCapReport); // once for each call
}

TEST(FormatArgs2, TheCapIsNotReportedWhileLoggingIsDisabled) {
    LogLines log;
    std::string const longer(4'100'096, 'z');
    gKTLogger->LogEnableAtRuntime(false);
    EXPECT_EQ(FORMAT_ARGS2("%s", longer.c_str()).size(), 4'100'095U);
    gKTLogger->LogEnableAtRuntime(true);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(BibAddressProc, IsStoredAndHandedBack) {
    EXPECT_EQ(GetKTBibAddressProc(), nullptr);
    EXPECT_EQ(SetKTBibAddressProc(&FirstHook), kKTErrorNone);
    EXPECT_EQ(GetKTBibAddressProc(), &FirstHook);
    EXPECT_EQ(SetKTBibAddressProc(nullptr), kKTErrorNone);
    EXPECT_EQ(GetKTBibAddressProc(), nullptr);
}

TEST(Allocate, SharesTheGlobalHeap) {
    void *const block = Allocate(1000);
    ASSERT_NE(block, nullptr);
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % alignof(std::max_align_t), 0U);
    std::memset(block, 0xAB, 1000);
    Deallocate(block);
    Deallocate(::operator new(10));
    ::operator delete(Allocate(10));
    void *const none = Allocate(0);
    EXPECT_NE(none, nullptr);
    Deallocate(none);
    Deallocate(nullptr);
}

#if !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__) && defined(_WIN32)
TEST(Allocate, ThrowsWhenMemoryIsShort) {
    EXPECT_THROW(Allocate(std::numeric_limits<KTUInt64>::max() / 2), std::bad_alloc);
}
#endif
