// WCopyTest.cpp: copying and moving: every result, and that nobody ever meets half a file.

#include "KTFileUtil.h"
#include "WChildProcess.h"
#include "WFileFixture.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <string>

namespace {

using WCopy = WFileFixture;

// Writes the beginning of the copy and then fails as a full disk does, leaving what it wrote.
BOOL WINAPI CopyHalf(wchar_t const *, wchar_t const *to, BOOL) {
    WOHandle const file(CreateFileW(to, GENERIC_WRITE, 0, nullptr, CREATE_NEW, 0, nullptr));
    DWORD written = 0;
    WriteFile(file.Get(), "ha", 2, &written, nullptr);
    SetLastError(ERROR_DISK_FULL);
    return FALSE;
}

// The process ends in the middle of a copy.
BOOL WINAPI CopyAndDie(wchar_t const *from, wchar_t const *to, BOOL refuse) {
    CopyHalf(from, to, refuse);
    TerminateProcess(GetCurrentProcess(), 7);
    return FALSE;
}

BOOL WINAPI CannotRename(wchar_t const *, wchar_t const *, DWORD) {
    SetLastError(ERROR_ACCESS_DENIED);
    return FALSE;
}

int g_Renames = 0;
DWORD g_LastRename = 0;

// The first rename meets another drive; those that follow work.
BOOL WINAPI RenameOnOneDrive(wchar_t const *from, wchar_t const *to, DWORD flags) {
    if (g_Renames++ == 0) {
        SetLastError(ERROR_NOT_SAME_DEVICE);
        return FALSE;
    }
    g_LastRename = flags;
    return MoveFileExW(from, to, flags);
}

int g_Copies = 0;

BOOL WINAPI CountCopies(wchar_t const *from, wchar_t const *to, BOOL refuse) {
    ++g_Copies;
    return CopyFileW(from, to, refuse);
}

BOOL WINAPI CannotFlush(HANDLE) {
    SetLastError(ERROR_DISK_FULL);
    return FALSE;
}

} // namespace

TEST_F(WCopy, CopiesContentTimesAndAttributes) {
    KTFile const from = File("from.txt", "content");
    SetTimes("from.txt", 126'227'808'000'000'000);
    MakeReadOnly("from.txt");
    EXPECT_EQ(KTFileUtil::FileCopy(from, KTFile(Path("to.txt"))), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("to.txt"), "content");
    EXPECT_EQ(KTFile(Path("to.txt")).GetTimeAttribute(KTFile::kTimeModified), 126'227'808'000'000'000U);
    EXPECT_NE(GetFileAttributesW(Wide("to.txt").c_str()) & FILE_ATTRIBUTE_READONLY, 0U);
    EXPECT_EQ(Content("from.txt"), "content");
    EXPECT_EQ(Count(""), 2);
}

TEST_F(WCopy, ReplacesOnlyWhenAsked) {
    KTFile const from = File("from.txt", "new");
    KTFile const to = File("to.txt", "old");
    EXPECT_EQ(KTFileUtil::FileCopy(from, to), KTFileUtil::kErrorAlreadyExists);
    EXPECT_EQ(Content("to.txt"), "old");
    EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("to.txt"), "new");
    MakeReadOnly("to.txt");
    EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorAccessDenied);
    EXPECT_EQ(Count(""), 2);
}

TEST_F(WCopy, RefusesWhatCannotBeCopied) {
    KTFile const from = File("from.txt", "x");
    KTFile const folder = Folder("d");
    KTFile const none(Path("none"));
    EXPECT_EQ(KTFileUtil::FileCopy(none, from, true), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::FileCopy(folder, none), KTFileUtil::kErrorIsAFolder);
    EXPECT_EQ(KTFileUtil::FileCopy(from, folder, true), KTFileUtil::kErrorIsAFolder);
    EXPECT_EQ(KTFileUtil::FileCopy(from, KTFile(Path("no\\such"))), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::FileCopy(KTFile(), none), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::FileCopy(from, KTFile()), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::FileCopy(from, KTFile(Path("a:b"))), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::FileCopy(from, from, true), KTFileUtil::kErrorNone) << "onto itself";
    EXPECT_EQ(Content("from.txt"), "x");
}

