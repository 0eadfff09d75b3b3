// DemoTest.cpp: the demo host as a user meets it: run as a child process, judged by its output and exit status.
//
// The child gets a temporary folder of its own, as its start empties the log there.
//
// Longer than other files: the sections of one output are judged with one fixture and its readers of tables.

#include "KTInterProcessFileLock.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <memory>
#include <regex>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;
using std::string_literals::operator""s;

struct CloseAnyHandle {
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};
using Handle = std::unique_ptr<HANDLE, CloseAnyHandle>;

// Files instead of pipes would do as well, but a pipe is what most callers of a console program give it.
struct Pipe {
    Handle read;
    Handle write;

    Pipe() {
        SECURITY_ATTRIBUTES inherited{sizeof inherited, nullptr, TRUE};
        HANDLE readEnd = nullptr;
        HANDLE writeEnd = nullptr;
        constexpr DWORD kRoomForAll = 1U << 20; // both pipes are read one after the other: neither may fill up
        if (CreatePipe(&readEnd, &writeEnd, &inherited, kRoomForAll) == FALSE) {
            throw std::runtime_error("CreatePipe");
        }
        read.reset(readEnd);
        write.reset(writeEnd);
        SetHandleInformation(readEnd, HANDLE_FLAG_INHERIT, 0);
    }

    std::string ReadToEnd() {
        write.reset(); // the child's end is the last one then
        std::string text;
        char part[4096];
        DWORD got = 0;
        while (ReadFile(read.get(), part, sizeof part, &got, nullptr) != FALSE && got != 0) {
            text.append(part, got);
        }
        return text;
    }
};

struct Outcome {
    DWORD status = 0;
    std::string out;
    std::string err;

    bool Has(std::string const &text) const { return out.find(text) != std::string::npos; }

    // The line of the table whose first cell is `name`, each run of blanks made one.
    std::string Row(std::string const &name) const {
        std::size_t const start = out.find("\n  " + name + " ");
        if (start == std::string::npos) {
            return "";
        }
        std::string row = out.substr(start + 3, out.find('\n', start + 1) - start - 3);
        row.erase(std::unique(row.begin(), row.end(), [](char a, char b) { return a == ' ' && b == ' '; }), row.end());
        return row;
    }
};

fs::path ProgramBesideThis() {
    std::wstring self(32768, L'\0');
    self.resize(GetModuleFileNameW(nullptr, self.data(), static_cast<DWORD>(self.size())));
    return fs::path(self).replace_filename(L"ktdemo.exe");
}

std::wstring Quoted(std::wstring const &argument) { return L"\"" + argument + L"\""; }

class Demo : public testing::Test {
  protected:
    Demo() {
        // The first window of all has Wine start a program for the desktop, which would inherit the demo's end of the
        // pipe and keep it open: it is started here, without the pipe. Every demo has a window, the timer service's.
        GetDesktopWindow();
        static fs::path const ownTemp = fs::temp_directory_path();
        m_Work = ownTemp / testing::UnitTest::GetInstance()->current_test_info()->name();
        fs::remove_all(m_Work);
        m_Temp = m_Work / "temp";
        m_Folder = m_Work / "folder";
        fs::create_directories(m_Temp);
        fs::create_directories(m_Folder);
        // Inherited by the child; this program's log is open already.
        SetEnvironmentVariableW(L"TEMP", m_Temp.c_str());
        SetEnvironmentVariableW(L"TMP", m_Temp.c_str());
    }

    void Write(fs::path const &name, std::string const &bytes) const {
        fs::create_directories((m_Folder / name).parent_path());
        std::ofstream(m_Folder / name, std::ios::binary) << bytes;
    }

    static Outcome Run(std::wstring const &arguments) {
        Pipe out;
        Pipe err;
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        startup.dwFlags = STARTF_USESTDHANDLES;
        startup.hStdOutput = out.write.get();
        startup.hStdError = err.write.get();
        PROCESS_INFORMATION information{};
        std::wstring command = Quoted(ProgramBesideThis().wstring()) + L" " + arguments;
        if (CreateProcessW(nullptr, command.data(), nullptr, nullptr, TRUE, 0, nullptr, nullptr, &startup,
                           &information) == FALSE) {
            throw std::runtime_error("cannot start ktdemo, error " + std::to_string(GetLastError()));
        }
        Handle const process(information.hProcess);
        Handle const thread(information.hThread);
        Outcome outcome;
        outcome.out = out.ReadToEnd();
        outcome.err = err.ReadToEnd();
        WaitForSingleObject(process.get(), INFINITE);
        GetExitCodeProcess(process.get(), &outcome.status);
        return outcome;
    }

    Outcome RunOnFolder() const { return Run(Quoted(m_Folder.wstring())); }

    fs::path m_Work;
    fs::path m_Temp;   // the child's temporary folder
    fs::path m_Folder; // a folder to run it on
};

Outcome CheckEmptyError(Outcome outcome) {
    EXPECT_TRUE(outcome.err.empty()) << outcome.err;
    return outcome;
}

std::size_t Lines(std::string const &text) {
    return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
}

std::string ReadAll(fs::path const &path) {
    std::ifstream stream(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), {}};
}

