// WReaderFileTest.cpp: the readers on files that the system does not let be read, and in its ANSI code page.

#include "KTClosedCaptionFileReader.h"
#include "KTSimpleIniFileReader.h"

#include "LogLines.h"
#include "WFileFixture.h"
#include "WImportHook.h"

namespace {

class WReaderFile : public WFileFixture {};

KTString InAnsi(std::string const &bytes) {
    wchar_t text[64] = {};
    MultiByteToWideChar(CP_ACP, 0, bytes.c_str(), -1, text, 64);
    return {text};
}

TEST_F(WReaderFile, ReadsLinesThatAreNotUtf8InTheAnsiCodePage) {
    KTString const path = File("a.ini", "[caf\xE9]\na=\xA9\xE9\x80\nb=caf\xC3\xA9\n").GetPathString();
    KTSimpleIniFileReader settings(path);
    KTString value;
    EXPECT_TRUE(settings.GetStringValForVariable(InAnsi("caf\xE9"), "a", value));
    EXPECT_EQ(InAnsi("\xA9\xE9\x80"), value);
    EXPECT_TRUE(settings.GetStringValForVariable(InAnsi("caf\xE9"), "b", value));
    EXPECT_EQ(KTString("caf\xC3\xA9"), value);
    KTClosedCaptionFileReader captions;
    auto const rows = captions.GetLinesFromFile(path, 4);
    ASSERT_EQ(3U, rows.size());
    EXPECT_EQ(InAnsi("a=\xA9\xE9\x80"), rows[1][0]);
}

// Bytes that the system still reads for the library.
DWORD g_readable = 0;

BOOL WINAPI ReadFileUntilDamage(HANDLE file, LPVOID buffer, DWORD count, LPDWORD moved, LPOVERLAPPED overlapped) {
    if (count > g_readable) {
        *moved = 0;
        SetLastError(ERROR_CRC);
        return FALSE;
    }
    g_readable -= count;
    return ReadFile(file, buffer, count, moved, overlapped);
}

// Not a single byte, the mark alone, and some chunks.
TEST_F(WReaderFile, GivesNothingOfAFileThatCannotBeReadToItsEnd) {
    std::string content;
    for (int i = 0; i < 1000; ++i) {
        content.append("n").append(std::to_string(i)).append("=1\n");
    }
    KTString const path = File("a.ini", content).GetPathString();
    WImportHook const hook(L"KTPublic.dll", "ReadFile", &ReadFileUntilDamage);
    ASSERT_TRUE(hook.IsActive());
    for (DWORD const readable : {0U, 2U, 5000U}) {
        g_readable = readable;
        LogLines log;
        KTSimpleIniFileReader settings(path);
        KTString value;
        EXPECT_FALSE(settings.GetStringValForVariable("", "n0", value)) << readable;
        g_readable = readable;
        KTClosedCaptionFileReader captions;
        EXPECT_TRUE(captions.GetLinesFromFile(path, 4).empty()) << readable;
        EXPECT_EQ((std::vector<std::string>{"Assert failed:  at source/private/utils/KTSimpleIniFileReader:220",
                                            "Assert failed:  at source/private/utils/KTClosedCaptionFileReader:165"}),
                  log.Take())
            << readable;
    }
}

TEST_F(WReaderFile, CannotOpenAFolder) {
    LogLines log;
    KTSimpleIniFileReader settings(Folder("a").GetPathString());
    KTString value;
    EXPECT_FALSE(settings.GetStringValForVariable("", "", value));
    KTClosedCaptionFileReader captions;
    EXPECT_TRUE(captions.GetLinesFromFile(Folder("a").GetPathString(), 3).empty());
    EXPECT_EQ(std::vector<std::string>(), log.Take());
}

// Not only those whose names the ANSI code page has.
TEST_F(WReaderFile, OpensFilesOfAnyName) {
    KTString name("\xCE\xA9 \xF0\x9F\x9A\xA2.ini");
    KTSimpleIniFileReader settings(File(name, "a=1\n").GetPathString());
    int value = 0;
    EXPECT_TRUE(settings.GetIntValForVariable("", "a", value));
    EXPECT_EQ(1, value);
}

} // namespace
