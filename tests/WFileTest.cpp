// WFileTest.cpp: KTFile and the toolbox's operations on single files, on the disk.

#include "KTFileUtil.h"
#include "WFileFixture.h"

#include <gtest/gtest.h>

#include <windows.h>

namespace {

using WFile = WFileFixture;

constexpr KTUInt64 kSecond = 10'000'000;
constexpr KTUInt64 kLongAgo = 12'622'780'800 * kSecond; // the first of January 2001

KTUInt64 Now() {
    FILETIME time;
    GetSystemTimeAsFileTime(&time);
    return (static_cast<KTUInt64>(time.dwHighDateTime) << 32) | time.dwLowDateTime;
}

// Says what it was told about its path.
class Watching : public KTFile {
  public:
    using KTFile::KTFile;
    std::vector<KTString> changes;

  private:
    void PathChanged(OString const &path) override { changes.push_back(KTString(path)); }
};

} // namespace

TEST_F(WFile, ExistsForFilesAndFolders) {
    EXPECT_TRUE(File("a.txt", "x").Exists());
    EXPECT_TRUE(File("a.txt", "x").DoesFileExist());
    EXPECT_TRUE(Folder("d").Exists());
    EXPECT_TRUE(KTFile(Path("d").GetPathAsKTString() + "\\").Exists());
    EXPECT_FALSE(KTFile(Path("none")).Exists());
    EXPECT_FALSE(KTFile(Path("a.txt\\x")).Exists());
    EXPECT_FALSE(KTFile().Exists());
    EXPECT_FALSE(KTFile(Path("a.txt.")).Exists()) << "the system would cut the dot";
    EXPECT_FALSE(KTFile(Path("nul")).Exists()) << "the system would find a device";
    EXPECT_FALSE(KTFile(KTString("Q:\\gone")).Exists());
}

TEST_F(WFile, ParentExists) {
    EXPECT_TRUE(KTFile(Path("none")).ParentExists());
    EXPECT_FALSE(KTFile(Path("none\\x")).ParentExists());
    File("a.txt");
    EXPECT_FALSE(KTFile(Path("a.txt\\x")).ParentExists()) << "a file holds nothing";
    EXPECT_FALSE(KTFile(KTString("C:\\")).ParentExists());
    EXPECT_FALSE(KTFile().ParentExists());
    EXPECT_TRUE(KTFile(KTString("relative")).ParentExists());
}

TEST_F(WFile, DeleteTakesFilesAndEmptyFolders) {
    EXPECT_TRUE(File("a.txt").Delete());
    EXPECT_FALSE(KTFile(Path("a.txt")).Exists());
    EXPECT_FALSE(KTFile(Path("a.txt")).Delete()) << "nothing there";
    EXPECT_TRUE(Folder("d").ForceDelete());
    File("full\\a.txt");
    EXPECT_FALSE(KTFile(Path("full")).Delete());
    EXPECT_TRUE(KTFile(Path("full\\a.txt")).Exists());
    EXPECT_FALSE(KTFile().Delete());
}

TEST_F(WFile, DeleteTakesReadOnlyFilesButNoFilesInUse) {
    File("r.txt");
    MakeReadOnly("r.txt");
    EXPECT_TRUE(KTFile(Path("r.txt")).Delete());
    KTFile const used = File("used.txt", "content");
    {
        WOHandle const lock = Hold("used.txt");
        EXPECT_FALSE(used.Delete());
        MakeReadOnly("used.txt");
        EXPECT_FALSE(used.Delete());
    }
    EXPECT_TRUE(used.Exists());
    EXPECT_NE(GetFileAttributesW(Wide("used.txt").c_str()) & FILE_ATTRIBUTE_READONLY, 0U) << "as it was";
    EXPECT_TRUE(used.Delete());
}

TEST_F(WFile, MakeFileCreatesOrEmpties) {
    KTFile const file(Path("new.txt"));
    EXPECT_TRUE(file.MakeFile(false));
    EXPECT_EQ(Content("new.txt"), "");
    File("new.txt", "content");
    EXPECT_FALSE(file.MakeFile(false));
    EXPECT_EQ(Content("new.txt"), "content");
    EXPECT_TRUE(file.MakeFile(true));
    EXPECT_EQ(Content("new.txt"), "");
    EXPECT_FALSE(KTFile(Path("none\\new.txt")).MakeFile(true));
    EXPECT_FALSE(Folder("d").MakeFile(true));
    EXPECT_FALSE(Folder("d").MakeFile(false));
    EXPECT_FALSE(KTFile().MakeFile(true));
    EXPECT_FALSE(KTFile(Path("a?b")).MakeFile(true));
    File("r.txt", "kept");
    MakeReadOnly("r.txt");
    EXPECT_FALSE(KTFile(Path("r.txt")).MakeFile(true));
    File("used.txt", "kept");
    WOHandle const lock = Hold("used.txt");
    EXPECT_FALSE(KTFile(Path("used.txt")).MakeFile(true));
}