TEST_F(Demo, CourseTextsAreCountedExactly) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_EQ(outcome.Row("File"), "File Encoding Bytes Units Lines Words Non-ASCII U+FFFD Notes");
    EXPECT_EQ(outcome.Row("settings.ini"), "settings.ini UTF-8 1093 1092 43 125 1 0");
    EXPECT_EQ(outcome.Row("captions/intro.bytes.txt"), "captions/intro.bytes.txt bytes 523 523 8 86 6 0");
    EXPECT_EQ(outcome.Row("captions/intro.utf16.txt"), "captions/intro.utf16.txt UTF-16 LE 1048 523 8 102 7 0");
    EXPECT_EQ(outcome.Row("strings/en_US.txt"), "strings/en_US.txt UTF-16 LE 1772 885 19 89 34 0");
    EXPECT_EQ(outcome.Row("strings/de_DE.txt"), "strings/de_DE.txt UTF-16 LE 1866 932 19 87 39 0");
    EXPECT_FALSE(outcome.Has("\xEF\xBF\xBD")) << "U+FFFD in well-formed text";
}

TEST_F(Demo, CourseCaptionsAreReadFromBothForms) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    std::string const captions = outcome.out.substr(std::min(outcome.out.find("Captions\n"), outcome.out.size()));
    EXPECT_NE(captions.find("intro.bytes.txt         8    42.00  Welcome to the harbour of Sankt Jürgen.\n"),
              std::string::npos);
    EXPECT_NE(captions.find("intro.utf16.txt         8    42.00  Welcome to the harbour of Sankt Jürgen.\n"),
              std::string::npos);
}

TEST_F(Demo, CourseDictionariesStandSideBySide) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.Row("Key"), "Key de_DE en_US");
    EXPECT_EQ(outcome.Row("Course/Title"), "Course/Title Sicherheit im Hafen Harbour Safety");
    EXPECT_EQ(outcome.Row("Page/Quay"), "Page/Quay „Abstand zur Kaikante halten“ “Keep clear of the edge”");
    EXPECT_EQ(outcome.Row("Shop/Price"), "Shop/Price Schwimmweste, ab 49,90 € Life jacket, from €49.90");
    EXPECT_EQ(outcome.Row("Glossary/Port"),
              "Glossary/Port Hafen, auf Griechisch λιμάνι ⚓ 🚢 Port, in Greek λιμάνι ⚓ 🚢");
    EXPECT_TRUE(outcome.Has("... and 7 texts more; --all shows everything\n"));
    EXPECT_EQ(outcome.Row("Quiz/Failed"), "");
    EXPECT_EQ(Run(L"--all \"" KT_COURSE L"\"").Row("Quiz/Failed"),
              "Quiz/Failed Noch nicht: bitte noch einmal Not yet: try once more");
}

TEST_F(Demo, CourseDictionaryIsWrittenInItsBinaryFormAndReadBack) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_TRUE(outcome.Has("Binary dictionary\n"));
    EXPECT_EQ(outcome.Row("written to"), "written to the session folder: 1686 bytes");
    EXPECT_EQ(outcome.Row("texts that are"), "texts that are the same when read back: 19 of 19");
    EXPECT_EQ(outcome.Row("$$$/Button/Help=Help^T"),
              "$$$/Button/Help=Help^T #{mdash} \\\"at once\\\" is not there and gives: Help™ — \"at once\"");
}

TEST_F(Demo, CoursePicturesAreListedWithTheirSizes) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_TRUE(outcome.Row("pictures/panorama.png").ends_with(" 3000 x 400"));
    EXPECT_TRUE(outcome.Row("pictures/lighthouse.png").ends_with(" 320 x 240"));
    EXPECT_TRUE(outcome.Row("pictures/crane.png").ends_with(" 240 x 320"));
    EXPECT_TRUE(outcome.Row("pictures/lifebuoy.png").ends_with(" 160 x 160"));
    EXPECT_TRUE(outcome.Row("pictures/no_entry.png").ends_with(" 96 x 96"));
}

TEST_F(Demo, CoursesWidestPictureScrollsOverTheStage) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_TRUE(outcome.Has("\nAnimation of pictures/panorama.png on a stage of 1024 x 640\n"));
    std::string const rows = outcome.out.substr(std::min(outcome.out.find("Animation of "), outcome.out.size()));
    EXPECT_NE(rows.find("\n      0        0   0.00  0 to 639             0   0.00  0 to 639\n"), std::string::npos);
    EXPECT_NE(rows.find("\n     10        0   0.08  0 to 639             0   0.40  0 to 639\n"), std::string::npos);
    EXPECT_NE(rows.find("\n     40     -831   1.00  519 to 1159      -1133   1.00  708 to 1348\n"), std::string::npos);
    EXPECT_NE(rows.find("\n     50    -1888   1.00  1180 to 1819     -1888   1.00  1180 to 1819\n"), std::string::npos);
    EXPECT_NE(rows.find("\n    100    -3776   0.00  2360 to 2999     -3776   0.00  2360 to 2999\n"), std::string::npos);
}

