// CaptionFileTest.cpp: KTClosedCaptionFileReader: lines and fields, in bytes and in UTF-16.

#include "KTClosedCaptionFileReader.h"

#include "LogLines.h"
#include "ReaderModel.h"
#include "StreamSupport.h"

#include <random>

namespace {

using Rows = std::vector<std::vector<KTString>>;

class CaptionFile : public StreamFixture, public testing::WithParamInterface<bool> {
  protected:
    Rows Read(std::string const &content, unsigned int mode) const {
        KTClosedCaptionFileReader reader;
        return reader.GetLinesFromFile(File("captions.txt", content).GetPathString(), mode);
    }
    Rows ReadForm(KTString const &text, unsigned int mode) const { return Read(Form(text), mode); }
    static std::string Form(KTString const &text) { return GetParam() ? Utf16File(text) : text.GetUTF8String(); }

    void ExpectAsModel(KTString const &text) const {
        for (unsigned int const mode : {3U, 4U, 5U}) {
            Rows expected;
            auto const lines = ModelFileLines(Form(text), false, [](std::string const &) { return Units(); });
            for (auto const &fields : ModelRows(lines, mode)) {
                std::vector<KTString> &row = expected.emplace_back();
                for (Units const &field : fields) {
                    row.push_back(FromUnits(field));
                }
            }
            EXPECT_TRUE(expected == ReadForm(text, mode)) << mode;
        }
    }
};

INSTANTIATE_TEST_SUITE_P(Forms, CaptionFile, testing::Values(false, true),
                         [](auto const &form) { return form.param ? "Utf16" : "Bytes"; });

TEST_P(CaptionFile, SplitsColumnsAtTabsInModeFour) {
    EXPECT_EQ((Rows{{"00:01", "Hello world"}}), ReadForm("00:01\tHello world", 4));
    EXPECT_EQ((Rows{{"a b", "", "c", " d"}}), ReadForm(" \ta b\t\tc\t d\t \t\r\n", 4));
}

TEST_P(CaptionFile, SplitsWordsAtBlanksInModeThree) {
    EXPECT_EQ((Rows{{"00:01", "Hello", "world"}}), ReadForm("00:01\tHello world", 3));
    EXPECT_EQ((Rows{{"a", "b", "c"}, {"d..", "e"}}), ReadForm("\t a \t\t b  c \t\r\nd..  e\n", 3));
}

TEST_P(CaptionFile, KeepsWholeLinesInOtherModes) {
    for (unsigned int const mode : {0U, 1U, 2U, 5U, 0xFFFFFFFFU}) {
        EXPECT_EQ((Rows{{"a \t\tb"}, {"ccc"}}), ReadForm(" a \t\tb \t\nccc\n", mode)) << mode;
    }
}

TEST_P(CaptionFile, PassesOverShortLines) {
    EXPECT_EQ((Rows{{"abc"}}), ReadForm("ab\n\n\r\n \t \n  ab\nabc\nx\n", 4));
    // The blanks at the end count, those at the start do not.
    EXPECT_EQ((Rows{{"a"}, {"ab"}}), ReadForm("a  \n  a \nab\t\n", 3));
    // Of UTF-16, in either form: two characters here, of three and four bytes, and a pair and one.
    EXPECT_EQ((Rows{{"\xF0\x9F\x9A\xA2!"}}), ReadForm("\xC3\xA9!\n\xC3\xA9\xC3\xA9\n\xF0\x9F\x9A\xA2!\n", 4));
}

TEST_P(CaptionFile, DropsEachCarriageReturn) {
    EXPECT_EQ((Rows{{"abc", "d"}}), ReadForm("\r \ra\rb\rc\r\td\r\r\n", 4));
}

TEST_P(CaptionFile, TakesALastLineThatIsNotEnded) {
    EXPECT_EQ((Rows{{"one"}, {"two"}}), ReadForm("one\ntwo", 4));
    EXPECT_EQ((Rows{{"one"}, {"two"}}), ReadForm("one\ntwo\r", 4));
}

TEST_P(CaptionFile, TakesAZeroAsText) {
    KTString line("a_b\tc");
    line[1] = 0;
    EXPECT_EQ((Rows{{line.substr(0, 3), "c"}, {"next"}}), ReadForm(line + "\nnext\n", 4));
}

// As for settings: each place of the piece comes to lie across a chunk's end.
TEST_P(CaptionFile, ReadsTheSameAcrossChunkEndsAtEachPlace) {
    KTString text;
    for (int i = 0; i < 1100; ++i) {
        text += "\r\n \t 0";
        text.AppendNumber(i);
        text += "\t\t \"x\r\xF0\x9F\x9A\xA2\xC3\xA9\"  y\t\r\r\n";
        text.append(text.size() % 2 == 0 ? 1 : 0, '\n');
    }
    ExpectAsModel(text);
}

TEST_P(CaptionFile, ReadsAnyTextAsTheModelDoes) {
    std::mt19937 random(5);
    for (int round = 0; round < 20; ++round) {
        KTString text;
        while (text.size() < 4000) {
            static constexpr char const *kPieces[] = {"\r\n", "a",     "\t", "  ",          "\n",
                                                      " \t",  "words", "\r", "\xE2\x82\xAC"};
            text += kPieces[random() % std::size(kPieces)];
            text.append(random() % 50 == 0 ? 1 : 0, 0);
        }
        ExpectAsModel(text);
    }
}

TEST_P(CaptionFile, ReadsOneLineOfManyFields) {
    KTString text;
    for (int i = 0; i < 100'000; ++i) {
        text += "\ta";
    }
    Rows const rows = ReadForm(text, 4);
    ASSERT_EQ(1U, rows.size());
    EXPECT_EQ(100'000U, rows[0].size());
}

class CaptionFileBytes : public StreamFixture {};

TEST_F(CaptionFileBytes, GivesNothingIfTheFileCannotBeOpened) {
    LogLines log;
    KTClosedCaptionFileReader reader;
    EXPECT_TRUE(reader.GetLinesFromFile(File("missing.txt").GetPathString(), 3).empty());
    EXPECT_TRUE(reader.GetLinesFromFile(KTString(), 4).empty());
    EXPECT_EQ(std::vector<std::string>(), log.Take());
}

TEST_F(CaptionFileBytes, TakesFilesOfHardlyAnyBytes) {
    LogLines log;
    KTClosedCaptionFileReader reader;
    for (std::string const content : {"", "\xFF", "\xFF\xFE", "\xFF\xFE\n", "\xEF\xBB\xBF", "\n", "ab"}) {
        EXPECT_TRUE(reader.GetLinesFromFile(File("captions.txt", content).GetPathString(), 4).empty()) << Hex(content);
    }
    EXPECT_EQ(std::vector<std::string>(), log.Take());
}

TEST_F(CaptionFileBytes, PassesOverTheMarkOfUtf8AndAnOddByteOfUtf16) {
    KTClosedCaptionFileReader reader;
    EXPECT_EQ((Rows{{"abc"}}), reader.GetLinesFromFile(File("a.txt", "\xEF\xBB\xBF abc").GetPathString(), 4));
    EXPECT_EQ((Rows{{"abc"}}),
              reader.GetLinesFromFile(File("b.txt", Utf16File(KTString("abc")) + "d").GetPathString(), 4));
}

} // namespace
