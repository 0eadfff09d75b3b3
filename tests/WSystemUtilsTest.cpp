// WSystemUtilsTest.cpp: services of the system on Windows, and what is reported where the system refuses.

#include "KTSystemUtils.h"

#include "ByteStream.h"
#include "LogLines.h"
#include "Units.h"
#include "WChildProcess.h"
#include "WImportHook.h"

#include <windows.h>

#include <dpapi.h>
#include <rpc.h>

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;
using Lines = std::vector<std::string>;

constexpr wchar_t kLibrary[] = L"KTPublic.dll";
constexpr char kNotTerminated[] =
    "Assert failed: string is not null terminated at source/private/utils/SystemUtils:196";

UUID const kKnownId = {0x00112233, 0x4455, 0x6677, {0x88, 0x99, 0xAA, 0xBB, 0xCC, 0xDD, 0xEE, 0xFF}};
int g_Freed = 0;

RPC_STATUS WINAPI CreateKnown(UUID *id) {
    *id = kKnownId;
    return RPC_S_OK;
}
RPC_STATUS WINAPI CreateLocal(UUID *id) {
    *id = kKnownId;
    return RPC_S_UUID_LOCAL_ONLY;
}
RPC_STATUS WINAPI CreateNothing(UUID *) { return RPC_S_UUID_NO_ADDRESS; }
RPC_STATUS WINAPI WriteNothing(UUID *, RPC_WSTR *) { return RPC_S_OUT_OF_MEMORY; }
RPC_STATUS WINAPI CountFree(RPC_WSTR *text) {
    ++g_Freed;
    return RpcStringFreeW(text);
}

LSTATUS WINAPI OpenNoKey(HKEY, wchar_t const *, DWORD, REGSAM, HKEY *) { return ERROR_ACCESS_DENIED; }
LSTATUS WINAPI FindNoValue(HKEY, wchar_t const *, DWORD *, DWORD *, BYTE *, DWORD *) { return ERROR_FILE_NOT_FOUND; }

FLASHWINFO g_Flashed;
int g_Flashes = 0;
BOOL WINAPI RecordFlash(FLASHWINFO *request) {
    g_Flashed = *request;
    ++g_Flashes;
    return FALSE;
}

DWORD g_ProtectFlags = 0;
BOOL WINAPI ProtectNothing(DATA_BLOB *, wchar_t const *, DATA_BLOB *, void *, CRYPTPROTECT_PROMPTSTRUCT *, DWORD flags,
                           DATA_BLOB *) {
    g_ProtectFlags = flags;
    return FALSE;
}
BOOL WINAPI UnprotectNothing(DATA_BLOB *, wchar_t **, DATA_BLOB *, void *, CRYPTPROTECT_PROMPTSTRUCT *, DWORD flags,
                             DATA_BLOB *) {
    g_ProtectFlags = flags;
    SetLastError(static_cast<DWORD>(NTE_BAD_KEY_STATE)); // as for another user's data
    return FALSE;
}

// What the system made of the bytes, behind its count.
Bytes ProtectedBySystem(Bytes plain, std::string entropy = "") {
    DATA_BLOB in{static_cast<DWORD>(plain.size()), plain.data()};
    DATA_BLOB extra{static_cast<DWORD>(entropy.size()), reinterpret_cast<BYTE *>(entropy.data())};
    DATA_BLOB out{};
    EXPECT_TRUE(CryptProtectData(&in, nullptr, entropy.empty() ? nullptr : &extra, nullptr, nullptr,
                                 CRYPTPROTECT_UI_FORBIDDEN, &out));
    Bytes bytes(sizeof out.cbData + out.cbData);
    std::memcpy(bytes.data(), &out.cbData, sizeof out.cbData);
    std::memcpy(bytes.data() + sizeof out.cbData, out.pbData, out.cbData);
    LocalFree(out.pbData);
    return bytes;
}

// The result of reading and the lines that it logs; the text is left alone unless it succeeds.
KTErrorCodeEnum Read(Bytes const &bytes, KTString &text, Lines &lines) {
    LogLines log;
    ByteStream stream(ByteStream::kReads, bytes);
    KTErrorCodeEnum const error = KTSystemUtils::DecryptStringUsingSystemCredentials(stream, text);
    lines = log.Take();
    return error;
}

