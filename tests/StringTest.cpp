// StringTest.cpp: comparison, concatenation, search and edit of KTString.

#include "Units.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <stdexcept>

namespace {

constexpr char const *kNullBytes = nullptr;
constexpr unsigned short const *kNullUnits = nullptr;
constexpr wchar_t const *kNullWide = nullptr;
constexpr auto npos = KTString::npos;

// Runs `action`, which must throw Error with exactly this text.
template <typename Error, typename Action> void ExpectError(char const *text, Action action) {
    try {
        action();
        ADD_FAILURE() << "nothing thrown, expected " << text;
    } catch (Error const &error) {
        EXPECT_STREQ(error.what(), text);
    }
}

template <typename Action> void ExpectInvalidPosition(Action action) {
    ExpectError<std::out_of_range>("invalid string position", action);
}

template <typename Action> void ExpectTooLong(Action action) {
    ExpectError<std::length_error>("string too long", action);
}

} // namespace

TEST(String, NotFoundIsTheLargest64BitValue) {
    EXPECT_EQ(KTString::npos, 0xFFFFFFFFFFFFFFFFU);
    EXPECT_EQ(KTString::GetNPos(), 0xFFFFFFFFFFFFFFFFU);
}

TEST(String, ShortTextIsHeldInline) {
    KTString const text("1234567");
    auto const *const object = reinterpret_cast<char const *>(&text);
    auto const *const units = reinterpret_cast<char const *>(text.c_str());
    EXPECT_TRUE(units >= object && units < object + sizeof text);
}

TEST(String, IsAlwaysTerminated) {
    KTString text;
    EXPECT_EQ(*text.c_str(), 0);
    text = "abc";
    EXPECT_EQ(text.c_str()[3], 0);
    EXPECT_EQ(text[3], 0);
    text.erase(1);
    EXPECT_EQ(text.c_str()[1], 0);
}

TEST(String, CopiesAndMovesAreValues) {
    KTString first("first text, longer than inline");
    KTString copy(first);
    copy[0] = 'F';
    EXPECT_EQ(first, "first text, longer than inline");
    KTString moved(std::move(copy));
    EXPECT_EQ(moved, "First text, longer than inline");
    first = moved;
    EXPECT_EQ(first, moved);
    KTString const &alias = first;
    first = alias;
    EXPECT_EQ(first, moved);
}

TEST(String, EqualsEveryKindOfTextOnBothSides) {
    KTString const text("K\xC3\xBCste");
    unsigned short const *const units = U(u"K\u00FCste");
    EXPECT_TRUE(text == KTString(units) && text == "K\xC3\xBCste" && text == units && text == L"K\u00FCste");
    EXPECT_TRUE("K\xC3\xBCste" == text && units == text && L"K\u00FCste" == text);
    EXPECT_FALSE(text != KTString(units) || text != "K\xC3\xBCste" || text != units || text != L"K\u00FCste");
    EXPECT_FALSE("K\xC3\xBCste" != text || units != text || L"K\u00FCste" != text);
    for (char const *other : {"K\xC3\xBCst", "K\xC3\xBCste!", "K\xC3\xBCstf", "k\xC3\xBCste", ""}) {
        KTString const different(other);
        std::wstring const wide = different.GetWstring();
        EXPECT_TRUE(text != different && text != other && text != different.c_str() && text != wide.c_str()) << other;
        EXPECT_TRUE(other != text && different.c_str() != text && wide.c_str() != text) << other;
        EXPECT_FALSE(text == different || text == other || text == different.c_str() || text == wide.c_str());
        EXPECT_FALSE(other == text || different.c_str() == text || wide.c_str() == text);
    }
}

