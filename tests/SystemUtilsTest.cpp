// SystemUtilsTest.cpp: services of the system that answer on every machine.

#include "KTSystemUtils.h"

#include "LogLines.h"

#include <gtest/gtest.h>

#include <regex>
#include <set>
#include <string>

namespace {

TEST(GuidTest, IsGroupsOfDigitsJoinedByHyphensAndNewEachTime) {
    std::regex const form("[0-9a-f]{8}-[0-9a-f]{4}-[0-9a-f]{4}-[0-9a-f]{4}-[0-9a-f]{12}");
    LogLines log;
    std::set<std::string> seen;
    for (int i = 0; i < 1000; ++i) {
        std::string const text = KTSystemUtils::CreateGUID().GetUTF8String();
        EXPECT_TRUE(std::regex_match(text, form)) << text;
        EXPECT_TRUE(seen.insert(text).second) << text;
    }
    EXPECT_TRUE(log.Take().empty());
}

} // namespace
