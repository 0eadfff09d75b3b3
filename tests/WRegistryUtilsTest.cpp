// WRegistryUtilsTest.cpp: keys and texts of the real registry.

#include "KTRegistryUtils.h"

#include "Units.h"
#include "WHandlesLeft.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <string>

namespace {

using Utils = KTRegistryUtils;

// Closes what a test opened.
class OpenKey {
  public:
    OpenKey(HKEY parent, KTString const &name) : error(Utils::OpenKeyReadOnly(parent, name, m_Key)) {}
    OpenKey(OpenKey const &) = delete;
    OpenKey &operator=(OpenKey const &) = delete;
    ~OpenKey() { EXPECT_EQ(kKTErrorNone, Utils::CloseKey(m_Key)); }

    HKEY Get() const { return m_Key; }

  private:
    HKEY m_Key = nullptr;

  public:
    KTErrorCodeEnum const error;
};

// A key of the test's own below the user's.
class Registry : public testing::Test {
  protected:
    Registry() : m_Name(L"Software\\KTPublicTest" + std::to_wstring(GetCurrentProcessId())) { Delete(); }
    ~Registry() override { Delete(); }

    KTString Name() const { return KTString(m_Name.c_str()); }

    void Set(wchar_t const *value, DWORD type, void const *data, std::size_t bytes) const {
        ASSERT_EQ(ERROR_SUCCESS,
                  RegSetKeyValueW(HKEY_CURRENT_USER, m_Name.c_str(), value, type, data, static_cast<DWORD>(bytes)));
    }

    // With its terminating zero, unless asked otherwise.
    void SetText(wchar_t const *value, std::wstring const &text, DWORD type = REG_SZ, bool terminated = true) const {
        HKEY key = nullptr;
        ASSERT_EQ(ERROR_SUCCESS, RegCreateKeyW(HKEY_CURRENT_USER, m_Name.c_str(), &key));
        ASSERT_EQ(ERROR_SUCCESS,
                  RegSetValueExW(key, value, 0, type, reinterpret_cast<BYTE const *>(text.c_str()),
                                 static_cast<DWORD>((text.size() + (terminated ? 1 : 0)) * sizeof(wchar_t))));
        RegCloseKey(key);
    }

    // The text value; "(none)" if reading it fails, which must leave the result alone.
    KTString Read(KTString const &value) const {
        OpenKey const key(HKEY_CURRENT_USER, Name());
        EXPECT_EQ(kKTErrorNone, key.error);
        KTString text("(none)");
        if (Utils::ReadString(key.Get(), value, text) != kKTErrorNone) {
            EXPECT_EQ(KTString("(none)"), text);
        }
        return text;
    }

  private:
    void Delete() const { RegDeleteTreeW(HKEY_CURRENT_USER, m_Name.c_str()); }

    std::wstring m_Name;
};

LSTATUS ReadOf(HKEY key, wchar_t const *name) {
    return RegQueryValueExW(key, name, nullptr, nullptr, nullptr, nullptr);
}

} // namespace

TEST_F(Registry, OpensAnExistingKeyForReadingOnly) {
    SetText(L"name", L"value");
    OpenKey const key(HKEY_CURRENT_USER, Name());
    ASSERT_EQ(kKTErrorNone, key.error);
    EXPECT_EQ(ERROR_SUCCESS, ReadOf(key.Get(), L"name"));
    EXPECT_EQ(ERROR_ACCESS_DENIED, RegSetValueExW(key.Get(), L"name", 0, REG_SZ, nullptr, 0));
}

TEST_F(Registry, NamesMatchInEitherCase) {
    SetText(L"Name", L"value");
    std::wstring upper = Name().GetWstring();
    CharUpperW(upper.data());
    OpenKey const key(HKEY_CURRENT_USER, KTString(upper.c_str()));
    KTString text;
    EXPECT_EQ(kKTErrorNone, Utils::ReadString(key.Get(), "NAME", text));
    EXPECT_EQ(KTString("value"), text);
}

TEST_F(Registry, OpensBelowAnOpenKey) {
    SetText(L"", L"x");
    OpenKey const software(HKEY_CURRENT_USER, "Software");
    OpenKey const key(software.Get(), Name().substr(9));
    EXPECT_EQ(kKTErrorNone, key.error);
    OpenKey const same(key.Get(), "");
    EXPECT_EQ(kKTErrorNone, same.error);
    KTString text;
    EXPECT_EQ(kKTErrorNone, Utils::ReadString(same.Get(), "", text));
    EXPECT_EQ(KTString("x"), text);
}