TEST(String, NullPointersCompareAsEmpty) {
    KTString const empty;
    KTString const text("a");
    EXPECT_TRUE(empty == kNullBytes && empty == kNullUnits && empty == kNullWide);
    EXPECT_TRUE(kNullBytes == empty && kNullUnits == empty && kNullWide == empty);
    EXPECT_TRUE(text != kNullBytes && text != kNullUnits && text != kNullWide);
    EXPECT_TRUE(kNullBytes != text && kNullUnits != text && kNullWide != text);
    EXPECT_TRUE(kNullBytes < text && kNullUnits < text && kNullWide < text);
    EXPECT_FALSE(text < kNullBytes || text < kNullUnits || text < kNullWide);
    EXPECT_FALSE(empty < kNullBytes || empty < kNullUnits || empty < kNullWide);
}

TEST(String, OrderIsOrdinalThenByLength) {
    // As units: "B" < "a"; as unsigned numbers: 0x7FFF < 0x8000 < 0xFFE9; a surrogate pair sorts below U+E000.
    std::vector<Units> const ascending{{},    {0},      {'A'},    {'A', 0},         {'A', 'A'}, {'B'},
                                       {'a'}, {0x7FFF}, {0x8000}, {0xD83D, 0xDC1D}, {0xE000},   {0xFFE9}};
    for (std::size_t i = 0; i < ascending.size(); ++i) {
        for (std::size_t j = 0; j < ascending.size(); ++j) {
            KTString const a = FromUnits(ascending[i]);
            KTString const b = FromUnits(ascending[j]);
            EXPECT_EQ(a < b, i < j) << i << ' ' << j;
            EXPECT_EQ(a == b, i == j) << i << ' ' << j;
            EXPECT_EQ(a.compare(b) < 0, i < j) << i << ' ' << j;
            EXPECT_EQ(a.compare(b) > 0, i > j) << i << ' ' << j;
        }
    }
}

TEST(String, SortsAgainstEveryKindOfTextOnBothSides) {
    KTString const text("middle");
    EXPECT_TRUE(text < "n" && text < U(u"n") && text < L"n" && text < KTString("middle!"));
    EXPECT_TRUE("l" < text && U(u"l") < text && L"l" < text);
    EXPECT_FALSE(text < "middle" || text < U(u"middle") || text < L"middle" || text < "middl");
    EXPECT_FALSE("middle" < text || U(u"n") < text || L"middle!" < text);
    EXPECT_LT(text.compare(U(u"n")), 0);
    EXPECT_EQ(text.compare(U(u"middle")), 0);
    EXPECT_GT(text.compare(kNullUnits), 0);
}

TEST(String, ConcatenatesEveryKindOfTextOnBothSides) {
    KTString const b("b");
    EXPECT_EQ(b + KTString("c"), "bc");
    EXPECT_EQ(b + "\xE2\x82\xAC", U(u"b\u20AC"));
    EXPECT_EQ(b + U(u"c"), "bc");
    EXPECT_EQ(b + L"c", "bc");
    EXPECT_EQ(b + static_cast<unsigned short>(0x20AC), U(u"b\u20AC"));
    EXPECT_EQ("\xE2\x82\xAC" + b, U(u"\u20AC"
                                    u"b"));
    EXPECT_EQ(U(u"a") + b, "ab");
    EXPECT_EQ(L"a" + b, "ab");
    EXPECT_EQ(static_cast<unsigned short>('a') + b, "ab");
    EXPECT_EQ(kNullBytes + b + kNullBytes + kNullUnits + kNullWide, "b");
    EXPECT_EQ(kNullUnits + b, "b");
    EXPECT_EQ(kNullWide + b, "b");
}

TEST(String, AppendsEveryKindOfText) {
    KTString text;
    text += KTString("a");
    text += "\xC3\xBC";
    text += U(u"c");
    text += L"d";
    text += static_cast<unsigned short>('e');
    text += kNullBytes;
    text += kNullUnits;
    text += kNullWide;
    EXPECT_EQ(text, U(u"a\u00FC"
                      u"cde"));
    text += text;
    EXPECT_EQ(text, U(u"a\u00FC"
                      u"cdea\u00FC"
                      u"cde"));
}

