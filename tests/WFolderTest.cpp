// WFolderTest.cpp: making, listing and deleting folders, and the links in them.

#include "KTFileUtil.h"
#include "WFileFixture.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <algorithm>
#include <bit>
#include <set>
#include <utility>
#include <vector>

namespace {

using WFolder = WFileFixture;
using Names = std::vector<KTString>;

Names Sorted(Names names) {
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> g_Switched;
std::vector<std::string> g_LookedUp;

BOOL WINAPI Disable(void **before) {
    *before = &g_Switched;
    g_Switched.emplace_back("off");
    return TRUE;
}

BOOL WINAPI Revert(void *before) {
    g_Switched.emplace_back(before == &g_Switched ? "on" : "wrong value");
    return TRUE;
}

FARPROC WINAPI GiveSwitches(HMODULE, char const *name) {
    g_LookedUp.emplace_back(name);
    bool const isDisable = g_LookedUp.back() == "Wow64DisableWow64FsRedirection";
    return isDisable ? std::bit_cast<FARPROC>(&Disable) : std::bit_cast<FARPROC>(&Revert);
}

FARPROC WINAPI GiveOneSwitch(HMODULE module, char const *name) {
    return std::string(name) == "Wow64DisableWow64FsRedirection" ? GiveSwitches(module, name) : nullptr;
}

} // namespace

TEST_F(WFolder, CreateDirectoryMakesOneFolder) {
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("new")), KTFileUtil::kErrorNone);
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(Path("new"))));
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("new")), KTFileUtil::kErrorAlreadyExists);
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("a\\b")), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(KTPath()), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("aux")), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("slash/")), KTFileUtil::kErrorNone);
    File("file");
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("file")), KTFileUtil::kErrorAlreadyExists);
    EXPECT_NE(KTFileUtil::CreateDirectoryW(Path("file\\x")), KTFileUtil::kErrorNone);
}

TEST_F(WFolder, CreateDirectoryMakesTheFoldersOnTheWay) {
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("a/b\\c"), true), KTFileUtil::kErrorNone);
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(Path("a\\b\\c"))));
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("a\\b\\c"), true), KTFileUtil::kErrorNone);
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(KTPath(KTString("C:\\")), true), KTFileUtil::kErrorNone);
    File("file");
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(Path("file"), true), KTFileUtil::kErrorAlreadyExists);
    EXPECT_NE(KTFileUtil::CreateDirectoryW(Path("file\\x\\y"), true), KTFileUtil::kErrorNone);
    EXPECT_NE(KTFileUtil::CreateDirectoryW(KTPath(KTString("Q:\\a\\b")), true), KTFileUtil::kErrorNone);
}

// One call for each folder on the way must not take the stack for it.
TEST_F(WFolder, TheWayMayHaveMoreFoldersThanCallsFitTheStack) {
    std::string path = "Q:";
    for (int i = 0; i < 6'000; ++i) {
        path += "\\a";
    }
    EXPECT_NE(KTFileUtil::CreateDirectoryW(KTPath(KTString(path.c_str())), true), KTFileUtil::kErrorNone);
}

TEST_F(WFolder, IsFolder) {
    EXPECT_TRUE(KTFileUtil::IsFolder(Folder("d")));
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(KTString("C:\\"))));
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(KTString("."))));
    EXPECT_FALSE(KTFileUtil::IsFolder(File("f")));
    EXPECT_FALSE(KTFileUtil::IsFolder(KTFile(Path("none"))));
    EXPECT_FALSE(KTFileUtil::IsFolder(KTFile()));
}

TEST_F(WFolder, ListsFilesOfOneFolder) {
    File("b.txt");
    File("a.TXT");
    File("noext");
    File("sub\\c.txt");
    Names names = {"old"};
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path(""), names), KTFileUtil::kErrorNone);
    EXPECT_EQ(Sorted(names), (Names{"a.TXT", "b.txt", "noext"}));
    for (char const *const extension : {".txt", "txt", "TXT", ".Txt"}) {
        EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtension(Path("/"), extension, names),
                  KTFileUtil::kErrorNone);
        EXPECT_EQ(Sorted(names), (Names{"a.TXT", "b.txt"})) << extension;
    }
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtension(Path(""), "xt", names),
              KTFileUtil::kErrorNone);
    EXPECT_EQ(names, Names{});
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtension(Path(""), "", names),
              KTFileUtil::kErrorNone);
    EXPECT_EQ(names, Names{"noext"});
}

