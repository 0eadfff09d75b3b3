// WLongPathTest.cpp: every operation on paths that the system's plain calls refuse: deep, on a share, by URL, with
// names in any units.

#include "KTFileUtil.h"
#include "WFileFixture.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <string>
#include <vector>

namespace {

using WLongPath = WFileFixture;

// All that can be done to a file and a folder below a place that does not exist yet.
void TryEverything(KTPath const &place) {
    using Util = KTFileUtil;
    SCOPED_TRACE(place.GetPathAsKTString().GetUTF8String());
    ASSERT_EQ(Util::CreateDirectoryW(place, true), Util::kErrorNone);
    EXPECT_TRUE(Util::IsFolder(KTFile(place)));
    KTPath path(place);
    path.Append("one.txt");
    KTFile file(path);
    EXPECT_TRUE(file.ParentExists());
    EXPECT_FALSE(file.Exists());
    ASSERT_TRUE(file.MakeFile(false));
    EXPECT_TRUE(file.Exists());
    EXPECT_TRUE(file.Touch());
    EXPECT_TRUE(file.CanOpen(KTFile::kAccessReadWrite, KTFile::kShareNone));
    EXPECT_EQ(file.GetSize(), 0U);
    EXPECT_GT(file.GetTimeAttribute(KTFile::kTimeModified), 0U);
    EXPECT_GT(Util::GetFileFreeSpace(path), 0U);
    KTPath other(place);
    other.Append("two.txt");
    EXPECT_EQ(Util::FileCopy(file, KTFile(other)), Util::kErrorNone);
    EXPECT_EQ(Util::FileCopy(file, KTFile(other)), Util::kErrorAlreadyExists);
    EXPECT_EQ(Util::MoveFileW(file, KTFile(other), true), Util::kErrorNone);
    EXPECT_EQ(Util::RenameFile(KTFile(other), "three.txt"), Util::kErrorNone);
    EXPECT_TRUE(Util::GetUniqueFile(place, ".u").Exists());
    KTPath const folder = Util::CreateUniqueDir(place, "d");
    EXPECT_TRUE(Util::IsFolder(KTFile(folder)));
    EXPECT_TRUE(Util::GetUniqueFile(folder, ".u").Exists());
    std::vector<KTString> names;
    EXPECT_EQ(Util::GetFileNamesInFolderAtPathRecursively(place, names), Util::kErrorNone);
    EXPECT_EQ(names.size(), 3U);
    KTPath copy = place.GetParentKTPath();
    copy.Append("copy");
    EXPECT_EQ(Util::FolderCopy(place, copy), Util::kErrorNone);
    EXPECT_EQ(Util::DeleteDirectory(copy), Util::kErrorNone);
    path = place;
    path.Append("three.txt");
    KTFile third(path);
    path = place;
    path.Append("four.txt");
    EXPECT_TRUE(third.SetPath(path));
    EXPECT_TRUE(third.Delete());
    EXPECT_EQ(Util::DeleteDirectory(place), Util::kErrorNone);
    EXPECT_FALSE(KTFile(place).Exists());
}

KTString ShareRoot() { return "\\\\ktserver\\share"; }

bool IsShareThere() { return KTFileUtil::IsFolder(KTFile(ShareRoot())); }

} // namespace

TEST_F(WLongPath, DeeperThan260And1024Characters) {
    KTPath path = Path("");
    while (path.GetPathAsKTString().size() < 300) {
        path.Append("a folder with a long name");
    }
    TryEverything(path);
    while (path.GetPathAsKTString().size() < 1100) {
        path.Append(KTString(L"one more f\u00F6lder, and deeper"));
    }
    TryEverything(path);
    KTPath const parent = path.GetParentKTPath();
    EXPECT_TRUE(KTFileUtil::IsFolder(KTFile(parent)));
    EXPECT_EQ(KTFileUtil::DeleteDirectory(Path("a folder with a long name")), KTFileUtil::kErrorNone);
    EXPECT_EQ(Count(""), 0);
}

TEST_F(WLongPath, SlashesDotsAndTrailingSeparators) {
    KTString slashes = Path("a/b/").GetPathAsKTString();
    for (unsigned short &unit : slashes) {
        unit = unit == '\\' ? static_cast<unsigned short>('/') : unit;
    }
    TryEverything(KTPath(slashes));
    TryEverything(KTPath(Path("x\\..\\.\\y").GetPathAsKTString() + "\\"));
    TryEverything(KTPath(KTString("\\\\?\\") + Path("extended").GetPathAsKTString()));
}