TEST(String, FindsForwardAndBackward) {
    KTString const text("abcabc");
    EXPECT_EQ(text.find(KTString("bc")), 1U);
    EXPECT_EQ(text.find(KTString("bc"), 2), 4U);
    EXPECT_EQ(text.find(KTString("x")), npos);
    EXPECT_EQ(text.find(KTString(), 6), 6U);
    EXPECT_EQ(text.find(KTString(), 7), npos);
    EXPECT_EQ(text.find(U(u"ca")), 2U);
    EXPECT_EQ(text.find(U(u"cax"), 0, 2), 2U);
    EXPECT_EQ(text.find(U(u"cax"), 0, 3), npos);
    EXPECT_EQ(text.find('c', 3), 5U);
    EXPECT_EQ(text.rfind(KTString("bc")), 4U);
    EXPECT_EQ(text.rfind(KTString("bc"), 3), 1U);
    EXPECT_EQ(text.rfind(U(u"abc")), 3U);
    EXPECT_EQ(text.rfind(U(u"abx"), npos, 2), 3U);
    EXPECT_EQ(text.rfind('a', 2), 0U);
    EXPECT_EQ(text.rfind('x'), npos);
    EXPECT_EQ(text.find(kNullUnits), 0U);
    EXPECT_EQ(text.rfind(kNullUnits), 6U);
}

TEST(String, FindsUnitsOfASet) {
    KTString const text("aabbcc");
    EXPECT_EQ(text.find_first_of(KTString("cb")), 2U);
    EXPECT_EQ(text.find_first_of(U(u"c"), 1), 4U);
    EXPECT_EQ(text.find_first_of(U(u"cb"), 0, 1), 4U);
    EXPECT_EQ(text.find_first_of('b', 3), 3U);
    EXPECT_EQ(text.find_first_of(KTString()), npos);
    EXPECT_EQ(text.find_last_of(KTString("ab")), 3U);
    EXPECT_EQ(text.find_last_of(U(u"a")), 1U);
    EXPECT_EQ(text.find_last_of(U(u"ab"), npos, 1), 1U);
    EXPECT_EQ(text.find_last_of('c', 4), 4U);
    EXPECT_EQ(text.find_first_not_of(KTString("ab")), 4U);
    EXPECT_EQ(text.find_first_not_of(U(u"a")), 2U);
    EXPECT_EQ(text.find_first_not_of(U(u"ab"), 0, 1), 2U);
    EXPECT_EQ(text.find_first_not_of('a', 1), 2U);
    EXPECT_EQ(text.find_first_not_of(KTString("abc")), npos);
    EXPECT_EQ(text.find_last_not_of(KTString("bc")), 1U);
    EXPECT_EQ(text.find_last_not_of(U(u"c")), 3U);
    EXPECT_EQ(text.find_last_not_of(U(u"cb"), npos, 1), 3U);
    EXPECT_EQ(text.find_last_not_of('c', 5), 3U);
    EXPECT_EQ(KTString().find_last_not_of('c'), npos);
}

// The whole search family against the standard string, whose meaning it has.
TEST(String, SearchesLikeTheStandardString) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (int round = 0; round < 20000; ++round) {
        KTUnits model;
        KTUnits set;
        for (std::size_t n = random() % 20; n != 0; --n) {
            model.push_back(static_cast<unsigned short>('a' + random() % 3));
        }
        for (std::size_t n = random() % 4; n != 0; --n) {
            set.push_back(static_cast<unsigned short>('a' + random() % 3));
        }
        KTString const text = FromUnits({model.begin(), model.end()});
        KTString const needle = FromUnits({set.begin(), set.end()});
        std::size_t const from = random() % 5 == 0 ? npos : random() % 24;
        std::size_t const count = set.empty() ? 0 : random() % set.size();
        ASSERT_EQ(text.find(needle, from), model.find(set, from));
        ASSERT_EQ(text.rfind(needle, from), model.rfind(set, from));
        ASSERT_EQ(text.find_first_of(needle, from), model.find_first_of(set, from));
        ASSERT_EQ(text.find_last_of(needle, from), model.find_last_of(set, from));
        ASSERT_EQ(text.find_first_not_of(needle, from), model.find_first_not_of(set, from));
        ASSERT_EQ(text.find_last_not_of(needle, from), model.find_last_not_of(set, from));
        ASSERT_EQ(text.find(set.c_str(), from, count), model.find(set.c_str(), from, count));
        ASSERT_EQ(text.find_last_not_of(set.c_str(), from, count), model.find_last_not_of(set.c_str(), from, count));
        ASSERT_EQ(text.Contains(needle) != 0, model.find(set) != npos);
    }
}