TEST_F(Demo, WithoutAReadablePictureNothingIsAnimated) {
    Write("fake.png", "no picture");
    // The start of a picture without width, and of one without height.
    std::string const start = "\x89PNG\r\n\x1A\n\0\0\0\x0DIHDR"s;
    Write("thin.png", start + "\0\0\0\0\0\0\0\1"s);
    Write("flat.png", start + "\0\0\0\1\0\0\0\0"s);
    EXPECT_FALSE(CheckEmptyError(RunOnFolder()).Has("Animation"));
    Write("huge.png", start + "\xFF\xFF\xFF\xFF\0\0\0\1"s);
    EXPECT_TRUE(CheckEmptyError(RunOnFolder()).Has("Animation of huge.png"));
}

TEST_F(Demo, CourseSettingsBecomeTypedProperties) {
    Outcome outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    outcome.out.erase(0, std::min(outcome.out.find("Properties\n"), outcome.out.size()));
    EXPECT_EQ(outcome.Row("Section"), "Section Property Kind Value");
    EXPECT_TRUE(outcome.Has("\n  Course     Author         string     Nora Hellström\n")) << outcome.out;
    EXPECT_TRUE(outcome.Has("\n  Course     Version        string     1.4.2\n"));
    EXPECT_TRUE(outcome.Has("\n  Player     AccentColour   colour     #1F6FA8\n"));
    EXPECT_TRUE(outcome.Has("\n  Player     PageDelay      double     2.50\n"));
    EXPECT_TRUE(outcome.Has("\n  Player     Width          int        1024\n"));
    EXPECT_TRUE(outcome.Has("\n  Publish    ServerAddress  undefined\n"));
    EXPECT_TRUE(outcome.Has("\n  Quiz       Flags          int        26\n"));
    EXPECT_TRUE(outcome.Has("\n  Shortcuts  ShowGlossary   shortcut   Shift+Ctrl+G\n"));
    EXPECT_TRUE(outcome.Has("\n  a copy is equal: yes\n"));
}

TEST_F(Demo, CourseShortcutsAreConverted) {
    Outcome outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    outcome.out.erase(0, std::min(outcome.out.find("Shortcuts\n"), outcome.out.size()));
    EXPECT_EQ(outcome.Row("Command"), "Command Shortcut Virtual key Hot-key flags");
    EXPECT_EQ(outcome.Row("FullScreen"), "FullScreen F11 122 0");
    EXPECT_EQ(outcome.Row("NextPage"), "NextPage PageDown 34 0");
    EXPECT_EQ(outcome.Row("Replay"), "Replay Ctrl+R 82 2");
    EXPECT_EQ(outcome.Row("ShowGlossary"), "ShowGlossary Shift+Ctrl+G 71 6");
    EXPECT_EQ(outcome.Row("ZoomOut"), "ZoomOut - 109 0");
}

TEST_F(Demo, SettingsOfAnyKindAreTakenAsTheyAre) {
    Write("odd.ini", "[\n=\n[]\nkey\n[S]]\na=0x\nb=0xFFFFFFFF\nc=9999999999\nd=.\ne=#12345G\nf=.5\n"
                     "[Shortcuts]\nnone=0\nodd=0x00010041\ntext=F1\n");
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_TRUE(outcome.Has("\n  S]         a         string    0x\n")) << outcome.out;
    EXPECT_TRUE(outcome.Has("\n  S]         b         int       -1\n"));
    EXPECT_TRUE(outcome.Has("\n  S]         c         string    9999999999\n"));
    EXPECT_TRUE(outcome.Has("\n  S]         d         string    .\n"));
    EXPECT_TRUE(outcome.Has("\n  S]         e         string    #12345G\n"));
    EXPECT_TRUE(outcome.Has("\n  S]         f         double    0.50\n"));
    EXPECT_EQ(outcome.Row("none"), "none 0 0");
    EXPECT_EQ(outcome.Row("odd"), "odd A 65 0");
}

TEST_F(Demo, SettingsAndCaptionsAreReadByTheReadersRules) {
    Write("any.ini", "\xEF\xBB\xBF [S] \r\n\t a =1\n==c\n;d=4\n#e=\r5");
    Write("caf.txt", "0.5\t2\tcaf\xE9\tau lait\n\t 2|3|one|two\n3\t4\t\n4\t\t5\n");
    Outcome outcome = CheckEmptyError(RunOnFolder());
    EXPECT_TRUE(outcome.Has("\n  S        a         int     1\n")) << outcome.out;
    EXPECT_TRUE(outcome.Has("\n  S        =         string  c\n"));
    EXPECT_TRUE(outcome.Has("\n  S        #e        int     5\n"));
    outcome.out.erase(0, std::min(outcome.out.find("Captions\n"), outcome.out.size()));
    EXPECT_TRUE(outcome.Row("caf.txt").starts_with("caf.txt 2 ")) << outcome.out;
}

TEST_F(Demo, EveryFileHasItsDigest) {
    Write("empty.bin", "");
    Write("sub/abc.txt", "abc");
    Write("used.txt", "two\n");
    Handle const used(CreateFileW((m_Folder / "used.txt").c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr,
                                  OPEN_EXISTING, 0, nullptr));
    Outcome outcome = RunOnFolder();
    outcome.out.erase(0, std::min(outcome.out.find("Digests\n"), outcome.out.size()));
    EXPECT_EQ(outcome.Row("File"), "File SHA-256");
    EXPECT_EQ(outcome.Row("empty.bin"), "empty.bin e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855");
    EXPECT_EQ(outcome.Row("sub/abc.txt"),
              "sub/abc.txt ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad");
    EXPECT_EQ(outcome.Row("used.txt"), "used.txt in use");
}