void ExpectRefused(Bytes const &bytes, Lines const &expected) {
    KTString text("old");
    Lines lines;
    EXPECT_EQ(kKTErrorFailed, Read(bytes, text, lines));
    EXPECT_EQ(KTString("old"), text);
    EXPECT_EQ(expected, lines);
}

DWORD WINAPI AskOnThread(void *answer) {
    *static_cast<bool *>(answer) = KTSystemUtils::IsMainThread();
    return 0;
}

// Asked on another thread.
bool IsMainThreadElsewhere() {
    bool answer = true;
    HANDLE const thread = CreateThread(nullptr, 0, AskOnThread, &answer, 0, nullptr);
    WaitForSingleObject(thread, INFINITE);
    CloseHandle(thread);
    return answer;
}

std::string MachineGuidOfRegistry() {
    char text[100] = {};
    DWORD size = sizeof text;
    RegGetValueA(HKEY_LOCAL_MACHINE, "SOFTWARE\\Microsoft\\Cryptography", "MachineGuid", RRF_RT_REG_SZ, nullptr, text,
                 &size);
    return text;
}

Lines const kNoMachineGuid = {"KTSystemUtils::GetMachineGuid, Error fetching machine guid!",
                              "KTSystemUtils::GetMachineGuid, Setting machine guid to default",
                              "Machine Guid: default"};

} // namespace

TEST(GuidOfSystem, IsTheSystemsTextOfTheSystemsIdentifier) {
    WImportHook const create(kLibrary, "UuidCreate", CreateKnown);
    WImportHook const release(kLibrary, "RpcStringFreeW", CountFree);
    ASSERT_TRUE(create.IsActive() && release.IsActive());
    g_Freed = 0;
    EXPECT_EQ("00112233-4455-6677-8899-aabbccddeeff", KTSystemUtils::CreateGUID().GetUTF8String());
    EXPECT_EQ(1, g_Freed) << "the system's text";
}

TEST(GuidOfSystem, OneThatIsUniqueOnThisMachineServesToo) {
    WImportHook const create(kLibrary, "UuidCreate", CreateLocal);
    EXPECT_EQ("00112233-4455-6677-8899-aabbccddeeff", KTSystemUtils::CreateGUID().GetUTF8String());
}

TEST(GuidOfSystem, ReportsThatNoneCouldBeMade) {
    WImportHook const create(kLibrary, "UuidCreate", CreateNothing);
    LogLines log;
    EXPECT_TRUE(KTSystemUtils::CreateGUID().empty());
    EXPECT_EQ(Lines{"Assert failed: Failed to generate a GUID at source/private/utils/SystemUtils:88"}, log.Take());
}

TEST(GuidOfSystem, ReportsThatItCouldNotBeWritten) {
    WImportHook const write(kLibrary, "UuidToStringW", WriteNothing);
    ASSERT_TRUE(write.IsActive());
    LogLines log;
    EXPECT_TRUE(KTSystemUtils::CreateGUID().empty());
    EXPECT_EQ(Lines{"Assert failed: Failed to convert GUID to string at source/private/utils/SystemUtils:83"},
              log.Take());
}

TEST(MachineGuid, IsTheOneInTheRegistryAndLogged) {
    std::string const expected = MachineGuidOfRegistry();
    ASSERT_FALSE(expected.empty());
    LogLines log;
    EXPECT_EQ(expected, KTSystemUtils::GetMachineGuid().GetUTF8String());
    EXPECT_EQ(Lines{"Machine Guid: " + expected}, log.Take());
}

TEST(MachineGuid, DefaultWithoutTheKeyOrTheValue) {
    LogLines log;
    {
        WImportHook const hook(kLibrary, "RegOpenKeyExW", OpenNoKey);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_EQ(KTString("default"), KTSystemUtils::GetMachineGuid());
    }
    EXPECT_EQ(kNoMachineGuid, log.Take());
    {
        WImportHook const hook(kLibrary, "RegQueryValueExW", FindNoValue);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_EQ(KTString("default"), KTSystemUtils::GetMachineGuid());
    }
    EXPECT_EQ(kNoMachineGuid, log.Take());
}

