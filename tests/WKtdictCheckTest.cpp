// WKtdictCheckTest.cpp: each kind of problem that `ktdict check` finds, with its file and place.

#include "WKtdict.h"

using namespace dictionary_files;

namespace {

constexpr wchar_t kEnglish[] = KT_COURSE "/strings/en_US.txt";
constexpr wchar_t kGerman[] = KT_COURSE "/strings/de_DE.txt";

class KtdictCheckTest : public KtdictTest {
  protected:
    // The problems of these files, one a line, without the count at the end.
    std::vector<std::string> Check(Arguments files) const {
        files.insert(files.begin(), L"check");
        KtdictOutcome const outcome = Run(files);
        std::vector<std::string> lines = outcome.Lines();
        EXPECT_EQ("", outcome.err);
        EXPECT_FALSE(lines.empty());
        if (lines.empty()) {
            return lines;
        }
        EXPECT_EQ(lines.size() == 1 ? 0U : 1U, outcome.status);
        std::string const count = std::to_string(lines.size() - 1);
        EXPECT_EQ(lines.size() == 1   ? "no problems"
                  : lines.size() == 2 ? "1 problem"
                                      : count + " problems",
                  lines.back());
        lines.pop_back();
        return lines;
    }

    using Lines = std::vector<std::string>;
};

TEST_F(KtdictCheckTest, AGoodFileHasNone) {
    Write(L"a.txt", Utf16(u"\"$$$/A=\u201Cx\u201D \\n ^T #{copy}\"\r\n\r\n\"$$$/B=\"\r\n"));
    EXPECT_EQ(Lines(), Check({L"a.txt"}));
    Write(L"a.lxdc", SmallFile().Bytes());
    EXPECT_EQ(Lines(), Check({L"a.lxdc"}));
    EXPECT_EQ(Lines(), Check({kEnglish, kGerman}));
}

TEST_F(KtdictCheckTest, LinesOfATextFile) {
    Write(L"a.txt", Utf16(u"\"$$$/Ok=fine\"\r\n"          // 1
                          u"\"$/Bad=x\"\r\n"              // 2
                          u"\r\n"                         // 3
                          u"\"=x\"\n"                     // 4
                          u"\"/Alone\"\r"                 // 5
                          u"\"/Open=x\r\n"                // 6
                          u"junk \"/Before=x\"\r\n"       // 7
                          u"\"/After=x\" junk\r\n"        // 8
                          u"\"/Wi\u2603e=x\"\r\n"         // 9
                          u"\"$$$/Ok=again\"\r\n"         // 10
                          u"\"/E=a\\qb\"\r\n"             // 11
                          u"\"/C=a^qb\"\r\n"              // 12
                          u"\"/T=a^\"\r\n"                // 13
                          u"\"/N=a#{nope}b\"\r\n"         // 14
                          u"\"/M=\\q ^q #{copyx} ^\"\r\n" // 15
                          u"\"$$$\"\r\n"));               // 16
    EXPECT_EQ((Lines{
                  "a.txt:2: lone-dollar: the entry begins with $ but not with $$$",
                  "a.txt:4: empty-key: the entry has no key",
                  "a.txt:5: no-equals: the entry has no = (/Alone)",
                  "a.txt:6: unclosed-quote: the second quotation mark is missing (/Open)",
                  "a.txt:7: text-before: the text before the quotation mark is ignored (/Before)",
                  "a.txt:8: text-after: the text behind the second quotation mark is ignored (/After)",
                  "a.txt:9: wide-key: the key has a character above U+00FF (/Wi\\u0003e)",
                  "a.txt:10: duplicate-key: the key was there before; its text is replaced (/Ok)",
                  "a.txt:11: unknown-escape: the character after \\ has no meaning there (/E)",
                  "a.txt:12: unknown-caret: the character after ^ has no meaning there (/C)",
                  "a.txt:13: trailing-escape: the text ends with \\ or ^ (/T)",
                  "a.txt:14: unknown-entity: #{ begins neither a name nor a number (/N)",
                  "a.txt:15: unknown-escape: the character after \\ has no meaning there (/M)",
                  "a.txt:15: unknown-caret: the character after ^ has no meaning there (/M)",
                  "a.txt:15: trailing-escape: the text ends with \\ or ^ (/M)",
                  "a.txt:15: unknown-entity: #{ begins neither a name nor a number (/M)",
                  "a.txt:16: no-equals: the entry has no =",
                  "a.txt:16: empty-key: the entry has no key",
              }),
              Check({L"a.txt"}));
}

TEST_F(KtdictCheckTest, TheEndOfATextFile) {
    Write(L"odd.txt", Utf16(u"/A=x\n/B=y") + "z");
    EXPECT_EQ(Lines{"odd.txt:2: odd-byte: the file ends in the middle of a UTF-16 unit"}, Check({L"odd.txt"}));
    Write(L"zero.txt", B("/A=x\n\n\0/B=y\n"));
    EXPECT_EQ(Lines{"zero.txt:3: early-end: a zero begins the line; nothing is read from here on"},
              Check({L"zero.txt"}));
}

TEST_F(KtdictCheckTest, EntriesThatNobodyGets) {
    Write(L"a.txt", "/\xDC=x\n/Z=a#{0}b\n/S=a#{D800}b\n");
    EXPECT_EQ((Lines{
                  "a.txt: unfindable-key: keys are looked up as UTF-8 and up to their first =, so nobody finds this "
                  "one (/\\xDC)",
                  "a.txt: zero-in-text: the application gets the text up to its first zero (/Z)",
                  "a.txt: unpaired-surrogate: the text has half of a character (/S)",
              }),
              Check({L"a.txt"}));
    SmallFile file;
    file.hasKeys = false;
    file.keysPresent = 'N';
    file.buckets = 0;
    Write(L"b.lxdc", file.Bytes());
    EXPECT_EQ((Lines{
                  "b.lxdc: no-key: entry 1 has no key, so nobody finds it",
                  "b.lxdc: no-key: entry 2 has no key, so nobody finds it",
              }),
              Check({L"b.lxdc"}));
    Write(L"old.lxdc", Header(1, 0, 1)
                           .U16(2)
                           .U16(7)
                           .U32(0)
                           .U16(0)
                           .U32(22)
                           .U32(2)
                           .Raw("/A")
                           .U32(1)
                           .Raw("B")
                           .U32(2)
                           .Raw("/A")
                           .U32(1)
                           .Raw("C")
                           .Bytes());
    EXPECT_EQ((Lines{
                  "old.lxdc: duplicate-key: the key is there more than once; the first one counts (/A)",
                  "old.lxdc: old-version: the application does not find the entries of a file of version 1; convert it",
              }),
              Check({L"old.lxdc"}));
}

TEST_F(KtdictCheckTest, BinaryFiles) {
    SmallFile file;
    std::string const whole = file.Bytes();
    Write(L"cut.lxdc", whole.substr(0, 40));
    EXPECT_EQ(Lines{"cut.lxdc: damaged: the block's head is cut off (byte 39)"}, Check({L"cut.lxdc"}));
    file.numbers = {310, 1021};
    Write(L"bucket.lxdc", file.Bytes());
    EXPECT_EQ(Lines{"bucket.lxdc: bad-bucket: the lists of the buckets do not fit the keys (byte 94)"},
              Check({L"bucket.lxdc"}));
    file = SmallFile();
    file.keyOffsets = {0, 0};
    file.keyLengths = {2, 2};
    file.numbers = {548};
    file.counts = {2};
    file.indices = {0, 1};
    file.buckets = 1;
    Write(L"twice.lxdc", file.Bytes());
    EXPECT_EQ(Lines{"twice.lxdc: duplicate-key: the key was there before; the later entry takes its place (/A)"},
              Check({L"twice.lxdc"}));
}

TEST_F(KtdictCheckTest, KeysAreComparedWithTheFirstFiles) {
    Write(L"en.txt", "/A=x\n/B=y\n/C=z\n");
    Write(L"de.txt", "/C=z\n/D=w\n/A=x\n");
    Write(L"fr.txt", "/B=y\n/C=z\n/A=x\n");
    Write(L"it.txt", "/A=x\n/B=y\n/C=z\n/D=w\n");
    EXPECT_EQ((Lines{
                  "de.txt: missing-key: only en.txt has the key (/B)",
                  "de.txt: extra-key: en.txt does not have the key (/D)",
                  "it.txt: extra-key: en.txt does not have the key (/D)",
              }),
              Check({L"en.txt", L"de.txt", L"fr.txt", L"it.txt"}));
    EXPECT_EQ(Lines(), Check({L"en.txt", L"fr.txt"}));
}

TEST_F(KtdictCheckTest, Json) {
    Write(L"en.txt", "/A=x\n/A=^q\n");
    Write(L"de.lxdc", SmallFile().Bytes().substr(0, 40));
    Write(L"fr.txt", "/A=x\n/\xDC=x\n");
    KtdictOutcome const outcome = Run({L"check", L"--format", L"json", L"en.txt", L"de.lxdc", L"fr.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("", outcome.err);
    JsonValue const problems = outcome.Json()["problems"];
    ASSERT_EQ(6U, problems.items.size()) << outcome.out;
    EXPECT_EQ("en.txt", problems[0]["file"].text);
    EXPECT_EQ(2, problems[0]["line"].number);
    EXPECT_EQ("duplicate-key", problems[0]["kind"].text);
    EXPECT_EQ("/A", problems[0]["key"].text);
    EXPECT_EQ("the key was there before; its text is replaced", problems[0]["detail"].text);
    EXPECT_FALSE(problems[0].Has("byte"));
    EXPECT_EQ("unknown-caret", problems[1]["kind"].text);
    EXPECT_EQ("damaged", problems[2]["kind"].text);
    EXPECT_EQ(39, problems[2]["byte"].number);
    EXPECT_FALSE(problems[2].Has("line"));
    EXPECT_FALSE(problems[2].Has("key"));
    EXPECT_EQ("missing-key", problems[3]["kind"].text);
    EXPECT_EQ("unfindable-key", problems[4]["kind"].text);
    EXPECT_EQ("2FDC", problems[4]["keyBytes"].text);
    EXPECT_EQ("extra-key", problems[5]["kind"].text);
    EXPECT_EQ(0U, Run({L"check", L"--format", L"json", L"--", kEnglish}).Json()["problems"].items.size());
}

} // namespace
