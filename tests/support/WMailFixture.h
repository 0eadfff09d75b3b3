// WMailFixture.h: a machine of the test's own to send mail from.
//
// While a test runs, its process sees another HKEY_LOCAL_MACHINE: a key of the user's, empty at first. Other processes
// and the machine's real mail programs stay out of it.

#pragma once

#include "KTSendMail.h"
#include "LogLines.h"
#include "MailDictionary.h"
#include "Units.h"

#include "mail/FakeOutlook.h" // the system's headers behind it define a type named byte

#include <gtest/gtest.h>

#include <windows.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

class WMailFixture : public testing::Test {
  protected:
    WMailFixture() : mail(KTSendMail::GetSendMailHandler(dictionary)) {
        RegDeleteTreeW(HKEY_CURRENT_USER, kFakeOutlookSettings); // of a run that was ended
        HKEY machine = nullptr;
        RegCreateKeyExW(HKEY_CURRENT_USER, (std::wstring(kFakeOutlookSettings) + L"\\Machine").c_str(), 0, nullptr, 0,
                        KEY_ALL_ACCESS, nullptr, &machine, nullptr);
        EXPECT_EQ(ERROR_SUCCESS, RegOverridePredefKey(HKEY_LOCAL_MACHINE, machine));
        RegCloseKey(machine);
        std::filesystem::remove(record);
    }
    ~WMailFixture() override {
        RegOverridePredefKey(HKEY_LOCAL_MACHINE, nullptr);
        RegDeleteTreeW(HKEY_CURRENT_USER, kFakeOutlookSettings);
    }

    /// Makes the key of the mail programs and names the default one.
    static void SetDefault(std::wstring const &name) { SetText(kClients, L"", name); }

    /// Registers a mail program, as its set-up would.
    static void AddClient(std::wstring const &name) { SetText(kClients + name, L"DLLPath", L"C:\\mail\\mapi.dll"); }

    static void SetText(std::wstring const &key, wchar_t const *name, std::wstring const &text, DWORD type = REG_SZ) {
        Set(key, name, type, text.c_str(), (text.size() + 1) * sizeof(wchar_t));
    }
    static void Set(std::wstring const &key, wchar_t const *name, DWORD type, void const *data, std::size_t size) {
        ASSERT_EQ(ERROR_SUCCESS,
                  RegSetKeyValueW(HKEY_LOCAL_MACHINE, key.c_str(), name, type, data, static_cast<DWORD>(size)));
    }

    static bool IsWine() { return GetProcAddress(GetModuleHandleW(L"ntdll"), "wine_get_version") != nullptr; }

    /// Where the stand-ins are, with those of `name`.
    static std::filesystem::path StandIns(std::wstring const &name = {}) {
        wchar_t program[MAX_PATH];
        GetModuleFileNameW(nullptr, program, MAX_PATH);
        return std::filesystem::path(program).parent_path() / L"mail" / name;
    }

    /// The lines that a stand-in has written since the last call.
    std::vector<std::string> TakeRecord() const {
        std::vector<std::string> lines;
        std::ifstream file(record, std::ios::binary);
        for (std::string line; std::getline(file, line);) {
            lines.push_back(line);
        }
        file.close();
        std::filesystem::remove(record);
        return lines;
    }

    /// The sending fails with the dictionary's text for the key.
    void ExpectFailure(KTString const &key) {
        EXPECT_EQ(kKTErrorFailed, mail->SendMail());
        KTErrorCodeEnum result = kKTErrorNone;
        EXPECT_EQ(dictionary.GetKeyValue(key), mail->GetFailureMessage(&result));
        EXPECT_EQ(kKTErrorFailed, result);
    }

    void ExpectSuccess() {
        EXPECT_EQ(kKTErrorNone, mail->SendMail());
        KTErrorCodeEnum result = kKTErrorFailed;
        EXPECT_EQ("Gesendet.", mail->GetFailureMessage(&result));
        EXPECT_EQ(kKTErrorNone, result);
    }

    inline static std::wstring const kClients = L"Software\\Clients\\Mail\\";
    std::filesystem::path const record = std::filesystem::temp_directory_path() / "record.txt";
    FullMailDictionary dictionary;
    std::unique_ptr<KTSendMail> const mail;
};

/// Lets the library find the MAPI32.DLL of a folder while this object lives.
class WMapiFolder {
  public:
    explicit WMapiFolder(std::filesystem::path folder) : m_Cookie(AddDllDirectory(folder.make_preferred().c_str())) {
        EXPECT_NE(nullptr, m_Cookie);
    }
    WMapiFolder(WMapiFolder const &) = delete;
    WMapiFolder &operator=(WMapiFolder const &) = delete;
    ~WMapiFolder() { RemoveDllDirectory(m_Cookie); }

  private:
    DLL_DIRECTORY_COOKIE m_Cookie;
};