TEST_F(Demo, MailProgramIsNamedAndNotUsed) {
    constexpr wchar_t kClients[] = L"Software\\Clients\\Mail";
    wchar_t name[256] = {};
    DWORD size = sizeof name;
    RegGetValueW(HKEY_LOCAL_MACHINE, kClients, nullptr, RRF_RT_REG_SZ, nullptr, name, &size);
    if (std::wstring(name).empty() || RegSetValueW(HKEY_LOCAL_MACHINE, kClients, REG_SZ, name, 0) != ERROR_SUCCESS) {
        GTEST_SKIP() << "there is no mail program, or it may not be changed";
    }
    Outcome const with = Run(L"\"" KT_COURSE L"\"");
    RegSetValueW(HKEY_LOCAL_MACHINE, kClients, REG_SZ, L"", 0);
    Outcome const without = Run(L"\"" KT_COURSE L"\"");
    RegSetValueW(HKEY_LOCAL_MACHINE, kClients, REG_SZ, name, 0);
    EXPECT_TRUE(with.Has("\nMail\n  the course would be sent by: " + fs::path(name).string() + "\n\n")) << with.out;
    EXPECT_TRUE(without.Has("\nMail\n  not sent: No mail program is set up on this machine.\n\n")) << without.out;
}

// What the library finds, the demo must find, too, or it would send a mail: a library that has no path yet, and names and
// paths of any length.
TEST_F(Demo, MailProgramIsFoundAsTheLibraryFindsIt) {
    std::wstring const clients = L"Software\\Clients\\Mail\\";
    wchar_t before[256] = {};
    DWORD size = sizeof before;
    RegGetValueW(HKEY_LOCAL_MACHINE, clients.c_str(), nullptr, RRF_RT_REG_SZ, nullptr, before, &size);
    for (std::wstring const &path : {std::wstring(), std::wstring(2000, L'x')}) {
        std::wstring const key = clients + L"Harbour Mail";
        auto const bytes = static_cast<DWORD>((path.size() + 1) * sizeof(wchar_t));
        if (RegSetKeyValueW(HKEY_LOCAL_MACHINE, key.c_str(), L"DLLPath", REG_SZ, path.c_str(), bytes) !=
            ERROR_SUCCESS) {
            GTEST_SKIP() << "the machine's mail programs may not be changed";
        }
        RegSetValueW(HKEY_LOCAL_MACHINE, clients.c_str(), REG_SZ, L"Harbour Mail", 0);
        Outcome const outcome = Run(L"\"" KT_COURSE L"\"");
        EXPECT_TRUE(outcome.Has("\nMail\n  the course would be sent by: Harbour Mail\n\n")) << outcome.out;
        RegSetValueW(HKEY_LOCAL_MACHINE, clients.c_str(), REG_SZ, before, 0);
        RegDeleteKeyW(HKEY_LOCAL_MACHINE, key.c_str());
    }
}

TEST_F(Demo, CourseSharesAreTakenApart) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.Row("Server"), "Server Share Path Named in");
    EXPECT_EQ(outcome.Row("harbour-server"), "harbour-server courses harbour-safety/1.4.2/ settings.ini");
}

TEST_F(Demo, SharesAreFoundAnywhereInALine) {
    Write("a.txt", "see \"file://///one/public/x/y\" or <smb://two/share/>, not smb://three nor SMB://four/share/\n"
                   "http://five/share/ smb://\xE6\xB8\xAF/caf\xC3\xA9/\n");
    Write("b.txt", "nothing here: smb:// \n");
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_EQ(outcome.Row("one"), "one public x/y a.txt");
    EXPECT_EQ(outcome.Row("two"), "two share a.txt");
    EXPECT_EQ(outcome.Row("\xE6\xB8\xAF"), "\xE6\xB8\xAF caf\xC3\xA9 a.txt");
    for (char const *const name : {"three", "four", "five"}) {
        EXPECT_EQ(outcome.Row(name), "");
    }
}

TEST_F(Demo, TheSystemIsDescribed) {
    Write("a.txt", "one\n");
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_FALSE(outcome.Has("Shares named in the texts\n"));
    EXPECT_TRUE(outcome.Has("\nSystem\n"));
    EXPECT_TRUE(std::regex_match(outcome.Row("Windows version"),
                                 std::regex("Windows version [0-9]+\\.[0-9]+\\.[0-9]+( \\(server\\))?")))
        << outcome.out;
    EXPECT_TRUE(std::regex_match(outcome.Row("process"), std::regex("process [0-9]+, [0-9]+ MiB in use")));
    EXPECT_TRUE(std::regex_match(outcome.Row("new identifier"),
                                 std::regex("new identifier [0-9a-f]{8}(-[0-9a-f]{4}){3}-[0-9a-f]{12}")));
    EXPECT_EQ(outcome.Row("the folder"), "the folder is on this machine");
}