TEST(String, ComparesParts) {
    KTString const text("abcdef");
    EXPECT_EQ(text.compare(1, 3, KTString("bcd")), 0);
    EXPECT_LT(text.compare(1, 2, KTString("bcd")), 0);
    EXPECT_EQ(text.compare(2, npos, KTString("xcdefx"), 1, 4), 0);
    EXPECT_EQ(text.compare(4, 9, U(u"ef")), 0);
    EXPECT_EQ(text.compare(4, 9, U(u"efg"), 2), 0);
    EXPECT_EQ(text.compare(6, 1, kNullUnits), 0);
    ExpectInvalidPosition([&] { (void)text.compare(7, 1, KTString("a")); });
    ExpectInvalidPosition([&] { (void)text.compare(7, 1, U(u"a")); });
    ExpectInvalidPosition([&] { (void)text.compare(0, 1, KTString("a"), 2, 1); });
}

TEST(String, InsertsErasesAndReplaces) {
    KTString text("ad");
    text.insert(1, KTString("c"));
    text.insert(1, KTString("xbx"), 1, 1);
    EXPECT_EQ(text, "abcd");
    text.insert(4, U(u"e")).insert(5, U(u"fgh"), 1).insert(0, 2, '-');
    EXPECT_EQ(text, "--abcdef");
    EXPECT_EQ(*text.insert(text.cbegin(), static_cast<unsigned short>('+')), '+');
    EXPECT_EQ(text, "+--abcdef");
    EXPECT_EQ(*text.erase(text.cbegin()), '-');
    EXPECT_EQ(*text.erase(text.cbegin(), text.cbegin() + 2), 'a');
    EXPECT_EQ(text.erase(4), "abcd");
    EXPECT_EQ(text.erase(1, 2), "ad");
    EXPECT_EQ(text.replace(1, 1, KTString("bcd")), "abcd");
    EXPECT_EQ(text.replace(0, 2, KTString("xyz"), 1, npos), "yzcd");
    EXPECT_EQ(text.replace(1, 2, U(u"-")), "y-d");
    EXPECT_EQ(text.replace(0, 1, U(u"abc"), 2), "ab-d");
    EXPECT_EQ(text.replace(2, 1, 3, '.'), "ab...d");
    EXPECT_EQ(text.replace(0, npos, kNullUnits), "");
    EXPECT_EQ(KTString("ab").erase(), "");
}

TEST(String, AppendsAndAssigns) {
    KTString text;
    text.append(KTString("a")).append(KTString("xbx"), 1, 1).append(U(u"c")).append(U(u"dxx"), 1).append(2, 'e');
    text.push_back('f');
    EXPECT_EQ(text, "abcdeef");
    EXPECT_EQ(text.assign(KTString("new")), "new");
    EXPECT_EQ(text.assign(KTString("xnewx"), 1, 3), "new");
    EXPECT_EQ(text.assign(U(u"units")), "units");
    EXPECT_EQ(text.assign(U(u"units"), 2), "un");
    EXPECT_EQ(text.assign(3, 'z'), "zzz");
    EXPECT_EQ(text.assign(text, 1, 1), "z");
    EXPECT_EQ(text.assign(kNullUnits), "");
    EXPECT_EQ(KTString("abc").substr(1), "bc");
    EXPECT_EQ(KTString("abc").substr(1, 1), "b");
    EXPECT_EQ(KTString("abc").substr(3), "");
}

