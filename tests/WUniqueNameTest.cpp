// WUniqueNameTest.cpp: temporary and unique names, within one process and between two, and the well-known folders.

#include "KTFileUtil.h"
#include "LogLines.h"
#include "WChildProcess.h"
#include "WFileFixture.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <set>
#include <string>
#include <vector>

namespace {

using WUniqueName = WFileFixture;

constexpr int kFilesOfEach = 1000;

KTString NameOf(KTFile const &file) { return KTFileUtil::GetFileName(file); }

bool Begins(KTString const &text, char const *start) { return text.find(KTString(start)) == 0; }

bool Ends(KTString const &text, char const *end) {
    KTString const wanted(end);
    return text.size() >= wanted.size() && text.substr(text.size() - wanted.size()) == wanted;
}

DWORD g_NameSize = 0;

DWORD WINAPI NoName(HMODULE, wchar_t *, DWORD size) {
    g_NameSize = size;
    return 0;
}

std::vector<std::wstring> g_Opened;
int g_Refusals = 0;

// The first names that are tried are taken already.
HANDLE WINAPI CreateTaken(wchar_t const *name, DWORD access, DWORD share, SECURITY_ATTRIBUTES *security, DWORD how,
                          DWORD flags, HANDLE model) {
    if (how == CREATE_NEW) {
        g_Opened.emplace_back(name);
        if (g_Refusals-- > 0) {
            SetLastError(ERROR_FILE_EXISTS);
            return INVALID_HANDLE_VALUE;
        }
    }
    return CreateFileW(name, access, share, security, how, flags, model);
}

HANDLE WINAPI CreateOnFullDisk(wchar_t const *, DWORD, DWORD, SECURITY_ATTRIBUTES *, DWORD, DWORD, HANDLE) {
    SetLastError(ERROR_DISK_FULL);
    return INVALID_HANDLE_VALUE;
}

} // namespace

TEST_F(WUniqueName, SessionFolderIsMadeOnce) {
    KTPath const folder = KTFileUtil::GetSessionTempFolder();
    EXPECT_EQ(folder, KTFileUtil::GetSessionTempFolder());
    KTString const name = NameOf(KTFile(folder));
    EXPECT_TRUE(Begins(name, "KT")) << name.GetUTF8String();
    EXPECT_TRUE(name.Contains("Session")) << name.GetUTF8String();
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(folder)));
    EXPECT_EQ(folder.GetParentKTPath(), KTFileUtil::GetSystemTempFolder().GetPath());
}

TEST_F(WUniqueName, TemporaryFilesAreNewAndEmpty) {
    KTFile const first = KTFileUtil::GetUniqueTemporaryFile(".ikt");
    KTFile const second = KTFileUtil::GetUniqueTemporaryFile(".ikt");
    EXPECT_NE(first, second);
    for (KTFile const &file : {first, second}) {
        EXPECT_TRUE(Begins(NameOf(file), "data-"));
        EXPECT_TRUE(Ends(NameOf(file), ".ikt"));
        EXPECT_EQ(file.GetPath().GetParentKTPath(), KTFileUtil::GetSessionTempFolder());
        EXPECT_TRUE(file.Exists());
        EXPECT_EQ(file.GetSize(), 0U);
        EXPECT_TRUE(file.Delete());
    }
    KTFile const own = KTFileUtil::GetUniqueTemporaryFile(Path(""), "pre-", ".x");
    EXPECT_TRUE(Begins(NameOf(own), "pre-"));
    EXPECT_TRUE(Ends(NameOf(own), ".x"));
    EXPECT_TRUE(own.Exists());
    EXPECT_EQ(Count(""), 1);
}

TEST_F(WUniqueName, UniqueFilesInAnyFolder) {
    KTFile const data = KTFileUtil::GetUniqueFile(Path(""), ".dat");
    EXPECT_TRUE(Begins(NameOf(data), "data-"));
    EXPECT_TRUE(Ends(NameOf(data), ".dat"));
    KTFile const plain = KTFileUtil::CreateUniqueFile(Path(""), "", "");
    EXPECT_TRUE(plain.Exists());
    EXPECT_EQ(KTFileUtil::GetExtension(plain), "");
    KTFile const named = KTFileUtil::CreateUniqueFile(Path("/"), KTString(L"\u20AC "), ".a.b");
    EXPECT_TRUE(named.Exists());
    EXPECT_EQ(Count(""), 3);
    KTFile const none;
    EXPECT_EQ(KTFileUtil::CreateUniqueFile(Path("missing"), "a", "b"), none);
    EXPECT_EQ(KTFileUtil::GetUniqueFile(data.GetPath(), "b"), none);
    EXPECT_EQ(KTFileUtil::CreateUniqueFile(KTPath(), "a", "b"), none);
    EXPECT_EQ(KTFileUtil::CreateUniqueFile(Path(""), "a\\", "b"), none);
    EXPECT_EQ(KTFileUtil::CreateUniqueFile(Path(""), "a", "/b"), none);
    EXPECT_EQ(KTFileUtil::CreateUniqueFile(Path(""), "a", "."), none);
    EXPECT_EQ(KTFileUtil::CreateUniqueFile(Path(""), "nul.", ""), none);
    EXPECT_EQ(KTFileUtil::GetUniqueTemporaryFile("?"), none);
    EXPECT_EQ(Count(""), 3);
}

