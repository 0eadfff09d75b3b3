// SettingsFileTest.cpp: KTSimpleIniFileReader: which lines are variables and sections, in bytes and in UTF-16; chunks and
// zeros; encodings; numbers.

#include "KTSimpleIniFileReader.h"

#include "KTAssert.h"
#include "LogLines.h"
#include "ReaderModel.h"
#include "StreamSupport.h"

#include <climits>
#include <cmath>
#include <limits>
#include <locale>
#include <memory>
#include <optional>
#include <random>
#include <sstream>

namespace {

std::string Assertion(int line) {
    return "Assert failed:  at source/private/utils/KTSimpleIniFileReader:" + std::to_string(line);
}

using Value = std::optional<std::string>;

class SettingsFile : public StreamFixture {
  protected:
    std::unique_ptr<KTSimpleIniFileReader> Load(std::string const &content) const {
        return std::make_unique<KTSimpleIniFileReader>(File("settings.ini", content).GetPathString());
    }

    static Value Get(KTSimpleIniFileReader &settings, KTString const &section, KTString const &variable) {
        KTString value("old");
        if (!settings.GetStringValForVariable(section, variable, value)) {
            EXPECT_EQ(KTString("old"), value);
            return std::nullopt;
        }
        return value.GetUTF8String();
    }

