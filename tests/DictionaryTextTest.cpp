// DictionaryTextTest.cpp: the text form: lines, quotation marks, encodings, what is written and what survives it.

#include "DictionaryFiles.h"
#include "DictionaryLines.h"

#include <gtest/gtest.h>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

std::string Utf16(UnitsView text, bool isBig = false) {
    return Fields(isBig).Raw(isBig ? "\xFE\xFF" : "\xFF\xFE").Units(text).Bytes();
}

// The entries of a text, read as bytes and in both orders of UTF-16, which must be the same.
std::string Read(std::string_view ascii) {
    DictionaryReader bytes;
    ReadBytes(bytes, ascii);
    KTUnits const units(ascii.begin(), ascii.end());
    for (bool const isBig : {false, true}) {
        DictionaryReader wide;
        ReadBytes(wide, Utf16(units, isBig));
        EXPECT_EQ(List(bytes), List(wide)) << ascii;
        EXPECT_EQ(bytes.IsValid(), wide.IsValid()) << ascii;
    }
    return (bytes.IsValid() ? "" : "invalid ") + List(bytes);
}

std::string Told(std::string_view ascii) {
    DictionaryReader dictionary;
    Problems problems;
    ReadBytes(dictionary, ascii, &problems);
    return problems.Text();
}

TEST(DictionaryTextTest, OneEntryALine) {
    EXPECT_EQ("/A=x /B=y", Read("\"$$$/A=x\"\r\n\"$$$/B=y\"\r\n"));
    EXPECT_EQ("/A=x /B=y", Read("\"$$$/A=x\"\n\"/B=y\""));
    EXPECT_EQ("/A=x /B=y", Read("\"$$$/A=x\"\r\"/B=y\"\r"));
    EXPECT_EQ("/A=x /B=y", Read("\n\r\r\n\n\"$$$/A=x\"\r\n\r\n\n\n\"/B=y\"\n\n"));
    EXPECT_EQ("", Read(""));
    EXPECT_EQ("", Read("\r\n"));
    EXPECT_EQ("/A=x /B=y /C=z", Read("/A=x\n/B=y\r/C=z"));
}

TEST(DictionaryTextTest, TheEntryStandsBetweenQuotationMarks) {
    EXPECT_EQ("/A=x", Read("rubbish $ = \"$$$/A=x\" more = \"$x\""));
    EXPECT_EQ("/A=x", Read("\"/A=x"));
    EXPECT_EQ("/A=x ", Read("/A=x "));
    EXPECT_EQ(" /A=x", Read(" /A=x")) << "without quotation marks blanks count";
    EXPECT_EQ("/A=say \"hi\"", Read("\"/A=say \\\"hi\\\"\""));
    EXPECT_EQ("/A=\"", Read("\"/A=\\\"\" rest"));
    EXPECT_EQ("/A=x\"y", Read("/A=x\\\"y")) << "a mark behind a backslash begins no entry";
    EXPECT_EQ("/A=x", Read("\\\"\"/A=x\""));
    EXPECT_EQ("/A=x\\\" y", Read("\"/A=x\\\\\" y\"")) << "the mark is looked at before the escapes are";
    EXPECT_EQ("", Read("\"\""));
    EXPECT_EQ("", Read("\""));
    EXPECT_EQ("/B=y", Read("\"\" /A=x\n/B=y"));
}

TEST(DictionaryTextTest, KeysAndTexts) {
    EXPECT_EQ("/A=x=y", Read("\"$$$/A=x=y\""));
    EXPECT_EQ("/A=", Read("\"$$$/A=\""));
    EXPECT_EQ("/A=", Read("\"$$$/A\""));
    EXPECT_EQ("$$$/A=x", Read("\"$$$$$$/A=x\"")) << "dropped once";
    EXPECT_EQ("", Read("\"=x\""));
    EXPECT_EQ("", Read("\"$$$=x\""));
    EXPECT_EQ("", Read("\"$$$\""));
    EXPECT_EQ("a b=c", Read("a b=c"));
    EXPECT_EQ("/A=2 /B=b", Read("/A=1\n/B=b\n/A=2"));
}

TEST(DictionaryTextTest, ALoneDollarClearsTheFlagAndSkipsTheLine) {
    EXPECT_EQ("invalid /A=x", Read("\"$/B=y\"\n\"/A=x\""));
    EXPECT_EQ("invalid /A=x", Read("$$/B=y\n/A=x"));
    EXPECT_EQ("invalid ", Read("$"));
    EXPECT_EQ("invalid ", Read("$$"));
    EXPECT_EQ("/$B=y", Read("/$B=y"));
}