TEST(String, EditsItselfWithItself) {
    KTString text("0123456789");
    text.insert(5, text);
    EXPECT_EQ(text, "01234012345678956789");
    text.replace(0, 10, text, 15, 5);
    EXPECT_EQ(text, "567895678956789");
    text.append(text.c_str(), 2);
    EXPECT_EQ(text, "56789567895678956");
}

TEST(String, PositionsPastTheEndThrow) {
    KTString text("abc");
    KTString const &constant = text;
    EXPECT_EQ(text.at(2), 'c');
    EXPECT_EQ(constant.at(0), 'a');
    ExpectInvalidPosition([&] { (void)text.at(3); });
    ExpectInvalidPosition([&] { (void)constant.at(3); });
    ExpectInvalidPosition([&] { (void)text.at(npos); });
    ExpectInvalidPosition([&] { (void)constant.at(npos); });
    ExpectInvalidPosition([&] { (void)text.substr(4); });
    ExpectInvalidPosition([&] { text.insert(4, KTString("x")); });
    ExpectInvalidPosition([&] { text.insert(4, U(u"x")); });
    ExpectInvalidPosition([&] { text.insert(4, U(u"x"), 1); });
    ExpectInvalidPosition([&] { text.insert(4, 1, 'x'); });
    ExpectInvalidPosition([&] { text.insert(0, KTString("x"), 2, 1); });
    ExpectInvalidPosition([&] { text.erase(4); });
    ExpectInvalidPosition([&] { text.replace(4, 0, KTString("x")); });
    ExpectInvalidPosition([&] { text.replace(0, 0, KTString("x"), 2, 0); });
    ExpectInvalidPosition([&] { text.replace(4, 0, 1, 'x'); });
    ExpectInvalidPosition([&] { text.append(KTString("x"), 2, 1); });
    ExpectInvalidPosition([&] { text.assign(KTString("x"), 2, 1); });
    EXPECT_EQ(text, "abc");
}

TEST(String, LengthsPastTheMaximumThrow) {
    KTString text("abc");
    std::size_t const most = text.max_size();
    ExpectTooLong([&] { text.append(most, 'x'); });
    ExpectTooLong([&] { text.append(U(u"x"), most); });
    ExpectTooLong([&] { text.append(U(u"x"), npos); });
    ExpectTooLong([&] { text.insert(1, most, 'x'); });
    ExpectTooLong([&] { text.insert(1, U(u"x"), most - 2); });
    ExpectTooLong([&] { text.replace(0, 2, most, 'x'); });
    ExpectTooLong([&] { text.assign(npos, 'x'); });
    ExpectTooLong([&] { text.reserve(npos); });
    EXPECT_EQ(text, "abc");
}

TEST(String, IteratesInBothDirections) {
    KTString text("abc");
    EXPECT_EQ(UnitsOf(text), (Units{'a', 'b', 'c'}));
    EXPECT_EQ(Units(text.rbegin(), text.rend()), (Units{'c', 'b', 'a'}));
    KTString const &constant = text;
    EXPECT_EQ(Units(constant.rbegin(), constant.rend()), (Units{'c', 'b', 'a'}));
    EXPECT_EQ(constant.end() - constant.begin(), 3);
    EXPECT_EQ(text.cend() - text.cbegin(), 3);
    std::reverse(text.begin(), text.end());
    EXPECT_EQ(text, "cba");
    text[0] = 'C';
    text.at(1) = 'B';
    EXPECT_EQ(text, "CBa");
    EXPECT_EQ(constant[0], 'C');
}

TEST(String, KnowsItsSize) {
    KTString text("abc");
    EXPECT_EQ(text.size(), 3U);
    EXPECT_EQ(text.length(), 3U);
    EXPECT_FALSE(text.empty());
    text.reserve(100);
    EXPECT_GE(text.capacity(), 100U);
    EXPECT_EQ(text, "abc");
    KTString other("other");
    text.swap(other);
    EXPECT_EQ(text, "other");
    text.clear();
    EXPECT_TRUE(text.empty());
}