    // Loads a file and compares all that the model finds, in order of its assertions.
    void ExpectAsModel(std::string const &content) const {
        ModelSettings const model(ModelFileLines(content, true, [](std::string const &) { return Units(); }));
        LogLines log;
        auto const settings = Load(content);
        std::vector<std::string> expected;
        expected.reserve(model.assertions.size());
        for (int const line : model.assertions) {
            expected.push_back(Assertion(line));
        }
        EXPECT_EQ(expected, log.Take());
        for (auto const &[section, variables] : model.sections) {
            for (auto const &[name, value] : variables) {
                KTString found;
                EXPECT_TRUE(settings->GetStringValForVariable(FromUnits(section), FromUnits(name), found));
                EXPECT_EQ(FromUnits(value), found);
            }
        }
    }
};

// What holds for both forms.
class SettingsFileForms : public SettingsFile, public testing::WithParamInterface<bool> {
  protected:
    std::unique_ptr<KTSimpleIniFileReader> LoadForm(std::string const &utf8) const {
        return Load(Form(KTString(OString::FromUTF8(utf8))));
    }
    static std::string Form(KTString const &text) { return GetParam() ? Utf16File(text) : text.GetUTF8String(); }
};

INSTANTIATE_TEST_SUITE_P(Forms, SettingsFileForms, testing::Values(false, true),
                         [](auto const &form) { return form.param ? "Utf16" : "Bytes"; });

TEST_P(SettingsFileForms, KeepsBlanksButThoseAtTheStartOfALine) {
    auto const settings = LoadForm("[Main]\n width = 10\n\t \tdepth\t=\t5 \t\n");
    EXPECT_EQ(Value(" 10"), Get(*settings, "Main", "width "));
    EXPECT_EQ(Value("\t5 \t"), Get(*settings, "Main", "depth\t"));
    EXPECT_EQ(Value(), Get(*settings, "Main", "width"));
    EXPECT_EQ(Value(), Get(*settings, "Main", " width "));
}

TEST_P(SettingsFileForms, DropsEachCarriageReturn) {
    auto const settings = LoadForm("\r \r[Ma\rin]\r\nwi\rdth=1\r0\r\r\n \r \rb=2\n");
    EXPECT_EQ(Value("10"), Get(*settings, "Main", "width"));
    EXPECT_EQ(Value("2"), Get(*settings, "Main", "b"));
}

TEST_P(SettingsFileForms, MakesSectionNamesOfAllButTheFirstBrackets) {
    auto const settings = LoadForm("[a]b\nx=1\n[a][b]\nx=2\n[a=b]\nx=3\n[c] ;d\nx=4\n [ e ] \nx=5\n[[f]]\nx=6\n");
    EXPECT_EQ(Value("1"), Get(*settings, "ab", "x"));
    EXPECT_EQ(Value("2"), Get(*settings, "a[b]", "x"));
    EXPECT_EQ(Value("3"), Get(*settings, "a=b", "x"));
    EXPECT_EQ(Value("4"), Get(*settings, "c ;d", "x"));
    EXPECT_EQ(Value("5"), Get(*settings, " e  ", "x"));
    EXPECT_EQ(Value("6"), Get(*settings, "[f]", "x"));
    EXPECT_EQ(Value(), Get(*settings, "a", "x"));
}

TEST_P(SettingsFileForms, PassesOverWhatIsNoVariable) {
    LogLines log;
    auto const settings = LoadForm("x\n=\n;\n[\n]\n;a=1\n  ;b=1\n#c=1\n[d=1\nwords\n\n \t\r\n]e=1\nf;=1\n");
    EXPECT_EQ(std::vector<std::string>(), log.Take());
    for (char const *const name : {"", ";a", "a", ";b", "b", "c", "[d", "d", "words"}) {
        EXPECT_EQ(Value(), Get(*settings, "", name)) << name;
    }
    EXPECT_EQ(Value("1"), Get(*settings, "", "#c"));
    EXPECT_EQ(Value("1"), Get(*settings, "", "]e"));
    EXPECT_EQ(Value("1"), Get(*settings, "", "f;"));
}

TEST_P(SettingsFileForms, SplitsAtTheFirstEqualsBehindTheFirstUnit) {
    LogLines log;
    auto const settings = LoadForm("=x\na==b\n==c\nd=\n=e=f\n");
    EXPECT_EQ(std::vector{Assertion(369)}, log.Take());
    EXPECT_EQ(Value("=b"), Get(*settings, "", "a"));
    EXPECT_EQ(Value("c"), Get(*settings, "", "="));
    EXPECT_EQ(Value(""), Get(*settings, "", "d"));
    EXPECT_EQ(Value("f"), Get(*settings, "", "=e"));
    EXPECT_EQ(Value(), Get(*settings, "", ""));
}

TEST_P(SettingsFileForms, ReportsARepeatedNameAndTakesTheNewValue) {
    LogLines log;
    auto const settings = LoadForm("a=1\n[s]\na=2\nA=3\na=4\n");
    EXPECT_EQ(std::vector{Assertion(379)}, log.Take());
    EXPECT_EQ(Value("1"), Get(*settings, "", "a"));
    EXPECT_EQ(Value("4"), Get(*settings, "s", "a"));
    EXPECT_EQ(Value("3"), Get(*settings, "s", "A"));
    EXPECT_EQ(Value(), Get(*settings, "S", "a"));
}

TEST_P(SettingsFileForms, ReportsInTheOrderOfTheLines) {
    LogLines log;
    LoadForm("a=1\na=2\n=x\n[s]\n=y\na=1\na=1\n");
    EXPECT_EQ((std::vector{Assertion(379), Assertion(369), Assertion(369), Assertion(379)}), log.Take());
}

TEST_P(SettingsFileForms, ReplacesASectionThatBeginsAgain) {
    LogLines log;
    auto const settings = LoadForm("z=0\n[s]\na=1\nb=2\n[t]\nc=3\n[s]\na=4\n[]\ny=5\n");
    EXPECT_EQ(std::vector<std::string>(), log.Take());
    EXPECT_EQ(Value("4"), Get(*settings, "s", "a"));
    EXPECT_EQ(Value(), Get(*settings, "s", "b"));
    EXPECT_EQ(Value("3"), Get(*settings, "t", "c"));
    EXPECT_EQ(Value(), Get(*settings, "", "z"));
    EXPECT_EQ(Value("5"), Get(*settings, "", "y"));
}

TEST_P(SettingsFileForms, TakesALastLineThatIsNotEnded) {
    EXPECT_EQ(Value("1"), Get(*LoadForm("[s]\na=1"), "s", "a"));
    EXPECT_EQ(Value("1"), Get(*LoadForm("[s]\na=1\r"), "s", "a"));
    EXPECT_EQ(Value(), Get(*LoadForm("[s]\na=1\n[s]"), "s", "a"));
}

TEST_P(SettingsFileForms, BeginsEachFileInTheSectionWithoutAName) {
    auto const first = LoadForm("a=1\n[last]\nb=2\n");
    auto const second = LoadForm("c=3\n");
    EXPECT_EQ(Value("3"), Get(*second, "", "c"));
    EXPECT_EQ(Value(), Get(*second, "last", "c"));
    EXPECT_EQ(Value("1"), Get(*first, "", "a"));
    EXPECT_EQ(Value("2"), Get(*first, "last", "b"));
    EXPECT_EQ(Value(), Get(*first, "", "c"));
}

TEST_P(SettingsFileForms, KeepsTextOfAnyLanguage) {
    auto const settings = LoadForm("[Größe]\nΩ=\xE2\x82\xAC \xF0\x9F\x9A\xA2 \xEF\xBF\xBD\n");
    EXPECT_EQ(Value("\xE2\x82\xAC \xF0\x9F\x9A\xA2 \xEF\xBF\xBD"), Get(*settings, "Größe", "Ω"));
}

// The zero ends its chunk of 1,024 bytes or units, behind the mark; the line goes on in the next.
TEST_P(SettingsFileForms, DropsTheRestOfAChunkBehindAZero) {
    auto const withZero = [](KTString text, std::size_t at) {
        text[at] = 0;
        return Form(text);
    };
    auto const shortFile = Load(withZero("a=1_junk\nb=2\n", 3));
    EXPECT_EQ(Value("1"), Get(*shortFile, "", "a"));
    EXPECT_EQ(Value(), Get(*shortFile, "", "b"));

    KTString twoChunks("a=1_");
    twoChunks.append(1020, 'j').append(KTString("2\nb=3\n"));
    auto const joined = Load(withZero(twoChunks, 3));
    EXPECT_EQ(Value("12"), Get(*joined, "", "a"));
    EXPECT_EQ(Value("3"), Get(*joined, "", "b"));

    KTString atTheEnds("_"); // the first and the last of a chunk
    atTheEnds.append(1023, 'j').append(KTString("a="));
    atTheEnds.append(1021, 'v').append(KTString("__\nb=3\n"));
    atTheEnds[2047] = 0;
    auto const ends = Load(withZero(atTheEnds, 0));
    EXPECT_EQ(Value(std::string(1021, 'v') + "_"), Get(*ends, "", "a"));
    EXPECT_EQ(Value("3"), Get(*ends, "", "b"));
}

TEST_P(SettingsFileForms, DropsBlanksAtTheStartOfALineThatAChunkCuts) {
    KTString text;
    text.append(1023, ' ').append(KTString("\t \ta=1\n"));
    EXPECT_EQ(Value("1"), Get(*LoadForm(text.GetUTF8String()), "", "a"));
}

// Each piece comes to lie across a chunk's end at each of its units, as its length and 1,024 have no common divisor.
TEST_P(SettingsFileForms, ReadsTheSameAcrossChunkEndsAtEachPlace) {
    KTString text;
    for (int i = 0; i < 1100; ++i) {
        KTString piece(i % 3 == 0 ? "[s" : "\r\n \t n");
        piece.AppendNumber(i);
        piece += i % 3 == 0 ? "\r]\"\r\n" : " == \"x\r\xF0\x9F\x9A\xA2\xC3\xA9\" ;[\r\r\n";
        text += piece;
        text.append(text.size() % 2 == 0 ? 1 : 0, '\n');
    }
    ExpectAsModel(Form(text));
}

TEST_P(SettingsFileForms, TakesZerosAtEachPlaceAsTheModelDoes) {
    std::mt19937 random(7);
    for (int round = 0; round < 40; ++round) {
        KTString text;
        while (text.size() < 4000) {
            static constexpr char const *kPieces[] = {"\r\n", "[s", "]", "=", "\n", " ", "\t", "name", ";", "\xC3\xA9"};
            text += kPieces[random() % std::size(kPieces)];
            text.append(random() % 200 == 0 ? 1 : 0, 0);
        }
        ExpectAsModel(Form(text));
    }
}

TEST_P(SettingsFileForms, ReadsALineLongerThanManyChunks) {
    std::string const value(300'000, 'v');
    auto const settings = LoadForm("a=" + value + "\nb=1\n");
    EXPECT_EQ(Value(value), Get(*settings, "", "a"));
    EXPECT_EQ(Value("1"), Get(*settings, "", "b"));
}

// ---- files and encodings ----

TEST_F(SettingsFile, IsEmptyIfTheFileCannotBeOpened) {
    LogLines log;
    KTSimpleIniFileReader settings(File("missing.ini").GetPathString());
    KTSimpleIniFileReader unnamed{KTString()};
    bool flag = true;
    int number = 7;
    unsigned int unsignedNumber = 7;
    double real = 7;
    for (KTSimpleIniFileReader *const one : {&settings, &unnamed}) {
        EXPECT_EQ(Value(), Get(*one, "", ""));
        EXPECT_FALSE(one->GetBoolValForVariable("", "", flag));
        EXPECT_FALSE(one->GetIntValForVariable("", "", number));
        EXPECT_FALSE(one->GetUIntValForVariable("", "", unsignedNumber));
        EXPECT_FALSE(one->GetDoubleValForVariable("", "", real));
    }
    EXPECT_TRUE(flag);
    EXPECT_EQ(7, number);
    EXPECT_EQ(7U, unsignedNumber);
    EXPECT_EQ(7, real);
    EXPECT_EQ(std::vector<std::string>(), log.Take());
}

TEST_F(SettingsFile, TakesFilesOfHardlyAnyBytes) {
    LogLines log;
    for (std::string const content : {"", "\xFF", "\xFF\xFE", "\xFF\xFE\n", "\xEF\xBB\xBF", "\xEF\xBB", "\n", "a"}) {
        EXPECT_EQ(Value(), Get(*Load(content), "", "")) << Hex(content);
    }
    EXPECT_EQ(std::vector<std::string>(), log.Take());
}

TEST_F(SettingsFile, DropsAnOddLastByteOfUtf16) {
    EXPECT_EQ(Value("1"), Get(*Load(Utf16File(KTString("a=1")) + "2"), "", "a"));
}

TEST_F(SettingsFile, KeepsUnpairedSurrogatesOfUtf16) {
    KTString value;
    EXPECT_TRUE(Load(Utf16File({'a', '=', 0xDC00, 0xD800, '\n'}))->GetStringValForVariable("", "a", value));
    EXPECT_EQ(FromUnits({0xDC00, 0xD800}), value);
}

TEST_F(SettingsFile, TakesOnlyLowByteFirstForUtf16) {
    // The other order is a file of bytes, which a zero ends at once.
    EXPECT_EQ(Value(), Get(*Load(std::string("\xFE\xFF\0a\0=\0\x31", 8)), "", "a"));
}

TEST_F(SettingsFile, PassesOverTheMarkOfUtf8) {
    EXPECT_EQ(Value("1"), Get(*Load("\xEF\xBB\xBF [s]\na=1\n"), "s", "a"));
    // Only one, and only at the beginning.
    EXPECT_EQ(Value("1"), Get(*Load("\xEF\xBB\xBF\xEF\xBB\xBF"
                                    "a=1\n"),
                              "",
                              "\xEF\xBB\xBF"
                              "a"));
    // It is part of the first chunk.
    EXPECT_EQ(Value("12"), Get(*Load("\xEF\xBB\xBF"
                                     "a=1" +
                                     std::string(1018, '\0') + "2\n"),
                               "", "a"));
}

// ---- values ----

TEST_F(SettingsFile, TakesOnlyTheWordTrueForTrue) {
    auto const settings = Load("a=true\nb=True\nc=false\nd=\ne=true \nf= true\ng=1\nh=TRUE\ni=truex\nj=tru\n");
    bool value = false;
    EXPECT_TRUE(settings->GetBoolValForVariable("", "a", value));
    EXPECT_TRUE(value);
    for (char const *const name : {"b", "c", "d", "e", "f", "g", "h", "i", "j"}) {
        value = true;
        EXPECT_TRUE(settings->GetBoolValForVariable("", name, value)) << name;
        EXPECT_FALSE(value) << name;
    }
    value = true;
    EXPECT_FALSE(settings->GetBoolValForVariable("", "k", value));
    EXPECT_TRUE(value);
}

template <typename Number> Number ByStream(std::string const &text, Number value) {
    std::istringstream(text) >> value;
    return value;
}

// A zero has a sign.
template <typename Number> void ExpectSame(Number expected, Number found, std::string const &text) {
    EXPECT_EQ(expected, found) << '"' << text << '"';
    EXPECT_EQ(std::signbit(static_cast<double>(expected)), std::signbit(static_cast<double>(found))) << text;
}

void ExpectNumbersByStream(KTSimpleIniFileReader &settings, KTString const &name, std::string const &text) {
    int number = 7;
    unsigned int unsignedNumber = 7;
    double real = 7;
    EXPECT_TRUE(settings.GetIntValForVariable("", name, number));
    EXPECT_TRUE(settings.GetUIntValForVariable("", name, unsignedNumber));
    EXPECT_TRUE(settings.GetDoubleValForVariable("", name, real));
    ExpectSame(ByStream(text, 7), number, text);
    ExpectSame(ByStream(text, 7U), unsignedNumber, text);
    ExpectSame(ByStream(text, 7.0), real, text);
}

TEST_F(SettingsFile, ReadsNumbersAsStreamsDo) {
    struct Case {
        char const *text;
        int number;
        unsigned int unsignedNumber;
        double real;
    };
    static constexpr double kMax = std::numeric_limits<double>::max();
    static constexpr Case kCases[] = {
        {"10", 10, 10, 10},
        {" \t\v\f10", 10, 10, 10},
        {"10 20", 10, 10, 10},
        {"-5", -5, UINT_MAX - 4, -5},
        {"+5", 5, 5, 5},
        {"0x1A", 0, 0, 0},
        {"010", 10, 10, 10},
        {"1e5", 1, 1, 100000},
        {"2.75", 2, 2, 2.75},
        {".5", 0, 0, 0.5},
        {"5.", 5, 5, 5},
        {"2147483647", INT_MAX, INT_MAX, 2147483647.0},
        {"2147483648", INT_MAX, 2147483648U, 2147483648.0},
        {"-2147483649", INT_MIN, 2147483647U, -2147483649.0},
        {"4294967296", INT_MAX, UINT_MAX, 4294967296.0},
        {"1e999", 1, 1, kMax},
        {"abc", 0, 0, 0},
        {"-", 0, 0, 0},
        {"", 7, 7, 7},
        {"  ", 7, 7, 7},
        {"\xC2\xA0"
         "5",
         0, 0, 0},
        {"1,000", 1, 1, 1},
    };
    for (Case const &one : kCases) {
        auto const settings = Load(std::string("n=") + one.text + "\n");
        ExpectNumbersByStream(*settings, "n", one.text);
        int number = 7;
        unsigned int unsignedNumber = 7;
        double real = 7;
        settings->GetIntValForVariable("", "n", number);
        settings->GetUIntValForVariable("", "n", unsignedNumber);
        settings->GetDoubleValForVariable("", "n", real);
        EXPECT_EQ(one.number, number) << one.text;
        EXPECT_EQ(one.unsignedNumber, unsignedNumber) << one.text;
        EXPECT_EQ(one.real, real) << one.text;
    }
}

TEST_F(SettingsFile, ReadsAnyTextAsANumberAsStreamsDo) {
    std::mt19937 random(11);
    std::vector<std::string> texts;
    std::string content;
    for (int i = 0; i < 4000; ++i) {
        static constexpr char kCharacters[] = "00123456789999..--++eE x \t";
        std::string text;
        for (unsigned int left = random() % 20; left != 0; --left) {
            // Mostly digits, so that many are numbers.
            text += random() % 3 != 0 ? static_cast<char>('0' + random() % 10)
                                      : kCharacters[random() % (sizeof kCharacters - 1)];
        }
        content += FORMAT_ARGS("n%d=%s\n", i, text.c_str());
        texts.push_back(text);
    }
    auto const settings = Load(content);
    for (std::size_t i = 0; i < texts.size(); ++i) {
        ExpectNumbersByStream(*settings, KTString(FORMAT_ARGS("n%d", static_cast<int>(i))), texts[i]);
    }
}

// The stream takes the locale that the program has set.
class Grouping : public std::numpunct<char> {
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

TEST_F(SettingsFile, ReadsNumbersByTheGlobalLocale) {
    auto const settings = Load("n=12.345\nr=2,5\nz=2.5\n");
    std::locale const before = std::locale::global(std::locale(std::locale::classic(), new Grouping));
    ExpectNumbersByStream(*settings, "n", "12.345");
    ExpectNumbersByStream(*settings, "r", "2,5");
    ExpectNumbersByStream(*settings, "z", "2.5");
    int number = 0;
    settings->GetIntValForVariable("", "n", number);
    std::locale::global(before);
    EXPECT_EQ(12345, number);
}

} // namespace