// Data that leave the library are the system's, and the other way round: other programs of the same user read them.
TEST(ProtectedTextOfSystem, IsUnitsWithATerminator) {
    ByteStream stream(ByteStream::kWrites);
    ASSERT_EQ(kKTErrorNone, KTSystemUtils::EncryptStringUsingSystemCredentials(KTString(L"\u00E4b"), stream));
    DATA_BLOB in{static_cast<DWORD>(stream.bytes.size() - 4), stream.bytes.data() + 4};
    DATA_BLOB out{};
    ASSERT_TRUE(CryptUnprotectData(&in, nullptr, nullptr, nullptr, nullptr, CRYPTPROTECT_UI_FORBIDDEN, &out));
    EXPECT_EQ((Bytes{0xE4, 0, 'b', 0, 0, 0}), Bytes(out.pbData, out.pbData + out.cbData));
    LocalFree(out.pbData);

    KTString text;
    Lines lines;
    EXPECT_EQ(kKTErrorNone, Read(ProtectedBySystem({'x', 1, 0, 0}), text, lines));
    EXPECT_EQ(FromUnits({0x178}), text);
    EXPECT_TRUE(lines.empty());
}

TEST(ProtectedTextOfSystem, ReportsAMissingTerminator) {
    ExpectRefused(ProtectedBySystem({'a', 0, 'b', 0}), {kNotTerminated});
    ExpectRefused(ProtectedBySystem({'a', 0, 0}), {kNotTerminated}); // half a unit
    ExpectRefused(ProtectedBySystem({0}), {kNotTerminated});
}

TEST(ProtectedTextOfSystem, RefusesWhatOthersProtected) {
    ExpectRefused(ProtectedBySystem({'a', 0, 0, 0}, "another program's own secret"), {});
    WImportHook const hook(kLibrary, "CryptUnprotectData", UnprotectNothing);
    ASSERT_TRUE(hook.IsActive());
    ExpectRefused(ProtectedBySystem({'a', 0, 0, 0}), {});
    EXPECT_EQ(DWORD{CRYPTPROTECT_UI_FORBIDDEN}, g_ProtectFlags) << "the user is never asked";
}

TEST(ProtectedTextOfSystem, WritesNothingIfTheSystemRefuses) {
    WImportHook const hook(kLibrary, "CryptProtectData", ProtectNothing);
    ASSERT_TRUE(hook.IsActive());
    LogLines log;
    ByteStream stream(ByteStream::kWrites);
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::EncryptStringUsingSystemCredentials("text", stream));
    EXPECT_TRUE(stream.bytes.empty());
    EXPECT_EQ(DWORD{CRYPTPROTECT_UI_FORBIDDEN}, g_ProtectFlags);
    EXPECT_TRUE(log.Take().empty());
}

TEST(TaskBar, FlashesTheButtonUntilTheWindowIsInFront) {
    HWND const window =
        CreateWindowExW(0, L"STATIC", L"bounce", WS_OVERLAPPED, 0, 0, 10, 10, nullptr, nullptr, nullptr, nullptr);
    ASSERT_NE(nullptr, window);
    KTSystemUtils::BounceApplicationTrayIcon(window);
    {
        WImportHook const hook(kLibrary, "FlashWindowEx", RecordFlash);
        ASSERT_TRUE(hook.IsActive());
        g_Flashes = 0;
        KTSystemUtils::BounceApplicationTrayIcon(window);
    }
    EXPECT_EQ(1, g_Flashes);
    EXPECT_EQ(sizeof(FLASHWINFO), g_Flashed.cbSize);
    EXPECT_EQ(window, g_Flashed.hwnd);
    EXPECT_EQ(DWORD{FLASHW_TRAY | FLASHW_TIMERNOFG}, g_Flashed.dwFlags);
    DestroyWindow(window);
    KTSystemUtils::BounceApplicationTrayIcon(window); // gone
    KTSystemUtils::BounceApplicationTrayIcon(nullptr);
}

TEST(MainThread, IsTheFirstOne) {
    EXPECT_TRUE(KTSystemUtils::IsMainThread());
    EXPECT_FALSE(IsMainThreadElsewhere());
    EXPECT_TRUE(KTSystemUtils::IsMainThread());
}

// It does not matter which thread asks first.
TEST(MainThreadChild, DISABLED_AsksElsewhereFirst) {
    EXPECT_FALSE(IsMainThreadElsewhere());
    EXPECT_TRUE(KTSystemUtils::IsMainThread());
}

TEST(MainThread, WhoeverAsksFirst) {
    WChildProcess child("MainThreadChild.DISABLED_AsksElsewhereFirst");
    ASSERT_TRUE(child.Started());
    EXPECT_EQ(0U, child.ExitStatus());
}
