// WMailClientTest.cpp: the default mail program in the registry, step by step. What is found goes to a MAPI32.DLL that
// refuses everything, so that the log tells what was read.

#include "WImportHook.h"
#include "WMailFixture.h"

#include <cstddef>
#include <new>

namespace {

constexpr char kClientError[] = "kKTMailClientError";

class WMailClientTest : public WMailFixture {
  protected:
    WMailClientTest() : m_Mapi(StandIns(L"both")) {
        SetEnvironmentVariableW(L"KT_MAPI_RECORD", record.c_str());
        SetEnvironmentVariableW(L"KT_MAPI_RESULT", L"2");
    }
    ~WMailClientTest() override { SetEnvironmentVariableW(L"KT_MAPI_RESULT", nullptr); }

    // No mail program was asked, and the log says nothing.
    void ExpectNoClient() {
        LogLines log;
        ExpectFailure(kClientError);
        EXPECT_EQ("Kein Standard-Mailprogramm gefunden.", mail->GetFailureMessage(nullptr));
        EXPECT_TRUE(TakeRecord().empty());
        EXPECT_TRUE(log.Take().empty());
    }

    // The mail program was asked, and the log says which one it is.
    void ExpectClient(std::string const &name, std::string const &dllPath, std::string const &preFirstRun = "") {
        LogLines log;
        ExpectFailure("kKTMAPIError");
        EXPECT_FALSE(TakeRecord().empty());
        EXPECT_EQ((std::vector<std::string>{"KTSendMail: MAPISendMail returned 2",
                                            "KTSendMail: not sent through " + name + ", DLLPath \"" + dllPath +
                                                "\", PreFirstRun \"" + preFirstRun + "\""}),
                  log.Take());
    }

