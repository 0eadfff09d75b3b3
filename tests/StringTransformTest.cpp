// StringTransformTest.cpp: numbers in text, predicates, replacing and splitting.

#include "LogLines.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <climits>
#include <ios>

namespace {

using Lines = std::vector<std::string>;

KTString WithNumber(int number, char const *format) {
    KTString text;
    EXPECT_EQ(text.AppendNumber(number, KTString(format)), kKTErrorNone);
    return text;
}

KTString WithReal(double number, int precision) {
    KTString text;
    EXPECT_EQ(text.AppendRealNumber(KTReal(number), precision), kKTErrorNone);
    return text;
}

std::vector<std::string> Pieces(char const *text, char const *delimiters) {
    std::vector<std::string> pieces;
    for (KTString const &piece : KTString(text).Split(KTString(delimiters))) {
        pieces.push_back(piece.GetUTF8String());
    }
    return pieces;
}

} // namespace

TEST(StringNumbers, IntegersAreAppended) {
    KTString text("n=");
    EXPECT_EQ(text.AppendNumber(-42), kKTErrorNone);
    EXPECT_EQ(text, "n=-42");
    EXPECT_EQ(text.AppendNumber(INT_MIN), kKTErrorNone);
    EXPECT_EQ(text, "n=-42-2147483648");
    KTString unsignedText;
    EXPECT_EQ(unsignedText.AppendUNumber(UINT_MAX), kKTErrorNone);
    EXPECT_EQ(unsignedText, "4294967295");
    KTString wide;
    EXPECT_EQ(wide.AppendUInt64(ULLONG_MAX), kKTErrorNone);
    EXPECT_EQ(wide, "18446744073709551615");
}

TEST(StringNumbers, TheCallersFormatIsUsed) {
    EXPECT_EQ(WithNumber(255, "%04x"), "00ff");
    EXPECT_EQ(WithNumber(7, "\xE2\x82\xAC %d %%"), U(u"\u20AC 7 %"));
    EXPECT_EQ(WithNumber(65, "%c"), "A");
    EXPECT_EQ(WithNumber(1, "no number"), "no number");
    EXPECT_EQ(WithNumber(1, ""), "");
}

TEST(StringNumbers, PointersAreDecimal) {
    KTString text;
    EXPECT_EQ(text.AppendPointer(reinterpret_cast<void *>(0x10)), kKTErrorNone);
    EXPECT_EQ(text, "16");
    KTString null;
    EXPECT_EQ(null.AppendPointer(nullptr), kKTErrorNone);
    EXPECT_EQ(null, "0");
}

TEST(StringNumbers, RealsHaveTheirPrecision) {
    EXPECT_EQ(WithReal(3.14159, 2), "3.14");
    EXPECT_EQ(WithReal(3.14159, 0), "3");
    EXPECT_EQ(WithReal(-0.5, 3), "-0.500");
    EXPECT_EQ(WithReal(1e15, 1), "1000000000000000.0");
}

TEST(StringNumbers, TextOf99BytesFitsAnd100DoesNot) {
    LogLines log;
    EXPECT_EQ(WithReal(1.0, 97).size(), 99U);
    EXPECT_EQ(log.Take(), Lines{});
    EXPECT_EQ(WithReal(1.0, 98), "");
    EXPECT_EQ(WithReal(1e300, 2), "");
    EXPECT_EQ(WithReal(1.0, INT_MAX), "");
    EXPECT_EQ(WithNumber(1, "%100d"), "");
    Lines const reports(4, "Assert failed: Number does not fit the buffer at source/private/utils/KTString:312");
    EXPECT_EQ(log.Take(), reports);
}