TEST_F(WUniqueName, ATakenNameLeadsToAnother) {
    WImportHook const hook(L"KTPublic.dll", "CreateFileW", &CreateTaken);
    ASSERT_TRUE(hook.IsActive());
    g_Opened.clear();
    g_Refusals = 3;
    EXPECT_TRUE(KTFileUtil::GetUniqueFile(Path(""), ".x").Exists());
    EXPECT_EQ(std::set<std::wstring>(g_Opened.begin(), g_Opened.end()).size(), 4U);
    g_Refusals = 1'000'000;
    EXPECT_EQ(KTFileUtil::GetUniqueFile(Path(""), ".x"), KTFile()) << "it gives up some time";
}

TEST_F(WUniqueName, AFullDiskGivesNoFile) {
    WImportHook const hook(L"KTPublic.dll", "CreateFileW", &CreateOnFullDisk);
    EXPECT_EQ(KTFileUtil::GetUniqueFile(Path(""), ".x"), KTFile());
    EXPECT_FALSE(KTFile(Path("x")).MakeFile(true));
}

TEST_F(WUniqueName, FoldersAndNamedFilesInTheSessionFolder) {
    KTPath const session = KTFileUtil::GetSessionTempFolder();
    KTFile const file = KTFileUtil::GetTempFileWithName("page.html");
    EXPECT_EQ(file.GetPath().GetParentKTPath(), session);
    EXPECT_EQ(NameOf(file), "page.html");
    EXPECT_FALSE(file.Exists());
    for (char const *const bad : {"", "a\\b", "..", "a.", "con"}) {
        EXPECT_EQ(KTFileUtil::GetTempFileWithName(bad), KTFile()) << bad;
        EXPECT_EQ(KTFileUtil::CreateTempDir(bad), KTPath()) << bad;
    }
    KTPath const folder = KTFileUtil::CreateTempDir("pages");
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(folder)));
    EXPECT_EQ(KTFileUtil::CreateTempDir("pages"), folder) << "it is there already";
    EXPECT_TRUE(file.MakeFile(false));
    EXPECT_EQ(KTFileUtil::CreateTempDir("page.html"), KTPath()) << "a file has the name";
    KTPath const unique = KTFileUtil::CreateUniqueTempDir("job");
    EXPECT_TRUE(Begins(NameOf(KTFile(unique)), "job-"));
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(unique)));
    EXPECT_NE(unique, KTFileUtil::CreateUniqueTempDir("job"));
    EXPECT_EQ(KTFileUtil::CreateUniqueDir(Path(""), "").GetParentKTPath(), KTPath(Path("")));
    EXPECT_EQ(KTFileUtil::CreateUniqueDir(Path("none"), "a"), KTPath());
    EXPECT_EQ(KTFileUtil::CreateUniqueDir(file.GetPath(), "a"), KTPath());
    EXPECT_EQ(KTFileUtil::CreateUniqueDir(Path(""), "a:"), KTPath());
    EXPECT_EQ(KTFileUtil::CreateUniqueDir(KTPath(), "a"), KTPath());
}

