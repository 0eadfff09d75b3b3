// PathFormsTest.cpp: every way to write a path, the parts of a path, relative paths, the list of temporary files. The
// disk is not asked, so the same program runs natively.

#include "KTFileUtil.h"
#include "KTTempFileHolder.h"
#include "LogLines.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

KTString Full(KTString const &path) { return KTFileUtil::GetFullPath(KTFile(path)); }

bool IsValid(KTString const &path) { return KTFileUtil::IsValidPath(KTPath(path)); }

std::string Repeated(std::string const &text, int times) {
    std::string all;
    for (int i = 0; i < times; ++i) {
        all += text;
    }
    return all;
}

KTString Text(std::string const &ascii) { return KTString(ascii.c_str()); }

KTString RelativeTo(char const *folder, char const *file) {
    return KTFileUtil::GetRelativePathIfPossible(KTPath(KTString(folder)), KTPath(KTString(file)));
}

} // namespace

TEST(PathForms, FullPathsAreCleanedAsText) {
    EXPECT_EQ(Full("C:\\a\\b.txt"), "C:\\a\\b.txt");
    EXPECT_EQ(Full("c:/a/b.txt"), "C:\\a\\b.txt");
    EXPECT_EQ(Full("C:\\a\\b\\"), "C:\\a\\b");
    EXPECT_EQ(Full("C:\\a\\\\b//"), "C:\\a\\b");
    EXPECT_EQ(Full("C:\\a\\.\\b\\.."), "C:\\a");
    EXPECT_EQ(Full("C:\\a\\..\\..\\..\\b"), "C:\\b") << "nothing leads out of the root";
    EXPECT_EQ(Full("C:\\.."), "C:\\");
    EXPECT_EQ(Full("C:\\"), "C:\\");
    EXPECT_EQ(Full("C:/"), "C:\\");
}

TEST(PathForms, RelativePathsBeginAtTheCurrentFolder) {
    KTString const here = Full(".");
    ASSERT_GT(here.size(), 3U);
    EXPECT_EQ(Full("a"), here + "\\a");
    EXPECT_EQ(Full("a/../b/"), here + "\\b");
    EXPECT_EQ(Full("..\\a"), KTPath(here).GetParentKTPath().GetPathAsKTString() == here.substr(0, 3)
                                 ? here.substr(0, 3) + "a"
                                 : KTPath(here).GetParentKTPath().GetPathAsKTString() + "\\a");
    EXPECT_EQ(Full("\\a\\b"), here.substr(0, 3) + "a\\b");
    EXPECT_EQ(Full("/a"), here.substr(0, 3) + "a");
    EXPECT_EQ(Full(here.substr(0, 2) + "a"), here + "\\a");
    EXPECT_EQ(Full(here.substr(0, 2)), here);
}

TEST(PathForms, SharesAndPrefixes) {
    EXPECT_EQ(Full("\\\\server\\share\\a"), "\\\\server\\share\\a");
    EXPECT_EQ(Full("//server/share/a/"), "\\\\server\\share\\a");
    EXPECT_EQ(Full("\\\\server\\share"), "\\\\server\\share");
    EXPECT_EQ(Full("\\\\server\\share\\..\\..\\a"), "\\\\server\\share\\a");
    EXPECT_EQ(Full("\\\\?\\C:\\a/b"), "C:\\a\\b");
    EXPECT_EQ(Full("\\\\?\\unc\\server\\share\\a"), "\\\\server\\share\\a");
    EXPECT_EQ(Full("\\\\?\\Volume{12345678-0000-0000-0000-100000000000}\\a"),
              "\\\\?\\Volume{12345678-0000-0000-0000-100000000000}\\a");
    for (char const *const bad :
         {"\\\\server", "\\\\server\\", "\\\\", "\\\\\\server\\share", "\\\\.\\C:", "\\\\.\\pipe\\a", "\\\\?\\",
          "\\\\?\\C:", "\\\\?\\UNC\\server", "\\\\?\\GLOBALROOT\\a", "\\\\se*rver\\b"}) {
        EXPECT_FALSE(IsValid(bad)) << bad;
        EXPECT_EQ(Full(bad), "") << bad;
    }
}

