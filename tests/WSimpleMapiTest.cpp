// WSimpleMapiTest.cpp: mails through a MAPI32.DLL that writes down what it is handed (mail/FakeMapi.cpp).

#include "WImportHook.h"
#include "WMailFixture.h"

namespace {

using Texts = std::vector<std::string>;

constexpr char kMapiError[] = "kKTMAPIError";
constexpr char kNoMapi[] = "Assert failed: Doesn't Support MAPI at source/private/utils/email/WKTSendMail:357";
constexpr char kUnfit[] = "KTSendMail: a path or a text cannot be handed to MAPISendMail";
constexpr char kNotSent[] =
    "KTSendMail: not sent through Harbour Mail, DLLPath \"C:\\mail\\mapi.dll\", PreFirstRun \"\"";
constexpr char kMessage[] = "message 0 0 sender none type null date null conversation null";

class WSimpleMapiTest : public WMailFixture {
  protected:
    WSimpleMapiTest() {
        AddClient(L"Harbour Mail");
        SetDefault(L"Harbour Mail");
        SetEnvironmentVariableW(L"KT_MAPI_RECORD", record.c_str());
        SetEnvironmentVariableW(L"KT_MAPI_RESULT", nullptr);
    }

    // Lets the DLLs return that number.
    static void Return(unsigned code) { SetEnvironmentVariableW(L"KT_MAPI_RESULT", std::to_wstring(code).c_str()); }

    // The record's lines that begin with the word, without it.
    static Texts Lines(Texts const &record, std::string const &word) {
        Texts found;
        for (std::string const &line : record) {
            if (line.starts_with(word + " ")) {
                found.push_back(line.substr(word.size() + 1));
            }
        }
        return found;
    }

    // Nothing was handed over, and the log tells why.
    void ExpectNothingSent(std::string const &reason) {
        LogLines log;
        ExpectFailure(kMapiError);
        EXPECT_TRUE(TakeRecord().empty());
        EXPECT_EQ((Texts{reason, kNotSent}), log.Take());
    }

