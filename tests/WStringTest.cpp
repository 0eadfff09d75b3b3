// WStringTest.cpp: replacements that never end, shown in child processes.

#include "KTString.h"
#include "WChildProcess.h"

#include <gtest/gtest.h>

#include <string>

namespace {

// Starts the child, waits until it says that it is about to replace, and expects that it does not come back.
void ExpectEndless(char const *test) {
    std::wstring const name =
        L"kt-endless-" + std::to_wstring(GetCurrentProcessId()) + std::to_wstring(GetTickCount64());
    WSignal started(name);
    WChildProcess child(test, {.argument = name, .flags = 0, .temp = {}});
    ASSERT_TRUE(started.IsSetWithin(60000));
    EXPECT_FALSE(child.EndsWithin(500));
}

} // namespace

TEST(EndlessReplaceAll, DISABLED_ChildReplacesByItself) {
    WSignal(WChildProcess::Argument()).Set();
    KTString("one a here").ReplaceAll("a", "a");
}

TEST(EndlessReplaceAll, DISABLED_ChildReplacesNothing) {
    WSignal(WChildProcess::Argument()).Set();
    KTString("text").ReplaceAll("", "");
}

TEST(EndlessReplaceAll, AReplacementThatContainsItsNeedleNeverEnds) {
    ExpectEndless("EndlessReplaceAll.DISABLED_ChildReplacesByItself");
}

TEST(EndlessReplaceAll, AnEmptyNeedleNeverEnds) { ExpectEndless("EndlessReplaceAll.DISABLED_ChildReplacesNothing"); }