  private:
    WMapiFolder m_Mapi;
};

void *NoMemory(std::size_t, std::nothrow_t const &) { return nullptr; }

TEST_F(WMailClientTest, WithoutMemoryThereIsNoSender) {
    WImportHook const hook(L"KTPublic.dll", "_ZnwyRKSt9nothrow_t", &NoMemory);
    if (!hook.IsActive()) {
        GTEST_SKIP() << "another compiler's name";
    }
    EXPECT_EQ(nullptr, KTSendMail::GetSendMailHandler(dictionary));
}

TEST_F(WMailClientTest, NoKeyOfMailPrograms) { ExpectNoClient(); }

TEST_F(WMailClientTest, NoDefaultName) {
    AddClient(L"Harbour Mail"); // makes the key of the mail programs, too
    ExpectNoClient();
}

TEST_F(WMailClientTest, EmptyDefaultName) {
    AddClient(L"Harbour Mail");
    SetText(kClients, L"DLLPath", L"C:\\mail\\mapi.dll"); // an empty name must not lead to this key
    SetDefault(L"");
    ExpectNoClient();
}

TEST_F(WMailClientTest, DefaultNameThatIsNoText) {
    AddClient(L"Harbour Mail");
    DWORD const number = 1;
    Set(kClients, L"", REG_DWORD, &number, sizeof number);
    ExpectNoClient();
}

TEST_F(WMailClientTest, DefaultNameWithoutItsKey) {
    AddClient(L"Harbour Mail");
    SetDefault(L"Other Mail");
    ExpectNoClient();
}

TEST_F(WMailClientTest, NoDllPath) {
    SetText(kClients + L"Harbour Mail", L"PreFirstRun", L"Start me");
    SetDefault(L"Harbour Mail");
    ExpectNoClient();
}

TEST_F(WMailClientTest, DllPathThatIsNoText) {
    DWORD const number = 1;
    Set(kClients + L"Harbour Mail", L"DLLPath", REG_DWORD, &number, sizeof number);
    SetDefault(L"Harbour Mail");
    ExpectNoClient();
}

TEST_F(WMailClientTest, OutlookWithoutItsKeyIsNoClientEither) {
    SetDefault(L"Microsoft Outlook");
    ExpectNoClient();
}

TEST_F(WMailClientTest, PreFirstRunMayBeMissing) {
    AddClient(L"Harbour Mail");
    SetDefault(L"Harbour Mail");
    ExpectClient("Harbour Mail", "C:\\mail\\mapi.dll");
}

TEST_F(WMailClientTest, PreFirstRunIsLoggedWhenSendingFails) {
    AddClient(L"Harbour Mail");
    SetText(kClients + L"Harbour Mail", L"PreFirstRun", L"Please start Harbour Mail 100% first.");
    SetDefault(L"Harbour Mail");
    ExpectClient("Harbour Mail", "C:\\mail\\mapi.dll", "Please start Harbour Mail 100% first.");
}

TEST_F(WMailClientTest, PreFirstRunThatIsNoTextIsPassedOver) {
    DWORD const number = 1;
    AddClient(L"Harbour Mail");
    Set(kClients + L"Harbour Mail", L"PreFirstRun", REG_DWORD, &number, sizeof number);
    SetDefault(L"Harbour Mail");
    ExpectClient("Harbour Mail", "C:\\mail\\mapi.dll");
}

TEST_F(WMailClientTest, AnExpandableDllPathIsExpanded) {
    SetEnvironmentVariableW(L"KT_MAIL_HOME", L"D:\\programs");
    SetText(kClients + L"Harbour Mail", L"DLLPath", L"%KT_MAIL_HOME%\\mapi.dll", REG_EXPAND_SZ);
    SetDefault(L"Harbour Mail");
    ExpectClient("Harbour Mail", "D:\\programs\\mapi.dll");
}

TEST_F(WMailClientTest, APlainDllPathIsNotExpanded) {
    SetEnvironmentVariableW(L"KT_MAIL_HOME", L"D:\\programs");
    SetText(kClients + L"Harbour Mail", L"DLLPath", L"%KT_MAIL_HOME%\\mapi.dll");
    SetDefault(L"Harbour Mail");
    ExpectClient("Harbour Mail", "%KT_MAIL_HOME%\\mapi.dll");
}

TEST_F(WMailClientTest, LongTextsAreReadWhole) {
    std::wstring const path = L"C:\\" + std::wstring(3000, L'x');
    SetEnvironmentVariableW(L"KT_MAIL_HOME", path.c_str());
    SetText(kClients + L"Größe λ", L"DLLPath", L"%KT_MAIL_HOME%;%KT_MAIL_HOME%", REG_EXPAND_SZ);
    SetText(kClients + L"Größe λ", L"PreFirstRun", std::wstring(5000, L'y'));
    SetDefault(L"Größe λ");
    std::string const narrow(path.begin(), path.end());
    ExpectClient("Größe λ", narrow + ";" + narrow, std::string(5000, 'y'));
}

TEST_F(WMailClientTest, ATextWithoutItsEndingZeroIsRead) {
    Set(kClients + L"Mail", L"DLLPath", REG_SZ, L"abc", 3 * sizeof(wchar_t));
    Set(kClients, L"", REG_SZ, L"Mail", 4 * sizeof(wchar_t));
    ExpectClient("Mail", "abc");
}

// Only the very name leads to automation.
TEST_F(WMailClientTest, OtherSpellingsOfOutlookAreOtherPrograms) {
    for (wchar_t const *const name : {L"microsoft outlook", L"Microsoft Outlook 2016", L"Outlook"}) {
        AddClient(name);
        SetDefault(name);
        ExpectFailure("kKTMAPIError");
        EXPECT_FALSE(TakeRecord().empty());
    }
}

TEST_F(WMailClientTest, TheDefaultOfTheMomentCounts) {
    ExpectNoClient();
    AddClient(L"Harbour Mail");
    SetDefault(L"Harbour Mail");
    ExpectClient("Harbour Mail", "C:\\mail\\mapi.dll");
    RegDeleteTreeW(HKEY_LOCAL_MACHINE, L"Software\\Clients");
    ExpectNoClient();
}

} // namespace
