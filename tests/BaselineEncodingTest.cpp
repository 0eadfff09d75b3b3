// BaselineEncodingTest.cpp: the conversions as they run on processors without SSE4.1, which the machine at hand would
// never choose. Native build only, as they are not exported.

#include "OUtf.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <iterator>
#include <random>
#include <string>

namespace {

Units Decoded(std::string const &bytes) {
    KTUnits const units = OUtf8ToUnitsBaseline(bytes);
    return {units.begin(), units.end()};
}

} // namespace

TEST(BaselineEncoding, RandomTextConvertsAsDefined) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    std::string const pieces[] = {
        "plain ASCII text of some length ", "\xC3\xA9", "\xD0\x9A\xD1\x83", "\xE8\xAA\xB2", "\xF0\x9F\x90\x9D", "z"};
    for (int round = 0; round < 20000; ++round) {
        std::string text;
        std::size_t const length = random() % 300;
        std::size_t const common = random() % std::size(pieces);
        while (text.size() < length) {
            text += pieces[random() % 3 == 0 ? random() % std::size(pieces) : common];
        }
        Units const units = ReferenceDecode(text);
        ASSERT_EQ(Decoded(text), units);
        ASSERT_EQ(OUnitsToUtf8Baseline(units.data(), units.size()), text);
        text.insert(random() % (text.size() + 1), 1, static_cast<char>(random()));
        ASSERT_EQ(Decoded(text), ReferenceDecode(text));
    }
}

TEST(BaselineEncoding, RandomUnitsEncodeAsDefined) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    unsigned short const kinds[] = {'a', 0x7F, 0x80, 0x7FF, 0x800, 0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xFFFF};
    for (int round = 0; round < 20000; ++round) {
        Units units(random() % 100);
        for (unsigned short &unit : units) {
            unit = random() % 3 == 0 ? static_cast<unsigned short>(random()) : kinds[random() % std::size(kinds)];
        }
        ASSERT_EQ(OUnitsToUtf8Baseline(units.data(), units.size()), ReferenceEncode(units));
    }
}
