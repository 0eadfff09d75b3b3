// WKtdictConvertTest.cpp: `ktdict convert`: every form into every form, what comes back otherwise, and what happens to
// files that are there.

#include "WKtdict.h"

using namespace dictionary_files;

namespace {

using NameList = std::vector<std::wstring>;

class KtdictConvertTest : public KtdictTest {
  protected:
    // Entries as dump prints them.
    std::string Dump(std::wstring const &name) const { return Run({L"dump", L"--no-header", L"--", name}).out; }

    // Entries as the engine reads them, without the tool.
    std::string Entries(std::wstring const &name) const {
        DictionaryReader dictionary;
        ReadBytes(dictionary, Read(name));
        EXPECT_TRUE(dictionary.IsValid());
        return List(dictionary);
    }

    template <std::size_t Size>
    KtdictOutcome Convert(wchar_t const *const (&form)[Size], std::wstring const &from, std::wstring const &to) const {
        Arguments arguments{L"convert", L"--force"};
        arguments.insert(arguments.end(), std::begin(form), std::end(form));
        arguments.insert(arguments.end(), {from, to});
        return Run(arguments);
    }

    // A binary file with these entries.
    void WriteEntries(std::wstring const &name,
                      std::vector<std::pair<std::string, std::u16string>> const &entries) const {
        DictionaryReader dictionary;
        for (auto const &entry : entries) {
            dictionary.Add("$$$" + entry.first,
                           {reinterpret_cast<unsigned short const *>(entry.second.data()), entry.second.size()});
        }
        Write(name, WriteBytes(dictionary));
    }
};

constexpr wchar_t const *kForms[][6] = {
    {L"--to", L"text", L"--encoding", L"utf-16", L"--byte-order", L"little"},
    {L"--to", L"text", L"--encoding", L"utf-16", L"--byte-order", L"big"},
    {L"--to", L"text", L"--encoding", L"ansi", L"--format", L"text"},
    {L"--to", L"binary", L"--encoding", L"utf-16", L"--byte-order", L"little"},
    {L"--to", L"binary", L"--encoding", L"utf-16", L"--byte-order", L"big"},
    {L"--to", L"binary", L"--encoding", L"utf-8", L"--byte-order", L"little"},
    {L"--to", L"binary", L"--encoding", L"utf-8", L"--byte-order", L"big"},
};
constexpr char const *kDescriptions[] = {
    "text, UTF-16, little-endian, 4 entries",
    "text, UTF-16, big-endian, 4 entries",
    "text, ANSI, 4 entries",
    "binary 2.7, UTF-16, little-endian, locale en_US, 4 entries",
    "binary 2.7, UTF-16, big-endian, locale en_US, 4 entries",
    "binary 2.7, UTF-8, little-endian, locale en_US, 4 entries",
    "binary 2.7, UTF-8, big-endian, locale en_US, 4 entries",
};

// ---- every form ----

TEST_F(KtdictConvertTest, EveryFormIntoEveryForm) {
    Write(L"start.txt",
          Utf16(u"\"$$$/A=caf\u00E9 \u2013 \u20AC\"\n\"$$$/Lines=one\\r\\ntwo \\\"three\\\"\"\n\"$$$/E=\"\n"
                u"\"$$$/T=a\tb\"\n"));
    std::string const entries = Entries(L"start.txt");
    std::wstring from = L"start.txt";
    for (std::size_t first = 0; first < std::size(kForms); ++first) {
        std::wstring const name = L"form" + std::to_wstring(first);
        KtdictOutcome const outcome = Convert(kForms[first], from, name);
        EXPECT_EQ(0U, outcome.status) << outcome.err;
        EXPECT_EQ("", outcome.err);
        EXPECT_NE(std::string::npos, outcome.out.find(kDescriptions[first])) << outcome.out;
        EXPECT_EQ(entries, Entries(name)) << first;
        KtdictOutcome const dump = Run({L"dump", name});
        EXPECT_EQ("# form" + std::to_string(first) + ": " + kDescriptions[first], dump.Lines()[0]);
        for (std::size_t second = 0; second < std::size(kForms); ++second) {
            KtdictOutcome const back = Convert(kForms[second], name, L"again");
            EXPECT_EQ(0U, back.status) << first << second << back.err;
            EXPECT_EQ(entries, Entries(L"again")) << first << second;
        }
        from = name;
    }
}

TEST_F(KtdictConvertTest, WritesWhatTheLibraryWrites) {
    Write(L"a.lxdc", SmallFile().Bytes());
    DictionaryReader dictionary;
    ReadBytes(dictionary, SmallFile().Bytes());
    EXPECT_EQ(0U, Run({L"convert", L"--to", L"text", L"a.lxdc", L"a.txt"}).status);
    EXPECT_EQ(WriteBytes(dictionary, {.isBinary = false}), Read(L"a.txt"));
    EXPECT_EQ(0U, Run({L"convert", L"--to", L"binary", L"a.txt", L"b.lxdc"}).status);
    EXPECT_EQ(WriteBytes(dictionary), Read(L"b.lxdc"));
    EXPECT_EQ(SmallFile().Bytes().size(), Read(L"b.lxdc").size());
}

TEST_F(KtdictConvertTest, TheLocale) {
    SmallFile file;
    file.locale = "de_DE";
    Write(L"a.lxdc", file.Bytes());
    EXPECT_EQ("a.lxdc -> b.lxdc: binary 2.7, UTF-8, little-endian, locale de_DE, 2 entries\n",
              Run({L"convert", L"--to", L"binary", L"--encoding", L"utf-8", L"a.lxdc", L"b.lxdc"}).out);
    KtdictOutcome const outcome = Run({L"convert", L"--to", L"binary", L"--locale", L"fr_CA", L"b.lxdc", L"c.lxdc"});
    EXPECT_EQ("b.lxdc -> c.lxdc: binary 2.7, UTF-16, little-endian, locale fr_CA, 2 entries\n", outcome.out);
    EXPECT_EQ("fr_CA", Run({L"dump", L"--format", L"json", L"c.lxdc"}).Json()["locale"].text);
}

TEST_F(KtdictConvertTest, EntriesWithoutKeysStayInTheirPlaces) {
    SmallFile file;
    file.hasKeys = false;
    file.keysPresent = 'N';
    file.buckets = 0;
    file.locale = "de_DE";
    Write(L"a.lxdc", file.Bytes());
    for (wchar_t const *const encoding : {L"utf-16", L"utf-8"}) {
        KtdictOutcome const outcome = Run({L"convert", L"-f", L"--to", L"binary", L"--locale", L"x", L"--byte-order",
                                           L"big", L"--encoding", encoding, L"a.lxdc", L"b.lxdc"});
        EXPECT_EQ(0U, outcome.status) << outcome.err;
        EXPECT_EQ("=B\n=H\xC3\xA9\n", Dump(L"b.lxdc"));
    }
    KtdictOutcome const outcome = Run({L"convert", L"--to", L"text", L"a.lxdc", L"b.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("a.lxdc: unwritable-key: entry 1: the form cannot hold the key; the entry is left out\n"
              "a.lxdc: unwritable-key: entry 2: the form cannot hold the key; the entry is left out\n",
              outcome.err);
    EXPECT_EQ("a.lxdc -> b.txt: text, UTF-16, little-endian, 0 entries\n", outcome.out);
}

TEST_F(KtdictConvertTest, Version1BecomesVersion2) {
    Write(L"old.lxdc", Header(1, 0, 1)
                           .U16(2)
                           .U16(7)
                           .U32(0)
                           .U16(0)
                           .U32(35)
                           .U32(2)
                           .Raw("/A")
                           .U32(1)
                           .Raw("B")
                           .U32(2)
                           .Raw("$C")
                           .U32(1)
                           .Raw("D")
                           .U32(4)
                           .Raw("/E=x")
                           .U32(1)
                           .Raw("F")
                           .Bytes());
    KtdictOutcome const outcome = Run({L"convert", L"--to", L"binary", L"old.lxdc", L"new.lxdc"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("old.lxdc: unwritable-key: the form cannot hold the key; the entry is left out (/E\\u003Dx)\n",
              outcome.err);
    EXPECT_EQ("/A=B\n$C=D\n", Dump(L"new.lxdc"));
    EXPECT_EQ("B\n", Run({L"get", L"/A", L"new.lxdc"}).out);
    EXPECT_EQ("D\n", Run({L"get", L"$$$$C", L"new.lxdc"}).out);
}

// ---- what comes back otherwise ----

TEST_F(KtdictConvertTest, WarnsOfWhatTheTextFormReadsOtherwise) {
    WriteEntries(L"a.lxdc", {{"/Plain", u"fine \"q\"\r\n\t\u2693"},
                             {"/Backslash", u"C:\\new"},
                             {"/Caret", u"2^Q"},
                             {"/Entity", u"#{copy}"},
                             {"/Harmless", u"^q \\q #{nope}"},
                             {"/End", u"x\\"},
                             {"/Two", u"\\n^T"}});
    KtdictOutcome const outcome = Run({L"convert", L"--to", L"text", L"a.lxdc", L"a.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ(
        "a.lxdc: backslash: the text's backslash is read as an escape; it comes back as \"C:\\new\" (/Backslash)\n"
        "a.lxdc: caret: the text's caret is read as an escape; it comes back as \"2\"\" (/Caret)\n"
        "a.lxdc: entity: the text's #{ is read as an entity; it comes back as \"\xC2\xA9\" (/Entity)\n"
        "a.lxdc: backslash: the text's backslash is read as an escape; it comes back as \"x\"\" (/End)\n"
        "a.lxdc: backslash: the text's backslash is read as an escape; it comes back as \"\\n\xE2\x84\xA2\" (/Two)\n"
        "a.lxdc: caret: the text's caret is read as an escape; it comes back as \"\\n\xE2\x84\xA2\" (/Two)\n",
        outcome.err);
    EXPECT_EQ("a.lxdc -> a.txt: text, UTF-16, little-endian, 7 entries\n", outcome.out) << "it is there all the same";
    EXPECT_EQ(1U, Run({L"diff", L"a.lxdc", L"a.txt"}).status);

    KtdictOutcome const json = Run({L"convert", L"-f", L"--format", L"json", L"--to", L"text", L"a.lxdc", L"a.txt"});
    EXPECT_EQ(1U, json.status);
    EXPECT_EQ("", json.err);
    JsonValue const document = json.Json();
    EXPECT_EQ(6U, document["problems"].items.size());
    EXPECT_EQ("caret", document["problems"][1]["kind"].text);
    EXPECT_EQ("/Caret", document["problems"][1]["key"].text);
    EXPECT_EQ("a.lxdc", document["input"].text);
    EXPECT_EQ("a.txt", document["output"].text);
    EXPECT_EQ(7, document["entryCount"].number);
}

TEST_F(KtdictConvertTest, WarnsOfWhatAnEncodingHasNot) {
    WriteEntries(L"a.lxdc", {{"/Fine", u"caf\u00E9 \u20AC"},
                             {"/Greek", u"\u03BB ^T"},
                             {"/Half", u"x\xD83D"},
                             {"/\xC3\x80", u"no code page 1252 key"}});
    KtdictOutcome const ansi = Run({L"convert", L"--to", L"text", L"--encoding", L"ansi", L"a.lxdc", L"a.txt"});
    EXPECT_EQ(1U, ansi.status);
    EXPECT_EQ("a.lxdc: caret: the text's caret is read as an escape; it comes back as \"? \xE2\x84\xA2\" (/Greek)\n"
              "a.lxdc: unmappable-text: the ANSI code page does not have all characters of the text; it comes back as "
              "\"? \xE2\x84\xA2\" (/Greek)\n"
              "a.lxdc: unmappable-text: the ANSI code page does not have all characters of the text; it comes back as "
              "\"x?\" (/Half)\n"
              "a.lxdc: unwritable-key: the form cannot hold the key; the entry is left out (/\xC3\x80)\n",
              ansi.err);
    EXPECT_EQ(1U, Run({L"convert", L"--to", L"text", L"a.lxdc", L"wide.txt"}).status) << "the caret";
    EXPECT_EQ("no code page 1252 key\n", Run({L"get", L"/\u00C0", L"wide.txt"}).out);
    KtdictOutcome const utf8 = Run({L"convert", L"--to", L"binary", L"--encoding", L"utf-8", L"a.lxdc", L"b.lxdc"});
    EXPECT_EQ(1U, utf8.status);
    EXPECT_EQ("a.lxdc: unpaired-surrogate: UTF-8 cannot hold half of a character; it comes back as \"x\xEF\xBF\xBD\" "
              "(/Half)\n",
              utf8.err);
    EXPECT_EQ(0U, Run({L"convert", L"--to", L"binary", L"a.lxdc", L"c.lxdc"}).status);
}

TEST_F(KtdictConvertTest, LeavesOutWhatWouldTearALineApart) {
    SmallFile file;
    file.keys = "\"\n/Bc"; // the first key would end its line
    Write(L"a.lxdc", file.Bytes());
    KtdictOutcome const outcome = Run({L"convert", L"--salvage", L"--to", L"text", L"a.lxdc", L"a.txt"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_NE(
        std::string::npos,
        outcome.err.find("a.lxdc: unwritable-key: the form cannot hold the key; the entry is left out (\"\\n)\n"));
    EXPECT_EQ("/Bc=H\xC3\xA9\n", Dump(L"a.txt"));
}

TEST_F(KtdictConvertTest, EscapeKeepsEverything) {
    WriteEntries(L"a.lxdc", {{"/Backslash", u"C:\\new \\\"x\\\" \\\\"},
                             {"/Caret", u"2^Q ^^ ^"},
                             {"/Entity", u"#{copy} #{5C} # {"},
                             {"/Zero", std::u16string(u"a\0b", 3)},
                             {"/Greek", u"\u03BB \U0001F6A2"},
                             {"/Half", u"x\xD83D"}});
    for (wchar_t const *const encoding : {L"utf-16", L"ansi"}) {
        KtdictOutcome const outcome =
            Run({L"convert", L"-f", L"--escape", L"--to", L"text", L"--encoding", encoding, L"a.lxdc", L"a.txt"});
        EXPECT_EQ(0U, outcome.status) << outcome.err;
        EXPECT_EQ("", outcome.err);
        EXPECT_EQ(0U, Run({L"diff", L"a.lxdc", L"a.txt"}).status);
        EXPECT_EQ(0U, Run({L"convert", L"-f", L"--to", L"binary", L"a.txt", L"b.lxdc"}).status);
        EXPECT_EQ(Read(L"a.lxdc"), Read(L"b.lxdc")) << "byte for byte";
    }
    EXPECT_NE(std::string::npos, Read(L"a.txt").find("\"/Greek=#{03BB} #{D83D}#{DEA2}\"\r\n")) << Read(L"a.txt");
}

TEST_F(KtdictConvertTest, ReportsTheInputsProblems) {
    Write(L"a.txt", "/A=x\n/A=^q\n");
    KtdictOutcome const outcome = Run({L"convert", L"--to", L"binary", L"a.txt", L"a.lxdc"});
    EXPECT_EQ(1U, outcome.status);
    EXPECT_EQ("a.txt:2: duplicate-key: the key was there before; its text is replaced (/A)\n"
              "a.txt:2: unknown-caret: the character after ^ has no meaning there (/A)\n",
              outcome.err);
    EXPECT_EQ("/A=^q\n", Dump(L"a.lxdc"));
}

// ---- damage ----

TEST_F(KtdictConvertTest, ADamagedInputIsConvertedOnlyOnDemand) {
    SmallFile file;
    file.numbers = {310, 1021};
    Write(L"bucket.lxdc", file.Bytes());
    Write(L"cut.lxdc", SmallFile().Bytes().substr(0, 90));
    Write(L"dollar.txt", "/A=x\n$B=y\n");
    Write(L"zero.txt", B("/A=x\n\0/B=y\n"));
    for (wchar_t const *const name : {L"bucket.lxdc", L"cut.lxdc", L"dollar.txt", L"zero.txt"}) {
        KtdictOutcome const refused = Run({L"convert", L"--to", L"binary", name, L"new.lxdc"});
        EXPECT_EQ(3U, refused.status);
        EXPECT_NE(std::string::npos, refused.err.find(" is damaged; --salvage converts what can be read of it\n"));
        EXPECT_FALSE(std::filesystem::exists(Path(L"new.lxdc")));
        KtdictOutcome const salvaged = Run({L"convert", L"--salvage", L"-f", L"--to", L"binary", name, L"saved.lxdc"});
        EXPECT_EQ(1U, salvaged.status) << salvaged.err;
        EXPECT_EQ("no problems\n", Run({L"check", L"saved.lxdc"}).out);
    }
    EXPECT_EQ("/A=x\n", Dump(L"saved.lxdc"));
}

// ---- files that are there ----

TEST_F(KtdictConvertTest, AnOutputThatIsThereIsRefused) {
    Write(L"a.txt", "/A=x\n");
    Write(L"b.lxdc", "precious");
    std::filesystem::create_directory(Path(L"folder"));
    for (wchar_t const *const name : {L"b.lxdc", L"B.LXDC", L".\\b.lxdc", L"folder"}) {
        KtdictOutcome const outcome = Run({L"convert", L"--to", L"binary", L"a.txt", name});
        EXPECT_EQ(3U, outcome.status);
        EXPECT_EQ("", outcome.out);
        EXPECT_NE(std::string::npos, outcome.err.find(" is there already; --force replaces it\n")) << outcome.err;
    }
    EXPECT_EQ("precious", Read(L"b.lxdc"));
    KtdictOutcome const json = Run({L"convert", L"--format", L"json", L"--to", L"binary", L"a.txt", L"b.lxdc"});
    EXPECT_EQ("b.lxdc is there already; --force replaces it", json.Json()["error"].text);
    EXPECT_EQ(0U, Run({L"convert", L"--force", L"--to", L"binary", L"a.txt", L"b.lxdc"}).status);
    EXPECT_EQ("/A=x\n", Dump(L"b.lxdc"));
    EXPECT_EQ((NameList{L"a.txt", L"b.lxdc", L"folder"}), Names()) << "nothing else is left";
}

TEST_F(KtdictConvertTest, TheInputIsNeverWritten) {
    Write(L"a.txt", "/A=x\n");
    std::filesystem::create_hard_link(Path(L"a.txt"), Path(L"link.txt"));
    for (wchar_t const *const name : {L"a.txt", L"A.TXT", L"./a.txt", L"link.txt"}) {
        for (wchar_t const *const force : {L"--force", L"--salvage"}) {
            KtdictOutcome const outcome = Run({L"convert", force, L"--to", L"binary", L"a.txt", name});
            EXPECT_EQ(3U, outcome.status);
            EXPECT_NE(std::string::npos, outcome.err.find(" is the input, which is never written\n")) << outcome.err;
        }
    }
    EXPECT_EQ("/A=x\n", Read(L"a.txt"));
    EXPECT_EQ("/A=x\n", Read(L"link.txt"));
}

TEST_F(KtdictConvertTest, WhatCannotBeWrittenLeavesNothing) {
    Write(L"a.txt", "/A=x\n");
    std::filesystem::create_directory(Path(L"folder"));
    for (wchar_t const *const name : {L"missing\\b.lxdc", L"no?name", L"folder", L"", L"nul"}) {
        KtdictOutcome const outcome = Run({L"convert", L"--force", L"--to", L"binary", L"a.txt", name});
        EXPECT_EQ(3U, outcome.status) << outcome.out;
        EXPECT_NE(std::string::npos, outcome.err.find(" cannot be written: ")) << outcome.err;
    }
    // A text that the binary form cannot hold; what is there stays as it is.
    Write(L"long.txt", "/Long=" + std::string(40000, 'x') + "\n");
    Write(L"b.lxdc", "precious");
    KtdictOutcome const outcome = Run({L"convert", L"--force", L"--to", L"binary", L"long.txt", L"b.lxdc"});
    EXPECT_EQ(3U, outcome.status);
    EXPECT_NE(std::string::npos,
              outcome.err.find("b.lxdc cannot be written: the text is too long for the binary form (/Long)\n"));
    EXPECT_EQ("precious", Read(L"b.lxdc"));
    // Nor does a file that another program keeps open.
    HANDLE const kept = CreateFileW(Path(L"b.lxdc").c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr);
    EXPECT_EQ(3U, Run({L"convert", L"--force", L"--to", L"binary", L"a.txt", L"b.lxdc"}).status);
    CloseHandle(kept);
    EXPECT_EQ("precious", Read(L"b.lxdc"));
    EXPECT_EQ((NameList{L"a.txt", L"b.lxdc", L"folder", L"long.txt"}), Names());
}

TEST_F(KtdictConvertTest, UnicodeNamesAndLongPaths) {
    std::wstring const name = L"\u00DCber\u2693\U0001F6A2.lxdc";
    Write(L"\u03BB.txt", "/A=x\n");
    EXPECT_EQ(0U, Run({L"convert", L"--to", L"binary", L"\u03BB.txt", name}).status);
    EXPECT_EQ("/A=x\n", Dump(name));
    std::wstring folder;
    std::vector<std::wstring> made; // longer than 260 characters, so by their extended names
    for (wchar_t letter = L'a'; letter < L'g'; ++letter) {
        folder += std::wstring(60, letter) + L"\\";
        made.push_back(L"\\\\?\\" + Path(folder).make_preferred().wstring());
        ASSERT_NE(FALSE, CreateDirectoryW(made.back().c_str(), nullptr));
    }
    std::wstring const distant = folder + std::wstring(250, L'x');
    KtdictOutcome const outcome = Run({L"convert", L"--to", L"binary", L"\u03BB.txt", distant});
    EXPECT_EQ(0U, outcome.status) << outcome.err;
    EXPECT_EQ("/A=x\n", Dump(distant));
    EXPECT_NE(FALSE, DeleteFileW((made.back() + std::wstring(250, L'x')).c_str()));
    for (; !made.empty(); made.pop_back()) {
        EXPECT_NE(FALSE, RemoveDirectoryW(made.back().c_str())) << "nothing else was left there";
    }
}

} // namespace