TEST_F(Demo, CoursesWidestPictureIsCutIntoTexturesAndShownWhole) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_TRUE(outcome.Has("\nTextures of pictures/panorama.png\n"));
    EXPECT_EQ(outcome.Row("4096, any size"), "4096, any size 1 4800000 the picture");
    EXPECT_EQ(outcome.Row("1024, any size"), "1024, any size 3 4833648 the picture");
    EXPECT_EQ(outcome.Row("512, powers of two"), "512, powers of two 30 4904480 the picture");
    EXPECT_EQ(outcome.Row("128, powers of two"), "128, powers of two 104 4980864 the picture");
    EXPECT_EQ(outcome.Row("1024, no borders"), "1024, no borders - - refused: KTGraphicsStructs, line 484");
    EXPECT_FALSE(outcome.Has("pictures: ")) << "no page without --report";
}

TEST_F(Demo, PageOfPicturesIsWritten) {
    fs::path const page = m_Work / u8"new" / u8"Seite €";
    Outcome const outcome = CheckEmptyError(Run(L"\"--report=" + page.wstring() + L"\" \"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_TRUE(outcome.Has("\\new\\Seite €\\index.html\n")) << outcome.out;
    std::string const html = ReadAll(page / "index.html");
    EXPECT_TRUE(html.starts_with("<!DOCTYPE html>\n"));
    EXPECT_TRUE(html.ends_with("</html>\n"));
    for (std::string const name : {"tiles-4096-any", "tiles-1024-any", "tiles-512-powers", "tiles-128-powers", "whole",
                                   "faded", "frame-0", "frame-20", "frame-40", "frame-60", "frame-80", "frame-100"}) {
        EXPECT_NE(html.find("<img src=\"" + name + ".png\" width="), std::string::npos) << name;
        EXPECT_TRUE(ReadAll(page / (name + ".png")).starts_with("\x89PNG\r\n")) << name;
    }
    EXPECT_FALSE(fs::exists(page / "tiles-1024-no-borders.png"));
}

TEST_F(Demo, PageThatCannotBeWrittenIsNoted) {
    Write("used", "a file, not a folder");
    Outcome const outcome =
        CheckEmptyError(Run(Quoted(L"--report=" + (m_Folder / "used").wstring()) + L" \"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_TRUE(outcome.Has("  the page of pictures could not be written: ")) << outcome.out;
}

TEST_F(Demo, DamagedAndHugePicturesAreNotCut) {
    std::string const start = "\x89PNG\r\n\x1A\n\0\0\0\x0DIHDR"s;
    Write("cut.png", start + "\0\0\0\2\0\0\0\2"s);
    EXPECT_TRUE(CheckEmptyError(RunOnFolder()).Has("\nTextures of cut.png\n  the picture is damaged or too large\n"));
    Write("huge.png", start + "\xFF\xFF\xFF\xFF\0\0\0\1"s);
    EXPECT_TRUE(CheckEmptyError(RunOnFolder()).Has("\nTextures of huge.png\n  the picture is damaged or too large\n"));
}

TEST_F(Demo, CourseChecksAllHold) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.Row("pieces unchanged by UTF-8"), "pieces unchanged by UTF-8 and back 6 of 6");
    EXPECT_EQ(outcome.Row("pieces unchanged by wide"), "pieces unchanged by wide and automation text 6 of 6");
    EXPECT_EQ(outcome.Row("files whose"), "files whose counts can be written and read back 6 of 6");
    EXPECT_EQ(outcome.Row("file names"), "file names that every system allows 6 of 6");
    EXPECT_EQ(outcome.Row("dictionary texts"), "dictionary texts that could name a file 30 of 38");
}

TEST_F(Demo, CourseFilesAreMeasuredCopiedAndTheCopyIsRemoved) {
    Write("a.txt", "one\n");
    Write("sub/b.bin", "12345");
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    std::size_t const start = outcome.out.find("Files on the disk\n");
    ASSERT_NE(start, std::string::npos) << outcome.out;
    Outcome section;
    section.out = outcome.out.substr(start);
    EXPECT_EQ(section.Row("File"), "File Bytes Created Changed");
    EXPECT_TRUE(section.Row("a.txt").starts_with("a.txt 4 20")) << outcome.out;
    std::string const row = section.Row("sub\\b.bin");
    EXPECT_TRUE(row.starts_with("sub\\b.bin 5 20")) << outcome.out;
    EXPECT_EQ(row.size(), std::string("sub\\b.bin 5 2026-01-02 03:04 2026-01-02 03:04").size()) << row;
    EXPECT_TRUE(section.Has("\n  copied to the session folder: 2 of 2\n")) << outcome.out;
    EXPECT_TRUE(section.Has("\\temp\\KTSession-"));
    for (auto const &entry : fs::directory_iterator(m_Temp)) {
        EXPECT_FALSE(entry.path().filename().wstring().starts_with(L"KT")) << entry.path();
    }
}

// Sizes are exact, times are not looked at.
TEST_F(Demo, CourseIsSavedAsOneDocumentReadBackComparedAndCloned) {
    Write("a.txt", "one\n");
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    std::size_t const start = outcome.out.find("Document\n");
    ASSERT_NE(start, std::string::npos) << outcome.out;
    Outcome section;
    section.out = outcome.out.substr(start);
    EXPECT_EQ(section.Row("Step"), "Step Bytes ms Whole");
    // Marks and version 12, title 4 + 6, lengths of the three lists 12; name 4 + 5, kind 4, size 8, digest 4 + 64,
    // bytes 4 + 4.
    for (std::string const step : {"saved", "read back", "saved again", "compared", "cloned"}) {
        EXPECT_TRUE(section.Row(step).starts_with(step + " 131 ")) << outcome.out;
        EXPECT_TRUE(section.Row(step).ends_with(" yes")) << outcome.out;
    }
    EXPECT_TRUE(section.Has("\n  read back and saved again, the document is the same: yes\n")) << outcome.out;
    EXPECT_TRUE(section.Has("\n  the clone is the same: yes\n")) << outcome.out;
    EXPECT_TRUE(section.Has("\n  digests that are the stored ones: 1 of 1\n")) << outcome.out;
    EXPECT_TRUE(section.Has("\n  one changed bit is found: yes\n")) << outcome.out;
}

TEST_F(Demo, CourseDocumentHoldsTheExampleCourse) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_TRUE(outcome.Has("\n  read back and saved again, the document is the same: yes\n")) << outcome.out;
    EXPECT_TRUE(outcome.Has("\n  the clone is the same: yes\n")) << outcome.out;
    EXPECT_TRUE(outcome.Has("\n  digests that are the stored ones: 11 of 11\n")) << outcome.out;
}

TEST_F(Demo, ACourseThatCannotBeCopiedIsStillShown) {
    Write("free.txt", "one\n");
    Write("used.txt", "two\n");
    Handle const used(CreateFileW((m_Folder / "used.txt").c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr,
                                  OPEN_EXISTING, 0, nullptr));
    Outcome const outcome = RunOnFolder();
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_TRUE(outcome.Has("not copied to the session folder: too large, or a file cannot be read\n"));
}

TEST_F(Demo, WorkIsSavedAndProgressShown) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    EXPECT_TRUE(outcome.Has("\nWork\n  texts finished by two message threads: 6 of 6\n"
                            "  texts in the autosave file: 6 of 6, written "))
        << outcome.out;
    EXPECT_FALSE(outcome.Has("written 0 times"));
    EXPECT_TRUE(outcome.Has("\n  progress shown ")) << outcome.out;
    std::string const log = ReadAll(m_Temp / "ktap_log.txt");
    EXPECT_NE(log.find(": progress: 6 of 6\n"), std::string::npos) << log;
    // Work, then the readers' end, then what the program does next.
    EXPECT_LT(log.find(": progress: 6 of 6\n"), log.find(": worker 1: ended"));
    EXPECT_LT(log.find(": worker 2: ended"), log.find(": copied to the session folder"));
}

