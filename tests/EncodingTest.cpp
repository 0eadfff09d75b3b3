// EncodingTest.cpp: KTString and OString between bytes and UTF-16, well-formed and broken.

#include "Units.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

namespace {

KTString FromBytes(std::string const &bytes) { return KTString(bytes.c_str(), KTString::kKTEncodingUTF8); }

struct Sample {
    char const *name;
    std::string utf8;
    Units units;
};

std::vector<Sample> const kWellFormed{
    {"ascii", "Hello", {'H', 'e', 'l', 'l', 'o'}},
    {"latin",
     "Gr\xC3\xB6\xC3\x9F"
     "e",
     {'G', 'r', 0xF6, 0xDF, 'e'}},
    {"cyrillic", "\xD0\x9A\xD1\x83\xD1\x80\xD1\x81", {0x41A, 0x443, 0x440, 0x441}},
    {"cjk", "\xE8\xAA\xB2\xE7\xA8\x8B", {0x8AB2, 0x7A0B}},
    {"emoji", "\xF0\x9F\x90\x9D!", {0xD83D, 0xDC1D, '!'}},
    {"first of two bytes", "\xC2\x80", {0x80}},
    {"last of two bytes", "\xDF\xBF", {0x7FF}},
    {"first of three bytes", "\xE0\xA0\x80", {0x800}},
    {"before the surrogates", "\xED\x9F\xBF", {0xD7FF}},
    {"after the surrogates", "\xEE\x80\x80", {0xE000}},
    {"last of three bytes", "\xEF\xBF\xBF", {0xFFFF}},
    {"first of four bytes", "\xF0\x90\x80\x80", {0xD800, 0xDC00}},
    {"last character", "\xF4\x8F\xBF\xBF", {0xDBFF, 0xDFFF}},
    {"byte order mark is kept", "\xEF\xBB\xBFx", {0xFEFF, 'x'}},
};

constexpr unsigned short R = 0xFFFD;

// The first ones are the examples of Unicode 15, tables 3-8 to 3-11.
std::vector<Sample> const kIllFormed{
    {"non-shortest forms", "\xC0\xAF\xE0\x80\xBF\xF0\x81\x82\x41", {R, R, R, R, R, R, R, R, 'A'}},
    {"surrogates", "\xED\xA0\x80\xED\xBF\xBF\xED\xAF\x41", {R, R, R, R, R, R, R, R, 'A'}},
    {"others", "\xF4\x91\x92\x93\xFF\x41\x80\xBF\x42", {R, R, R, R, R, 'A', R, R, 'B'}},
    {"truncated", "\xE1\x80\xE2\xF0\x91\x92\xF1\xBF\x41", {R, R, R, R, 'A'}},
    {"cut at the end, two", "a\xC3", {'a', R}},
    {"cut at the end, three", "a\xE2\x82", {'a', R}},
    {"cut at the end, four", "a\xF0\x9F\x90", {'a', R}},
    {"lone byte of another code page", "A\xE9", {'A', R}},
    {"continuation first",
     "\x80"
     "a",
     {R, 'a'}},
    {"five-byte form", "\xF8\x88\x80\x80\x80", {R, R, R, R, R}},
    {"above the last character", "\xF4\x90\x80\x80", {R, R, R, R}},
};

} // namespace

TEST(Encoding, Utf8IsDecodedAndEncoded) {
    for (Sample const &sample : kWellFormed) {
        EXPECT_EQ(UnitsOf(FromBytes(sample.utf8)), sample.units) << sample.name;
        EXPECT_EQ(FromUnits(sample.units).GetUTF8String(), sample.utf8) << sample.name;
        EXPECT_EQ(OString::FromUTF8(sample.utf8).GetUTF8(), sample.utf8) << sample.name;
    }
}

TEST(Encoding, EachMaximalIllFormedPartBecomesOneReplacement) {
    for (Sample const &sample : kIllFormed) {
        EXPECT_EQ(UnitsOf(FromBytes(sample.utf8)), sample.units) << sample.name;
    }
}

TEST(Encoding, EveryCodePointSurvivesTheRoundTrip) {
    Units units;
    for (unsigned point = 1; point <= 0x10FFFF; ++point) {
        if (point >= 0x10000) {
            units.push_back(static_cast<unsigned short>(0xD800 + ((point - 0x10000) >> 10)));
            units.push_back(static_cast<unsigned short>(0xDC00 + ((point - 0x10000) & 0x3FF)));
        } else if (point < 0xD800 || point > 0xDFFF) {
            units.push_back(static_cast<unsigned short>(point));
        }
    }
    std::string const utf8 = FromUnits(units).GetUTF8String();
    EXPECT_EQ(utf8, ReferenceEncode(units));
    EXPECT_TRUE(UnitsOf(FromBytes(utf8)) == units);
}