TEST(PathForms, FileUrls) {
    EXPECT_EQ(Full("file:///C:/a/b.txt"), "C:\\a\\b.txt");
    EXPECT_EQ(Full("FILE:///c|/a"), "C:\\a");
    EXPECT_EQ(Full("file://localhost/C:/a"), "C:\\a");
    EXPECT_EQ(Full("file:/C:/a"), "C:\\a");
    EXPECT_EQ(Full("file:///C:/a%20b/%E2%82%AC%c3%a4.txt"), KTString(U(u"C:\\a b\\\u20AC\u00E4.txt")));
    EXPECT_EQ(Full("file://server/share"), "\\\\server\\share");
    EXPECT_EQ(Full("file://server/share/a%20b/c"), "\\\\server\\share\\a b\\c");
    EXPECT_EQ(Full("file:////server/share/a"), "\\\\server\\share\\a");
    EXPECT_EQ(Full("file://server/100% share"), "\\\\server\\100% share");
    EXPECT_EQ(Full("file://server/50%zz"), "\\\\server\\50%zz");
    for (char const *const bad : {"file:", "file://", "file://server", "file:a", "file:///C:/a%2Fb", "file:///C:/a%5cb",
                                  "file:///C:/a%00", "file:///C:/%FF", "file:///C:/a?b", "file:///C:/a%3Fb"}) {
        EXPECT_FALSE(IsValid(bad)) << bad;
    }
    EXPECT_FALSE(IsValid("http://server/share")) << "a colon cannot be in a name";
}

TEST(PathForms, NamesThatWindowsCannotHoldAreRefused) {
    for (char const *const bad :
         {"a.",    "a ",  "...", "a<b",     "a>b",        "a:b",  "a\"b",     "a|b",      "a?",     "*",      "a\x01",
          "a\x1F", "con", "NUL", "Aux.txt", "PRN.tar.gz", "COM1", "lpt9.log", "nul .txt", "CONIN$", "conout$"}) {
        EXPECT_FALSE(IsValid(Text(std::string("C:\\x\\") + bad))) << bad;
        EXPECT_FALSE(IsValid(Text(std::string("C:\\") + bad + "\\x"))) << bad;
        EXPECT_TRUE(!IsValid(bad) || bad[1] == ':') << bad; // which is a file in drive A's current folder
        EXPECT_FALSE(IsValid(Text(std::string("\\\\server\\share\\") + bad))) << bad;
    }
    EXPECT_FALSE(IsValid(U(u"C:\\COM\u00B9")));
    EXPECT_FALSE(IsValid(FromUnits({'C', ':', '\\', 'a', 0, 'b'})));
    EXPECT_FALSE(IsValid(""));
    for (char const *const good : {"console", "COM", "COM0", "COM10", "LPTx", "nul1", "acon", ".a", "..a", "a..b", " a",
                                   "a b", "auxiliary.txt", "a%b", "~", "#", "a;b", "a'b"}) {
        EXPECT_TRUE(IsValid(Text(std::string("C:\\") + good))) << good;
        EXPECT_EQ(Full(Text(std::string("C:\\") + good)), Text(std::string("C:\\") + good));
    }
}

TEST(PathForms, NonAsciiAndUnpairedSurrogatesPassUnchanged) {
    KTString const odd = FromUnits({'C', ':', '\\', 0xD800, 'a', 0xDC00, '\\', 0x20AC, 0x80, 0xFFFF});
    EXPECT_EQ(Full(odd), odd);
    EXPECT_EQ(Full(odd + "\\"), odd);
}

TEST(PathForms, Lengths) {
    KTString const deep = Text("C:" + Repeated("\\0123456789", 200));
    EXPECT_EQ(Full(deep), deep);
    EXPECT_TRUE(IsValid(Text("C:\\" + std::string(255, 'n'))));
    EXPECT_FALSE(IsValid(Text("C:\\" + std::string(256, 'n'))));
    KTString const longest = Text("C:" + Repeated("\\0123456789", 2972)); // 32,694 units
    EXPECT_EQ(Full(longest), longest);
    EXPECT_FALSE(IsValid(longest + "\\12345678"));
    EXPECT_FALSE(IsValid(longest + "/12345678"));
}

TEST(PathParts, NameBaseAndExtension) {
    struct Row {
        char const *path;
        char const *name;
        char const *base;
        char const *extension;
    };
    constexpr Row kRows[] = {
        {"C:\\a\\notes.txt", "notes.txt", "notes", ".txt"},
        {"source/private/utils/KTLogger", "KTLogger", "KTLogger", ""},
        {"C:\\a.b\\c", "c", "c", ""},
        {"a.tar.gz", "a.tar.gz", "a.tar", ".gz"},
        {"C:\\.profile", ".profile", ".profile", ""},
        {"C:\\a\\b.c\\", "b.c", "b", ".c"},
        {"a.", "a.", "a", "."},
        {"C:x.y", "x.y", "x", ".y"},
        {"C:\\", "", "", ""},
        {"\\\\server\\share.x", "", "", ""},
        {"\\\\server\\share\\a.b", "a.b", "a", ".b"},
        {"", "", "", ""},
        {"\\", "", "", ""},
    };
    for (Row const &row : kRows) {
        KTString const path(row.path);
        EXPECT_EQ(KTFileUtil::GetFileName(path), row.name) << row.path;
        EXPECT_EQ(KTFileUtil::GetBaseFileName(path), row.base) << row.path;
        EXPECT_EQ(KTFileUtil::GetExtension(path), row.extension) << row.path;
        EXPECT_EQ(KTFileUtil::GetFileName(KTFile(path)), row.name) << row.path;
        EXPECT_EQ(KTFileUtil::GetBaseFileName(KTFile(path)), row.base) << row.path;
        EXPECT_EQ(KTFileUtil::GetExtension(KTFile(path)), row.extension) << row.path;
    }
}