TEST_F(WLongPath, RelativePaths) {
    std::filesystem::path const before = std::filesystem::current_path();
    std::filesystem::current_path(Wide(""));
    TryEverything(KTPath(KTString("relative\\inner")));
    TryEverything(KTPath(KTString("relative/../other")));
    EXPECT_EQ(Count(""), 1) << "the folder that was made on the way";
    std::filesystem::current_path(before);
}

TEST_F(WLongPath, FileUrls) {
    KTPath path = Path("a b");
    path.ReplaceAllBackSlashWithFrontSlash();
    KTString url = KTString("file:///") + path.GetPathAsKTString();
    TryEverything(KTPath(url));
    url.ReplaceAll2(" ", "%20");
    TryEverything(KTPath(url));
    EXPECT_EQ(KTFileUtil::CreateDirectoryW(KTPath(url)), KTFileUtil::kErrorNone);
    EXPECT_TRUE(KTFile(Path("a b")).Exists());
}

TEST_F(WLongPath, NamesInAnyScript) { TryEverything(Path(KTString(L"\u8AB2\u7A0B \u03B1\u03B2 \U0001F41D \u00E4"))); }

// Where the disk takes any units, as NTFS does, such names work like others; a disk that keeps names as UTF-8 refuses
// them. They are never altered.
TEST_F(WLongPath, UnpairedSurrogatesAreHandedOn) {
    Units units = UnitsOf(Path("x").GetPathAsKTString());
    units.back() = 0xD800;
    KTPath const path(FromUnits(units));
    EXPECT_TRUE(KTFileUtil::IsValidPath(path));
    KTFile const file(path);
    if (file.MakeFile(false)) {
        EXPECT_TRUE(file.Exists());
        std::vector<KTString> names;
        EXPECT_EQ(KTFileUtil::GetFileNamesInFolderAtPath(Path(""), names), KTFileUtil::kErrorNone);
        EXPECT_EQ(names, std::vector<KTString>{FromUnits({0xD800})});
        EXPECT_TRUE(file.Delete());
    } else {
        EXPECT_FALSE(file.Exists());
        EXPECT_EQ(Count(""), 0);
    }
}

TEST_F(WLongPath, Shares) {
    if (!IsShareThere()) {
        GTEST_SKIP() << "no share to test with";
    }
    EXPECT_TRUE(KTFile(KTString("\\\\ktserver\\share")).Exists());
    EXPECT_TRUE(KTFile(KTString("\\\\ktserver\\share\\")).Exists());
    EXPECT_TRUE(KTFile(KTString("file://ktserver/share")).Exists());
    EXPECT_FALSE(KTFile(KTString("file://ktserver/none")).Exists());
    EXPECT_FALSE(KTFile(KTString("\\\\noserver\\share")).Exists());
    KTFileUtil::DeleteDirectory(KTPath(ShareRoot() + "\\work"));
    TryEverything(KTPath(ShareRoot() + "\\work\\a"));
    TryEverything(KTPath(KTString("//ktserver/share/work/b/")));
    TryEverything(KTPath(KTString("file://ktserver/share/work/c%20d")));
    TryEverything(KTPath(KTString("\\\\?\\UNC\\ktserver\\share\\work\\e")));
    KTPath deep(ShareRoot() + "\\work");
    while (deep.GetPathAsKTString().size() < 1100) {
        deep.Append("a folder with a long name");
    }
    TryEverything(deep);
    EXPECT_EQ(KTFileUtil::DeleteDirectory(KTPath(ShareRoot() + "\\work")), KTFileUtil::kErrorNone);
}

TEST_F(WLongPath, ACourseMovesFromAShareToTheDisk) {
    if (!IsShareThere()) {
        GTEST_SKIP() << "no share to test with";
    }
    KTPath const there(ShareRoot() + "\\moving");
    KTFileUtil::DeleteDirectory(there);
    File("tree\\sub\\a.txt", "content");
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(Path("tree")), KTFile(there)), KTFileUtil::kErrorNone);
    EXPECT_FALSE(KTFile(Path("tree")).Exists());
    EXPECT_EQ(KTFileUtil::MoveFileW(KTFile(there), KTFile(Path("back"))), KTFileUtil::kErrorNone);
    EXPECT_EQ(Content("back\\sub\\a.txt"), "content");
}