TEST(Encoding, UnpairedSurrogatesAreEncodedAsReplacements) {
    EXPECT_EQ(FromUnits({0xD800}).GetUTF8String(), "\xEF\xBF\xBD");
    EXPECT_EQ(FromUnits({0xDC00, 'a'}).GetUTF8String(), "\xEF\xBF\xBD"
                                                        "a");
    EXPECT_EQ(FromUnits({0xD83D, 'a', 0xDC1D}).GetUTF8String(), "\xEF\xBF\xBD"
                                                                "a\xEF\xBF\xBD");
    EXPECT_EQ(FromUnits({0xD83D, 0xD83D, 0xDC1D}).GetUTF8String(), "\xEF\xBF\xBD\xF0\x9F\x90\x9D");
    EXPECT_EQ(FromUnits({0xDC1D, 0xD83D}).GetUTF8String(), "\xEF\xBF\xBD\xEF\xBF\xBD");
}

// Every short byte sequence from the bytes at which the decoder's decisions change, at every distance from a block's
// borders.
TEST(Encoding, AllShortSequencesOfCriticalBytesDecodeAsDefined) {
    std::string const critical("\x41\x7F\x80\x8F\x90\x9F\xA0\xBF\xC1\xC2\xDF\xE0\xE1\xED\xEF\xF0\xF1\xF4\xF5\xFF");
    for (char const a : critical) {
        for (char const b : critical) {
            for (char const c : critical) {
                std::string const text{a, b, c, '\xBF'};
                ASSERT_EQ(UnitsOf(FromBytes(text)), ReferenceDecode(text));
                std::string const inside = "0123456789abc" + text + "0123456789abcdefghij";
                ASSERT_EQ(UnitsOf(FromBytes(inside)), ReferenceDecode(inside));
            }
        }
    }
}

TEST(Encoding, RandomBytesDecodeAsDefined) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    std::vector<std::string> pieces{"plain ASCII text of some length ",
                                    "\xC3\xA9",
                                    "\xD0\x9A\xD1\x83",
                                    "\xE8\xAA\xB2",
                                    "\xF0\x9F\x90\x9D",
                                    "\xE2\x82",
                                    "\xF0\x9F",
                                    "\x80",
                                    "\xC0",
                                    "\xED\xA0\x80",
                                    "z"};
    for (int round = 0; round < 20000; ++round) {
        std::string text;
        std::size_t const length = random() % 200;
        while (text.size() < length) {
            if (random() % 8 == 0) {
                text.push_back(static_cast<char>(1 + random() % 255));
            } else {
                text += pieces[random() % pieces.size()];
            }
        }
        ASSERT_EQ(UnitsOf(FromBytes(text)), ReferenceDecode(text));
    }
}

TEST(Encoding, RandomUnitsEncodeAsDefined) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    unsigned short const kinds[] = {'a',    0x7F,   0x80,   0x7FF,  0x800,  0xD7FF,
                                    0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xE000, 0xFFFF};
    for (int round = 0; round < 20000; ++round) {
        Units units(random() % 100);
        unsigned short const common = kinds[random() % std::size(kinds)];
        for (unsigned short &unit : units) {
            unsigned const dice = random() % 4;
            unit = dice == 0   ? static_cast<unsigned short>(random())
                   : dice == 1 ? kinds[random() % std::size(kinds)]
                               : common;
        }
        ASSERT_EQ(FromUnits(units).GetUTF8String(), ReferenceEncode(units));
    }
}

TEST(Encoding, DecodingReservesNoMoreThanTheText) {
    std::string utf8;
    for (int i = 0; i < 1000; ++i) {
        utf8 += "\xE8\xAA\xB2";
    }
    EXPECT_EQ(FromBytes(utf8).size(), 1000U);
    EXPECT_LT(FromBytes(utf8).capacity(), 1100U);
}

TEST(Encoding, BytesAreSignExtended) {
    EXPECT_EQ(UnitsOf(KTString("\x41\xE9", KTString::kKTEncodingBytes)), (Units{0x0041, 0xFFE9}));
    EXPECT_EQ(UnitsOf(KTString("\x7F\x80\xFF", KTString::kKTEncodingBytes)), (Units{0x7F, 0xFF80, 0xFFFF}));
}

TEST(Encoding, AnyOtherEncodingYieldsAnEmptyString) {
    EXPECT_TRUE(KTString("text", static_cast<KTString::KTCharEncodingType>(2)).empty());
    EXPECT_TRUE(KTString("text", static_cast<KTString::KTCharEncodingType>(-1)).empty());
}

TEST(Encoding, NullPointersGiveEmptyStrings) {
    EXPECT_TRUE(KTString(static_cast<char const *>(nullptr), KTString::kKTEncodingBytes).empty());
    EXPECT_TRUE(KTString(static_cast<char const *>(nullptr), KTString::kKTEncodingUTF8).empty());
    EXPECT_TRUE(KTString(static_cast<unsigned short const *>(nullptr)).empty());
    EXPECT_TRUE(KTString(static_cast<wchar_t const *>(nullptr)).empty());
}