TEST_F(Registry, OpensNothingElse) {
    auto *key = reinterpret_cast<HKEY>(1); // is overwritten
    EXPECT_EQ(kKTErrorFailed, Utils::OpenKeyReadOnly(HKEY_CURRENT_USER, Name(), key)) << "it is not there";
    EXPECT_EQ(nullptr, key);
    EXPECT_EQ(kKTErrorFailed, Utils::OpenKeyReadOnly(nullptr, "Software", key));
    KTString withZero("Software");
    withZero.push_back(0);
    EXPECT_EQ(kKTErrorFailed, Utils::OpenKeyReadOnly(HKEY_CURRENT_USER, withZero, key));
    EXPECT_EQ(nullptr, key);
    LONG status = RegOpenKeyExW(HKEY_CURRENT_USER, Name().GetWstring().c_str(), 0, KEY_READ, &key);
    EXPECT_EQ(ERROR_FILE_NOT_FOUND, status) << "and was not made";
}

TEST_F(Registry, ClosesOnce) {
    HKEY key = nullptr;
    EXPECT_EQ(kKTErrorNone, Utils::CloseKey(key)) << "nothing to close";
    ASSERT_EQ(kKTErrorNone, Utils::OpenKeyReadOnly(HKEY_CURRENT_USER, "Software", key));
    HKEY closed = key;
    EXPECT_EQ(kKTErrorNone, Utils::CloseKey(key));
    EXPECT_EQ(nullptr, key);
    EXPECT_EQ(ERROR_INVALID_HANDLE, ReadOf(closed, L"x"));
    EXPECT_EQ(kKTErrorFailed, Utils::CloseKey(closed));
    EXPECT_EQ(nullptr, closed);
}

