// WKtdictTest.cpp: ktdict's command line, and dump, get and diff.

#include "WKtdict.h"

using namespace dictionary_files;

namespace {

class KtdictCommandLineTest : public KtdictTest {};
class KtdictDumpTest : public KtdictTest {};
class KtdictGetTest : public KtdictTest {};
class KtdictDiffTest : public KtdictTest {};

constexpr char kHint[] = "ktdict: `ktdict --help` lists the commands and options\n";

// ---- the command line ----

TEST_F(KtdictCommandLineTest, HelpNamesTheCommandsAndTheStatuses) {
    for (wchar_t const *const option : {L"--help", L"-h"}) {
        KtdictOutcome const outcome = Run({option});
        EXPECT_EQ(0U, outcome.status);
        EXPECT_EQ("", outcome.err);
        for (char const *const text :
             {"dump", "get", "check", "convert", "diff", "--version", "Exit status: 0 fine; 1 "}) {
            EXPECT_NE(std::string::npos, outcome.out.find(text)) << text;
        }
    }
    KtdictOutcome const outcome = Run({L"convert", L"--help"});
    EXPECT_EQ(0U, outcome.status);
    for (char const *const text : {"INPUT", "OUTPUT", "--to", "--encoding", "--byte-order", "--locale", "--escape",
                                   "--salvage", "-f,--force", "--format"}) {
        EXPECT_NE(std::string::npos, outcome.out.find(text)) << text;
    }
}

TEST_F(KtdictCommandLineTest, Version) {
    KtdictOutcome const outcome = Run({L"--version"});
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("ktdict " KTDICT_VERSION "\n", outcome.out);
}

TEST_F(KtdictCommandLineTest, WrongUsageHasStatus2AndTouchesNothing) {
    Write(L"a.txt", "\"$$$/A=x\"\n");
    Write(L"b.txt", "\"$$$/A=x\"\n");
    struct {
        Arguments arguments;
        std::string message;
    } const cases[] = {
        {{}, "A subcommand is required"},
        {{L"print", L"a.txt"}, "A subcommand is required"},
        {{L"dump"}, "FILE is required"},
        {{L"dump", L"a.txt", L"b.txt"}, "FILE: At Most 1 required but received 2"},
        {{L"dump", L"--bogus", L"a.txt"}, "The following argument was not expected: --bogus"},
        {{L"dump", L"--format", L"xml", L"a.txt"}, "--format: xml not in {text,json}"},
        {{L"get", L"/A"}, "FILE is required"},
        {{L"get", L"$$/A", L"a.txt"}, "the key begins with $ but not with $$$"},
        {{L"get", L"$$$=x", L"a.txt"}, "the key has no name"},
        {{L"get", L"", L"a.txt"}, "the key has no name"},
        {{L"get", L"-r", L"--format", L"json", L"/A", L"a.txt"}, "--raw does not go with --format json"},
        {{L"check"}, "FILE is required"},
        {{L"diff", L"a.txt"}, "FILE: At least 2 required but received 1"},
        {{L"diff", L"a.txt", L"b.txt", L"c.txt"}, "FILE: At Most 2 required but received 3"},
        {{L"convert", L"a.txt", L"c"}, "--to is required"},
        {{L"convert", L"--to", L"binary", L"a.txt"}, "OUTPUT is required"},
        {{L"convert", L"--to", L"json", L"a.txt", L"c"}, "--to: json not in {text,binary}"},
        {{L"convert", L"--to", L"binary", L"--encoding", L"ansi", L"a.txt", L"c"},
         "the binary form is utf-16 or utf-8"},
        {{L"convert", L"--to", L"text", L"--encoding", L"utf-8", L"a.txt", L"c"}, "the text form is utf-16 or ansi"},
        {{L"convert", L"--to", L"text", L"--encoding", L"ansi", L"--byte-order", L"big", L"a.txt", L"c"},
         "ANSI text has no byte order"},
        {{L"convert", L"--to", L"text", L"--locale", L"x", L"a.txt", L"c"}, "only the binary form names a locale"},
        {{L"convert", L"--to", L"binary", L"--escape", L"a.txt", L"c"}, "the binary form needs no --escape"},
        {{L"convert", L"--to", L"binary", L"--byte-order", L"odd", L"a.txt", L"c"},
         "--byte-order: odd not in {little,big}"},
    };
    for (auto const &wrong : cases) {
        KtdictOutcome const outcome = Run(wrong.arguments);
        EXPECT_EQ(2U, outcome.status) << wrong.message;
        EXPECT_EQ("", outcome.out) << wrong.message;
        EXPECT_EQ("ktdict: " + wrong.message + "\n" + kHint, outcome.err);
    }
    EXPECT_EQ((std::vector<std::wstring>{L"a.txt", L"b.txt"}), Names());
}

TEST_F(KtdictCommandLineTest, TheNamesOfFilesAndKeysAreFree) {
    // CLI11 would take most of these for something else.
    for (wchar_t const *const name :
         {L"[en,de]", L"dump", L"++", L"-dashed", L"\u00DCbersicht \u2693.txt", L"\U0001F6A2.txt", L"a b"}) {
        Write(name, "\"$$$/A=x\"\n");
        EXPECT_EQ("/A=x\n", Run({L"dump", L"--no-header", L"--", name}).out);
        KtdictOutcome const twice = Run({L"check", L"--", name, name});
        EXPECT_EQ("no problems\n", twice.out) << twice.err;
    }
    Write(L"keys", "[x,y]=1\n-dashed=2\n--help=3\nget=4\n/\xC3\x9C\xE2\x9A\x93=5\n");
    EXPECT_EQ("1\n", Run({L"get", L"[x,y]", L"keys"}).out);
    EXPECT_EQ("2\n", Run({L"get", L"--", L"-dashed", L"keys"}).out);
    EXPECT_EQ("3\n", Run({L"get", L"--", L"--help", L"keys"}).out);
    EXPECT_EQ("4\n", Run({L"get", L"get", L"keys"}).out);
    EXPECT_EQ(0U, Run({L"get", L"--", L"-dashed", L"keys"}).status);
}

TEST_F(KtdictCommandLineTest, WhatCannotBeReadHasStatus3) {
    Write(L"a.txt", "\"$$$/A=x\"\n");
    std::filesystem::create_directory(Path(L"folder"));
    for (wchar_t const *const name : {L"missing.txt", L"folder", L"no?name", L"missing\\a.txt", L""}) {
        for (Arguments const &arguments :
             {Arguments{L"dump", name}, Arguments{L"get", L"/A", L"a.txt", name}, Arguments{L"check", L"a.txt", name},
              Arguments{L"diff", L"a.txt", name}, Arguments{L"diff", name, L"a.txt"},
              Arguments{L"convert", L"--to", L"binary", name, L"c"}}) {
            KtdictOutcome const outcome = Run(arguments);
            EXPECT_EQ(3U, outcome.status);
            EXPECT_EQ(0U, outcome.err.find("ktdict: ")) << outcome.err;
            EXPECT_NE(std::string::npos, outcome.err.find(" cannot be read: ")) << outcome.err;
        }
    }
    KtdictOutcome const outcome = Run({L"dump", L"--format", L"json", L"missing.txt"});
    EXPECT_EQ(3U, outcome.status);
    EXPECT_EQ(0U, outcome.Json()["error"].text.find("missing.txt cannot be read: "));
    EXPECT_EQ((std::vector<std::wstring>{L"a.txt", L"folder"}), Names());
}

TEST_F(KtdictCommandLineTest, AFileThatAnotherProgramKeepsToItselfHasStatus3) {
    Write(L"a.txt", "\"$$$/A=x\"\n");
    HANDLE const kept = CreateFileW(Path(L"a.txt").c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr);
    EXPECT_EQ(3U, Run({L"dump", L"a.txt"}).status);
    CloseHandle(kept);
    EXPECT_EQ(0U, Run({L"dump", L"a.txt"}).status);
}

TEST_F(KtdictCommandLineTest, AnOutputThatTakesNothingHasStatus3) {
    Write(L"a.txt", "\"$$$/A=x\"\n");
    SECURITY_ATTRIBUTES inherited{sizeof inherited, nullptr, TRUE};
    HANDLE const readOnly =
        CreateFileW(Path(L"a.txt").c_str(), GENERIC_READ, FILE_SHARE_READ, &inherited, OPEN_EXISTING, 0, nullptr);
    for (Arguments const &arguments :
         {Arguments{L"dump", L"a.txt"}, Arguments{L"--help"}, Arguments{L"check", L"--format", L"json", L"a.txt"}}) {
        KtdictOutcome const outcome = Run(arguments, readOnly);
        EXPECT_EQ(3U, outcome.status);
        EXPECT_EQ("ktdict: the output cannot be written\n", outcome.err);
    }
    CloseHandle(readOnly);
}

TEST_F(KtdictCommandLineTest, TheLibrarysLogIsLeftAlone) {
    std::filesystem::path const log = std::filesystem::temp_directory_path() / "ktap_log.txt";
    std::ofstream(log, std::ios::binary) << "12: of the application";
    Write(L"a.txt", "\"$$$/A=x\"\n");
    EXPECT_EQ(0U, Run({L"dump", L"a.txt"}).status);
    std::ifstream file(log, std::ios::binary);
    EXPECT_EQ("12: of the application", std::string(std::istreambuf_iterator<char>(file), {}));
}

// ---- dump ----

TEST_F(KtdictDumpTest, DescribesTheFileAndPrintsItsEntries) {
    std::u16string const text =
        u"\"$$$/A=Gr\u00FC\u00DFe \u2693 \U0001F6A2\"\r\n\"$$$/Long=one\\ntwo\\tthree\\\\ \\\"q\\\"\"\r\n\"/E=\"\r\n";
    std::string const entries = "/A=Gr\xC3\xBC\xC3\x9F"
                                "e \xE2\x9A\x93 \xF0\x9F\x9A\xA2\n/Long=one\\ntwo\\tthree\\\\ \"q\"\n/E=\n";
    Write(L"little.txt", Utf16(text));
    Write(L"big.txt", Utf16(text, true));
    KtdictOutcome outcome = Run({L"dump", L"little.txt"});
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("", outcome.err);
    EXPECT_EQ("# little.txt: text, UTF-16, little-endian, 3 entries\n" + entries, outcome.out);
    EXPECT_EQ("# big.txt: text, UTF-16, big-endian, 3 entries\n" + entries, Run({L"dump", L"big.txt"}).out);
    EXPECT_EQ(entries, Run({L"dump", L"--no-header", L"big.txt"}).out);

    Write(L"bytes.txt", "/A=caf\xE9\n");
    EXPECT_EQ("# bytes.txt: text, ANSI, 1 entry\n/A=caf\xC3\xA9\n", Run({L"dump", L"bytes.txt"}).out);
    Write(L"empty.txt", "");
    EXPECT_EQ("# empty.txt: text, ANSI, 0 entries\n", Run({L"dump", L"empty.txt"}).out);
    SmallFile file;
    Write(L"small.lxdc", file.Bytes());
    EXPECT_EQ("# small.lxdc: binary 2.7, UTF-16, little-endian, locale en_US, 2 entries\n/A=B\n/Bc=H\xC3\xA9\n",
              Run({L"dump", L"small.lxdc"}).out);
    file.isBig = true;
    file.encoding = 1;
    file.minor = 1;
    file.rawValues = "B\xE2\x9A\x93";
    file.valueBytes = 4;
    file.valueOffsets = {0, 1};
    file.valueLengths = {1, 3};
    file.locale = "de_DE";
    Write(L"big.lxdc", file.Bytes());
    EXPECT_EQ("# big.lxdc: binary 2.1, UTF-8, big-endian, locale de_DE, 2 entries\n/A=B\n/Bc=\xE2\x9A\x93\n",
              Run({L"dump", L"big.lxdc"}).out);
}

TEST_F(KtdictDumpTest, EscapesWhatCouldNotBeToldApart) {
    SmallFile file;
    file.keys = "=\xE9/Bc"; // no UTF-8
    file.values = u"\x1B\xD83D\x2028";
    Write(L"a.lxdc", file.Bytes());
    EXPECT_EQ("\\u003D\\xE9=\\u001B\n/Bc=\\uD83D\\u2028\n", Run({L"dump", L"--no-header", L"a.lxdc"}).out);
    file.keys = "\n\\\xC3\xA9=";
    Write(L"b.lxdc", file.Bytes());
    EXPECT_EQ("\\n\\\\=\\u001B\n\xC3\xA9\\u003D=\\uD83D\\u2028\n", Run({L"dump", L"--no-header", L"b.lxdc"}).out);
}

TEST_F(KtdictDumpTest, JsonHoldsEverythingAndIsAlwaysUtf8) {
    SmallFile file;
    file.keys = "/\xE9/\"\\";
    file.values = u"\x01\xD83D\x7F";
    Write(L"\u2693.lxdc", file.Bytes());
    KtdictOutcome const outcome = Run({L"dump", L"--format", L"json", L"\u2693.lxdc"});
    EXPECT_EQ(1U, outcome.status) << "the buckets are those of other keys";
    JsonValue const json = outcome.Json();
    EXPECT_EQ("bad-bucket", json["problems"][0]["kind"].text);
    EXPECT_EQ("\xE2\x9A\x93.lxdc", json["file"].text);
    EXPECT_EQ("binary", json["form"].text);
    EXPECT_EQ("2.7", json["version"].text);
    EXPECT_EQ("UTF-16", json["encoding"].text);
    EXPECT_EQ("little", json["byteOrder"].text);
    EXPECT_EQ("en_US", json["locale"].text);
    EXPECT_FALSE(json["isWhole"].boolean);
    EXPECT_EQ(2, json["entryCount"].number);
    JsonValue const &one = json["entries"][0];
    EXPECT_EQ("/\xEF\xBF\xBD", one["key"].text);
    EXPECT_EQ("2FE9", one["keyBytes"].text);
    EXPECT_EQ("\x01", one["text"].text);
    EXPECT_FALSE(one.Has("textUnits"));
    JsonValue const &other = json["entries"][1];
    EXPECT_EQ("/\"\\", other["key"].text);
    EXPECT_FALSE(other.Has("keyBytes"));
    EXPECT_EQ("\xEF\xBF\xBD\x7F", other["text"].text);
    EXPECT_EQ("D83D007F", other["textUnits"].text);
}

TEST_F(KtdictDumpTest, JsonOfATextFile) {
    Write(L"a.txt", Utf16(u"\"$$$/A=\U0001F6A2\\n\"\n", true));
    JsonValue const json = Run({L"dump", L"--format=json", L"a.txt"}).Json();
    EXPECT_EQ(0U, json["problems"].items.size());
    EXPECT_EQ("text", json["form"].text);
    EXPECT_FALSE(json.Has("version"));
    EXPECT_FALSE(json.Has("locale"));
    EXPECT_EQ("big", json["byteOrder"].text);
    EXPECT_TRUE(json["isWhole"].boolean);
    EXPECT_EQ("\xF0\x9F\x9A\xA2\n", json["entries"][0]["text"].text);
    Write(L"b.txt", "/A=x\n");
    EXPECT_FALSE(Run({L"dump", L"--format=json", L"b.txt"}).Json().Has("byteOrder"));
}

TEST_F(KtdictDumpTest, EntriesWithoutKeysAndOfVersion1AreThere) {
    SmallFile file;
    file.hasKeys = false;
    file.keysPresent = 'N';
    file.buckets = 0;
    Write(L"values.lxdc", file.Bytes());
    EXPECT_EQ("=B\n=H\xC3\xA9\n", Run({L"dump", L"--no-header", L"values.lxdc"}).out);
    JsonValue const json = Run({L"dump", L"--format", L"json", L"values.lxdc"}).Json();
    EXPECT_EQ(JsonValue::Null, json["entries"][0]["key"].kind);
    EXPECT_EQ("H\xC3\xA9", json["entries"][1]["text"].text);

    std::string const old = Header(1, 0, 1)
                                .U16(2)
                                .U16(7)
                                .U32(0)
                                .U16(0)
                                .U32(24)
                                .U32(2)
                                .Raw("/A")
                                .U32(1)
                                .Raw("B")
                                .U32(2)
                                .Raw("/C")
                                .U32(3)
                                .Raw("\xE2\x9A\x93")
                                .Bytes();
    Write(L"old.lxdc", old);
    KtdictOutcome const outcome = Run({L"dump", L"old.lxdc"});
    EXPECT_EQ(0U, outcome.status) << outcome.err;
    EXPECT_EQ("# old.lxdc: binary 1.0, UTF-8, little-endian, 2 entries\n/A=B\n/C=\xE2\x9A\x93\n", outcome.out);
}

TEST_F(KtdictDumpTest, WhatIsDamagedIsPrintedAsFarAsItGoes) {
    Write(L"a.txt", "/A=x\n$B=y\n/C=\\q\n");
    KtdictOutcome const outcome = Run({L"dump", L"--no-header", L"a.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("/A=x\n/C=\\\\q\n", outcome.out);
    EXPECT_EQ("a.txt:2: lone-dollar: the entry begins with $ but not with $$$\n", outcome.err);

    std::string const whole = SmallFile().Bytes();
    for (std::size_t size = 0; size < whole.size(); size += 3) {
        Write(L"cut.lxdc", whole.substr(0, size));
        KtdictOutcome const text = Run({L"dump", L"cut.lxdc"});
        if (size >= 21) {
            EXPECT_EQ(1U, text.status) << size;
            EXPECT_EQ(0U, text.err.find("cut.lxdc: ")) << text.err;
        } else {
            EXPECT_GE(1U, text.status) << size; // text, to all appearances
        }
    }
}

TEST_F(KtdictDumpTest, HostileFilesNeitherCrashNorHang) {
    SmallFile file;
    std::vector<std::string> files;
    file.localeLength = 0xFFFFFFFF;
    files.push_back(file.Bytes());
    file = SmallFile();
    file.entries = 0xFFFFFFF0;
    files.push_back(file.Bytes());
    file = SmallFile();
    file.keyOffsets = {0xFFFFFFFF, 0xFFFFFFFE};
    files.push_back(file.Bytes());
    file = SmallFile();
    file.major = 3;
    files.push_back(file.Bytes());
    files.push_back(B("LexiStr Binary Format"));
    files.push_back(Header(1, 5, 0).U32(0xFFFFFFFF).Bytes());
    for (std::string const &bytes : files) {
        Write(L"a.lxdc", bytes);
        for (Arguments const &arguments :
             {Arguments{L"dump", L"--format", L"json", L"a.lxdc"}, Arguments{L"check", L"--format", L"json", L"a.lxdc"},
              Arguments{L"diff", L"--format", L"json", L"a.lxdc", L"a.lxdc"},
              Arguments{L"get", L"--format", L"json", L"/A", L"a.lxdc"}}) {
            KtdictOutcome const outcome = Run(arguments);
            EXPECT_EQ(1U, outcome.status);
            EXPECT_EQ("damaged", outcome.Json()["problems"][0]["kind"].text);
        }
    }
    std::string noise = B("\"\0\x80\xFF^\\#{=\r\n$");
    for (int i = 0; i < 10; ++i) {
        noise += noise;
    }
    Write(L"noise.txt", noise);
    EXPECT_EQ(1U, Run({L"check", L"noise.txt"}).status);
    EXPECT_EQ(JsonValue::Array, Run({L"check", L"--format", L"json", L"noise.txt"}).Json()["problems"].kind);
    Write(L"noise.txt", "\xFF\xFE" + noise + "x");
    EXPECT_EQ(1U, Run({L"check", L"noise.txt"}).status);
}

// 300 MiB of texts in a file of 100 KiB.
TEST_F(KtdictDumpTest, EntriesThatOverlapAreComparedWhereTheyAre) {
    constexpr std::uint32_t kEntries = 5000;
    constexpr std::uint32_t kUnits = 32767;
    SmallFile file;
    file.hasKeys = false;
    file.keysPresent = 'N';
    file.buckets = 0;
    file.entries = file.second = kEntries;
    file.valueOffsets.assign(kEntries, 0);
    file.valueLengths.assign(kEntries, kUnits * 2);
    file.valueBytes = kUnits * 2;
    file.values.assign(kUnits, u'x');
    Write(L"a.lxdc", file.Bytes());
    KtdictOutcome const outcome = Run({L"diff", L"a.lxdc", L"a.lxdc"});
    EXPECT_EQ(0U, outcome.status) << outcome.err;
    EXPECT_EQ("", outcome.out);
}

// ---- get ----

TEST_F(KtdictGetTest, FindsAsTheApplicationDoes) {
    Write(L"a.txt", "\"$$$/A=one\\ntwo\"\n\"$$$/E=\"\n");
    for (wchar_t const *const key : {L"/A", L"$$$/A", L"$$$/A=default", L"/A=default"}) {
        KtdictOutcome const outcome = Run({L"get", key, L"a.txt"});
        EXPECT_EQ(0U, outcome.status);
        EXPECT_EQ("one\\ntwo\n", outcome.out);
        EXPECT_EQ("", outcome.err);
    }
    EXPECT_EQ("one\ntwo\n", Run({L"get", L"--raw", L"/A", L"a.txt"}).out);
    EXPECT_EQ("one\ntwo\n", Run({L"get", L"-r", L"/A", L"a.txt"}).out);
    EXPECT_EQ("\n", Run({L"get", L"/E", L"a.txt"}).out);
    EXPECT_EQ(0U, Run({L"get", L"/E", L"a.txt"}).status);
}

TEST_F(KtdictGetTest, AMissingKeyHasStatus1) {
    Write(L"a.txt", "\"$$$/A=x\"\n");
    KtdictOutcome outcome = Run({L"get", L"/B", L"a.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_EQ("ktdict: a.txt does not have the key\n", outcome.err);
    outcome = Run({L"get", L"/B=say \\\"hi\\\"#{copy}", L"a.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("say \"hi\"\xC2\xA9\n", outcome.out) << "the default is what the application would show";
    EXPECT_EQ("ktdict: a.txt does not have the key\n", outcome.err);
    outcome = Run({L"get", L"/B=\u00E9", L"a.txt"});
    EXPECT_EQ("\xEF\xBF\x83\xEF\xBE\xA9\n", outcome.out) << "each byte of a default is sign-extended";
}

TEST_F(KtdictGetTest, LooksIntoEachFileByItself) {
    Write(L"a.txt", "/A=x\n/B=y\n");
    Write(L"b.txt", "/A=z\n");
    EXPECT_EQ("a.txt: x\nb.txt: z\n", Run({L"get", L"/A", L"a.txt", L"b.txt"}).out);
    KtdictOutcome const outcome = Run({L"get", L"/B", L"a.txt", L"b.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("a.txt: y\n", outcome.out);
    EXPECT_EQ("ktdict: b.txt does not have the key\n", outcome.err);

    JsonValue const json = Run({L"get", L"--format", L"json", L"$$$/B=d", L"a.txt", L"b.txt"}).Json();
    EXPECT_EQ("/B", json["key"].text);
    EXPECT_EQ("a.txt", json["results"][0]["file"].text);
    EXPECT_EQ("entry", json["results"][0]["found"].text);
    EXPECT_EQ("y", json["results"][0]["text"].text);
    EXPECT_EQ("default", json["results"][1]["found"].text);
    EXPECT_EQ("d", json["results"][1]["text"].text);
    JsonValue const none = Run({L"get", L"--format", L"json", L"/C", L"a.txt"}).Json();
    EXPECT_EQ("nothing", none["results"][0]["found"].text);
    EXPECT_FALSE(none["results"][0].Has("text"));
}

TEST_F(KtdictGetTest, GivesNoMoreThanTheApplicationGets) {
    Write(L"a.txt", "/A=one#{0}two\n/Z=#{0}\n");
    for (wchar_t const *const key : {L"/A", L"/B=one#{0}two"}) {
        EXPECT_EQ("one\n", Run({L"get", key, L"a.txt"}).out);
        EXPECT_EQ("one\n", Run({L"get", L"--raw", key, L"a.txt"}).out);
        JsonValue const json = Run({L"get", L"--format", L"json", key, L"a.txt"}).Json();
        EXPECT_EQ("one", json["results"][0]["text"].text);
    }
    EXPECT_EQ("\n", Run({L"get", L"/Z", L"a.txt"}).out);
    EXPECT_EQ("/A=one\\u0000two\n/Z=\\u0000\n", Run({L"dump", L"--no-header", L"a.txt"}).out) << "all of it";
}

TEST_F(KtdictGetTest, SaysThatEntriesOfVersion1AreNotFound) {
    Write(L"old.lxdc", Header(1, 0, 1).U16(2).U16(7).U32(0).U16(0).U32(11).U32(2).Raw("/A").U32(1).Raw("B").Bytes());
    KtdictOutcome const outcome = Run({L"get", L"/A", L"old.lxdc"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_EQ("ktdict: old.lxdc has the key in a table of version 1, where the application does not look\n",
              outcome.err);
    JsonValue const json = Run({L"get", L"--format", L"json", L"/A", L"old.lxdc"}).Json();
    EXPECT_TRUE(json["results"][0]["isInVersion1Table"].boolean);
}

TEST_F(KtdictGetTest, ADamagedFileHasStatus1EvenIfTheKeyIsThere) {
    Write(L"a.txt", "/A=x\n$B=y\n");
    KtdictOutcome const outcome = Run({L"get", L"/A", L"a.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("x\n", outcome.out);
    EXPECT_EQ("a.txt:2: lone-dollar: the entry begins with $ but not with $$$\n", outcome.err);
}

// ---- diff ----

TEST_F(KtdictDiffTest, TellsWhatDiffers) {
    Write(L"a.txt", "/Same=x\n/Gone=g\n/Changed=old\n");
    Write(L"b.txt", "/New=n\n/Changed=new\\n\n/Same=x\n");
    KtdictOutcome const outcome = Run({L"diff", L"a.txt", L"b.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("--- a.txt\n+++ b.txt\n-/Gone=g\n-/Changed=old\n+/Changed=new\\n\n+/New=n\n", outcome.out);
    EXPECT_EQ("", outcome.err);
    KtdictOutcome const json = Run({L"diff", L"--format", L"json", L"a.txt", L"b.txt"});
    EXPECT_EQ(1U, json.status);
    JsonValue const document = json.Json();
    EXPECT_EQ("a.txt", document["first"].text);
    EXPECT_EQ("b.txt", document["second"].text);
    JsonValue const &all = document["differences"];
    ASSERT_EQ(3U, all.items.size());
    EXPECT_EQ("first", all[0]["in"].text);
    EXPECT_EQ("/Gone", all[0]["key"].text);
    EXPECT_EQ("g", all[0]["text"].text);
    EXPECT_EQ("both", all[1]["in"].text);
    EXPECT_EQ("old", all[1]["first"].text);
    EXPECT_EQ("new\n", all[1]["second"].text);
    EXPECT_EQ("second", all[2]["in"].text);
    EXPECT_EQ("/New", all[2]["key"].text);
}

TEST_F(KtdictDiffTest, FormsAndOrderDoNotMatter) {
    Write(L"a.txt", "/Bc=H\xE9\n/A=B\n");
    SmallFile file;
    file.isBig = true;
    Write(L"b.lxdc", file.Bytes());
    KtdictOutcome const outcome = Run({L"diff", L"a.txt", L"b.lxdc"});
    EXPECT_EQ(0U, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_EQ(0U, Run({L"diff", L"--format", L"json", L"a.txt", L"b.lxdc"}).Json()["differences"].items.size());
    Write(L"old.lxdc", Header(1, 0, 1).U16(2).U16(7).U32(0).U16(0).U32(11).U32(2).Raw("/A").U32(1).Raw("B").Bytes());
    EXPECT_EQ("--- old.lxdc\n+++ b.lxdc\n+/Bc=H\xC3\xA9\n", Run({L"diff", L"old.lxdc", L"b.lxdc"}).out);
}

TEST_F(KtdictDiffTest, EntriesWithoutKeysAreComparedByTheirPlaces) {
    SmallFile file;
    file.hasKeys = false;
    file.keysPresent = 'N';
    file.buckets = 0;
    Write(L"a.lxdc", file.Bytes());
    file.values = u"CH\u00E9";
    Write(L"b.lxdc", file.Bytes());
    EXPECT_EQ("--- a.lxdc\n+++ b.lxdc\n-=B\n+=C\n", Run({L"diff", L"a.lxdc", L"b.lxdc"}).out);
    Write(L"c.txt", "");
    KtdictOutcome const outcome = Run({L"diff", L"--format", L"json", L"c.txt", L"a.lxdc"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ(JsonValue::Null, outcome.Json()["differences"][1]["key"].kind);
}

TEST_F(KtdictDiffTest, ADamagedFileHasStatus1) {
    Write(L"a.txt", "/A=x\n$B=y\n");
    Write(L"b.txt", "/A=x\n");
    KtdictOutcome const outcome = Run({L"diff", L"a.txt", L"b.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("", outcome.out);
    EXPECT_EQ("a.txt:2: lone-dollar: the entry begins with $ but not with $$$\n", outcome.err);
}

} // namespace