TEST_F(WFolder, ListsATree) {
    File("a.txt");
    File("sub\\b.txt");
    File("sub\\deeper\\c.dat");
    File(KTString(L"\u00FCber\\\u20AC.txt"));
    Folder("empty");
    Names names;
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathRecursively(Path(""), names), KTFileUtil::kErrorNone);
    EXPECT_EQ(Sorted(names), (Names{"a.txt", "sub\\b.txt", "sub\\deeper\\c.dat", KTString(L"\u00FCber\\\u20AC.txt")}));
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtensionRecursively(Path(""), "txt", names),
              KTFileUtil::kErrorNone);
    EXPECT_EQ(Sorted(names), (Names{"a.txt", "sub\\b.txt", KTString(L"\u00FCber\\\u20AC.txt")}));
}

TEST_F(WFolder, TellsEmptyFromUnreadable) {
    Names names = {"old"};
    Folder("empty");
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path("empty"), names), KTFileUtil::kErrorNone);
    EXPECT_TRUE(names.empty());
    names = {"old"};
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path("none"), names), KTFileUtil::kErrorNotFound);
    EXPECT_TRUE(names.empty());
    File("file");
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathRecursively(Path("file"), names), KTFileUtil::kErrorNotAFolder);
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(KTPath(), names), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path("a|b"), names), KTFileUtil::kErrorInvalidName);
    EXPECT_NE(KTFileUtil::GetFileNamesInFolderAtPath(KTPath(KTString("Q:\\")), names), KTFileUtil::kErrorNone);
}

namespace {

wchar_t const *g_Unreadable = nullptr;

HANDLE WINAPI FindRefusing(wchar_t const *pattern, FINDEX_INFO_LEVELS level, void *data, FINDEX_SEARCH_OPS operation,
                           void *filter, DWORD flags) {
    if (std::wstring(pattern).find(g_Unreadable) != std::wstring::npos) {
        SetLastError(ERROR_ACCESS_DENIED);
        return INVALID_HANDLE_VALUE;
    }
    return FindFirstFileExW(pattern, level, data, operation, filter, flags);
}

} // namespace

TEST_F(WFolder, AFolderBelowThatCannotBeReadIsReportedAndTheRestListed) {
    File("a.txt");
    File("closed\\b.txt");
    File("open\\c.txt");
    g_Unreadable = L"\\closed\\";
    WImportHook const hook(L"KTPublic.dll", "FindFirstFileExW", &FindRefusing);
    ASSERT_TRUE(hook.IsActive());
    Names names;
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathRecursively(Path(""), names), KTFileUtil::kErrorAccessDenied);
    EXPECT_EQ(Sorted(names), (Names{"a.txt", "open\\c.txt"}));
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path("closed"), names), KTFileUtil::kErrorAccessDenied);
}

TEST_F(WFolder, RedirectionIsOffWhileAFolderIsListed) {
    Names names;
    {
        WImportHook const hook(L"KTPublic.dll", "GetProcAddress", &GiveSwitches);
        ASSERT_TRUE(hook.IsActive());
        g_Switched.clear();
        g_LookedUp.clear();
        EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path(""), names), KTFileUtil::kErrorNone);
    }
    EXPECT_EQ(g_LookedUp,
              (std::vector<std::string>{"Wow64DisableWow64FsRedirection", "Wow64RevertWow64FsRedirection"}));
    EXPECT_EQ(g_Switched, (std::vector<std::string>{"off", "on"}));
    WImportHook const hook(L"KTPublic.dll", "GetProcAddress", &GiveOneSwitch);
    g_Switched.clear();
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path(""), names), KTFileUtil::kErrorNone);
    EXPECT_TRUE(g_Switched.empty()) << "one function alone is not used";
}

