// WOutlookMailTest.cpp: mails through automation, to a server that writes down every call (mail/FakeOutlook.cpp): loaded
// into the test, started for it, or running already.
//
// A machine with the real program is left alone: the tests are skipped there.

#include "WImportHook.h"
#include "WMailFixture.h"

#include <objbase.h>
#include <oleauto.h>

#include <algorithm>
#include <map>

namespace {

using Texts = std::vector<std::string>;

constexpr char kClientError[] = "kKTMailClientError";

HRESULT WINAPI RecordOleInitialize(void *reserved) {
    RecordFakeOutlook("OleInitialize");
    return OleInitialize(reserved);
}

void WINAPI RecordOleUninitialize() {
    RecordFakeOutlook("OleUninitialize");
    OleUninitialize();
}

class WOutlookMailTest : public WMailFixture {
  protected:
    WOutlookMailTest()
        : m_Initialize(L"KTPublic.dll", "OleInitialize", &RecordOleInitialize),
          m_Uninitialize(L"KTPublic.dll", "OleUninitialize", &RecordOleUninitialize) {
        EXPECT_TRUE(m_Initialize.IsActive() && m_Uninitialize.IsActive());
        AddClient(L"Microsoft Outlook");
        SetDefault(L"Microsoft Outlook");
        Tell(L"Record", record.wstring());
        mail->SetToRecipients("a@example.com; Bob <bob@example.com>");
        mail->SetCCRecipients("c@example.com");
        mail->SetEmailSubject("Größe λ ⚓");
        mail->SetEmailBody("One\r\ntwo 🚢");
        mail->SetFileList({KTString("C:\\a\\b c.txt"), KTString("C:/船/⚓.zip")});
    }
    ~WOutlookMailTest() override {
        if (m_IsRegistered) {
            Unregister();
        }
    }

    void SetUp() override {
        CLSID existing{};
        if (FAILED(CLSIDFromProgID(L"Outlook.Application", &existing))) {
            return;
        }
        if (!IsEqualCLSID(existing, kFakeOutlookClass)) {
            GTEST_SKIP() << "the real program is installed here";
        }
        Unregister(); // of a run that was ended
    }

    // A setting of the pretended mail program.
    static void Tell(wchar_t const *name, std::wstring const &value) {
        RegSetKeyValueW(HKEY_CURRENT_USER, kFakeOutlookSettings, name, REG_SZ, value.c_str(),
                        static_cast<DWORD>((value.size() + 1) * sizeof(wchar_t)));
    }

    // Registers the class with one kind of server: InprocServer32 or LocalServer32.
    void Register(std::wstring const &kind, std::filesystem::path const &server) {
        m_IsRegistered = true;
        SetClass(L"Outlook.Application\\CLSID", ClassId());
        SetClass(L"CLSID\\" + ClassId() + L"\\" + kind, server.wstring());
    }
    void RegisterModule() { Register(L"InprocServer32", StandIns(L"ktoutlook.dll")); }

    // What is written down when all goes well, without the objects' lives.
    static Texts Calls(bool silently) {
        return {"OleInitialize",
                "Application.GetNameSpace(\"MAPI\")",
                "NameSpace.GetDefaultFolder(6)",
                "Folder.Display()",
                "Application.CreateItem(0)",
                "MailItem.Subject = \"Größe λ ⚓\"",
                "MailItem.Body = \"One\\r\\ntwo 🚢\\r\\n\\r\\n\"",
                "MailItem.To = \"a@example.com; Bob <bob@example.com>\"",
                "MailItem.Cc = \"c@example.com\"",
                "MailItem.Attachments",
                "Attachments.Add(\"C:\\a\\b c.txt\")",
                "Attachments.Add(\"C:\\船\\⚓.zip\")",
                "MailItem.GetInspector",
                silently ? "MailItem.Send()" : "Inspector.Activate()",
                "OleUninitialize"};
    }