TEST_F(WCopy, FilesInUseAreLeftAlone) {
    KTFile const from = File("from.txt", "new");
    KTFile const to = File("to.txt", "old");
    {
        WOHandle const lock = Hold("to.txt", GENERIC_READ, FILE_SHARE_READ);
        EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorInUse);
        EXPECT_EQ(KTFileUtil::MoveFileW(from, to, true), KTFileUtil::kErrorInUse);
    }
    {
        WOHandle const lock = Hold("from.txt");
        EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorInUse);
        EXPECT_EQ(KTFileUtil::MoveFileW(from, to, true), KTFileUtil::kErrorInUse);
    }
    EXPECT_EQ(Content("to.txt"), "old");
    EXPECT_EQ(Content("from.txt"), "new");
    EXPECT_EQ(Count(""), 2);
}

TEST_F(WCopy, AFullDiskLeavesTheOldFileAndNoPieces) {
    KTFile const from = File("from.txt", "half of it");
    KTFile const to = File("to.txt", "old");
    {
        WImportHook const hook(L"KTPublic.dll", "CopyFileW", &CopyHalf);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorDiskFull);
        EXPECT_EQ(KTFileUtil::FileCopy(from, KTFile(Path("fresh.txt"))), KTFileUtil::kErrorDiskFull);
        File("tree\\a.txt");
        EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("copy")), KTFileUtil::kErrorDiskFull);
    }
    {
        WImportHook const hook(L"KTPublic.dll", "FlushFileBuffers", &CannotFlush);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorDiskFull);
    }
    {
        WImportHook const hook(L"KTPublic.dll", "MoveFileExW", &CannotRename);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_EQ(KTFileUtil::FileCopy(from, to, true), KTFileUtil::kErrorAccessDenied);
        EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("copy")), KTFileUtil::kErrorAccessDenied);
    }
    EXPECT_EQ(Content("to.txt"), "old");
    EXPECT_EQ(Count(""), 3) << "two files and one folder";
}

TEST_F(WCopy, DISABLED_ChildDiesWhileCopying) {
    KTPath const folder{KTString(WChildProcess::Argument().c_str())};
    KTPath from(folder);
    KTPath to(folder);
    from.Append("from.txt");
    to.Append("to.txt");
    WImportHook const hook(L"KTPublic.dll", "CopyFileW", &CopyAndDie);
    KTFileUtil::FileCopy(KTFile(from), KTFile(to), true);
}

TEST_F(WCopy, AProcessThatEndsWhileCopyingLeavesTheOldFile) {
    File("from.txt", "half of it");
    File("to.txt", "old");
    WChildProcess child("WCopy.DISABLED_ChildDiesWhileCopying", {.argument = Wide(""), .flags = 0, .temp = {}});
    EXPECT_EQ(child.ExitStatus(), 7U);
    EXPECT_EQ(Content("to.txt"), "old");
    EXPECT_EQ(Count(""), 3) << "and the piece, under a name of its own";
}

TEST_F(WCopy, CopiesTrees) {
    File("tree\\a.txt", "a");
    File("tree\\sub\\b.txt", "b");
    Folder("tree\\empty");
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree/"), Path("copy\\")), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("copy\\a.txt"), "a");
    EXPECT_EQ(Content("copy\\sub\\b.txt"), "b");
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(Path("copy\\empty"))));
    EXPECT_EQ(Count(""), 2);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("copy")), KTFileUtil::kErrorAlreadyExists);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("none"), Path("x")), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree\\a.txt"), Path("x")), KTFileUtil::kErrorNotAFolder);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("no\\such")), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("tree\\sub\\x")), KTFileUtil::kErrorFailed);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("TREE\\x")), KTFileUtil::kErrorFailed);
    EXPECT_EQ(KTFileUtil::FolderCopy(KTPath(), Path("x")), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), KTPath()), KTFileUtil::kErrorInvalidName);
    WOHandle const lock = Hold("tree\\sub\\b.txt");
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("x")), KTFileUtil::kErrorInUse);
    EXPECT_EQ(Count(""), 2) << "no half a tree";
}