TEST_F(WFolder, DeletesTreesWithReadOnlyFiles) {
    File("d\\a.txt");
    File("d\\e\\b.txt");
    Folder("d\\f\\g");
    MakeReadOnly("d\\e\\b.txt");
    SetFileAttributesW(Wide("d\\f").c_str(), FILE_ATTRIBUTE_READONLY);
    EXPECT_EQ(KTFileUtil::DeleteDirectory(KTPath(Path("d").GetPathAsKTString() + "\\")), KTFileUtil::kErrorNone);
    EXPECT_FALSE(KTFile(Path("d")).Exists());
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("d")), KTFileUtil::kErrorNotFound);
    File("file");
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("file")), KTFileUtil::kErrorNotAFolder);
    EXPECT_TRUE(KTFile(Path("file")).Exists());
    EXPECT_EQ(KTFileUtil::DeleteDirectory(KTPath()), KTFileUtil::kErrorInvalidName);
}

TEST_F(WFolder, AFileInUseKeepsItsFoldersOnly) {
    File("d\\keep\\used.txt");
    File("d\\other\\b.txt");
    File("d\\a.txt");
    WOHandle const lock = Hold("d\\keep\\used.txt");
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("d")), KTFileUtil::kErrorInUse);
    EXPECT_TRUE(KTFile(Path("d\\keep\\used.txt")).Exists());
    EXPECT_FALSE(KTFile(Path("d\\other")).Exists());
    EXPECT_FALSE(KTFile(Path("d\\a.txt")).Exists());
}

// Wine shows the links of the system around it but would delete what they lead to: there they stay, which is an error.
// Everything else is as on Windows.
TEST_F(WFolder, LinksAreNeitherEnteredNorFollowed) {
    File("outside\\precious.txt", "kept");
    Folder("outside empty");
    Folder("d\\e");
    if (!MakeLink("d\\e\\link", "outside") || !MakeLink("d\\other", "outside empty")) {
        GTEST_SKIP() << "no links to folders here";
    }
    ASSERT_TRUE(KTFile(Path("d\\e\\link\\precious.txt")).Exists());
    File("d\\e\\own.txt");
    Names names;
    EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPathRecursively(Path("d"), names), KTFileUtil::kErrorNone);
    EXPECT_EQ(names, Names{"e\\own.txt"});
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("d"), Path("copy")), KTFileUtil::kErrorNone);
    EXPECT_TRUE(KTFile(Path("copy\\e\\own.txt")).Exists());
    EXPECT_FALSE(KTFile(Path("copy\\e\\link")).Exists());
    KTFileUtil::ErrorCodeEnum const result = KTFileUtil::DeleteDirectory(Path("d"));
    EXPECT_EQ(result == KTFileUtil::kErrorNone, !IsWine());
    EXPECT_EQ(KTFile(Path("d")).Exists(), IsWine());
    EXPECT_FALSE(KTFile(Path("d\\e\\own.txt")).Exists());
    EXPECT_EQ(Content("outside\\precious.txt"), "kept");
    EXPECT_TRUE(KTFile(Path("outside empty")).Exists());
}

TEST_F(WFolder, OfALinkToAFileTheLinkIsDeleted) {
    File("outside.txt", "kept");
    Folder("d");
    if (!MakeLink("d\\link.txt", "outside.txt", false) || !MakeLink("second.txt", "outside.txt", false)) {
        GTEST_SKIP() << "no links to files here";
    }
    ASSERT_EQ(Content("d\\link.txt"), "kept");
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("d")) == KTFileUtil::kErrorNone, !IsWine());
    EXPECT_EQ(KTFile(Path("second.txt")).Delete(), !IsWine());
    EXPECT_EQ(Content("outside.txt"), "kept");
}

TEST_F(WFolder, ALinkAsTheRootIsDeletedAlone) {
    File("outside\\precious.txt", "kept");
    if (!MakeLink("link", "outside") || !MakeLink("second", "outside")) {
        GTEST_SKIP() << "no links to folders here";
    }
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("link")) == KTFileUtil::kErrorNone, !IsWine());
    EXPECT_EQ(KTFile(Path("link")).Exists(), IsWine());
    EXPECT_EQ(KTFile(Path("second")).Delete(), !IsWine());
    EXPECT_EQ(Content("outside\\precious.txt"), "kept");
}