    static bool IsLife(std::string const &line) { return line.starts_with("+ ") || line.starts_with("- "); }

    static Texts WithoutLives(Texts lines) {
        std::erase_if(lines, IsLife);
        return lines;
    }

    // Every object is gone, and was before OLE was left.
    static void ExpectAllReleased(Texts const &lines) {
        std::map<std::string, int> alive;
        for (std::string const &line : lines) {
            if (IsLife(line)) {
                alive[line.substr(2)] += line[0] == '+' ? 1 : -1;
            }
        }
        for (auto const &[kind, count] : alive) {
            EXPECT_EQ(0, count) << kind;
        }
        EXPECT_EQ("OleUninitialize", lines.empty() ? "" : lines.back());
    }

    // This thread is in no apartment.
    static void ExpectOleLeft() {
        APTTYPE type{};
        APTTYPEQUALIFIER qualifier{};
        EXPECT_EQ(CO_E_NOTINITIALIZED, CoGetApartmentType(&type, &qualifier));
    }

    // The sending fails at that line of the mail source; nothing of it stays. Gives the record.
    Texts ExpectFailureAt(int line, std::string const &message) {
        LogLines log;
        ExpectFailure(kClientError);
        EXPECT_EQ(
            (Texts{"Assert failed: " + message + " at source/private/utils/email/WKTSendMail:" + std::to_string(line),
                   "KTSendMail: not sent through Microsoft Outlook, DLLPath \"C:\\mail\\mapi.dll\", PreFirstRun \"\""}),
            log.Take());
        return TakeRecord();
    }

  private:
    static void Unregister() {
        RegDeleteTreeW(ClassesRoot(), (ClassesPath() + L"Outlook.Application").c_str());
        RegDeleteTreeW(ClassesRoot(), (ClassesPath() + L"CLSID\\" + ClassId()).c_str());
    }

    // Wine shows the machine's classes only; on Windows the user's own come first and need no special rights.
    static HKEY ClassesRoot() { return IsWine() ? HKEY_CLASSES_ROOT : HKEY_CURRENT_USER; }
    static std::wstring ClassesPath() { return IsWine() ? L"" : L"Software\\Classes\\"; }
    static std::wstring ClassId() {
        wchar_t text[40] = {};
        StringFromGUID2(kFakeOutlookClass, text, 40);
        return text;
    }
    static void SetClass(std::wstring const &key, std::wstring const &value) {
        ASSERT_EQ(ERROR_SUCCESS,
                  RegSetKeyValueW(ClassesRoot(), (ClassesPath() + key).c_str(), nullptr, REG_SZ, value.c_str(),
                                  static_cast<DWORD>((value.size() + 1) * sizeof(wchar_t))));
    }