TEST_F(Demo, WorkOnManyTextsIsSavedWhole) {
    for (int i = 0; i < 1100; ++i) { // more than a message queue holds
        Write("text" + std::to_string(i) + ".txt", "one two\n");
    }
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_TRUE(outcome.Has("  texts finished by two message threads: 1100 of 1100\n"
                            "  texts in the autosave file: 1100 of 1100, written "));
    std::string const log = ReadAll(m_Temp / "ktap_log.txt");
    EXPECT_NE(log.find(": progress: 1100 of 1100\n"), std::string::npos);
}

TEST_F(Demo, LogIsWhereItSaysAndHasAsManyLines) {
    Outcome const outcome = CheckEmptyError(Run(L"\"" KT_COURSE L"\""));
    std::string const log = ReadAll(m_Temp / "ktap_log.txt");
    std::string const count = std::to_string(Lines(log));
    EXPECT_GT(Lines(log), 6U * 3U);
    EXPECT_TRUE(outcome.Has("\n  " + count + " lines written, " + count + " in the file\n")) << outcome.out;
    EXPECT_TRUE(outcome.Has("\\temp\\ktap_log.txt\n")) << outcome.out;
    EXPECT_NE(log.find(": settings.ini: lines: 43, words: 125\n"), std::string::npos);
    // Each line is whole, and every thread has written.
    EXPECT_NE(log.find("worker 1: started\n"), std::string::npos);
    EXPECT_NE(log.find("worker 2: started\n"), std::string::npos);
    EXPECT_NE(log.find("worker 2: ended, files read: "), std::string::npos);
    EXPECT_TRUE(fs::exists(m_Temp / "ktdemo.lock"));
}

TEST_F(Demo, SecondRunIsTurnedAway) {
    std::ofstream(m_Temp / "ktdemo.lock").put('x');
    KTInterProcessFileLock lock(KTString((m_Temp / "ktdemo.lock").c_str()));
    ASSERT_TRUE(lock.TryLock());
    Outcome const outcome = Run(L"\"" KT_COURSE L"\"");
    EXPECT_EQ(outcome.status, 1U);
    EXPECT_TRUE(outcome.err.starts_with("ktdemo: another ktdemo is running")) << outcome.err;
    EXPECT_TRUE(outcome.out.empty());
    lock.Unlock();
    EXPECT_EQ(Run(L"\"" KT_COURSE L"\"").status, 0U);
}