TEST(Encoding, TheEndIsFoundFromEveryAlignment) {
    for (std::size_t offset = 0; offset < 40; ++offset) {
        for (std::size_t length = 0; length < 70; ++length) {
            std::string const bytes = std::string(offset, 'x') + std::string(length, 'y');
            ASSERT_EQ(KTString(bytes.c_str() + offset, KTString::kKTEncodingBytes).size(), length);
            Units units(offset + length, 'y');
            units.push_back(0);
            ASSERT_EQ(KTString(units.data() + offset).size(), length);
            std::wstring const wide(offset + length, L'y');
            ASSERT_EQ(KTString(wide.c_str() + offset).size(), length);
        }
    }
}

TEST(Encoding, UnitAndWidePointersAreCopiedToTheirZero) {
    EXPECT_EQ(UnitsOf(KTString(U(u"a\xD800\x20AC"))), (Units{'a', 0xD800, 0x20AC}));
    wchar_t const wide[] = {L'a', static_cast<wchar_t>(0xD800), static_cast<wchar_t>(0x20AC), 0, L'b', 0};
    EXPECT_EQ(UnitsOf(KTString(wide)), (Units{'a', 0xD800, 0x20AC}));
}

TEST(Encoding, WideAndOrbFormsHoldTheUnits) {
    KTString const text = FromUnits({'a', 0, 0xD800, 0x20AC});
    std::wstring const wide = text.GetWstring();
    ASSERT_EQ(wide.size(), 4U);
    EXPECT_EQ(wide[1], L'\0');
    EXPECT_EQ(wide[2], static_cast<wchar_t>(0xD800));
    EXPECT_EQ(wide[3], static_cast<wchar_t>(0x20AC));
    OString const orb = text.GetOString();
    EXPECT_EQ(orb.length(), 4U);
    EXPECT_EQ(KTString(orb), text);
}

TEST(Encoding, AutomationStringsAreCopiedUpToTheGivenLength) {
    CComBSTR const bstr(5, L"ab\0cd");
    EXPECT_EQ(bstr.Length(), 5U);
    EXPECT_EQ(UnitsOf(KTString(bstr, 0)), (Units{'a', 'b', 0, 'c', 'd'}));
    EXPECT_EQ(UnitsOf(KTString(bstr, 2)), (Units{'a', 'b'}));
    EXPECT_EQ(UnitsOf(KTString(bstr, 4)), (Units{'a', 'b', 0, 'c'}));
    EXPECT_EQ(KTString(bstr, 5).size(), 5U);
    EXPECT_EQ(KTString(bstr, 6).size(), 5U);
    EXPECT_TRUE(KTString(CComBSTR(), 0).empty());
    EXPECT_TRUE(KTString(CComBSTR(), 7).empty());
}

TEST(Encoding, AutomationStringsOwnTheirText) {
    CComBSTR first(L"first");
    CComBSTR copy = first;
    EXPECT_NE(copy.m_str, first.m_str);
    CComBSTR moved = std::move(first);
    EXPECT_EQ(first.m_str, nullptr); // NOLINT(bugprone-use-after-move,clang-analyzer-cplusplus.Move): null is promised
    wchar_t *const detached = moved.Detach();
    EXPECT_EQ(moved.Length(), 0U);
    copy.Attach(detached);
    EXPECT_EQ(KTString(copy, 0), "first");
    copy.Attach(copy.m_str); // owned already
    EXPECT_EQ(KTString(copy, 0), "first");
    copy = CComBSTR(L"second");
    EXPECT_EQ(KTString(copy, 0), "second");
    EXPECT_EQ(CComBSTR(nullptr).m_str, nullptr);
}

TEST(Encoding, OrbAnyOfFollowsItsFlags) {
    OString const text = OString::FromUTF8("Kurs \xC3\x9C");
    EXPECT_TRUE(text.ContainsAny(OString::FromUTF8("xyzu")));
    EXPECT_FALSE(text.ContainsAny(OString::FromUTF8("k")));
    EXPECT_TRUE(text.ContainsAny(OString::FromUTF8("k"), OString::kAnyOfIgnoreCase));
    EXPECT_TRUE(text.ContainsAny(OString::FromUTF8("\xC3\xBC"), OString::kAnyOfIgnoreCase));
    EXPECT_FALSE(text.ContainsAny(OString::FromUTF8("q"), OString::kAnyOfIgnoreCase));
    EXPECT_FALSE(text.ContainsAny(OString()));
    EXPECT_FALSE(OString().ContainsAny(text));
    EXPECT_TRUE(text.ContainsAny(OString::FromUTF8("K"), 0xFFFFFFF0)); // unknown bits are ignored
}