    WImportHook m_Initialize;
    WImportHook m_Uninitialize;
    bool m_IsRegistered = false;
};

TEST_F(WOutlookMailTest, ShowsTheMessage) {
    RegisterModule();
    LogLines log;
    ExpectSuccess();
    Texts const lines = TakeRecord();
    EXPECT_EQ(Calls(false), WithoutLives(lines));
    ExpectAllReleased(lines);
    ExpectOleLeft();
    EXPECT_TRUE(log.Take().empty());
}

TEST_F(WOutlookMailTest, SendsSilently) {
    RegisterModule();
    mail->SetSendMailSilently(1);
    ExpectSuccess();
    Texts const lines = TakeRecord();
    EXPECT_EQ(Calls(true), WithoutLives(lines));
    ExpectAllReleased(lines);
    ExpectOleLeft();
}

TEST_F(WOutlookMailTest, ObjectsLiveAsLongAsTheyAreUsed) {
    RegisterModule();
    mail->SetFileList({KTString("C:\\a.txt")});
    ExpectSuccess();
    Texts lives = TakeRecord();
    std::erase_if(lives, [](std::string const &line) { return !IsLife(line); });
    EXPECT_EQ((Texts{"+ Application", "+ NameSpace", "+ Folder", "- Folder", "- NameSpace", "+ MailItem",
                     "+ Attachments", "+ Attachment", "- Attachment", "- Attachments", "+ Inspector", "- Inspector",
                     "- MailItem", "- Application"}),
              lives);
}

// What is appended to the text is appended to what is sent, not to what is stored.
TEST_F(WOutlookMailTest, AMailMayBeSentAgain) {
    RegisterModule();
    ExpectSuccess();
    TakeRecord();
    ExpectSuccess();
    EXPECT_EQ(Calls(false), WithoutLives(TakeRecord()));
}

TEST_F(WOutlookMailTest, AnEmptyMail) {
    RegisterModule();
    mail->SetToRecipients("");
    mail->SetCCRecipients("");
    mail->SetEmailSubject("");
    mail->SetEmailBody("");
    mail->SetFileList({});
    ExpectSuccess();
    EXPECT_EQ((Texts{"OleInitialize", "Application.GetNameSpace(\"MAPI\")", "NameSpace.GetDefaultFolder(6)",
                     "Folder.Display()", "Application.CreateItem(0)", "MailItem.Subject = \"\"",
                     "MailItem.Body = \"\\r\\n\\r\\n\"", "MailItem.To = \"\"", "MailItem.Cc = \"\"",
                     "MailItem.Attachments", "MailItem.GetInspector", "Inspector.Activate()", "OleUninitialize"}),
              WithoutLives(TakeRecord()));
}

TEST_F(WOutlookMailTest, AttachmentsAreFullPaths) {
    RegisterModule();
    mail->SetFileList({KTString("notes.txt"), KTString("file:///C:/d/e.txt")});
    ExpectSuccess();
    Texts added = TakeRecord();
    std::erase_if(added, [](std::string const &line) { return !line.starts_with("Attachments.Add"); });
    EXPECT_EQ((Texts{"Attachments.Add(\"" + std::filesystem::current_path().string() + "\\notes.txt\")",
                     "Attachments.Add(\"C:\\d\\e.txt\")"}),
              added);
}

TEST_F(WOutlookMailTest, AnAttachmentWithoutAValidPathStopsTheMail) {
    RegisterModule();
    mail->SetFileList({KTString("C:\\a\\b c.txt"), KTString("")});
    Texts const lines = ExpectFailureAt(258, "Add: 0x80070057");
    Texts expected = Calls(false);
    expected.erase(expected.begin() + 11, expected.end() - 1);
    EXPECT_EQ(expected, WithoutLives(lines));
    ExpectAllReleased(lines);
}

// ---- whose instance ----

TEST_F(WOutlookMailTest, StartsAProgramAndLetsItGo) {
    Register(L"LocalServer32", StandIns(L"ktoutlook.exe"));
    HANDLE const ended = CreateEventW(nullptr, TRUE, FALSE, L"KTOutlookEnded");
    ResetEvent(ended);
    ExpectSuccess();
    ExpectOleLeft();
    EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(ended, 60000));
    CloseHandle(ended);
    Texts const lines = TakeRecord();
    Texts expected = Calls(false);
    expected.insert(expected.begin() + 1, "a started program");
    Texts calls = WithoutLives(lines);
    // The program tells its end when it likes.
    EXPECT_EQ(1, std::erase(calls, "objects left: 0"));
    EXPECT_EQ(expected, calls);
    EXPECT_EQ(std::count(lines.begin(), lines.end(), "+ MailItem"),
              std::count(lines.begin(), lines.end(), "- MailItem"));
}

