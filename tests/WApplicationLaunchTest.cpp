// WApplicationLaunchTest.cpp: starting a program that records how it was called.

#include "KTApplicationLaunchUtil.h"

#include "WFileFixture.h"
#include "WHandlesLeft.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

constexpr KTUInt32 kNoId = 77;

class Launch : public WFileFixture {
  protected:
    // A copy of the recorder under that name.
    KTFile Program(KTString const &name) const {
        KTPath recorder = KTFileUtil::GetResourcesFolderPath();
        recorder.Append("ktrecorder.exe");
        KTFile program(Path(name));
        EXPECT_EQ(KTFileUtil::kErrorNone, KTFileUtil::FileCopy(KTFile(recorder), program));
        return program;
    }

    KTString Record() const { return Path("record").GetPathAsKTString(); }

    // Starts the program, waits for its end and returns what it recorded: its arguments behind the first, with bars.
    KTString Run(KTString const &path, std::vector<KTString> arguments) const {
        arguments.insert(arguments.begin(), Record());
        KTUInt32 id = 0;
        EXPECT_EQ(kKTErrorNone, KTApplicationLaunchUtil::LaunchApplication(path, arguments, &id));
        WaitFor(id);
        std::string const bytes = Content("record");
        KTFile(Path("record")).Delete();
        KTString text;
        text.append(reinterpret_cast<unsigned short const *>(bytes.data()), bytes.size() / 2);
        return text;
    }

    static void WaitFor(KTUInt32 id) {
        EXPECT_NE(0U, id);
        WOHandle const process(OpenProcess(SYNCHRONIZE, FALSE, id));
        if (process.IsValid()) { // else it has ended already
            EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(process.Get(), 60000));
        }
    }

    static void ExpectError(KTErrorCodeEnum error, KTString const &path, std::vector<KTString> const &arguments = {}) {
        KTUInt32 id = kNoId;
        EXPECT_EQ(error, KTApplicationLaunchUtil::LaunchApplication(path, arguments, &id)) << path.GetUTF8String();
        EXPECT_EQ(kNoId, id);
    }
};

BOOL g_Inherited = TRUE;
BOOL WINAPI RefuseProcess(wchar_t const *, wchar_t *, SECURITY_ATTRIBUTES *, SECURITY_ATTRIBUTES *, BOOL inherit, DWORD,
                          void *, wchar_t const *, STARTUPINFOW *, PROCESS_INFORMATION *) {
    g_Inherited = inherit;
    SetLastError(740); // needs more rights; not every header has its name
    return FALSE;
}

} // namespace

TEST_F(Launch, TheSuffixIsOptional) {
    KTString const path = Program("kt tool.exe").GetPathString();
    KTString const bare = path.substr(0, path.size() - 4);
    EXPECT_EQ(KTString("a\n"), Run(path, {"a"}));
    EXPECT_EQ(KTString("b\n"), Run(bare, {"b"}));
    EXPECT_EQ(KTString("c\n"), Run(bare + ".EXE", {"c"}));
}

TEST_F(Launch, TheSuffixIsAppendedToOtherExtensions) {
    KTString const path = Program("kt tool.v2.exe").GetPathString();
    EXPECT_EQ(KTString("a\n"), Run(path.substr(0, path.size() - 4), {"a"}));
    Program("tool.com");
    ExpectError(kKTErrorFileNotFound, Path("tool.com").GetPathAsKTString());
}

TEST_F(Launch, ProgramsThatAreNotThere) {
    ExpectError(kKTErrorFileNotFound, Path("missing").GetPathAsKTString());
    ExpectError(kKTErrorFileNotFound, Path("missing.exe").GetPathAsKTString());
    ExpectError(kKTErrorFileNotFound, Path("no folder\\missing").GetPathAsKTString());
    ExpectError(kKTErrorFileNotFound, "");
    ExpectError(kKTErrorFileNotFound, "a<b");
    ExpectError(kKTErrorFileNotFound, "ktrecorder"); // only the current folder is searched
    Folder("folder.exe");
    ExpectError(kKTErrorFileNotFound, Path("folder").GetPathAsKTString());
    ExpectError(kKTErrorFileNotFound, Path("folder.exe").GetPathAsKTString());
}