TEST(PathParts, FolderWithAndWithoutSeparator) {
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(KTString("C:\\a\\b.c")), 0), "C:\\a");
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(KTString("C:\\a\\b.c")), 1), "C:\\a\\");
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(KTString("C:\\b")), 1), "C:\\");
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(KTString("C:\\b")), 0), "C:\\");
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(KTString("C:b")), 1), "C:") << "C:\\ is another folder";
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(KTString("b")), 1), "");
    EXPECT_EQ(KTFileUtil::GetPathOnly(KTFile(), 1), "");
}

TEST(PathParts, Components) {
    auto const joined = [](char const *path) {
        KTString text;
        for (OString const &part : OPath(KTString(path).GetOString()).GetComponents()) {
            text += KTString(part) + "|";
        }
        return text;
    };
    EXPECT_EQ(joined("C:\\a\\b"), "C:|a|b|");
    EXPECT_EQ(joined("C:/a//b/"), "C:|a|b|");
    EXPECT_EQ(joined("C:a"), "C:|a|");
    EXPECT_EQ(joined("\\\\server\\share\\a"), "\\\\server\\share|a|");
    EXPECT_EQ(joined("\\a"), "\\|a|");
    EXPECT_EQ(joined("a/b"), "a|b|");
    EXPECT_EQ(joined(""), "");
    EXPECT_EQ(joined("\\"), "\\|");
}

TEST(PathParts, Separator) { EXPECT_EQ(KTFileUtil::GetDirectorySeparator(), "\\"); }

TEST(PathParts, APathMayBeAppendedToItself) {
    OPath path(OString::FromUTF8("ab"));
    path.Append(path.GetString());
    EXPECT_EQ(KTString(path.GetString()), "ab\\ab");
}

TEST(RelativePath, IsTheRestBelowTheFolder) {
    EXPECT_EQ(RelativeTo("C:\\a", "C:\\a\\b\\c.txt"), "b\\c.txt");
    EXPECT_EQ(RelativeTo("C:\\a\\", "C:/A/b/c.txt"), "b\\c.txt");
    EXPECT_EQ(RelativeTo("C:\\", "C:\\a"), "a");
    EXPECT_EQ(RelativeTo("\\\\s\\h", "\\\\s\\h\\a"), "a");
    EXPECT_EQ(RelativeTo("C:\\a", "C:\\a"), "");
    EXPECT_EQ(RelativeTo("", "a\\b"), "a\\b");
}

TEST(RelativePath, AFileElsewhereKeepsItsPath) {
    LogLines log;
    EXPECT_EQ(RelativeTo("C:\\a", "C:\\ab\\c"), "C:\\ab\\c");
    EXPECT_EQ(RelativeTo("C:\\a", "D:\\a\\c"), "D:\\a\\c");
    EXPECT_EQ(RelativeTo("C:\\a\\b", "C:\\a\\c"), "C:\\a\\c");
    EXPECT_EQ(log.Take(), std::vector<std::string>{});
}

TEST(RelativePath, ADeeperFolderIsReported) {
    LogLines log;
    EXPECT_EQ(RelativeTo("C:\\a\\b\\c", "C:\\a\\b"), "C:\\a\\b");
    EXPECT_EQ(log.Take(), std::vector<std::string>{
                              "Assert failed: Relative Path cant be evaluated as the folder path is deeper than the "
                              "file path at source/private/utils/KTFileUtils:412"});
}

TEST(TempFileHolder, HoldsEachFileOnce) {
    KTFile const a(KTString("C:\\a"));
    KTFile const b(KTString("C:\\b"));
    KTFile const c(KTString("C:\\c"));
    KTTempFileHolder holder;
    EXPECT_TRUE(holder.GetFileList().empty());
    EXPECT_EQ(holder.AddFile(a), kKTErrorNone);
    EXPECT_EQ(holder.AddFile(a), kKTErrorFailed);
    EXPECT_EQ(holder.AddFile(std::vector<KTFile>{b, a, c}), kKTErrorFailed);
    EXPECT_EQ(holder.GetFileList(), (std::vector<KTFile>{a, b, c}));
    EXPECT_EQ(holder.AddFile(std::vector<KTFile>{}), kKTErrorNone);
    EXPECT_EQ(KTTempFileHolder(b).GetFileList(), std::vector<KTFile>{b});
    EXPECT_EQ(KTTempFileHolder(std::vector<KTFile>{c, b, c}).GetFileList(), (std::vector<KTFile>{c, b}));
    holder.GetFileList().clear();
    EXPECT_EQ(holder.GetFileList().size(), 3U) << "what it gives is a copy";
}