TEST_F(WUniqueName, DISABLED_ChildUsesASessionFolder) {
    EXPECT_TRUE(KTFileUtil::DeleteAllTempFilesCreated()) << "nothing was made yet";
    KTPath const folder = KTFileUtil::GetSessionTempFolder();
    EXPECT_TRUE(KTFileUtil::GetUniqueTemporaryFile(".ikt").Exists());
    KTFile held = KTFileUtil::GetUniqueTemporaryFile(".held");
    {
        WOHandle const lock(CreateFileW(held.GrabTString(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr));
        EXPECT_FALSE(KTFileUtil::DeleteAllTempFilesCreated()) << "one file is in use";
        EXPECT_TRUE(held.Exists());
    }
    EXPECT_TRUE(KTFileUtil::DeleteAllTempFilesCreated());
    EXPECT_FALSE(KTFile(folder).Exists());
    EXPECT_EQ(KTFileUtil::GetSessionTempFolder(), folder) << "the same path, though it is gone";
    EXPECT_FALSE(KTFile(folder).Exists());
    EXPECT_EQ(KTFileUtil::GetUniqueTemporaryFile(".ikt"), KTFile());
    EXPECT_EQ(KTFileUtil::CreateTempDir("a"), KTPath());
    EXPECT_TRUE(KTFileUtil::DeleteAllTempFilesCreated());
    ASSERT_EQ(KTFileUtil::CreateDirectoryW(folder), KTFileUtil::kErrorNone);
    KTFile const left = KTFileUtil::GetTempFileWithName("left behind");
    EXPECT_TRUE(left.MakeFile(false));
}

TEST_F(WUniqueName, EachProcessHasASessionFolderOfItsOwn) {
    std::filesystem::path const shared = Wide("");
    WChildProcess first("WUniqueName.DISABLED_ChildUsesASessionFolder", {.argument = L"", .flags = 0, .temp = shared});
    WChildProcess second("WUniqueName.DISABLED_ChildUsesASessionFolder", {.argument = L"", .flags = 0, .temp = shared});
    EXPECT_EQ(first.ExitStatus(), 0U);
    EXPECT_EQ(second.ExitStatus(), 0U);
    std::set<std::wstring> folders;
    for (auto const &entry : std::filesystem::recursive_directory_iterator(shared)) {
        if (entry.path().filename() == L"left behind") {
            folders.insert(entry.path().parent_path().wstring());
        }
    }
    EXPECT_EQ(folders.size(), 2U);
}

TEST_F(WUniqueName, DISABLED_ChildCreatesMany) {
    KTPath const folder{KTString(WChildProcess::Argument().c_str())};
    WSignal start(L"KTUniqueNameStart");
    ASSERT_TRUE(start.IsSetWithin(60000));
    std::set<std::wstring> names;
    for (int i = 0; i < kFilesOfEach; ++i) {
        KTFile const file = KTFileUtil::GetUniqueFile(folder, ".x");
        ASSERT_TRUE(file.Exists());
        names.insert(file.GrabTString());
    }
    EXPECT_EQ(names.size(), static_cast<std::size_t>(kFilesOfEach));
}

TEST_F(WUniqueName, TwoProcessesNeverCollide) {
    Folder("many");
    WSignal start(L"KTUniqueNameStart");
    WChildProcess first("WUniqueName.DISABLED_ChildCreatesMany", {.argument = Wide("many"), .flags = 0, .temp = {}});
    WChildProcess second("WUniqueName.DISABLED_ChildCreatesMany", {.argument = Wide("many"), .flags = 0, .temp = {}});
    start.Set();
    EXPECT_EQ(first.ExitStatus(), 0U);
    EXPECT_EQ(second.ExitStatus(), 0U);
    EXPECT_EQ(Count("many"), 2 * kFilesOfEach);
}

TEST_F(WUniqueName, TheExecutableAndWhatLiesBesideIt) {
    wchar_t self[MAX_PATH];
    GetModuleFileNameW(nullptr, self, MAX_PATH);
    EXPECT_EQ(KTFileUtil::GetCurrentExecutablePath().GetPathAsKTString(), KTString(self));
    KTPath const folder = KTFileUtil::GetResourcesFolderPath();
    EXPECT_EQ(folder, KTPath(KTString(self)).GetParentKTPath());
    EXPECT_EQ(KTFileUtil::GetApplicationLocaleFolder().GetPathString(),
              folder.GetPathAsKTString() + "\\en_US\\strings.lxdc");
    EXPECT_EQ(KTFileUtil::GetSSLCACertificatePath(), folder.GetPathAsKTString() + "\\cacert\\cacert.pem");
}

TEST_F(WUniqueName, AnUnknownExecutableIsReported) {
    WImportHook const hook(L"KTPublic.dll", "GetModuleFileNameW", &NoName);
    ASSERT_TRUE(hook.IsActive());
    LogLines log;
    EXPECT_EQ(KTFileUtil::GetCurrentExecutablePath(), KTPath());
    EXPECT_EQ(g_NameSize, 32'767U);
    EXPECT_EQ(log.Take(), std::vector<std::string>{"Assert failed:  at source/private/utils/WKTFileUtil:88"});
    EXPECT_EQ(KTFileUtil::GetResourcesFolderPath(), KTPath());
}

TEST_F(WUniqueName, WellKnownFoldersAreThere) {
    std::set<KTString> paths;
    for (KTPath const &folder : {KTFileUtil::GetUserDocumentsFolder(), KTFileUtil::GetSharedDocumentsFolder(),
                                 KTFileUtil::GetUserApplicationDataFolder(), KTFileUtil::GetCommonFilesFolder(),
                                 KTFileUtil::GetUserPreferenceFolder(), KTFileUtil::GetSystemTempFolder().GetPath()}) {
        EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(folder))) << folder;
        paths.insert(folder.GetPathAsKTString());
    }
    EXPECT_EQ(paths.size(), 6U);
    KTString const roaming(_wgetenv(L"APPDATA"));
    EXPECT_EQ(KTFileUtil::GetUserApplicationDataFolder().GetPathAsKTString(), roaming);
    KTString const common(_wgetenv(L"CommonProgramW6432"));
    EXPECT_EQ(KTFileUtil::GetCommonFilesFolder().GetPathAsKTString(), common);
}
