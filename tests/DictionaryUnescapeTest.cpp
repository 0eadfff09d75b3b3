// DictionaryUnescapeTest.cpp: escapes with "\" and "^", entities and numbers; and the multibyte conversions.

#include "DictionaryUnescape.h"
#include "DictionaryEntities.h"
#include "DictionaryFiles.h"

#include <gtest/gtest.h>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

std::string Un(UnitsView text, CaretTable table = CaretTable::First) { return Show(Unescape(text, table)); }

KTUnits Ascii(std::string_view text) { return {text.begin(), text.end()}; }

TEST(DictionaryUnescapeTest, BackslashEscapes) {
    EXPECT_EQ("\"", Un(V(u"\\\"")));
    EXPECT_EQ("<000A>", Un(V(u"\\n")));
    EXPECT_EQ("<000D>", Un(V(u"\\r")));
    EXPECT_EQ("<0009>", Un(V(u"\\t")));
    EXPECT_EQ("<0008>", Un(V(u"\\b")));
    EXPECT_EQ("a<000A>b", Un(V(u"a\\nb")));
}

TEST(DictionaryUnescapeTest, CaretEscapesOfBothTables) {
    struct Row {
        char letter;
        char const *result;
    };
    constexpr Row kRows[] = {
        {'Q', "\""},     {'[', "<201C>"}, {']', "<201D>"}, {'{', "<2018>"}, {'}', "<2019>"}, {'C', "<00A9>"},
        {'R', "<00AE>"}, {'T', "<2122>"}, {'B', "<2022>"}, {'#', "<2318>"}, {'!', "<00AC>"}, {'I', "<2206>"},
        {'S', "<2211>"}, {'n', "<000A>"}, {'r', "<000D>"}, {'D', "<00B0>"},
    };
    std::string known = "e^";
    for (Row const &row : kRows) {
        KTUnits const text = Ascii(std::string{'^', row.letter});
        EXPECT_EQ(row.result, Un(text)) << row.letter;
        EXPECT_EQ(row.result, Un(text, CaretTable::Second)) << row.letter;
        known += row.letter;
    }
    EXPECT_EQ("^e", Un(V(u"^e")));
    EXPECT_EQ("<00E9>", Un(V(u"^e"), CaretTable::Second));
    for (char letter = 0x21; letter < 0x7F; ++letter) {
        if (known.find(letter) == std::string::npos) {
            std::string const text{'^', letter};
            EXPECT_EQ(text, Un(Ascii(text)));
            EXPECT_EQ(text, Un(Ascii(text), CaretTable::Second));
        }
    }
}

TEST(DictionaryUnescapeTest, ThePlatformsFlagSelectsTheSecondTable) {
    EXPECT_EQ(CaretTable::First, PlatformCaretTable());
    EXPECT_EQ("^e", Show(Unescape(V(u"^e"))));
    SetPlatformCaretFlag(true);
    EXPECT_EQ(CaretTable::Second, PlatformCaretTable());
    EXPECT_EQ("<00E9>", Show(Unescape(V(u"^e"))));
    SetPlatformCaretFlag(false);
    EXPECT_EQ("^e", Show(Unescape(V(u"^e"))));
}

TEST(DictionaryUnescapeTest, WhatHasNoMeaningStays) {
    EXPECT_EQ("\\x", Un(V(u"\\x")));
    EXPECT_EQ("^x", Un(V(u"^x")));
    EXPECT_EQ("\\", Un(V(u"\\\\")));
    EXPECT_EQ("^", Un(V(u"^^")));
    EXPECT_EQ("\\n", Un(V(u"\\\\n"))) << "the first backslash takes the second, not the n";
    EXPECT_EQ("\\<000A>", Un(V(u"\\\\\\n")));
    EXPECT_EQ("\\^C", Un(V(u"\\^C"))) << "the caret belongs to the backslash";
    EXPECT_EQ("^\\n", Un(V(u"^\\n")));
    EXPECT_EQ("a\\", Un(V(u"a\\")));
    EXPECT_EQ("a^", Un(V(u"a^")));
    EXPECT_EQ("\\", Un(V(u"\\")));
    EXPECT_EQ("", Un({}));
    EXPECT_EQ("\\<0101>", Un(V(u"\\\u0101"))) << "compared as units, not as bytes";
}