TEST(DictionaryTextTest, TheFlagIsNeverSetAgain) {
    DictionaryReader dictionary;
    ReadBytes(dictionary, "$x");
    ReadBytes(dictionary, "/A=x");
    ReadBytes(dictionary, SmallFile().Bytes());
    EXPECT_FALSE(dictionary.IsValid());
}

TEST(DictionaryTextTest, TextsAreUnescaped) {
    EXPECT_EQ("/K=He said \"hi\"<00A9><2122>", Read("\"$$$/K=He said \\\"hi\\\"#{copy}^T\""));
    EXPECT_EQ("/K=a<000A>b<000D><000A>", Read("\"$$$/K=a\\nb#{endl}\""));
    EXPECT_EQ("/K\\n^T=x", Read("/K\\n^T=x")) << "keys are not";
}

TEST(DictionaryTextTest, AZeroAtTheBeginningOfALineEndsTheText) {
    EXPECT_EQ("/A=x", Read(B("/A=x\n\0/B=y\n/C=z")));
    EXPECT_EQ("/A=x", Read(B("/A=x\r\n\r\n\0")));
    EXPECT_EQ("", Read(B("\0/A=x")));
    EXPECT_EQ("/A=x<0000>y /B=z", Read(B("/A=x\0y\n/B=z"))) << "inside a line it belongs to the text";
    EXPECT_EQ(std::string("/A\0=x", 5), Read(B("/A\0=x")));
}

TEST(DictionaryTextTest, EncodingsByTheFirstTwoBytes) {
    DictionaryReader dictionary;
    ReadBytes(dictionary, Utf16(V(u"/A=\u00E9\u263A")));
    ReadBytes(dictionary, Utf16(V(u"/B=\u00E9\u263A"), true));
    ReadBytes(dictionary, "/C=\xE9");
    ReadBytes(dictionary, "\xFF");
    ReadBytes(dictionary, "\xFE");
    ReadBytes(dictionary, "\xFF\xFF/D=x");
    EXPECT_EQ("<00E9><263A>", Look(dictionary, "/A"));
    EXPECT_EQ("<00E9><263A>", Look(dictionary, "/B"));
    EXPECT_EQ(Show(MultibyteToUnits(kEncodingAnsi, "\xE9")), Look(dictionary, "/C"));
    EXPECT_TRUE(dictionary.IsValid());
    // A key's units are narrowed to their low bytes: the mark of other bytes is no mark but part of the key.
    KTUnits const odd = MultibyteToUnits(kEncodingAnsi, "\xFF\xFF/D");
    std::string name;
    for (unsigned short const unit : odd) {
        name.push_back(static_cast<char>(unit));
    }
    EXPECT_EQ("x", Look(dictionary, name));
}

TEST(DictionaryTextTest, KeysAreNarrowedToLowBytes) {
    DictionaryReader dictionary;
    Problems problems;
    ReadBytes(dictionary, Utf16(V(u"/\u0141\u00E9=x")), &problems);
    EXPECT_EQ("/A\xE9=x", List(dictionary));
    EXPECT_EQ("1:wide-key:/A\xE9", problems.Text());
    ReadBytes(dictionary, Utf16(V(u"\u0124\u0124\u0124/B=x"))); // narrowed, three dollars
    EXPECT_EQ("x", Look(dictionary, "$$$$$$/B")) << "the dollars are looked at as units";
}

TEST(DictionaryTextTest, AnOddByteAtTheEndIsLeftOut) {
    for (bool const isBig : {false, true}) {
        DictionaryReader dictionary;
        Problems problems;
        ReadBytes(dictionary, Utf16(V(u"/A=x\n/B=y"), isBig) + "z", &problems);
        EXPECT_EQ("/A=x /B=y", List(dictionary));
        EXPECT_FALSE(dictionary.IsValid());
        EXPECT_EQ("2:odd-byte:", problems.Text());
    }
    DictionaryReader markOnly;
    ReadBytes(markOnly, "\xFF\xFE");
    EXPECT_TRUE(markOnly.IsValid());
}

