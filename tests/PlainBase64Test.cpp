// PlainBase64Test.cpp: Base64 as it runs on processors without SSE4.1, which the machine at hand would never choose, and
// dates of HTTP. Native build only, as neither is exported.

#include "KTBase64.h"
#include "KTHttpDate.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <random>
#include <stdexcept>
#include <string>
#include <vector>

using KTBase64::Runs;

TEST(PlainBase64, GivesWhatTheFastestCodeGives) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (int round = 0; round < 5000; ++round) {
        std::string bytes(random() % 200, '\0');
        for (char &byte : bytes) {
            byte = static_cast<char>(random());
        }
        std::string text = KTBase64::Encode(bytes, Runs::Plain);
        ASSERT_EQ(text, KTBase64::Encode(bytes, Runs::Fastest));
        ASSERT_EQ(KTBase64::Decode(text, Runs::Plain), bytes);
        ASSERT_EQ(KTBase64::Decode(text, Runs::Fastest), bytes);
        text.insert(random() % (text.size() + 1), random() % 5, ' ');
        ASSERT_EQ(KTBase64::Decode(text, Runs::Plain), bytes);
        text.insert(random() % (text.size() + 1), 1, '-');
        ASSERT_THROW(KTBase64::Decode(text, Runs::Plain), std::invalid_argument);
    }
}

// The encoder counts right by construction, so the check is asked by itself.
TEST(PlainBase64, AnotherNumberOfCharactersThanTheTextHoldsIsReported) {
    using Lines = std::vector<std::string>;
    LogLines log;
    EXPECT_TRUE(KTBase64::IsWhole(0, 0));
    EXPECT_TRUE(KTBase64::IsWhole(8, 8));
    EXPECT_EQ(log.Take(), Lines{});
    EXPECT_FALSE(KTBase64::IsWhole(7, 8));
    EXPECT_FALSE(KTBase64::IsWhole(12, 8));
    EXPECT_EQ(log.Take(), Lines(2, "Assert failed:  at source/private/utils/KTPublicUtils:231"));
}

TEST(HttpDate, HasTheFixedForm) {
    EXPECT_EQ(KTHttpDate(784111777), "Sun, 06 Nov 1994 08:49:37 GMT");
    EXPECT_EQ(KTHttpDate(0), "Thu, 01 Jan 1970 00:00:00 GMT");
    EXPECT_EQ(KTHttpDate(951782400), "Tue, 29 Feb 2000 00:00:00 GMT");
    EXPECT_EQ(KTHttpDate(253402300800), "Sat, 01 Jan 10000 00:00:00 GMT");
}