// The names and code points of HTML 4.01, sections 24.2.1 and 24.4.1, written down apart from the library's table.
constexpr struct {
    char const *name;
    unsigned unit;
} kHtml[] = {
    {"endl", 0x000D},   {"tab", 0x0009},    {"cr", 0x000D},     {"lf", 0x000A},     {"nbsp", 0x00A0},
    {"iexcl", 0x00A1},  {"cent", 0x00A2},   {"pound", 0x00A3},  {"curren", 0x00A4}, {"yen", 0x00A5},
    {"brvbar", 0x00A6}, {"sect", 0x00A7},   {"uml", 0x00A8},    {"copy", 0x00A9},   {"ordf", 0x00AA},
    {"laquo", 0x00AB},  {"not", 0x00AC},    {"shy", 0x00AD},    {"reg", 0x00AE},    {"macr", 0x00AF},
    {"deg", 0x00B0},    {"plusmn", 0x00B1}, {"sup2", 0x00B2},   {"sup3", 0x00B3},   {"acute", 0x00B4},
    {"micro", 0x00B5},  {"para", 0x00B6},   {"middot", 0x00B7}, {"cedil", 0x00B8},  {"sup1", 0x00B9},
    {"ordm", 0x00BA},   {"raquo", 0x00BB},  {"frac14", 0x00BC}, {"frac12", 0x00BD}, {"frac34", 0x00BE},
    {"iquest", 0x00BF}, {"Agrave", 0x00C0}, {"Aacute", 0x00C1}, {"Acirc", 0x00C2},  {"Atilde", 0x00C3},
    {"Auml", 0x00C4},   {"Aring", 0x00C5},  {"AElig", 0x00C6},  {"Ccedil", 0x00C7}, {"Egrave", 0x00C8},
    {"Eacute", 0x00C9}, {"Ecirc", 0x00CA},  {"Euml", 0x00CB},   {"Igrave", 0x00CC}, {"Iacute", 0x00CD},
    {"Icirc", 0x00CE},  {"Iuml", 0x00CF},   {"ETH", 0x00D0},    {"Ntilde", 0x00D1}, {"Ograve", 0x00D2},
    {"Oacute", 0x00D3}, {"Ocirc", 0x00D4},  {"Otilde", 0x00D5}, {"Ouml", 0x00D6},   {"times", 0x00D7},
    {"Oslash", 0x00D8}, {"Ugrave", 0x00D9}, {"Uacute", 0x00DA}, {"Ucirc", 0x00DB},  {"Uuml", 0x00DC},
    {"Yacute", 0x00DD}, {"THORN", 0x00DE},  {"szlig", 0x00DF},  {"agrave", 0x00E0}, {"aacute", 0x00E1},
    {"acirc", 0x00E2},  {"atilde", 0x00E3}, {"auml", 0x00E4},   {"aring", 0x00E5},  {"aelig", 0x00E6},
    {"ccedil", 0x00E7}, {"egrave", 0x00E8}, {"eacute", 0x00E9}, {"ecirc", 0x00EA},  {"euml", 0x00EB},
    {"igrave", 0x00EC}, {"iacute", 0x00ED}, {"icirc", 0x00EE},  {"iuml", 0x00EF},   {"eth", 0x00F0},
    {"ntilde", 0x00F1}, {"ograve", 0x00F2}, {"oacute", 0x00F3}, {"ocirc", 0x00F4},  {"otilde", 0x00F5},
    {"ouml", 0x00F6},   {"divide", 0x00F7}, {"oslash", 0x00F8}, {"ugrave", 0x00F9}, {"uacute", 0x00FA},
    {"ucirc", 0x00FB},  {"uuml", 0x00FC},   {"yacute", 0x00FD}, {"thorn", 0x00FE},  {"yuml", 0x00FF},
    {"quot", 0x0022},   {"amp", 0x0026},    {"lt", 0x003C},     {"gt", 0x003E},     {"OElig", 0x0152},
    {"oelig", 0x0153},  {"Scaron", 0x0160}, {"scaron", 0x0161}, {"Yuml", 0x0178},   {"circ", 0x02C6},
    {"tilde", 0x02DC},  {"ensp", 0x2002},   {"emsp", 0x2003},   {"thinsp", 0x2009}, {"zwnj", 0x200C},
    {"zwj", 0x200D},    {"lrm", 0x200E},    {"rlm", 0x200F},    {"ndash", 0x2013},  {"mdash", 0x2014},
    {"lsquo", 0x2018},  {"rsquo", 0x2019},  {"sbquo", 0x201A},  {"ldquo", 0x201C},  {"rdquo", 0x201D},
    {"bdquo", 0x201E},  {"dagger", 0x2020}, {"Dagger", 0x2021}, {"permil", 0x2030}, {"lsaquo", 0x2039},
    {"rsaquo", 0x203A}, {"euro", 0x20AC},
};

