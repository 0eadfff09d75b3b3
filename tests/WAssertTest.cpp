// WAssertTest.cpp: the growable formatting buffer from the outside: when it is allocated, and the format that never ends.

#include "KTAssert.h"
#include "WChildProcess.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

namespace {

std::vector<std::size_t> g_ArraySizes;
int g_ArraysFreed = 0;

void *RecordNewArray(std::size_t size) {
    g_ArraySizes.push_back(size);
    return std::malloc(size);
}

void RecordDeleteArray(void *block) {
    if (block != nullptr) {
        ++g_ArraysFreed;
    }
    std::free(block);
}

using Sizes = std::vector<std::size_t>;

} // namespace

TEST(FormatArgs2Child, DISABLED_ChildWatchesTheBuffer) {
    WImportHook const allocation(L"KTPublic.dll", "_Znay", &RecordNewArray);
    WImportHook const release(L"KTPublic.dll", "_ZdaPv", &RecordDeleteArray);
    ASSERT_TRUE(allocation.IsActive());
    ASSERT_TRUE(release.IsActive());
    std::string const text(5000, 'x');

    FORMAT_ARGS2(nullptr);
    EXPECT_EQ(std::exchange(g_ArraySizes, {}), Sizes{}) << "a null format needs no buffer";
    FORMAT_ARGS2("short");
    EXPECT_EQ(std::exchange(g_ArraySizes, {}), Sizes{4096});
    EXPECT_EQ(FORMAT_ARGS2("%s", text.c_str()).size(), 5000U);
    EXPECT_EQ(std::exchange(g_ArraySizes, {}), Sizes{8192});
    EXPECT_EQ(g_ArraysFreed, 1) << "the smaller buffer was replaced";
    EXPECT_EQ(FORMAT_ARGS2("short"), "short");
    FORMAT_ARGS2(nullptr);
    EXPECT_EQ(std::exchange(g_ArraySizes, {}), Sizes{}) << "the grown buffer is kept";
    FORMAT_ARGS2("%s%s", text.c_str(), text.c_str());
    EXPECT_EQ(std::exchange(g_ArraySizes, {}), Sizes{12288}) << "growth starts from the largest size so far";
}

TEST(FormatArgs2Child, TheBufferGrowsByStepsAndIsKept) {
    WChildProcess child("FormatArgs2Child.DISABLED_ChildWatchesTheBuffer");
    EXPECT_EQ(child.ExitStatus(), 0U);
}

TEST(FormatArgs2Child, DISABLED_ChildFormatsNothing) {
    WSignal(WChildProcess::Argument()).Set();
    FORMAT_ARGS2("%s", "");
}

TEST(FormatArgs2Child, AnExpansionToNothingNeverReturns) {
    std::wstring const name = L"kt-empty-format-" + std::to_wstring(GetCurrentProcessId());
    WSignal started(name);
    WChildProcess child("FormatArgs2Child.DISABLED_ChildFormatsNothing", {.argument = name, .flags = 0, .temp = {}});
    ASSERT_TRUE(started.IsSetWithin(60000));
    EXPECT_FALSE(child.EndsWithin(500));
}