TEST_F(Launch, EachArgumentArrivesAsOne) {
    KTString const path = Program("kt tool.exe").GetPathString();
    std::vector<KTString> const arguments = {"plain",
                                             "with blank",
                                             "tab\tinside",
                                             "",
                                             "quo\"te",
                                             "\"",
                                             "\\",
                                             "back\\slash",
                                             "ends\\",
                                             "blank and ends\\",
                                             "two\\\\",
                                             "blank two\\\\",
                                             "b\\\"q",
                                             "b\\\\\"q q",
                                             "a\\\\b c",
                                             KTString(L"\u00FCn\u00EF \u8AB2\u7A0B \U0001F41D"),
                                             "%PATH%",
                                             "^&<>()!",
                                             "'single quotes'",
                                             "last"};
    KTString expected;
    for (KTString const &argument : arguments) {
        expected += (expected.empty() ? KTString() : KTString("|")) + argument;
    }
    EXPECT_EQ(expected + "\n", Run(path, arguments));
}

TEST_F(Launch, PathsOfEveryForm) {
    KTFile const program = Program(KTString(L"inn\u00E9r tool.exe"));
    KTPath path = program.GetPath();
    path.ReplaceAllBackSlashWithFrontSlash();
    EXPECT_EQ(KTString("a\n"), Run(path.GetPathAsKTString(), {"a"}));
    EXPECT_EQ(KTString("b\n"), Run(KTString("file:///") + path.GetPathAsKTString(), {"b"}));
    std::filesystem::path const before = std::filesystem::current_path();
    std::filesystem::current_path(Wide(""));
    EXPECT_EQ(KTString("c\n"), Run(KTString(L"inn\u00E9r tool"), {"c"}));
    EXPECT_EQ(KTString("d\n"), Run(KTString(L".\\inn\u00E9r tool"), {"d"}));
    std::filesystem::current_path(before);
}

TEST_F(Launch, AsLongAsACommandLineMayBe) {
    KTString const path = Program("kt tool.exe").GetPathString();
    std::size_t const others = path.size() + 2 + 1 + Record().size() + 1;
    KTString const longest(std::string(32'766 - others, 'x').c_str());
    EXPECT_TRUE(longest + "\n" == Run(path, {longest}));
    ExpectError(kKTErrorFailed, path, {Record(), longest + "x"});
}

TEST_F(Launch, TheIdMayBeLeftOut) {
    KTString const path = Program("kt tool.exe").GetPathString();
    EXPECT_EQ(kKTErrorNone, KTApplicationLaunchUtil::LaunchApplication(path, {Record(), "x"}));
    for (int attempt = 0; attempt < 200 && Content("record").empty(); ++attempt) {
        Sleep(50); // without its id nobody tells when it has ended
    }
    EXPECT_EQ(std::string("x\0\n\0", 4), Content("record"));
}

TEST_F(Launch, WhatTheSystemCannotStart) {
    File("text.exe", "this is no program");
    ExpectError(kKTErrorFailed, Path("text.exe").GetPathAsKTString());
    KTString const path = Program("kt tool.exe").GetPathString();
    KTString withZero("a");
    withZero.push_back(0);
    ExpectError(kKTErrorFailed, path, {withZero});
    ExpectError(kKTErrorFailed, path, {KTString(std::string(32'767, 'x').c_str())});
    EXPECT_FALSE(KTFile(Path("record")).Exists());
    WImportHook const hook(L"KTPublic.dll", "CreateProcessW", RefuseProcess);
    ASSERT_TRUE(hook.IsActive());
    ExpectError(kKTErrorFailed, path);
    EXPECT_FALSE(g_Inherited);
}

TEST_F(Launch, LeavesNoHandle) {
    KTString const path = Program("kt tool.exe").GetPathString();
    ExpectNoHandleLeft([&] {
        KTUInt32 id = 0;
        KTApplicationLaunchUtil::LaunchApplication(path, {}, &id);
        WaitFor(id);
    });
}