TEST(DictionaryTextTest, LinesLongerThanAPieceAndManyOfThem) {
    std::string file;
    std::string const longText(3 * BufferedSource::kPiece + 1, 'v');
    file += "/Long=" + longText + "\r\n";
    for (int i = 0; i < 20'000; ++i) {
        file += "\"$$$/" + std::to_string(i) + "=" + std::to_string(i * 3) + "\"\r\n";
    }
    DictionaryReader dictionary;
    Problems problems;
    ReadBytes(dictionary, file + "\"$x\"", &problems);
    EXPECT_EQ(20'001U, dictionary.Array().EntryTotal());
    EXPECT_EQ(longText, Look(dictionary, "/Long"));
    EXPECT_EQ("59997", Look(dictionary, "/19999"));
    EXPECT_EQ("20002:lone-dollar:", problems.Text());
}

TEST(DictionaryTextTest, TellsEachProblemWithItsLine) {
    EXPECT_EQ("", Told("\"$$$/A=x\\n^T#{copy}\"\r\n\r\n\"$$$/B=\"\r\n"));
    EXPECT_EQ("2:lone-dollar:", Told("/A=x\n$B=y"));
    EXPECT_EQ("1:empty-key:", Told("\"=x\""));
    EXPECT_EQ("1:no-equals:/A", Told("\"/A\""));
    EXPECT_EQ("3:unclosed-quote:/A", Told("\n\n\"/A=x"));
    EXPECT_EQ("1:text-before:/A", Told("x \"/A=x\""));
    EXPECT_EQ("1:text-after:/A", Told("\"/A=x\" y"));
    EXPECT_EQ("", Told(" \t\"/A=x\"\t "));
    EXPECT_EQ("1:unknown-escape:/A", Told("/A=\\x"));
    EXPECT_EQ("1:unknown-caret:/A", Told("/A=^x"));
    EXPECT_EQ("1:trailing-escape:/A", Told("/A=x\\"));
    EXPECT_EQ("1:trailing-escape:/A", Told("/A=x^"));
    EXPECT_EQ("1:unknown-entity:/A 1:unknown-entity:/A", Told("/A=#{x}#{copyx}"));
    EXPECT_EQ("4:duplicate-key:/A", Told("/A=x\r\n\r\n/B=y\r\n$$$/A=z"));
    EXPECT_EQ("3:early-end:", Told(B("/A=x\n\n\0/B=y")));
    EXPECT_EQ("1:no-equals: 1:empty-key:", Told("\"\""));
}

TEST(DictionaryTextTest, LinesAreCountedAsEditorsDo) {
    EXPECT_EQ("5:lone-dollar: 7:lone-dollar: 8:lone-dollar:", Told("\r\n\n\r\r\n$a\r\n\r\n$b\r$c"));
    EXPECT_EQ("1:lone-dollar: 2:lone-dollar: 4:lone-dollar:", Told("$a\r$b\n\r$c"));
}

TEST(DictionaryTextTest, WritesTheTextForm) {
    DictionaryReader dictionary;
    dictionary.Add("$$$/A", V(u"x\n\r\"y\"\t\\^#{copy}"));
    dictionary.Add("/\xC3\xA9", V(u"\u263A"));
    dictionary.Add("/Empty", {});
    DictionaryForm form;
    form.isBinary = false;
    UnitsView const expected = V(u"\"/A=x\\n\\r\\\"y\\\"\t\\^#{copy}\"\r\n\"/\u00C3\u00A9=\u263A\"\r\n\"/Empty=\"\r\n");
    EXPECT_EQ(Utf16(expected), WriteBytes(dictionary, form));
    form.order = std::endian::big;
    EXPECT_EQ(Utf16(expected, true), WriteBytes(dictionary, form));
    EXPECT_EQ("\xFF\xFE", WriteBytes(DictionaryReader(), {false, 0, std::endian::little}));
}

TEST(DictionaryTextTest, WritesTheAnsiCodePageAndTellsLosses) {
    DictionaryReader dictionary;
    dictionary.Add("/A", V(u"x\u00E9"));
    dictionary.Add("/B", V(u"\u65E5"));
    DictionaryForm const form{false, kEncodingAnsi, std::endian::little};
    Problems problems;
    std::string const bytes = WriteBytes(dictionary, form, &problems);
    EXPECT_EQ("\"/A=x" + UnitsToMultibyte(kEncodingAnsi, V(u"\u00E9")) + "\"\r\n\"/B=?\"\r\n", bytes);
    EXPECT_EQ("0:unmappable-text:/B", problems.Text());
    DictionaryReader read;
    ReadBytes(read, bytes);
    EXPECT_EQ("/A=x<00E9> /B=?", List(read));
}

TEST(DictionaryTextTest, EntriesWithNeitherKeyNorTextAreNotWritten) {
    SmallFile file;
    file.keysPresent = 'N';
    file.hasKeys = false;
    file.buckets = 0;
    file.valueLengths = {0, 4};
    DictionaryReader dictionary;
    ReadBytes(dictionary, file.Bytes());
    EXPECT_EQ(Utf16(V(u"\"=H\u00E9\"\r\n")), WriteBytes(dictionary, {false, 0, std::endian::little}));
}

TEST(DictionaryTextTest, WhatIsWrittenReadsBackButForBackslashesCaretsAndEntities) {
    DictionaryReader dictionary;
    dictionary.Add("/A", V(u"say \"hi\"\r\n\u263A\xD800\t\b$=\u00A9"));
    dictionary.Add("/\xC3\xA9", V(u"x"));
    dictionary.Add("/Long", KTUnits(70'000, 'v'));
    dictionary.Add("/Empty", {});
    dictionary.Add("/Zero", V(u"a\0b"));
    for (bool const isBig : {false, true}) {
        DictionaryReader read;
        Problems problems;
        DictionaryForm const form{false, 0, isBig ? std::endian::big : std::endian::little};
        ReadBytes(read, WriteBytes(dictionary, form), &problems);
        EXPECT_TRUE(read.IsValid());
        EXPECT_EQ(List(dictionary), List(read));
        EXPECT_EQ("", problems.Text());
    }
}

TEST(DictionaryTextTest, SaysWhichEntriesSurvive) {
    for (char16_t const *text : {u"x", u"", u"\"", u"\n\r\t", u"\u263A", u"#", u"{copy}", u"$", u"=", u"#x"}) {
        UnitsView const units(reinterpret_cast<unsigned short const *>(text), std::char_traits<char16_t>::length(text));
        EXPECT_TRUE(SurvivesTextForm("/A", units, kEncodingNone)) << Show(units);
    }
    for (char16_t const *text : {u"\\n", u"\\\\", u"x\\", u"^T", u"^^", u"#{copy}", u"#{41}"}) {
        UnitsView const units(reinterpret_cast<unsigned short const *>(text), std::char_traits<char16_t>::length(text));
        EXPECT_FALSE(SurvivesTextForm("/A", units, kEncodingNone)) << Show(units);
    }
    // These look like escapes and stay.
    EXPECT_TRUE(SurvivesTextForm("/A", V(u"\\x ^x #{x}"), kEncodingNone));
    for (char const *key : {"$A", "/A\n", "/A\rB", "/A\"B", "", "/A=B"}) {
        EXPECT_FALSE(SurvivesTextForm(key, V(u"x"), kEncodingNone)) << key;
    }
    EXPECT_TRUE(SurvivesTextForm("/\xC3\xA9", V(u"x"), kEncodingNone));
    EXPECT_TRUE(SurvivesTextForm("/A$ \\", V(u"x"), kEncodingNone));
    EXPECT_TRUE(SurvivesTextForm("/A", V(u"x"), kEncodingAnsi));
    EXPECT_FALSE(SurvivesTextForm("/A", V(u"\u65E5"), kEncodingAnsi));
    EXPECT_FALSE(SurvivesTextForm("/A", V(u"^T"), kEncodingAnsi));
}

// What SurvivesTextForm says is what writing and reading do.
TEST(DictionaryTextTest, SurvivingIsReadingBackTheSame) {
    std::string const letters = "\"\\^#{}nTcopy$=/ \r\n";
    unsigned state = 1;
    auto const next = [&state] { return (state = state * 1664525 + 1013904223) >> 16; };
    for (int round = 0; round < 4000; ++round) {
        std::string key = "/";
        KTUnits value;
        for (unsigned i = next() % 4; i > 0; --i) {
            key.push_back(letters[next() % letters.size()]);
        }
        for (unsigned i = next() % 10; i > 0; --i) {
            value.push_back(static_cast<unsigned char>(letters[next() % letters.size()]));
        }
        DictionaryReader dictionary;
        if (key.find('=') != std::string::npos) {
            continue; // cannot be added
        }
        dictionary.Add(key, value);
        DictionaryReader read;
        ReadBytes(read, WriteBytes(dictionary, {false, 0, std::endian::little}));
        bool const survived = List(read) == List(dictionary) && read.IsValid();
        EXPECT_EQ(survived, SurvivesTextForm(key, value, kEncodingNone)) << key << " " << Show(value);
    }
}

} // namespace