TEST_F(Demo, EmptyFolderIsAnError) {
    Outcome const outcome = RunOnFolder();
    EXPECT_EQ(outcome.status, 1U);
    EXPECT_TRUE(outcome.err.starts_with("ktdemo: nothing to read in ")) << outcome.err;
    EXPECT_EQ(Lines(outcome.err), 1U);
    EXPECT_TRUE(outcome.out.empty()) << outcome.out;
}

TEST_F(Demo, MissingFolderIsAnError) {
    Outcome const outcome = Run(Quoted((m_Work / "no such").wstring()));
    EXPECT_EQ(outcome.status, 1U);
    EXPECT_TRUE(outcome.err.starts_with("ktdemo: no such folder: ")) << outcome.err;
    EXPECT_EQ(Lines(outcome.err), 1U);
    Write("file.txt", "x");
    EXPECT_EQ(Run(Quoted((m_Folder / "file.txt").wstring())).status, 1U) << "a file is no folder";
    EXPECT_EQ(Run(L"\"\"").status, 1U);
}

TEST_F(Demo, EveryEncodingIsFound) {
    Write("be.txt", "\xFE\xFF\0G\0r\0\xF6\0\xDF\0e"s);
    Write("le.txt", "\xFF\xFEG\0r\0\xF6\0\xDF\0e\0"s);
    Write("plain16.csv", "a\0;\0b\0\r\0\n\0"s);
    Write("plain16be.csv", "\0a\0;\0b\0\n"s);
    Write("mark.json", "\xEF\xBB\xBF{\"price\": \"\xE2\x82\xAC\"}\n");
    Write("eight.md", "Gr\xC3\xB6\xC3\x9F"
                      "e\n");
    Write("single.srt", "Gr\xF6\xDF"
                        "e\n");
    Write("old.vtt", "one\rtwo\rthree");
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_EQ(outcome.Row("be.txt"), "be.txt UTF-16 BE 12 5 1 1 2 0");
    EXPECT_EQ(outcome.Row("le.txt"), "le.txt UTF-16 LE 12 5 1 1 2 0");
    EXPECT_EQ(outcome.Row("plain16.csv"), "plain16.csv UTF-16 LE 10 5 1 1 0 0");
    EXPECT_EQ(outcome.Row("plain16be.csv"), "plain16be.csv UTF-16 BE 8 4 1 1 0 0");
    EXPECT_EQ(outcome.Row("mark.json"), "mark.json UTF-8 BOM 20 15 1 2 1 0");
    EXPECT_EQ(outcome.Row("eight.md"), "eight.md UTF-8 8 6 1 1 2 0");
    EXPECT_EQ(outcome.Row("single.srt"), "single.srt bytes 6 6 1 1 2 0");
    EXPECT_EQ(outcome.Row("old.vtt"), "old.vtt UTF-8 13 13 3 3 0 0");
}

TEST_F(Demo, JunkIsReadAndNoted) {
    Write("odd.txt", "\xFF\xFEH\0i\0!"s);
    Write("lone.txt", "\xFF\xFE"
                      "A\0\0\xD8"
                      "B\0"s);
    Write("bad.txt", "\xC3\xA4 \xC3\xB6 \xC3\xBC \xE2\x82\xAC \xFF \xE2\x82 end\n");
    Write("zeros.txt", "a\0b\0\0c"s);
    Write("nothing.xml", "");
    Write("percent.txt", "%s%n\n\"$$$/\n\"$$$/a\n1|x\n1|99999999999|y\n");
    Write("fake.png", "no picture");
    Write("other.bin", "\0\1\2"s);
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_EQ(outcome.Row("odd.txt"), "odd.txt UTF-16 LE 7 2 1 1 0 0 odd last byte left out");
    EXPECT_EQ(outcome.Row("lone.txt"), "lone.txt UTF-16 LE 8 3 1 1 1 0 unpaired surrogates");
    EXPECT_EQ(outcome.Row("bad.txt"), "bad.txt UTF-8 22 16 1 7 6 2");
    EXPECT_EQ(outcome.Row("zeros.txt"), "zeros.txt UTF-8 6 6 1 1 0 0 zero units");
    EXPECT_EQ(outcome.Row("nothing.xml"), "nothing.xml empty 0 0 0 0 0 0");
    EXPECT_EQ(outcome.Row("fake.png"), "fake.png 10 not a PNG picture");
    EXPECT_EQ(outcome.Row("other.bin"), "other.bin 3");
    EXPECT_EQ(outcome.Row("pieces unchanged by UTF-8"), "pieces unchanged by UTF-8 and back 4 of 5");
    EXPECT_FALSE(outcome.Has("Captions\n"));
    EXPECT_FALSE(outcome.Has("Dictionary\n"));
}