TEST_F(Registry, ReadsTextsOfAnyLength) {
    for (std::size_t const length : {0U, 1U, 510U, 511U, 512U, 513U, 1024U, 100'000U}) {
        std::wstring const text(length, L'\u00E4');
        SetText(L"text", text);
        EXPECT_TRUE(Read("text") == text.c_str()) << length;
        SetText(L"text", text, REG_SZ, false);
        EXPECT_TRUE(Read("text") == text.c_str()) << length << ", not terminated";
    }
    SetText(L"\u8AB2", L"\U0001F41D");
    EXPECT_EQ(KTString(L"\U0001F41D"), Read(KTString(L"\u8AB2")));
}

TEST_F(Registry, ATextEndsAtItsFirstZero) {
    SetText(L"text", std::wstring(L"ab\0cd", 5));
    EXPECT_EQ(KTString("ab"), Read("text"));
    Set(L"odd", REG_SZ, L"abc", 5); // two and a half characters
    EXPECT_EQ(KTString("ab"), Read("odd"));
}

TEST_F(Registry, TheUnnamedValue) {
    SetText(nullptr, L"unnamed");
    EXPECT_EQ(KTString("unnamed"), Read(""));
}

TEST_F(Registry, FillsVariablesInWhereTheTypeSaysSo) {
    SetEnvironmentVariableW(L"KT_REGISTRY_TEST", L"filled in");
    SetText(L"expand", L"<%KT_REGISTRY_TEST%>%KT_NO_SUCH%", REG_EXPAND_SZ);
    SetText(L"plain", L"<%KT_REGISTRY_TEST%>");
    EXPECT_EQ(KTString("<filled in>%KT_NO_SUCH%"), Read("expand"));
    EXPECT_EQ(KTString("<%KT_REGISTRY_TEST%>"), Read("plain"));
    std::wstring const large(10'000, L'v');
    SetEnvironmentVariableW(L"KT_REGISTRY_TEST", large.c_str());
    SetText(L"expand", L"%KT_REGISTRY_TEST%.%KT_REGISTRY_TEST%", REG_EXPAND_SZ, false);
    EXPECT_TRUE(Read("expand") == (large + L"." + large).c_str());
    // More than the system fills in: the text stays as it is.
    SetText(L"expand", L"%KT_REGISTRY_TEST%%KT_REGISTRY_TEST%%KT_REGISTRY_TEST%%KT_REGISTRY_TEST%", REG_EXPAND_SZ);
    EXPECT_EQ(KTString("%KT_REGISTRY_TEST%%KT_REGISTRY_TEST%%KT_REGISTRY_TEST%%KT_REGISTRY_TEST%"), Read("expand"));
    SetEnvironmentVariableW(L"KT_REGISTRY_TEST", nullptr);
}

TEST_F(Registry, RefusesWhatIsNoText) {
    DWORD const number = 0x00410042;
    std::wstring const list(L"a\0b\0", 4);
    std::string const large(10'000, 'b');
    Set(L"number", REG_DWORD, &number, sizeof number);
    Set(L"list", REG_MULTI_SZ, list.c_str(), (list.size() + 1) * sizeof(wchar_t));
    Set(L"bytes", REG_BINARY, "abcd", 4);
    Set(L"many bytes", REG_BINARY, large.data(), large.size());
    for (char const *const value : {"number", "list", "bytes", "many bytes", "missing", ""}) {
        EXPECT_EQ(KTString("(none)"), Read(value)) << value;
    }
}

TEST_F(Registry, RefusesNamesWithZerosAndNullKeys) {
    SetText(L"name", L"value");
    KTString withZero("name");
    withZero.push_back(0);
    EXPECT_EQ(KTString("(none)"), Read(withZero));
    KTString text("old");
    EXPECT_EQ(kKTErrorFailed, Utils::ReadString(nullptr, "name", text));
    EXPECT_EQ(KTString("old"), text);
}

TEST_F(Registry, PathsAreJoinedByOneBackSlash) {
    for (char const *const parent : {"Software\\Harbour", "Software\\Harbour\\"}) {
        for (char const *const child : {"Course", "\\Course"}) {
            EXPECT_EQ(KTString("Software\\Harbour\\Course"), Utils::ConstructKey(parent, child));
        }
    }
    EXPECT_EQ(KTString("a"), Utils::ConstructKey("a", ""));
    EXPECT_EQ(KTString("a"), Utils::ConstructKey("", "a"));
    EXPECT_EQ(KTString(), Utils::ConstructKey("", ""));
    EXPECT_EQ(KTString("\\"), Utils::ConstructKey("\\", "\\"));
    EXPECT_EQ(KTString("a\\b\\c\\d\\"), Utils::ConstructKey("a\\b", "c\\d\\"));
}

TEST_F(Registry, ItemsAreAKeyAndAName) {
    KTString key("old");
    KTString name("old");
    for (char const *const item : {"", "a", "\\a", "\\"}) {
        EXPECT_FALSE(Utils::ConstructKeyAndName(item, key, name)) << item;
        EXPECT_EQ(KTString("old"), key);
        EXPECT_EQ(KTString("old"), name);
    }
    EXPECT_TRUE(Utils::ConstructKeyAndName("Software\\Harbour\\Course", key, name));
    EXPECT_EQ(KTString("Software\\Harbour"), key);
    EXPECT_EQ(KTString("Course"), name);
    EXPECT_TRUE(Utils::ConstructKeyAndName("Software\\Harbour\\", key, name));
    EXPECT_EQ(KTString("Software\\Harbour"), key);
    EXPECT_EQ(KTString(), name);
    KTString item("a\\b");
    EXPECT_TRUE(Utils::ConstructKeyAndName(item, item, name)) << "a result may be the item";
    EXPECT_EQ(KTString("a"), item);
    EXPECT_EQ(KTString("b"), name);
}

TEST_F(Registry, SystemItemsAreTheMachines) {
    KTString value("old");
    for (char const *const item : {"", "MachineGuid", "SOFTWARE\\Microsoft\\Cryptography\\No such value",
                                   "SOFTWARE\\No such key\\MachineGuid", "SOFTWARE\\Microsoft\\Cryptography\\"}) {
        EXPECT_EQ(kKTErrorFailed, Utils::GetSystemItem(item, value)) << item;
        EXPECT_EQ(KTString("old"), value);
    }
    SetText(L"mine", L"value");
    EXPECT_EQ(kKTErrorFailed, Utils::GetSystemItem(Utils::ConstructKey(Name(), "mine"), value)) << "the user's";
    KTString withZero("SOFTWARE\\Microsoft\\Cryptography");
    withZero.push_back(0);
    EXPECT_EQ(kKTErrorFailed, Utils::GetSystemItem(withZero + "\\MachineGuid", value));
    EXPECT_EQ(KTString("old"), value);

    wchar_t expected[100] = {};
    DWORD size = sizeof expected;
    ASSERT_EQ(ERROR_SUCCESS, RegGetValueW(HKEY_LOCAL_MACHINE, L"SOFTWARE\\Microsoft\\Cryptography", L"MachineGuid",
                                          RRF_RT_REG_SZ, nullptr, expected, &size));
    EXPECT_EQ(kKTErrorNone, Utils::GetSystemItem("SOFTWARE\\Microsoft\\Cryptography\\MachineGuid", value));
    EXPECT_EQ(KTString(expected), value);
}

TEST_F(Registry, LeavesNoHandle) {
    SetText(L"name", L"value");
    ExpectNoHandleLeft([&] {
        KTString value;
        Read("name");
        Read("missing");
        Utils::GetSystemItem("SOFTWARE\\Microsoft\\Cryptography\\MachineGuid", value);
        Utils::GetSystemItem("SOFTWARE\\Microsoft\\Cryptography\\missing", value);
    });
}