TEST_F(WFile, TouchSetsTheTimes) {
    KTFile const file = File("a.txt", "x");
    SetTimes("a.txt", kLongAgo);
    EXPECT_EQ(file.GetTimeAttribute(KTFile::kTimeModified), kLongAgo);
    KTUInt64 const before = Now();
    EXPECT_TRUE(file.Touch());
    EXPECT_GE(file.GetTimeAttribute(KTFile::kTimeModified) + kSecond, before);
    EXPECT_GE(file.GetTimeAttribute(KTFile::kTimeAccessed) + kSecond, before);
    EXPECT_EQ(Content("a.txt"), "x");
    EXPECT_FALSE(KTFile(Path("none")).Touch());
    EXPECT_FALSE(KTFile(Path("none")).Exists()) << "touching creates nothing";
    EXPECT_FALSE(KTFile().Touch());
    EXPECT_TRUE(Folder("d").Touch());
    MakeReadOnly("a.txt");
    EXPECT_TRUE(file.Touch());
}

TEST_F(WFile, SizeAndTimes) {
    KTFile const file = File("a.txt", "12345");
    EXPECT_EQ(file.GetSize(), 5U);
    EXPECT_EQ(KTFileUtil::GetFileSize(file), 5U);
    EXPECT_EQ(Folder("d").GetSize(), 0U);
    EXPECT_EQ(KTFile(Path("none")).GetSize(), 0U);
    EXPECT_EQ(KTFileUtil::GetFileSize(KTFile()), 0U);
    for (auto const attribute : {KTFile::kTimeCreated, KTFile::kTimeModified, KTFile::kTimeAccessed}) {
        EXPECT_GT(file.GetTimeAttribute(attribute) + 3600 * kSecond, Now());
        EXPECT_LT(file.GetTimeAttribute(attribute), Now() + 3600 * kSecond);
        EXPECT_GT(Folder("d").GetTimeAttribute(attribute), 0U);
        EXPECT_EQ(KTFile(Path("none")).GetTimeAttribute(attribute), 0U);
    }
    EXPECT_EQ(file.GetTimeAttribute(static_cast<KTFile::TimeAttribute>(9)), 0U);
    WOHandle const lock = Hold("a.txt");
    EXPECT_EQ(file.GetSize(), 5U) << "a held file has a size, too";
}

TEST_F(WFile, DatesAreTheTimeStamps) {
    KTFile const file = File("a.txt", "x");
    SetTimes("a.txt", kLongAgo);
    EXPECT_EQ(KTFileUtil::GetFileModificationDate(file).GetInternalTime(), kLongAgo);
    EXPECT_EQ(KTFileUtil::GetFileLastAccessedDate(file).GetInternalTime(), kLongAgo);
    EXPECT_EQ(KTFileUtil::GetFileCreationDate(file).GetInternalTime(), file.GetTimeAttribute(KTFile::kTimeCreated));
    EXPECT_TRUE(KTFileUtil::GetFileCreationDate(file).IsValid());
    EXPECT_TRUE(KTFileUtil::GetFileModificationDate(Folder("d")).IsValid());
    for (KTFile const &none : {KTFile(Path("none")), KTFile(), KTFile(Path("a?"))}) {
        EXPECT_FALSE(KTFileUtil::GetFileModificationDate(none).IsValid());
        EXPECT_FALSE(KTFileUtil::GetFileCreationDate(none).IsValid());
        EXPECT_FALSE(KTFileUtil::GetFileLastAccessedDate(none).IsValid());
    }
    WOHandle const lock = Hold("a.txt");
    EXPECT_EQ(KTFileUtil::GetFileModificationDate(file).GetInternalTime(), kLongAgo);
}

TEST_F(WFile, SizesAreOf64Bits) {
    KTFile const file = File("big");
    WOHandle handle(CreateFileW(Wide("big").c_str(), GENERIC_WRITE, 0, nullptr, OPEN_EXISTING, 0, nullptr));
    LARGE_INTEGER end{};
    end.QuadPart = 0x1'2345'6789;
    ASSERT_NE(SetFilePointerEx(handle.Get(), end, nullptr, FILE_BEGIN), FALSE);
    ASSERT_NE(SetEndOfFile(handle.Get()), FALSE);
    handle.Close();
    EXPECT_EQ(file.GetSize(), 0x1'2345'6789U);
    EXPECT_TRUE(file.Delete());
}