    // The system's code page.
    static std::string InCodePage(wchar_t const *text) {
        char bytes[256] = {};
        WideCharToMultiByte(CP_ACP, 0, text, -1, bytes, sizeof bytes, nullptr, nullptr);
        return bytes;
    }
    static bool HasAllCharacters() { return GetACP() == CP_UTF8; }
};

TEST_F(WSimpleMapiTest, HandsEverythingOver) {
    WMapiFolder const mapi(StandIns(L"both"));
    LogLines log;
    mail->SetToRecipients("a@example.com; Bob <bob@example.com>;Harbour Office");
    mail->SetCCRecipients("\"Doe, Jane\" <jane@example.com>, c@example.com");
    mail->SetEmailSubject("Course for review");
    mail->SetEmailBody("One\r\ntwo\nthree");
    mail->SetFileList({KTString("C:\\courses\\a.zip"), KTString("C:\\courses\\b c.txt")});
    ExpectSuccess();
    EXPECT_EQ((Texts{"MAPISendMail", "session 0 window 0 flags 9 reserved 0", kMessage, "subject Course for review",
                     "text One\\r\\ntwo\\nthree", "to 0 0 none a@example.com|SMTP:a@example.com",
                     "to 0 0 none Bob|SMTP:bob@example.com", "to 0 0 none Harbour Office|null",
                     "cc 0 0 none Doe, Jane|SMTP:jane@example.com", "cc 0 0 none c@example.com|SMTP:c@example.com",
                     "file 0 0 4294967295 none C:\\courses\\a.zip|a.zip",
                     "file 0 0 4294967295 none C:\\courses\\b c.txt|b c.txt"}),
              TakeRecord());
    EXPECT_TRUE(log.Take().empty());
}

TEST_F(WSimpleMapiTest, AnEmptyMailIsHandedOverAsItIs) {
    WMapiFolder const mapi(StandIns(L"both"));
    ExpectSuccess();
    EXPECT_EQ((Texts{"MAPISendMail", "session 0 window 0 flags 9 reserved 0", kMessage, "subject ", "text "}),
              TakeRecord());
}

TEST_F(WSimpleMapiTest, SilentlyMeansWithoutAnyWindow) {
    WMapiFolder const mapi(StandIns(L"both"));
    for (short const silently : {short{1}, short{-1}, short{0}}) {
        mail->SetSendMailSilently(silently);
        ExpectSuccess();
        std::string const flags = silently != 0 ? "0" : "9"; // sign in, show the message
        EXPECT_EQ(Texts{"0 window 0 flags " + flags + " reserved 0"}, Lines(TakeRecord(), "session"));
    }
}

TEST_F(WSimpleMapiTest, TheShownMessageBelongsToTheActiveWindow) {
    WMapiFolder const mapi(StandIns(L"both"));
    HWND const window =
        CreateWindowExW(0, L"STATIC", L"host", WS_POPUP | WS_VISIBLE, 0, 0, 10, 10, nullptr, nullptr, nullptr, nullptr);
    SetActiveWindow(window);
    EXPECT_EQ(window, GetActiveWindow());
    ExpectSuccess();
    std::string const number = std::to_string(reinterpret_cast<ULONG_PTR>(window));
    EXPECT_EQ(Texts{"0 window " + number + " flags 9 reserved 0"}, Lines(TakeRecord(), "session"));
    mail->SetSendMailSilently(1);
    ExpectSuccess();
    EXPECT_EQ(Texts{"0 window 0 flags 0 reserved 0"}, Lines(TakeRecord(), "session"));
    DestroyWindow(window);
}

TEST_F(WSimpleMapiTest, TextsGoInTheSystemsCodePage) {
    if (InCodePage(L"Größe é") == InCodePage(L"Gr??e ?")) {
        GTEST_SKIP() << "the code page has none of these";
    }
    WMapiFolder const mapi(StandIns(L"both"));
    mail->SetToRecipients("Jürgen Größe <j@example.com>");
    mail->SetCCRecipients("é <e@example.com>");
    mail->SetEmailSubject("Größe");
    mail->SetEmailBody("é");
    mail->SetFileList({KTString("C:\\Größe\\é.txt")});
    ExpectSuccess();
    EXPECT_EQ(
        (Texts{"MAPISendMail", "session 0 window 0 flags 9 reserved 0", kMessage, "subject " + InCodePage(L"Größe"),
               "text " + InCodePage(L"é"), "to 0 0 none " + InCodePage(L"Jürgen Größe") + "|SMTP:j@example.com",
               "cc 0 0 none " + InCodePage(L"é") + "|SMTP:e@example.com",
               "file 0 0 4294967295 none " + InCodePage(L"C:\\Größe\\é.txt|é.txt")}),
        TakeRecord());
}

// Each text on its own decides; the others stay what they are.
TEST_F(WSimpleMapiTest, WhatTheCodePageLacksGoesWide) {
    if (HasAllCharacters()) {
        GTEST_SKIP() << "the code page is UTF-8";
    }
    WMapiFolder const mapi(StandIns(L"both"));
    mail->SetToRecipients("Jürgen <j@example.com>");
    mail->SetEmailSubject("Größe");
    mail->SetEmailBody("λιμάνι ⚓ 🚢\r\n");
    mail->SetFileList({KTString("C:\\船\\⚓.txt")});
    ExpectSuccess();
    EXPECT_EQ((Texts{"MAPISendMailW", "session 0 window 0 flags 9 reserved 0", kMessage, "subject Größe",
                     "text λιμάνι ⚓ 🚢\\r\\n", "to 0 0 none Jürgen|SMTP:j@example.com",
                     "file 0 0 4294967295 none C:\\船\\⚓.txt|⚓.txt"}),
              TakeRecord());

    mail->SetEmailBody("");
    mail->SetFileList({});
    ExpectSuccess();
    EXPECT_EQ("MAPISendMail", TakeRecord().at(0));
    mail->SetToRecipients("λ <l@example.com>");
    ExpectSuccess();
    EXPECT_EQ("MAPISendMailW", TakeRecord().at(0));
    mail->SetToRecipients("");
    mail->SetCCRecipients("λ");
    ExpectSuccess();
    EXPECT_EQ("MAPISendMailW", TakeRecord().at(0));
    mail->SetCCRecipients("");
    mail->SetEmailSubject("λ");
    ExpectSuccess();
    EXPECT_EQ("MAPISendMailW", TakeRecord().at(0));
}

// A letter that the code page would replace by a similar one is lost all the same.
TEST_F(WSimpleMapiTest, SimilarLettersAreNotGoodEnough) {
    if (HasAllCharacters()) {
        GTEST_SKIP() << "the code page is UTF-8";
    }
    WMapiFolder const mapi(StandIns(L"both"));
    mail->SetEmailSubject("Ā ∞ Ａ");
    ExpectSuccess();
    EXPECT_EQ((Texts{"Ā ∞ Ａ"}), Lines(TakeRecord(), "subject"));
}

TEST_F(WSimpleMapiTest, WithoutTheWideFunctionNothingIsMangled) {
    if (HasAllCharacters()) {
        GTEST_SKIP() << "the code page is UTF-8";
    }
    WMapiFolder const mapi(StandIns(L"bytes"));
    mail->SetEmailSubject("plain");
    ExpectSuccess();
    EXPECT_EQ("MAPISendMail", TakeRecord().at(0));
    mail->SetEmailSubject("λ");
    ExpectNothingSent(kUnfit);
}

TEST_F(WSimpleMapiTest, AttachmentsAreFullPaths) {
    WMapiFolder const mapi(StandIns(L"both"));
    std::string const here = std::filesystem::current_path().string();
    mail->SetFileList({KTString("notes.txt"), KTString("C:/a/../b/c.txt"), KTString("file:///C:/d/e.txt"),
                       KTString("\\\\server\\share\\f.txt")});
    ExpectSuccess();
    std::string const start = "0 0 4294967295 none ";
    EXPECT_EQ((Texts{start + here + "\\notes.txt|notes.txt", start + "C:\\b\\c.txt|c.txt", start + "C:\\d\\e.txt|e.txt",
                     start + "\\\\server\\share\\f.txt|f.txt"}),
              Lines(TakeRecord(), "file"));
}

TEST_F(WSimpleMapiTest, AnAttachmentWithoutAValidPathKeepsTheMailBack) {
    WMapiFolder const mapi(StandIns(L"both"));
    mail->SetFileList({KTString("C:\\a.txt"), KTString("")});
    ExpectNothingSent(kUnfit);
    mail->SetFileList({KTString("C:\\a?.txt")});
    ExpectNothingSent(kUnfit);
}

// The mail program takes texts up to their first zero: a part of the text, or another address, would go out.
TEST_F(WSimpleMapiTest, ATextWithAZeroInsideKeepsTheMailBack) {
    WMapiFolder const mapi(StandIns(L"both"));
    KTString const text = FromUnits({'a', 0, 'b'});
    mail->SetEmailSubject(text);
    ExpectNothingSent(kUnfit);
    mail->SetEmailSubject("subject");
    mail->SetEmailBody(text);
    ExpectNothingSent(kUnfit);
    mail->SetEmailBody("");
    mail->SetToRecipients(text);
    ExpectNothingSent(kUnfit);
    mail->SetToRecipients("Jane <" + text + ">");
    ExpectNothingSent(kUnfit);
    mail->SetToRecipients("");
    mail->SetCCRecipients(text);
    ExpectNothingSent(kUnfit);
    mail->SetCCRecipients("");
    mail->SetFileList({"C:\\" + text});
    ExpectNothingSent(kUnfit);
    mail->SetFileList({});
    ExpectSuccess();
}

TEST_F(WSimpleMapiTest, EveryRefusalIsAFailure) {
    WMapiFolder const mapi(StandIns(L"both"));
    for (unsigned code = 1; code <= 26; ++code) { // MAPI_E_USER_ABORT to MAPI_E_NOT_SUPPORTED
        Return(code);
        LogLines log;
        ExpectFailure(kMapiError);
        EXPECT_EQ("Das Mailprogramm hat die Nachricht abgelehnt.", mail->GetFailureMessage(nullptr));
        EXPECT_EQ((Texts{"KTSendMail: MAPISendMail returned " + std::to_string(code), kNotSent}), log.Take());
    }
    Return(0);
    ExpectSuccess();
}

TEST_F(WSimpleMapiTest, ARefusedWideMailIsAFailure) {
    if (HasAllCharacters()) {
        GTEST_SKIP() << "the code page is UTF-8";
    }
    WMapiFolder const mapi(StandIns(L"both"));
    mail->SetEmailSubject("λ");
    Return(2);
    ExpectFailure(kMapiError);
    EXPECT_EQ("MAPISendMailW", TakeRecord().at(0));
}

TEST_F(WSimpleMapiTest, AMailMayBeSentAgain) {
    WMapiFolder const mapi(StandIns(L"both"));
    mail->SetEmailSubject("first");
    ExpectSuccess();
    Texts const first = TakeRecord();
    ExpectSuccess();
    EXPECT_EQ(first, TakeRecord());
    mail->SetEmailSubject("second");
    ExpectSuccess();
    EXPECT_EQ(Texts{"second"}, Lines(TakeRecord(), "subject"));
}

TEST_F(WSimpleMapiTest, TheLibraryIsReleased) {
    WMapiFolder const mapi(StandIns(L"both"));
    ExpectSuccess();
    EXPECT_EQ(nullptr, GetModuleHandleW(L"MAPI32.DLL"));
    Return(2);
    ExpectFailure(kMapiError);
    EXPECT_EQ(nullptr, GetModuleHandleW(L"MAPI32.DLL"));
}

TEST_F(WSimpleMapiTest, ALibraryWithoutTheFunctionIsNoMapi) {
    WMapiFolder const mapi(StandIns(L"wide")); // even with the other one
    ExpectNothingSent(kNoMapi);
    EXPECT_EQ(nullptr, GetModuleHandleW(L"MAPI32.DLL"));
}

HMODULE WINAPI RefuseToLoad(LPCWSTR name, HANDLE, DWORD) {
    EXPECT_STREQ(L"MAPI32.DLL", name);
    SetLastError(ERROR_MOD_NOT_FOUND);
    return nullptr;
}

TEST_F(WSimpleMapiTest, AMissingLibraryIsNoMapi) {
    WImportHook const hook(L"KTPublic.dll", "LoadLibraryExW", &RefuseToLoad);
    ASSERT_TRUE(hook.IsActive());
    ExpectNothingSent(kNoMapi);
}

std::wstring foundLibrary;

HMODULE WINAPI LookOnly(LPCWSTR name, HANDLE file, DWORD flags) {
    HMODULE const module = LoadLibraryExW(name, file, flags);
    wchar_t path[MAX_PATH] = {};
    GetModuleFileNameW(module, path, MAX_PATH);
    foundLibrary = path;
    FreeLibrary(module);
    return nullptr;
}

TEST_F(WSimpleMapiTest, TheCurrentFolderIsNotSearched) {
    std::filesystem::path const folder = std::filesystem::temp_directory_path() / "documents";
    std::filesystem::create_directories(folder);
    std::filesystem::copy_file(StandIns(L"both") / L"MAPI32.dll", folder / L"MAPI32.DLL",
                               std::filesystem::copy_options::overwrite_existing);
    std::filesystem::path const before = std::filesystem::current_path();
    WImportHook const hook(L"KTPublic.dll", "LoadLibraryExW", &LookOnly);
    ASSERT_TRUE(hook.IsActive());
    std::filesystem::current_path(folder);
    ExpectFailure(kMapiError);
    std::filesystem::current_path(before);
    EXPECT_EQ(foundLibrary.npos, foundLibrary.find(L"documents"));

    WMapiFolder const mapi(StandIns(L"both"));
    ExpectFailure(kMapiError);
    EXPECT_NE(foundLibrary.npos, foundLibrary.find(L"both"));
}

} // namespace