TEST(DictionaryUnescapeTest, HasThe132EntitiesInTheirOrder) {
    ASSERT_EQ(132U, std::size(kHtml));
    ASSERT_EQ(132U, kEntities.size());
    for (std::size_t i = 0; i < std::size(kHtml); ++i) {
        EXPECT_EQ(kHtml[i].name, kEntities[i].name);
        std::string expected = Show(KTUnits{static_cast<unsigned short>(kHtml[i].unit)});
        if (i == 0) {
            expected = "<000D><000A>";
        }
        KTUnits const text = Ascii("a#{" + std::string(kHtml[i].name) + "}b");
        EXPECT_EQ("a" + expected + "b", Un(text));
    }
}

// The first name in the table's order that the text begins with decides; no other one, and no number, is tried.
TEST(DictionaryUnescapeTest, ThePrefixRuleHoldsForEveryName) {
    for (auto const &entity : kHtml) {
        for (char letter = 0x21; letter < 0x7F; ++letter) {
            if (letter == '^' || letter == '\\') {
                continue; // takes the next character away before entities are looked for
            }
            std::string const text = "#{" + std::string(entity.name) + letter + "}";
            std::string const after = text.substr(2);
            bool isKnown = letter == '}';
            for (auto const &first : kHtml) {
                if (after.starts_with(first.name)) {
                    isKnown = after.substr(std::string_view(first.name).size()).starts_with('}');
                    break;
                }
            }
            EXPECT_EQ(!isKnown, Un(Ascii(text)) == text) << text;
        }
    }
}

TEST(DictionaryUnescapeTest, NumbersOfOneToFourDigits) {
    EXPECT_EQ("<263A>", Un(V(u"#{U+263A}")));
    EXPECT_EQ("<263A>", Un(V(u"#{u263a}")));
    EXPECT_EQ("<263A>", Un(V(u"#{263A}")));
    EXPECT_EQ("<263A>", Un(V(u"#{U+263a}")));
    EXPECT_EQ("A", Un(V(u"#{41}")));
    EXPECT_EQ("<0007>", Un(V(u"#{7}")));
    EXPECT_EQ("<0000>", Un(V(u"#{u0}")));
    EXPECT_EQ("<FFFF>", Un(V(u"#{ffff}")));
    EXPECT_EQ("#{U+1F600}", Un(V(u"#{U+1F600}")));
    EXPECT_EQ("#{u+263A}", Un(V(u"#{u+263A}")));
    EXPECT_EQ("#{U263A}", Un(V(u"#{U263A}")));
    EXPECT_EQ("#{U+}", Un(V(u"#{U+}")));
    EXPECT_EQ("#{u}", Un(V(u"#{u}")));
    EXPECT_EQ("#{G1}", Un(V(u"#{G1}")));
    EXPECT_EQ("#{26 3A}", Un(V(u"#{26 3A}")));
    EXPECT_EQ("#{<0141>}", Un(V(u"#{\u0141}"))) << "a unit whose low byte is a digit";
}

TEST(DictionaryUnescapeTest, WhatIsNoEntityStaysAndScanningGoesOnBehindTheHash) {
    EXPECT_EQ("#{copyx}", Un(V(u"#{copyx}")));
    EXPECT_EQ("#{COPY}", Un(V(u"#{COPY}"))) << "names are case-sensitive";
    EXPECT_EQ("#{copy", Un(V(u"#{copy")));
    EXPECT_EQ("#{", Un(V(u"#{")));
    EXPECT_EQ("#{}", Un(V(u"#{}")));
    EXPECT_EQ("#{1", Un(V(u"#{1")));
    EXPECT_EQ("#", Un(V(u"#")));
    EXPECT_EQ("#copy}", Un(V(u"#copy}")));
    EXPECT_EQ("#{#{<00A9>", Un(V(u"#{#{#{copy}")));
    EXPECT_EQ("##<00A9>}", Un(V(u"###{copy}}")));
    EXPECT_EQ("<00A9><00AE><000D><000A>", Un(V(u"#{copy}#{reg}#{endl}")));
}