TEST(StringNumbers, FormatsThatReadPointersAreRefused) {
    LogLines log;
    for (char const *format :
         {"%s", "%S", "%Z", "%n", "%-10s", "%d %s", "%% %hs", "%*.*ls", "%Fs", "%hNs", "%1$s", "%'s", "% %s"}) {
        EXPECT_EQ(WithNumber(1, format), "") << format;
        EXPECT_EQ(log.Take(),
                  Lines{"Assert failed: Number format reads a pointer at source/private/utils/KTString:301"});
    }
    EXPECT_EQ(WithNumber(1, "%%s"), "%s");
    EXPECT_EQ(WithNumber(1, "%d s"), "1 s");
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(StringNumbers, IntegersAreRead) {
    EXPECT_EQ(KTString("123").GetIntValue(), 123U);
    EXPECT_EQ(KTString("  7 apples").GetIntValue(std::dec), 7U);
    EXPECT_EQ(KTString("fF").GetIntValue(std::hex), 255U);
    EXPECT_EQ(KTString("0x1A").GetIntValue(std::hex), 26U);
    EXPECT_EQ(KTString("17").GetIntValue(std::oct), 15U);
    EXPECT_EQ(KTString("4294967295").GetIntValue(), 4294967295U);
    EXPECT_EQ(KTString("-1").GetIntValue(), 4294967295U);
    EXPECT_EQ(KTString("99999999999").GetIntValue(), 4294967295U);
    EXPECT_EQ(KTString("18446744073709551615").GetUInt64Value(), ULLONG_MAX);
    EXPECT_EQ(KTString("ffffffffffffffff").GetUInt64Value(std::hex), ULLONG_MAX);
    EXPECT_EQ(KTString("5000000000").GetUInt64Value(std::dec), 5000000000U);
    EXPECT_EQ(KTString("12").GetIntValue(nullptr), 12U);
}

TEST(StringNumbers, OtherValuesAreRead) {
    EXPECT_EQ(KTString("-2.5e3 ").GetDoubleValue(), -2500.0);
    EXPECT_EQ(KTString("1000").GetPointerValue(), reinterpret_cast<void *>(0x1000));
    EXPECT_EQ(KTString("0x20").GetPointerValue(), reinterpret_cast<void *>(0x20));
}

TEST(StringNumbers, TextWithoutANumberReadsAsZero) {
    for (char const *text : {"", "   ", "abc!", "-", "\xE2\x82\xAC 5"}) {
        KTString const string(text);
        EXPECT_EQ(string.GetIntValue(), 0U) << text;
        EXPECT_EQ(string.GetUInt64Value(), 0U) << text;
        EXPECT_EQ(string.GetDoubleValue(), 0.0) << text;
        EXPECT_EQ(KTString("xyz").GetPointerValue(), nullptr) << text;
    }
}

TEST(StringPredicates, ContainsFindsTexts) {
    EXPECT_EQ(KTString("abc").Contains("bc"), 1);
    EXPECT_EQ(KTString("abc").Contains("x"), 0);
    EXPECT_EQ(KTString("abc").Contains(""), 1);
    EXPECT_EQ(KTString().Contains(KTString()), 1);
}

TEST(StringPredicates, ContainsAnyFollowsItsFlags) {
    EXPECT_EQ(KTString("abc").ContainsAny("xyc", 0), 1);
    EXPECT_EQ(KTString("abc").ContainsAny("C", OString::kAnyOfExact), 0);
    EXPECT_EQ(KTString("abc").ContainsAny("C", OString::kAnyOfIgnoreCase), 1);
    EXPECT_EQ(KTString("abc").ContainsAny("", 0), 0);
}

TEST(StringPredicates, ThirtyTwoCharactersAreSpecial) {
    std::string const special = "~`!@#$%^&*()_+{}:\"<>?/.,';[]=-|\\";
    ASSERT_EQ(special.size(), 32U);
    for (int c = 1; c < 128; ++c) {
        bool const expected = special.find(static_cast<char>(c)) != std::string::npos;
        KTString text("ab");
        text.insert(1, 1, static_cast<unsigned short>(c));
        EXPECT_EQ(text.ContainsSpecialCharacters() != 0, expected) << c;
    }
    EXPECT_EQ(KTString("gr\xC3\xBC\xC3\x9F"
                       "e 12")
                  .ContainsSpecialCharacters(),
              0);
    EXPECT_EQ(KTString().ContainsSpecialCharacters(), 0);
}

TEST(StringPredicates, NineCharactersAreForbiddenInFileNames) {
    std::string const forbidden = "/\\:*?\"<>|";
    ASSERT_EQ(forbidden.size(), 9U);
    for (int c = 1; c < 128; ++c) {
        bool const expected = forbidden.find(static_cast<char>(c)) == std::string::npos;
        KTString text("ab");
        text.insert(1, 1, static_cast<unsigned short>(c));
        EXPECT_EQ(text.IsPermissableFileName() != 0, expected) << c;
    }
    EXPECT_EQ(KTString("report.txt").IsPermissableFileName(), 1);
    EXPECT_EQ(KTString("report.txt").ContainsSpecialCharacters(), 1);
    EXPECT_EQ(KTString().IsPermissableFileName(), 1);
}

TEST(StringReplace, ReplaceAllSearchesFromTheBeginningAgain) {
    EXPECT_EQ(KTString("one two one").ReplaceAll("one", "1"), "1 two 1");
    // What a replacement creates is replaced too, to its left as well.
    EXPECT_EQ(KTString("aabb").ReplaceAll("ab", ""), "");
    EXPECT_EQ(KTString("aaabbb").ReplaceAll("ab", ""), "");
    EXPECT_EQ(KTString("xaab").ReplaceAll("ab", "b"), "xb");
    EXPECT_EQ(KTString("////").ReplaceAll("//", "/"), "/");
    EXPECT_EQ(KTString("abababa").ReplaceAll("aba", "a"), "a");
}

TEST(StringReplace, ReplaceAllChangesTheStringItself) {
    KTString text("a.b.c");
    EXPECT_EQ(&text.ReplaceAll(".", ""), &text);
    EXPECT_EQ(text, "abc");
    KTString self("ab");
    self.ReplaceAll(self, "x");
    EXPECT_EQ(self, "x");
}

TEST(StringReplace, ReplaceAll2GoesOnBehindEachReplacement) {
    EXPECT_EQ(KTString("aa").ReplaceAll2("a", "aa"), "aaaa");
    EXPECT_EQ(KTString("aabb").ReplaceAll2("ab", ""), "ab");
    EXPECT_EQ(KTString("////").ReplaceAll2("//", "/"), "//");
    EXPECT_EQ(KTString("aaa").ReplaceAll2("aa", "b"), "ba");
    EXPECT_EQ(KTString("text").ReplaceAll2("", "x"), "text");
    EXPECT_EQ(KTString("text").ReplaceAll2("text", ""), "");
    EXPECT_EQ(KTString().ReplaceAll2("a", "b"), "");
    KTString text("a.b");
    EXPECT_EQ(&text.ReplaceAll2(".", text), &text);
    EXPECT_EQ(text, "aa.bb");
    text.ReplaceAll2(text, "x");
    EXPECT_EQ(text, "x");
}

TEST(StringSplit, EverySeparatorCuts) {
    using Strings = std::vector<std::string>;
    EXPECT_EQ(Pieces("a,,b", ","), (Strings{"a", "", "b"}));
    EXPECT_EQ(Pieces("a;b,c", ",;"), (Strings{"a", "b", "c"}));
    EXPECT_EQ(Pieces(",a,", ","), (Strings{"", "a", ""}));
    EXPECT_EQ(Pieces("", ","), (Strings{""}));
    EXPECT_EQ(Pieces("", ""), (Strings{""}));
    EXPECT_EQ(Pieces("abc", ""), (Strings{"abc"}));
    EXPECT_EQ(Pieces(",", ","), (Strings{"", ""}));
    EXPECT_EQ(Pieces("\xE2\x82\xAC|\xC3\xBC", "|"), (Strings{"\xE2\x82\xAC", "\xC3\xBC"}));
    // More delimiters than are held inline.
    EXPECT_EQ(Pieces("1a2z3m4", "zyxwvutsrqponmlkjihgfedcba"), (Strings{"1", "2", "3", "4"}));
}