TEST_F(Demo, NamesBeyondAsciiAndDeepTreesAreWalked) {
    fs::path const name = u8"Größe 港 €/Ünter.TXT";
    Write(name, "na\xC3\xAFve\n");
    // The system's calls refuse more than 260 characters unless the path has its extended form.
    std::wstring deep = L"\\\\?\\" + m_Folder.wstring();
    for (int level = 0; level < 12; ++level) {
        deep += L"\\a folder with a long name, " + std::to_wstring(level);
        ASSERT_NE(CreateDirectoryW(deep.c_str(), nullptr), FALSE) << GetLastError();
    }
    deep += L"\\deep.txt";
    Handle(CreateFileW(deep.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW, 0, nullptr)).reset();
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_EQ(outcome.Row("Größe 港 €/Ünter.TXT"), "Größe 港 €/Ünter.TXT UTF-8 7 6 1 1 1 0");
    EXPECT_TRUE(outcome.Has("name, 11/deep.txt  empty")) << outcome.out;
    Outcome const inside = CheckEmptyError(Run(Quoted((m_Folder / name).parent_path().wstring())));
    EXPECT_EQ(inside.Row("Ünter.TXT"), "Ünter.TXT UTF-8 7 6 1 1 1 0");
    EXPECT_TRUE(inside.out.starts_with("Course folder: ")) << inside.out;
}

TEST_F(Demo, FolderMayBeGivenWithForwardSlashes) {
    Write("a.txt", "one two\n");
    std::wstring const slashes = m_Folder.generic_wstring();
    EXPECT_EQ(Run(Quoted(slashes)).Row("a.txt"), "a.txt UTF-8 8 8 1 2 0 0");
    EXPECT_EQ(Run(Quoted(slashes + L"/")).Row("a.txt"), "a.txt UTF-8 8 8 1 2 0 0");
    EXPECT_EQ(Run(L"-- " + Quoted(slashes)).status, 0U);
}

TEST_F(Demo, FileInUseIsNotedAndTheOthersAreRead) {
    Write("free.txt", "one\n");
    Write("used.txt", "two\n");
    Handle const used(CreateFileW((m_Folder / "used.txt").c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr,
                                  OPEN_EXISTING, 0, nullptr));
    Outcome const outcome = RunOnFolder();
    EXPECT_EQ(outcome.status, 0U);
    EXPECT_EQ(outcome.Row("used.txt"), "used.txt - 4 - - - - - in use");
    EXPECT_EQ(outcome.Row("free.txt"), "free.txt UTF-8 4 4 1 1 0 0");
    fs::remove(m_Folder / "free.txt");
    Outcome const nothing = RunOnFolder();
    EXPECT_EQ(nothing.status, 1U);
    EXPECT_TRUE(nothing.err.starts_with("ktdemo: nothing readable in ")) << nothing.err;
    EXPECT_EQ(nothing.Row("used.txt"), "used.txt - 4 - - - - - in use");
}

TEST_F(Demo, HugeFileIsCutBetweenCharacters) {
    // A character of three bytes lies across the limit of 32 MiB.
    constexpr std::size_t kLimit = 32U << 20;
    std::string bytes(kLimit + 10, 'x');
    bytes.replace(kLimit - 1, 3, "\xE2\x82\xAC");
    Write("huge.txt", bytes);
    Outcome const outcome = CheckEmptyError(RunOnFolder());
    EXPECT_EQ(outcome.Row("huge.txt"), "huge.txt UTF-8 33554442 33554431 1 1 0 0 only the first 32 MiB");
}

TEST_F(Demo, HelpAndWrongUsage) {
    Outcome const help = CheckEmptyError(Run(L"--help"));
    EXPECT_EQ(help.status, 0U);
    EXPECT_TRUE(help.out.starts_with("usage: ktdemo [--all | --crash] [--report=FOLDER] [FOLDER]\n"));
    for (wchar_t const *arguments : {L"--bogus", L"one two"}) {
        Outcome const outcome = Run(arguments);
        EXPECT_EQ(outcome.status, 2U);
        EXPECT_TRUE(outcome.out.empty());
        EXPECT_EQ(Lines(outcome.err), 1U) << outcome.err;
    }
}

// A fault while saving, in a real child of the demo: what the author keeps.
TEST_F(Demo, CrashingWhileSavingKeepsTheWork) {
    Outcome const outcome = CheckEmptyError(Run(L"--crash \"" KT_COURSE L"\""));
    EXPECT_EQ(outcome.status, 1U);
    EXPECT_TRUE(outcome.Has("Crash while saving\n  texts in project   6\n"
                            "  structured error   0xC0000005 caught as a C++ exception\n"));
    EXPECT_TRUE(outcome.Has("message            A fatal error has occured and the application is being terminated."));
    EXPECT_TRUE(outcome.Has("  clean-up callback  done\n"));
    EXPECT_FALSE(outcome.Has("NOT whole"));
    fs::path const project = m_Temp / "ktdemo-project";
    std::string const backUp = ReadAll(project / "course.ktbak");
    EXPECT_FALSE(backUp.empty());
    EXPECT_EQ(backUp, ReadAll(project / "course.ktdoc")); // saved before the crash
    std::size_t dumps = 0;
    for (auto const &entry : fs::recursive_directory_iterator(m_Temp)) {
        dumps += entry.path().extension() == ".dmp" ? 1 : 0;
    }
    EXPECT_EQ(dumps, 1U);
    std::size_t const dump = outcome.out.find("  crash dump         ");
    ASSERT_NE(dump, std::string::npos);
    std::string const path = outcome.out.substr(dump + 21, outcome.out.find(" (", dump) - dump - 21);
    EXPECT_TRUE(fs::exists(fs::path(std::u8string(path.begin(), path.end())))) << path;
}

} // namespace