TEST_F(WFile, CanOpenAsksForTheMoment) {
    KTFile const file = File("a.txt");
    EXPECT_TRUE(file.CanOpen(KTFile::kAccessReadWrite, KTFile::kShareNone));
    EXPECT_FALSE(KTFile(Path("none")).CanOpen(KTFile::kAccessRead, KTFile::kShareAll));
    EXPECT_FALSE(Folder("d").CanOpen(KTFile::kAccessRead, KTFile::kShareAll));
    EXPECT_FALSE(KTFile().CanOpen(KTFile::kAccessRead, KTFile::kShareAll));
    {
        WOHandle const reader = Hold("a.txt", GENERIC_READ, FILE_SHARE_READ);
        EXPECT_TRUE(file.CanOpen(KTFile::kAccessRead, KTFile::kShareRead));
        EXPECT_FALSE(file.CanOpen(KTFile::kAccessRead, KTFile::kShareNone)) << "the reader is there";
        EXPECT_FALSE(file.CanOpen(KTFile::kAccessRead, KTFile::kShareWrite));
        EXPECT_FALSE(file.CanOpen(KTFile::kAccessWrite, KTFile::kShareAll)) << "the reader shares reading only";
    }
    MakeReadOnly("a.txt");
    EXPECT_TRUE(file.CanOpen(KTFile::kAccessRead, KTFile::kShareNone));
    EXPECT_FALSE(file.CanOpen(KTFile::kAccessWrite, KTFile::kShareAll));
}

TEST_F(WFile, SetPathRenamesWhatIsThere) {
    Watching file(File("a.txt", "content").GetPath());
    EXPECT_TRUE(file.SetPath(Path("b.txt")));
    EXPECT_EQ(file.GetPathString(), Path("b.txt").GetPathAsKTString());
    EXPECT_EQ(Content("b.txt"), "content");
    EXPECT_FALSE(KTFile(Path("a.txt")).Exists());
    EXPECT_TRUE(file.SetPath(Path("B.txt").GetPathAsKTString())) << "the case alone";
    EXPECT_EQ(file.changes,
              (std::vector<KTString>{Path("b.txt").GetPathAsKTString(), Path("B.txt").GetPathAsKTString()}));
    File("taken.txt", "kept");
    for (char const *const refused : {"taken.txt", "none\\x", "a?b", "nul"}) {
        EXPECT_FALSE(file.SetPath(Path(refused))) << refused;
        EXPECT_EQ(file.GetPathString(), Path("B.txt").GetPathAsKTString()) << refused;
    }
    EXPECT_FALSE(file.SetPath(KTPath()));
    EXPECT_EQ(Content("taken.txt"), "kept");
    EXPECT_EQ(file.changes.size(), 2U);
    {
        WOHandle const lock = Hold("b.txt");
        EXPECT_FALSE(file.SetPath(Path("c.txt")));
    }
    KTFile folder = Folder("d");
    File("d\\x", "in it");
    EXPECT_TRUE(folder.SetPath(Path("e")));
    EXPECT_EQ(Content("e\\x"), "in it");
}

TEST_F(WFile, SetPathOnlyChangesTheValueWhereNothingIs) {
    Watching file(Path("none"));
    File("there.txt", "kept");
    EXPECT_TRUE(file.SetPath(Path("there.txt")));
    EXPECT_EQ(file.GetPath(), Path("there.txt"));
    EXPECT_EQ(Content("there.txt"), "kept");
    KTFile nothing;
    EXPECT_FALSE(nothing.SetPath(KTString("a*b")));
    EXPECT_TRUE(nothing.SetPath(KTString("later")));
    EXPECT_TRUE(nothing.SetPath(KTPath())) << "it may name nothing again";
    EXPECT_EQ(nothing.GetPathString(), "");
}

TEST_F(WFile, GrabTStringIsThePathForTheSystem) {
    KTFile const file(KTString(L"C:\\\u20AC.txt"));
    EXPECT_STREQ(file.GrabTString(), L"C:\\\u20AC.txt");
    EXPECT_STREQ(KTFile().GrabTString(), L"");
}

TEST_F(WFile, AliasLeadsToItsTarget) {
    File("target.txt", "x");
    MakeShellLink("one.lnk", Wide("target.txt"));
    MakeShellLink("two.LNK", Wide("one.lnk"));
    KTFile file(Path("one.lnk"));
    EXPECT_TRUE(file.ResolveAlias());
    EXPECT_EQ(file.GetPathString(), Path("target.txt").GetPathAsKTString());
    EXPECT_TRUE(file.ResolveAlias()) << "it is none any more";
    KTFile chain(Path("two.LNK"));
    EXPECT_TRUE(chain.ResolveAlias());
    EXPECT_EQ(chain.GetPathString(), Path("target.txt").GetPathAsKTString());
    EXPECT_TRUE(KTFile(Path("target.txt")).ResolveAlias());
    Folder("folder.lnk");
    KTFile folder(Path("folder.lnk"));
    EXPECT_TRUE(folder.ResolveAlias());
    EXPECT_EQ(folder.GetPath(), Path("folder.lnk"));
}

TEST_F(WFile, AliasThatCannotBeReadStays) {
    KTFile junk = File("junk.lnk", "no link");
    EXPECT_FALSE(junk.ResolveAlias());
    EXPECT_EQ(junk.GetPath(), Path("junk.lnk"));
    EXPECT_FALSE(KTFile(Path("none.lnk")).ResolveAlias());
    EXPECT_FALSE(KTFile().ResolveAlias());
    MakeShellLink("circle.lnk", Wide("circle.lnk"));
    EXPECT_FALSE(KTFile(Path("circle.lnk")).ResolveAlias());
}