TEST_F(WOutlookMailTest, AttachesToARunningProgram) {
    RegisterModule(); // would be created if none ran
    HANDLE const ready = CreateEventW(nullptr, TRUE, FALSE, L"KTOutlookReady");
    HANDLE const stop = CreateEventW(nullptr, TRUE, FALSE, L"KTOutlookStop");
    ResetEvent(ready);
    ResetEvent(stop);
    std::wstring command = L"\"" + StandIns(L"ktoutlook.exe").wstring() + L"\" /running";
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION process{};
    ASSERT_NE(FALSE, CreateProcessW(nullptr, command.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                                    &process));
    EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(ready, 60000));
    mail->SetSendMailSilently(1);
    ExpectSuccess();
    ExpectOleLeft();
    SetEvent(stop);
    EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(process.hProcess, 60000));
    for (HANDLE const handle : {ready, stop, process.hProcess, process.hThread}) {
        CloseHandle(handle);
    }
    Texts const lines = TakeRecord();
    Texts expected = Calls(true);
    expected.insert(expected.begin(), "a running program");
    expected.push_back("objects left: 0");
    EXPECT_EQ(expected, WithoutLives(lines));
    EXPECT_EQ(1, std::count(lines.begin(), lines.end(), "+ Application"));
}

// The host itself may use OLE, and be what the mail is sent through.
TEST_F(WOutlookMailTest, AttachesWithinAThreadThatUsesOle) {
    RegisterModule();
    ASSERT_EQ(S_OK, OleInitialize(nullptr));
    IUnknown *application = nullptr;
    ASSERT_EQ(S_OK, CoCreateInstance(kFakeOutlookClass, nullptr, CLSCTX_INPROC_SERVER, IID_IUnknown,
                                     reinterpret_cast<void **>(&application)));
    DWORD cookie = 0;
    ASSERT_EQ(S_OK, RegisterActiveObject(application, kFakeOutlookClass, ACTIVEOBJECT_STRONG, &cookie));
    TakeRecord();
    ExpectSuccess();
    Texts const lines = TakeRecord();
    EXPECT_EQ(Calls(false), WithoutLives(lines));
    EXPECT_EQ(0, std::count(lines.begin(), lines.end(), "+ Application")) << "it has made another";
    APTTYPE type{};
    APTTYPEQUALIFIER qualifier{};
    EXPECT_EQ(S_OK, CoGetApartmentType(&type, &qualifier)) << "it has taken OLE from its host";
    RevokeActiveObject(cookie, nullptr);
    EXPECT_EQ(0U, application->Release());
    OleUninitialize();
    ExpectOleLeft();
}

// An instance that cannot be automated counts as none.
TEST_F(WOutlookMailTest, CreatesAnInstanceBesideAnUnfitOne) {
    RegisterModule();
    ASSERT_EQ(S_OK, OleInitialize(nullptr));
    IUnknown *const factory = MakeFakeOutlookFactory(); // knows no IDispatch
    DWORD cookie = 0;
    ASSERT_EQ(S_OK, RegisterActiveObject(factory, kFakeOutlookClass, ACTIVEOBJECT_STRONG, &cookie));
    ExpectSuccess();
    Texts const lines = TakeRecord();
    EXPECT_EQ(Calls(false), WithoutLives(lines));
    EXPECT_EQ(1, std::count(lines.begin(), lines.end(), "+ Application"));
    RevokeActiveObject(cookie, nullptr);
    EXPECT_EQ(0U, factory->Release());
    OleUninitialize();
}

// ---- failures ----

TEST_F(WOutlookMailTest, NoClassOfThatName) {
    EXPECT_EQ((Texts{"OleInitialize", "OleUninitialize"}), ExpectFailureAt(148, "CLSIDFromProgID: 0x800401F3"));
    ExpectOleLeft();
}

TEST_F(WOutlookMailTest, NoServerBehindTheClass) {
    Register(L"InprocServer32", StandIns(L"missing.dll"));
    LogLines log;
    ExpectFailure(kClientError);
    Texts const lines = log.Take();
    ASSERT_EQ(2U, lines.size());
    EXPECT_TRUE(lines[0].starts_with("Assert failed: CoCreateInstance: 0x8")) << lines[0];
    EXPECT_TRUE(lines[0].ends_with(" at source/private/utils/email/WKTSendMail:163")) << lines[0];
    EXPECT_EQ((Texts{"OleInitialize", "OleUninitialize"}), TakeRecord());
    ExpectOleLeft();
}