TEST(DictionaryUnescapeTest, EntitiesComeAfterEscapes) {
    EXPECT_EQ("\"hi\"<00A9><2122>", Un(V(u"\\\"hi\\\"#{copy}^T")));
    EXPECT_EQ("#{copy\\}", Un(V(u"#{copy\\}")));
    EXPECT_EQ("#{co\\py}", Un(V(u"#{co\\py}")));
    EXPECT_EQ("<2318>{copy}", Un(V(u"^#{copy}"))) << "the caret has taken the hash away";
    EXPECT_EQ("\\<00A9>", Un(V(u"\\#{copy}")));
    EXPECT_EQ("\\n", Un(V(u"#{5C}n"))) << "what an entity gives is not looked at again";
}

TEST(DictionaryUnescapeTest, TellsWhatLooksLikeAnEscapeAndIsNone) {
    std::string told;
    auto const note = [&](EscapeProblem const &problem) {
        told += std::to_string(static_cast<int>(problem.kind)) + "@" + std::to_string(problem.at) + " ";
    };
    Unescape(V(u"a\\x^y#{zz}b\\"), CaretTable::First, note);
    EXPECT_EQ("0@1 1@3 2@11 3@5 ", told);
    told.clear();
    Unescape(V(u"\\n^T#{copy}\\\\^^"), CaretTable::First, note);
    EXPECT_EQ("", told);
}

TEST(DictionaryUnescapeTest, ConvertsUtf8AndTellsABufferThatIsTooSmall) {
    EXPECT_EQ("<00E9><20AC>", Show(MultibyteToUnits(kEncodingUtf8, "\xC3\xA9\xE2\x82\xAC")));
    EXPECT_EQ("<FFFD>", Show(MultibyteToUnits(kEncodingUtf8, "\xC3")));
    EXPECT_EQ("", Show(MultibyteToUnits(kEncodingUtf8, "")));
    unsigned short units[4] = {};
    EXPECT_EQ(2U, ConvertMultibyte(kEncodingUtf8, "ab", units, 2));
    for (int const encoding : {kEncodingUtf8, kEncodingAnsi}) {
        try {
            ConvertMultibyte(encoding, "abc", units, 2);
            FAIL() << "it does not fit";
        } catch (TextConversionException const &problem) {
            EXPECT_EQ(0x42554646U, problem.Code());
        }
    }
    // More than the system takes at once; the text itself is never touched.
    std::string_view const tooLong(reinterpret_cast<char const *>(units), std::size_t{1} << 31);
    for (int const encoding : {kEncodingUtf8, kEncodingAnsi}) {
        try {
            ConvertMultibyte(encoding, tooLong, units, 2);
            FAIL() << "it is too long";
        } catch (TextConversionException const &problem) {
            EXPECT_EQ(0x6875683FU, problem.Code());
        }
    }
}

TEST(DictionaryUnescapeTest, TellsWhatAnEncodingCannotHold) {
    bool lossy = false;
    EXPECT_EQ("\xC3\xA9", UnitsToMultibyte(kEncodingUtf8, V(u"\u00E9"), &lossy));
    EXPECT_EQ("ab", UnitsToMultibyte(kEncodingAnsi, V(u"ab"), &lossy));
    EXPECT_FALSE(lossy);
    UnitsToMultibyte(kEncodingUtf8, V(u"\xD800"), &lossy);
    EXPECT_TRUE(lossy);
    lossy = false;
    EXPECT_EQ("", UnitsToMultibyte(kEncodingAnsi, {}, &lossy));
    EXPECT_FALSE(lossy);
    UnitsToMultibyte(kEncodingAnsi, V(u"\u65E5"), &lossy);
    EXPECT_TRUE(lossy);
}

} // namespace
