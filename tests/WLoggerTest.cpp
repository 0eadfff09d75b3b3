// WLoggerTest.cpp: the debugger output and the load of the library, on Windows.

#include "KTAssert.h"
#include "LogLines.h"
#include "Units.h"
#include "WChildProcess.h"
#include "WImportHook.h"
#include "WKTLogger.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <ctime>
#include <string>
#include <utility>
#include <vector>

namespace {

std::vector<std::wstring> g_Sent;

void WINAPI RecordOutput(wchar_t const *text) { g_Sent.emplace_back(text); }

BOOL WINAPI ClaimDebugger() { return TRUE; }

// Records the debugger output of the library while it believes in a debugger.
class OutputRecorder {
  public:
    OutputRecorder() { g_Sent.clear(); }

    std::vector<std::wstring> Take() {
        EXPECT_TRUE(m_Output.IsActive());
        return std::exchange(g_Sent, {});
    }

  private:
    WImportHook m_Output{L"KTPublic.dll", "OutputDebugStringW", &RecordOutput};
    WImportHook m_Debugger{L"KTPublic.dll", "IsDebuggerPresent", &ClaimDebugger};
};

constexpr DWORD kPastMonitorCheck = 150; // longer than the library's pause between two looks for a monitor

using Texts = std::vector<std::wstring>;

// Runs the child as its debugger and collects the debugger output.
Texts DebugToTheEnd(WChildProcess const &child) {
    Texts texts;
    DEBUG_EVENT event{};
    while (WaitForDebugEvent(&event, 60000) != FALSE) {
        DWORD answer = DBG_CONTINUE;
        if (event.dwDebugEventCode == OUTPUT_DEBUG_STRING_EVENT) {
            auto const &info = event.u.DebugString;
            std::vector<char> bytes(info.nDebugStringLength + 2U);
            HANDLE const process = OpenProcess(PROCESS_VM_READ, FALSE, child.Id());
            SIZE_T read = 0;
            ReadProcessMemory(process, info.lpDebugStringData, bytes.data(), info.nDebugStringLength, &read);
            CloseHandle(process);
            std::string const narrow(bytes.data());
            texts.push_back(info.fUnicode != 0 ? std::wstring(reinterpret_cast<wchar_t const *>(bytes.data()))
                                               : std::wstring(narrow.begin(), narrow.end()));
        } else if (event.dwDebugEventCode == EXCEPTION_DEBUG_EVENT &&
                   event.u.Exception.ExceptionRecord.ExceptionCode != EXCEPTION_BREAKPOINT) {
            answer = DBG_EXCEPTION_NOT_HANDLED;
        } else if (event.dwDebugEventCode == EXIT_PROCESS_DEBUG_EVENT) {
            ContinueDebugEvent(event.dwProcessId, event.dwThreadId, answer);
            break;
        }
        ContinueDebugEvent(event.dwProcessId, event.dwThreadId, answer);
    }
    return texts;
}

} // namespace

TEST(DebugOutput, BytesAreWidenedWithTheirSign) {
    OutputRecorder recorder;
    gKTLogger->Log(std::string("A\xE9\x7F\x80"));
    EXPECT_EQ(recorder.Take(), (Texts{std::wstring{L'A', 0xFFE9, 0x7F, 0xFF80}, L"\n"}));
}

TEST(DebugOutput, WideTextIsUnchanged) {
    OutputRecorder recorder;
    LogLines log;
    gKTLogger->Log(std::wstring(L"\u20AC wide"));
    EXPECT_EQ(recorder.Take(), (Texts{L"\u20AC wide", L"\n"}));
    EXPECT_EQ(log.Take(), std::vector<std::string>{"\xAC wide"});
}

TEST(DebugOutput, VariadicFormsGoTheSameWay) {
    OutputRecorder recorder;
    gKTLogger->Log("%d \xE9", 5);
    gKTLogger->Log(L"%d %s", 6, L"\u20AC"); // the run-time's %s is wide here
    EXPECT_EQ(recorder.Take(), (Texts{std::wstring{L'5', L' ', 0xFFE9}, L"\n", L"6 \u20AC", L"\n"}));
}

TEST(DebugOutput, StopsWhileLoggingIsDisabled) {
    OutputRecorder recorder;
    gKTLogger->LogEnableAtRuntime(false);
    gKTLogger->Log("silent");
    gKTLogger->Log(L"silent");
    gKTLogger->Log(std::string("silent"));
    gKTLogger->Log(std::wstring(L"silent"));
    KTAssertFailed("silent", "path", 1);
    gKTLogger->LogEnableAtRuntime(true);
    EXPECT_EQ(recorder.Take(), Texts{});
}

TEST(DebugOutput, GoesOutWhileASystemWideMonitorRuns) {
    g_Sent.clear();
    WImportHook const output(L"KTPublic.dll", "OutputDebugStringW", &RecordOutput);
    Sleep(kPastMonitorCheck);
    gKTLogger->Log("nobody watches");
    EXPECT_EQ(g_Sent, Texts{});
    HANDLE const monitor = CreateEventW(nullptr, FALSE, FALSE, L"DBWIN_BUFFER_READY");
    Sleep(kPastMonitorCheck);
    gKTLogger->Log("watched");
    EXPECT_EQ(g_Sent, (Texts{L"watched", L"\n"}));
    CloseHandle(monitor);
    Sleep(kPastMonitorCheck);
    gKTLogger->Log("nobody watches any more");
    EXPECT_EQ(g_Sent.size(), 2U);
}