TEST_F(WOutlookMailTest, NoInstanceToBeHad) {
    RegisterModule();
    Tell(L"FailHow", L"create");
    EXPECT_EQ((Texts{"OleInitialize", "OleUninitialize"}), ExpectFailureAt(163, "CoCreateInstance: 0x8007000E"));
    ExpectOleLeft();
}

// Such a thread cannot use OLE; what it has stays as it is.
TEST_F(WOutlookMailTest, NoOleInTheMultithreadedApartment) {
    RegisterModule();
    ASSERT_EQ(S_OK, CoInitializeEx(nullptr, COINIT_MULTITHREADED));
    EXPECT_EQ(Texts{"OleInitialize"}, ExpectFailureAt(141, "OleInitialize: 0x80010106"));
    APTTYPE type{};
    APTTYPEQUALIFIER qualifier{};
    EXPECT_EQ(S_OK, CoGetApartmentType(&type, &qualifier));
    EXPECT_EQ(APTTYPE_MTA, type);
    CoUninitialize();
    ExpectOleLeft();
}

struct Step {
    char const *member;
    int line;
    std::size_t call; // place in Calls
    bool givesObject;
};

constexpr Step kSteps[] = {{"GetNameSpace", 178, 1, true},  {"GetDefaultFolder", 187, 2, true},
                           {"Display", 195, 3, false},      {"CreateItem", 204, 4, true},
                           {"Subject", 213, 5, false},      {"Body", 221, 6, false},
                           {"To", 229, 7, false},           {"Cc", 237, 8, false},
                           {"Attachments", 246, 9, true},   {"Add", 258, 10, false},
                           {"GetInspector", 269, 12, true}, {"Send", 278, 13, false},
                           {"Activate", 284, 13, false}};

struct Way {
    wchar_t const *how;
    char const *message;
    bool isCalled;      // before it fails
    bool needsAnObject; // fails only where one is expected
};

constexpr Way kWays[] = {{L"name", ": 0x80020006", false, false},
                         {L"call", ": 0x80004005", true, false},
                         {L"exception", ": 0x80020009 not today ⚓", true, false},
                         {L"empty", ": 0x80020005", true, true},
                         {L"null", ": 0x80020005", true, true},
                         {L"other", ": 0x80020005", true, true}};

class WOutlookStepTest : public WOutlookMailTest, public testing::WithParamInterface<Step> {};

TEST_P(WOutlookStepTest, FailsAtItsLineAndLeavesNothingBehind) {
    Step const &step = GetParam();
    std::string const member = step.member;
    bool const silently = member == "Send";
    RegisterModule();
    mail->SetSendMailSilently(silently ? 1 : 0);
    Tell(L"FailAt", std::wstring(member.begin(), member.end()));
    for (Way const &way : kWays) {
        if (way.needsAnObject && !step.givesObject) {
            continue;
        }
        SCOPED_TRACE(member + way.message);
        Tell(L"FailHow", way.how);
        Texts const lines = ExpectFailureAt(step.line, member + way.message);
        Texts expected = Calls(silently);
        expected.erase(expected.begin() + static_cast<std::ptrdiff_t>(step.call + (way.isCalled ? 1 : 0)),
                       expected.end() - 1);
        EXPECT_EQ(expected, WithoutLives(lines));
        ExpectAllReleased(lines);
        ExpectOleLeft();
    }
    Tell(L"FailHow", L"");
    ExpectSuccess();
}

INSTANTIATE_TEST_SUITE_P(WOutlookMailTest, WOutlookStepTest, testing::ValuesIn(kSteps),
                         [](auto const &one) { return std::string(one.param.member); });

} // namespace
