// WFileErrorTest.cpp: every reason that the system can give, as the toolbox's error code. The reasons are played through
// the import table: most of them, a removed drive for one, cannot be provoked on a test machine.

#include "KTFileUtil.h"
#include "WFileFixture.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <vector>

namespace {

class WFileError : public WFileFixture {};

DWORD g_Code = 0;

BOOL WINAPI FailToMakeFolder(wchar_t const *, SECURITY_ATTRIBUTES *) {
    SetLastError(g_Code);
    return FALSE;
}

HANDLE WINAPI FailToFind(wchar_t const *, FINDEX_INFO_LEVELS, void *, FINDEX_SEARCH_OPS, void *, DWORD) {
    SetLastError(g_Code);
    return INVALID_HANDLE_VALUE;
}

struct Row {
    DWORD code;
    KTFileUtil::ErrorCodeEnum expected;
};

constexpr Row kRows[] = {
    {ERROR_FILE_NOT_FOUND, KTFileUtil::kErrorNotFound},
    {ERROR_PATH_NOT_FOUND, KTFileUtil::kErrorNotFound},
    {ERROR_INVALID_NAME, KTFileUtil::kErrorInvalidName},
    {ERROR_BAD_PATHNAME, KTFileUtil::kErrorInvalidName},
    {ERROR_FILENAME_EXCED_RANGE, KTFileUtil::kErrorInvalidName},
    {ERROR_DIRECTORY, KTFileUtil::kErrorNotAFolder},
    {ERROR_FILE_EXISTS, KTFileUtil::kErrorAlreadyExists},
    {ERROR_ALREADY_EXISTS, KTFileUtil::kErrorAlreadyExists},
    {ERROR_ACCESS_DENIED, KTFileUtil::kErrorAccessDenied},
    {ERROR_WRITE_PROTECT, KTFileUtil::kErrorAccessDenied},
    {ERROR_PRIVILEGE_NOT_HELD, KTFileUtil::kErrorAccessDenied},
    {ERROR_SHARING_VIOLATION, KTFileUtil::kErrorInUse},
    {ERROR_LOCK_VIOLATION, KTFileUtil::kErrorInUse},
    {ERROR_USER_MAPPED_FILE, KTFileUtil::kErrorInUse},
    {ERROR_DISK_FULL, KTFileUtil::kErrorDiskFull},
    {ERROR_HANDLE_DISK_FULL, KTFileUtil::kErrorDiskFull},
    {1295, KTFileUtil::kErrorDiskFull}, // the quota is used up
    {ERROR_NOT_READY, KTFileUtil::kErrorNotReady},
    {ERROR_INVALID_DRIVE, KTFileUtil::kErrorNotReady},
    {ERROR_BAD_NETPATH, KTFileUtil::kErrorNotReady},
    {ERROR_BAD_NET_NAME, KTFileUtil::kErrorNotReady},
    {ERROR_NETNAME_DELETED, KTFileUtil::kErrorNotReady},
    {ERROR_NETWORK_UNREACHABLE, KTFileUtil::kErrorNotReady},
    {ERROR_DEV_NOT_EXIST, KTFileUtil::kErrorNotReady},
    {ERROR_NO_MEDIA_IN_DRIVE, KTFileUtil::kErrorNotReady},
    {ERROR_DIR_NOT_EMPTY, KTFileUtil::kErrorNotEmpty},
    {ERROR_GEN_FAILURE, KTFileUtil::kErrorFailed},
    {ERROR_SUCCESS, KTFileUtil::kErrorFailed}, // a failure without a reason is one all the same
};

} // namespace

TEST_F(WFileError, EveryReasonHasItsCode) {
    WImportHook const hook(L"KTPublic.dll", "CreateDirectoryW", &FailToMakeFolder);
    ASSERT_TRUE(hook.IsActive());
    for (Row const &row : kRows) {
        g_Code = row.code;
        EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("new")), row.expected) << row.code;
    }
}

TEST_F(WFileError, AListingThatCannotBeReadIsNotEmpty) {
    WImportHook const hook(L"KTPublic.dll", "FindFirstFileExW", &FailToFind);
    ASSERT_TRUE(hook.IsActive());
    for (DWORD const code : {DWORD{ERROR_ACCESS_DENIED}, DWORD{ERROR_NOT_READY}, DWORD{ERROR_NETNAME_DELETED}}) {
        g_Code = code;
        std::vector<KTString> names(1);
        EXPECT_NE(KTFileUtil::GetFileNamesInFolderAtPath(Path(""), names), KTFileUtil::kErrorNone) << code;
        EXPECT_TRUE(names.empty());
        EXPECT_NE(KTFileUtil::GetFileNamesInFolderAtPathRecursively(Path(""), names), KTFileUtil::kErrorNone) << code;
    }
}