TEST(DebugOutput, DISABLED_ChildLogsTwoLines) {
    gKTLogger->Log("seen by the debugger");
    gKTLogger->Log(std::wstring(L"wide line"));
}

TEST(DebugOutput, ADebuggerSeesEveryLine) {
    WChildProcess const child("DebugOutput.DISABLED_ChildLogsTwoLines",
                              {.argument = L"", .flags = DEBUG_ONLY_THIS_PROCESS, .temp = {}});
    ASSERT_TRUE(child.Started());
    Texts const texts = DebugToTheEnd(child);
    auto const first = std::find(texts.begin(), texts.end(), L"seen by the debugger");
    ASSERT_GE(texts.end() - first, 4);
    EXPECT_EQ(Texts(first, first + 4), (Texts{L"seen by the debugger", L"\n", L"wide line", L"\n"}));
}

TEST(LibraryLoad, DISABLED_ChildLogsOneLine) { gKTLogger->Log("only line"); }

TEST(LibraryLoad, EmptiesTheFileOfThePreviousRun) {
    WChildProcess child("LibraryLoad.DISABLED_ChildLogsOneLine");
    ASSERT_EQ(child.ExitStatus(), 0U);
    std::string const first = child.Log();
    EXPECT_TRUE(first.ends_with(": only line\n")) << first;
    EXPECT_EQ(std::count(first.begin(), first.end(), '\n'), 1);
    {
        std::ofstream(child.Temp() / "ktap_log.txt", std::ios::app) << "left by the previous run\n";
    }
    EXPECT_NE(child.Log(), first);
    WChildProcess again("LibraryLoad.DISABLED_ChildLogsOneLine", {.argument = L"", .flags = 0, .temp = child.Temp()});
    ASSERT_EQ(again.ExitStatus(), 0U);
    std::string const second = child.Log();
    EXPECT_TRUE(second.ends_with(": only line\n")) << second;
    EXPECT_EQ(std::count(second.begin(), second.end(), '\n'), 1) << second;
}

TEST(LibraryLoad, DISABLED_ChildLogsWithoutAFile) {
    EXPECT_TRUE(gKTLogger->IsLogEnabled());
    gKTLogger->Log("lost");
    gKTLogger->Log("lost %d", 1);
    KTAssertFailed("lost", "path", 1);
}

TEST(LibraryLoad, AFolderThatCannotTakeTheFileLosesLinesSilently) {
    std::filesystem::path const blocked = std::filesystem::temp_directory_path() / "blocked";
    std::filesystem::create_directories(blocked / "ktap_log.txt"); // a folder stands where the file would be
    WChildProcess child("LibraryLoad.DISABLED_ChildLogsWithoutAFile", {.argument = L"", .flags = 0, .temp = blocked});
    EXPECT_EQ(child.ExitStatus(), 0U);
    EXPECT_TRUE(std::filesystem::is_directory(blocked / "ktap_log.txt"));
}

TEST(LibraryLoad, TheLogWorksInAFolderOfAnyName) {
    // Greek, Japanese and an emoji: in no code page together.
    std::filesystem::path const folder =
        std::filesystem::temp_directory_path() / L"\u03B1\u03B2-\u8AB2\u7A0B-\U0001F41D";
    std::filesystem::create_directories(folder);
    WChildProcess child("LibraryLoad.DISABLED_ChildLogsOneLine", {.argument = L"", .flags = 0, .temp = folder});
    ASSERT_EQ(child.ExitStatus(), 0U);
    EXPECT_TRUE(child.Log().ends_with(": only line\n")) << child.Log();
}

TEST(LibraryLoad, DISABLED_ChildDeletesTheLogger) {
    std::filesystem::path const file(gKTLogger->GetLogFilePath().GetPathAsKTString().GetWstring());
    gKTLogger->Log("last line");
    std::error_code error;
    EXPECT_FALSE(std::filesystem::remove(file, error)) << "open until the logger is deleted";
    delete dynamic_cast<WKTLogger *>(gKTLogger);
    EXPECT_TRUE(std::filesystem::remove(file, error));
}

TEST(LibraryLoad, ADeletedLoggerClosesItsFile) {
    WChildProcess child("LibraryLoad.DISABLED_ChildDeletesTheLogger");
    EXPECT_EQ(child.ExitStatus(), 0U);
}

// The division and multiplication by 1000 lose a unit at some clock readings, such as 1001, which shows that they are
// done. A fresh process meets such a reading within its first seconds.
TEST(LoggerNumber, DISABLED_ChildLogsAtALosingReading) {
    for (;;) {
        std::clock_t const clock = std::clock();
        if (static_cast<long long>(static_cast<double>(clock) / 1000.0 * 1000.0) == static_cast<long long>(clock)) {
            continue;
        }
        std::size_t const start = ReadLogFile().size();
        gKTLogger->Log(std::string("x"));
        if (std::clock() == clock) { // nothing moved meanwhile
            EXPECT_EQ(std::stoll(ReadLogFile().substr(start)), static_cast<long long>(clock) - 1);
            return;
        }
    }
}

TEST(LoggerNumber, IsTheClockThroughADouble) {
    WChildProcess child("LoggerNumber.DISABLED_ChildLogsAtALosingReading");
    EXPECT_EQ(child.ExitStatus(), 0U);
}

TEST(WindowsLogger, IsTheProcessWideOne) {
    EXPECT_NE(dynamic_cast<WKTLogger *>(gKTLogger), nullptr);
    EXPECT_EQ(sizeof(WKTLogger), sizeof(KTLogger));
}