namespace {

std::wstring g_Watched;
bool g_Renamed = false;

// Whoever else works in the tree: tries to put a link in a folder's place while it is read.
HANDLE WINAPI FindWithIntruder(wchar_t const *pattern, FINDEX_INFO_LEVELS level, void *data,
                               FINDEX_SEARCH_OPS operation, void *filter, DWORD flags) {
    if (std::wstring(pattern).ends_with(L"\\inner\\*")) {
        g_Renamed = MoveFileW(g_Watched.c_str(), (g_Watched + L".moved").c_str()) != FALSE;
    }
    return FindFirstFileExW(pattern, level, data, operation, filter, flags);
}

} // namespace

TEST_F(WFolder, NoFolderCanBeExchangedWhileItIsEmptied) {
    File("d\\inner\\a.txt");
    g_Watched = Wide("d\\inner");
    g_Renamed = false;
    WImportHook const hook(L"KTPublic.dll", "FindFirstFileExW", &FindWithIntruder);
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("d")), KTFileUtil::kErrorNone);
    EXPECT_FALSE(g_Renamed);
    EXPECT_FALSE(KTFile(Path("d")).Exists());
}

TEST_F(WFolder, FreeSpaceAndServers) {
    EXPECT_GT(KTFileUtil::GetFileFreeSpace(Path("")), 0U);
    EXPECT_GT(KTFileUtil::GetFileFreeSpace(Path("not\\there\\yet")), 0U);
    EXPECT_GT(KTFileUtil::GetFileFreeSpace(File("f").GetPath()), 0U);
    EXPECT_EQ(KTFileUtil::GetFileFreeSpace(KTPath()), 0U);
    EXPECT_EQ(KTFileUtil::GetFileFreeSpace(KTPath(KTString("Q:\\"))), 0U);
    EXPECT_FALSE(KTFileUtil::OnServerVolume(Path("")));
    EXPECT_TRUE(KTFileUtil::OnServerVolume(KTPath(KTString("\\\\server\\share\\a"))));
    EXPECT_TRUE(KTFileUtil::OnServerVolume(KTPath(KTString("file://server/share"))));
    EXPECT_FALSE(KTFileUtil::OnServerVolume(KTPath()));
    EXPECT_TRUE(KTFileUtil::IsLocalPath(Path("x")));
    EXPECT_TRUE(KTFileUtil::IsLocalPath(KTPath(KTString("relative"))));
    EXPECT_TRUE(KTFileUtil::IsLocalPath(KTPath(KTString("file:///C:/a"))));
    EXPECT_FALSE(KTFileUtil::IsLocalPath(KTPath(KTString("\\\\server\\share"))));
    EXPECT_FALSE(KTFileUtil::IsLocalPath(KTPath(KTString("file://server/share"))));
    EXPECT_FALSE(KTFileUtil::IsLocalPath(KTPath()));
    EXPECT_FALSE(KTFileUtil::IsLocalPath(Path("a?b")));
    EXPECT_TRUE(KTFileUtil::IsLocalPath2(Path("x")));
    EXPECT_FALSE(KTFileUtil::IsLocalPath2(KTPath(KTString("//server/share"))));
    EXPECT_FALSE(KTFileUtil::IsLocalPath2(KTPath()));
}

namespace {

UINT WINAPI EveryDriveIsAShare(wchar_t const *) { return DRIVE_REMOTE; }

} // namespace

TEST_F(WFolder, ADriveLetterMayBelongToAShare) {
    WImportHook const hook(L"KTPublic.dll", "GetDriveTypeW", &EveryDriveIsAShare);
    ASSERT_TRUE(hook.IsActive());
    EXPECT_TRUE(KTFileUtil::OnServerVolume(Path("x")));
    EXPECT_TRUE(KTFileUtil::IsLocalPath(Path("x")));
    EXPECT_FALSE(KTFileUtil::IsLocalPath2(Path("x")));
}