TEST_F(WCopy, MovesFilesAndFolders) {
    EXPECT_EQ(KTFileUtil::MoveFileW(File("a.txt", "a"), KTFile(Path("b.txt"))), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("b.txt"), "a");
    EXPECT_FALSE(KTFile(Path("a.txt")).Exists());
    File("c.txt", "c");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("b.txt")), KTFile(Path("c.txt"))), KTFileUtil::kErrorAlreadyExists);
    EXPECT_EQ(Content("c.txt"), "c");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("b.txt")), KTFile(Path("c.txt")), true), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("c.txt"), "a");
    File("tree\\sub\\x", "in it");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("tree")), KTFile(Path("moved"))), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("moved\\sub\\x"), "in it");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("c.txt")), KTFile(Path("moved")), true), KTFileUtil::kErrorIsAFolder);
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("moved")), KTFile(Path("c.txt")), true),
              KTFileUtil::kErrorAlreadyExists);
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("none")), KTFile(Path("x"))), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("c.txt")), KTFile(Path("no\\x"))), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(), KTFile(Path("x"))), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("c.txt")), KTFile()), KTFileUtil::kErrorInvalidName);
    MakeReadOnly("c.txt");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("c.txt")), KTFile(Path("d.txt"))), KTFileUtil::kErrorNone);
    File("e.txt");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("e.txt")), KTFile(Path("d.txt")), true),
              KTFileUtil::kErrorAccessDenied);
}

TEST_F(WCopy, MovesToAnotherDriveByCopying) {
    KTFile const file = File("a.txt", "a");
    File("tree\\sub\\x", "in it");
    WImportHook const hook(L"KTPublic.dll", "MoveFileExW", &RenameOnOneDrive);
    g_Renames = 0;
    EXPECT_EQ(KTFileUtil::MoveFileW(file, KTFile(Path("b.txt"))), KTFileUtil::kErrorNone);
    g_Renames = 0;
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("tree")), KTFile(Path("moved"))), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("b.txt"), "a");
    EXPECT_EQ(Content("moved\\sub\\x"), "in it");
    EXPECT_EQ(Count(""), 2);
    g_Renames = 0;
    File("c.txt", "old");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("b.txt")), KTFile(Path("c.txt")), true), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("c.txt"), "a");
    EXPECT_EQ(Count(""), 2);
}

// The original goes only when the copy is safe.
TEST_F(WCopy, MovesToAnotherDriveOnlyWhatHasReachedTheDisk) {
    KTFile const file = File("a.txt", "a");
    KTFile const readOnly = File("r.txt", "r");
    MakeReadOnly("r.txt");
    File("tree\\sub\\x", "in it");
    File("c.txt", "old");
    {
        WImportHook const renames(L"KTPublic.dll", "MoveFileExW", &RenameOnOneDrive);
        WImportHook const hook(L"KTPublic.dll", "FlushFileBuffers", &CannotFlush);
        ASSERT_TRUE(hook.IsActive());
        for (KTFile const &from : {file, readOnly, KTFile(Path("tree"))}) {
            g_Renames = 0;
            EXPECT_EQ(KTFileUtil::MoveFileW(from, KTFile(Path("b"))), KTFileUtil::kErrorDiskFull) << from;
        }
        EXPECT_EQ(KTFileUtil::FileCopy(readOnly, KTFile(Path("c.txt")), true), KTFileUtil::kErrorDiskFull);
    }
    EXPECT_EQ(Content("a.txt"), "a");
    EXPECT_EQ(Content("r.txt"), "r");
    EXPECT_EQ(Content("tree\\sub\\x"), "in it");
    EXPECT_EQ(Content("c.txt"), "old");
    EXPECT_EQ(Count(""), 4);
    WImportHook const renames(L"KTPublic.dll", "MoveFileExW", &RenameOnOneDrive);
    g_Renames = 0;
    EXPECT_EQ(KTFileUtil::MoveFileW(readOnly, KTFile(Path("b"))), KTFileUtil::kErrorNone);
    EXPECT_EQ(g_LastRename, static_cast<DWORD>(MOVEFILE_WRITE_THROUGH)) << "and so has its name";
    EXPECT_EQ(Content("b"), "r");
    EXPECT_NE(GetFileAttributesW(Wide("b").c_str()) & FILE_ATTRIBUTE_READONLY, 0U) << "still read-only";
    EXPECT_FALSE(readOnly.Exists());
}

