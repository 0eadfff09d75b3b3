// PathTest.cpp: path values and the system's temporary folder.

#include "KTFileUtil.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <filesystem>

namespace {

KTString Appended(char const *path, char const *element) {
    KTPath value{KTString(path)};
    value.Append(element);
    return value.GetPathAsKTString();
}

KTString ParentOf(char const *path) { return KTPath(KTString(path)).GetParentKTPath().GetPathAsKTString(); }

} // namespace

TEST(Path, AppendJoinsWithOneSeparator) {
    EXPECT_EQ(Appended("C:\\a", "b"), "C:\\a\\b");
    EXPECT_EQ(Appended("C:\\a\\", "b"), "C:\\a\\b");
    EXPECT_EQ(Appended("C:/a/", "b"), "C:/a/b");
    EXPECT_EQ(Appended("C:\\a", "\\b"), "C:\\a\\b");
    EXPECT_EQ(Appended("C:\\a\\", "\\b\\"), "C:\\a\\b\\");
    EXPECT_EQ(Appended("", "b"), "b");
    EXPECT_EQ(Appended("", "\\b"), "\\b");
    EXPECT_EQ(Appended("a", ""), "a");
    EXPECT_EQ(Appended("a", "\\"), "a");
    EXPECT_EQ(Appended("a", "b/c"), "a\\b/c");
}

TEST(Path, PlusAppends) {
    KTPath path{KTString("a")};
    EXPECT_EQ(&(path += "b"), &path);
    EXPECT_EQ((path += U(u"\u20AC")).GetPathAsKTString(), U(u"a\\b\\\u20AC"));
}

TEST(Path, ParentIsTheContainingFolder) {
    EXPECT_EQ(ParentOf("C:\\a\\b.txt"), "C:\\a");
    EXPECT_EQ(ParentOf("C:\\a\\b\\"), "C:\\a");
    EXPECT_EQ(ParentOf("C:/a/b"), "C:/a");
    EXPECT_EQ(ParentOf("C:\\a\\\\b"), "C:\\a");
    EXPECT_EQ(ParentOf("C:\\a"), "C:\\");
    EXPECT_EQ(ParentOf("C:\\"), "");
    EXPECT_EQ(ParentOf("C:a"), "C:");
    EXPECT_EQ(ParentOf("a\\b"), "a");
    EXPECT_EQ(ParentOf("a"), "");
    EXPECT_EQ(ParentOf(""), "");
    EXPECT_EQ(ParentOf("\\a"), "\\");
    EXPECT_EQ(ParentOf("\\"), "");
    EXPECT_EQ(ParentOf("\\\\server\\share\\a"), "\\\\server\\share");
    EXPECT_EQ(ParentOf("\\\\server\\share\\a\\b"), "\\\\server\\share\\a");
    EXPECT_EQ(ParentOf("\\\\server\\share"), "");
    EXPECT_EQ(ParentOf("\\\\server"), "");
}

TEST(Path, ComparesAndCopiesAsText) {
    KTPath const path{KTString("C:\\a")};
    KTPath copy(path);
    EXPECT_TRUE(copy == path);
    EXPECT_FALSE(copy != path);
    copy.SetPath("C:\\b");
    EXPECT_TRUE(copy != path);
    copy = path;
    EXPECT_TRUE(copy == path);
    EXPECT_TRUE(KTPath{KTString("C:\\A")} != path);
    EXPECT_TRUE(KTPath() == KTPath{KTString()});
}

TEST(Path, BackSlashesBecomeFrontSlashes) {
    KTPath path{KTString("C:\\a/b\\c")};
    path.ReplaceAllBackSlashWithFrontSlash();
    EXPECT_EQ(path.GetPathAsKTString(), "C:/a/b/c");
}

TEST(File, IsNamedByAPathInEveryForm) {
    KTString const text("C:\\a\\b");
    KTFile const file(text);
    EXPECT_EQ(file.GetPathString(), text);
    EXPECT_TRUE(file.GetPath() == KTPath(text));
    EXPECT_TRUE(file == KTFile(KTPath(text)));
    EXPECT_TRUE(file == KTFile(text.GetOString()));
    EXPECT_TRUE(file == KTFile(OPath(text.GetOString())));
    EXPECT_TRUE(file == KTFile(OFile(OPath(text.GetOString()))));
    EXPECT_TRUE(file != KTFile());
    KTFile copy;
    copy = file;
    EXPECT_TRUE(copy == file);
    auto const *const allocated = new KTFile(copy);
    EXPECT_TRUE(*allocated == file);
    delete allocated;
}

TEST(FileUtil, TheSystemTempFolderExistsAndHasNoTrailingSeparator) {
    KTString const folder = KTFileUtil::GetSystemTempFolder().GetPathString();
    ASSERT_FALSE(folder.empty());
    EXPECT_EQ(KTString("\\/").find(folder[folder.size() - 1]), KTString::npos);
    EXPECT_TRUE(std::filesystem::is_directory(std::filesystem::path(folder.GetWstring())));
}
