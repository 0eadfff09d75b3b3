// WSystemUtilsTest.cpp: services of the system on Windows, and what is reported where the system refuses.

#include "KTSystemUtils.h"

#include "LogLines.h"
#include "WImportHook.h"

#include <windows.h>

#include <rpc.h>

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";

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
RPC_STATUS WINAPI WriteNothing(UUID const *, RPC_WSTR *) { return RPC_S_OUT_OF_MEMORY; }
RPC_STATUS WINAPI CountFree(RPC_WSTR *text) {
    ++g_Freed;
    return RpcStringFreeW(text);
}

TEST(GuidTest, IsTheSystemsTextOfTheSystemsIdentifier) {
    WImportHook const create(kLibrary, "UuidCreate", CreateKnown);
    WImportHook const release(kLibrary, "RpcStringFreeW", CountFree);
    ASSERT_TRUE(create.IsActive() && release.IsActive());
    g_Freed = 0;
    EXPECT_EQ("00112233-4455-6677-8899-aabbccddeeff", KTSystemUtils::CreateGUID().GetUTF8String());
    EXPECT_EQ(1, g_Freed); // the system's text
}

TEST(GuidTest, OneThatIsUniqueOnThisMachineServesToo) {
    WImportHook const create(kLibrary, "UuidCreate", CreateLocal);
    EXPECT_EQ("00112233-4455-6677-8899-aabbccddeeff", KTSystemUtils::CreateGUID().GetUTF8String());
}

TEST(GuidTest, ReportsThatNoneCouldBeMade) {
    WImportHook const create(kLibrary, "UuidCreate", CreateNothing);
    LogLines log;
    EXPECT_TRUE(KTSystemUtils::CreateGUID().empty());
    EXPECT_EQ(
        std::vector<std::string>{"Assert failed: Failed to generate a GUID at source/private/utils/SystemUtils:88"},
        log.Take());
}

TEST(GuidTest, ReportsThatItCouldNotBeWritten) {
    WImportHook const write(kLibrary, "UuidToStringW", WriteNothing);
    ASSERT_TRUE(write.IsActive());
    LogLines log;
    EXPECT_TRUE(KTSystemUtils::CreateGUID().empty());
    EXPECT_EQ(std::vector<std::string>{"Assert failed: Failed to convert GUID to string at "
                                       "source/private/utils/SystemUtils:83"},
              log.Take());
}

} // namespace