TEST_F(WCopy, FoldersWithLinksDoNotMoveToAnotherDrive) {
    File("outside\\precious.txt", "kept");
    File("tree\\sub\\x", "in it");
    if (!MakeLink("tree\\sub\\link", "outside")) {
        GTEST_SKIP() << "no links to folders here";
    }
    WImportHook const hook(L"KTPublic.dll", "MoveFileExW", &RenameOnOneDrive);
    g_Renames = 0;
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("tree")), KTFile(Path("moved"))), KTFileUtil::kErrorFailed);
    EXPECT_EQ(Content("tree\\sub\\x"), "in it");
    EXPECT_EQ(Content("tree\\sub\\link\\precious.txt"), "kept");
    EXPECT_EQ(Count(""), 2);
}

TEST_F(WCopy, AFolderWithANameThatIsRefusedIsNotCopied) {
    File("tree\\a.txt", "a");
    std::wstring const odd = L"\\\\?\\" + Wide("tree") + L"\\notes.";
    ASSERT_TRUE(WOHandle(CreateFileW(odd.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW, 0, nullptr)).IsValid());
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("copy")), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(Count(""), 1);
    EXPECT_NE(DeleteFileW(odd.c_str()), FALSE) << "others cannot";
}

// Another name of the folder: a link, a mapped drive, the machine's own share.
TEST_F(WCopy, AFolderIsNotCopiedIntoItselfUnderAnotherName) {
    File("tree\\a.txt", "a");
    File("tree\\sub\\b.txt", "b");
    if (!MakeLink("alias", "tree")) {
        GTEST_SKIP() << "no links to folders here";
    }
    WImportHook const hook(L"KTPublic.dll", "CopyFileW", &CountCopies);
    ASSERT_TRUE(hook.IsActive());
    g_Copies = 0;
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("alias\\x")), KTFileUtil::kErrorFailed);
    EXPECT_EQ(KTFileUtil::FolderCopy(Path("tree"), Path("alias\\sub\\x")), KTFileUtil::kErrorFailed);
    EXPECT_LE(g_Copies, 4) << "no file twice";
    EXPECT_EQ(Count("tree"), 2);
    EXPECT_EQ(Count("tree\\sub"), 1);
}

TEST_F(WCopy, RenamesInTheFolder) {
    EXPECT_EQ(KTFileUtil::RenameFile(File("a.txt", "a"), "b.txt"), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("b.txt"), "a");
    EXPECT_EQ(KTFileUtil::RenameFile(KTFile(Path("b.txt")), "B.TXT"), KTFileUtil::kErrorNone);
    KTFile const file(Path("B.TXT"));
    for (char const *const name : {"", "x\\y", "x/y", "..", "x.", "C:\\x", "nul"}) {
        EXPECT_EQ(KTFileUtil::RenameFile(file, name), KTFileUtil::kErrorInvalidName) << name;
    }
    File("taken.txt", "kept");
    Folder("d");
    EXPECT_EQ(KTFileUtil::RenameFile(file, "taken.txt"), KTFileUtil::kErrorAlreadyExists);
    EXPECT_EQ(KTFileUtil::RenameFile(file, "d"), KTFileUtil::kErrorIsAFolder);
    EXPECT_EQ(KTFileUtil::RenameFile(KTFile(Path("none")), "x"), KTFileUtil::kErrorNotFound);
    EXPECT_EQ(KTFileUtil::RenameFile(KTFile(), "x"), KTFileUtil::kErrorInvalidName);
    EXPECT_EQ(KTFileUtil::RenameFile(KTFile(Path("d")), "e"), KTFileUtil::kErrorNone);
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(Path("e"))));
    WOHandle const lock = Hold("b.txt");
    EXPECT_EQ(KTFileUtil::RenameFile(file, "c.txt"), KTFileUtil::kErrorInUse);
    EXPECT_EQ(Content("taken.txt"), "kept");
}
