// WChildProcess.h: a test that runs in a process of its own, because it ends or hangs its process or needs a fresh load
// of the library.
//
// The body is a test of the same program whose name begins with "DISABLED_", so that an ordinary run passes it over. The
// child gets a temporary folder of its own: its load of the library empties the log there, not the parent's.

#pragma once

#include <windows.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

class WChildProcess {
  public:
    /// What a child gets besides its test.
    struct Options {
        std::wstring argument;      ///< reaches the child through Argument()
        DWORD flags = 0;            ///< creation flags, such as DEBUG_ONLY_THIS_PROCESS
        std::filesystem::path temp; ///< an existing temporary folder; a new one of its own by default
    };

    /// Starts this program with the one test `name` ("Suite.DISABLED_Test").
    explicit WChildProcess(std::string const &name) : WChildProcess(name, Options{}) {}
    WChildProcess(std::string const &name, Options const &options)
        : m_OwnsTemp(options.temp.empty()), m_Temp(m_OwnsTemp ? MakeTemp() : options.temp) {
        wchar_t program[MAX_PATH];
        GetModuleFileNameW(nullptr, program, MAX_PATH);
        std::wstring command = L"\"" + std::wstring(program) + L"\" --gtest_also_run_disabled_tests --gtest_filter=" +
                               std::wstring(name.begin(), name.end());
        std::wstring const temp = GetVariable(L"TEMP");
        SetEnvironmentVariableW(L"TEMP", m_Temp.c_str());
        SetEnvironmentVariableW(L"TMP", m_Temp.c_str());
        SetEnvironmentVariableW(L"KT_CHILD_ARGUMENT", options.argument.c_str());
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        m_Started = CreateProcessW(nullptr, command.data(), nullptr, nullptr, FALSE, options.flags, nullptr, nullptr,
                                   &startup, &m_Process) != FALSE;
        SetEnvironmentVariableW(L"TEMP", temp.c_str());
        SetEnvironmentVariableW(L"TMP", temp.c_str());
    }

    WChildProcess(WChildProcess const &) = delete;
    WChildProcess &operator=(WChildProcess const &) = delete;

    /// Ends the child if it still runs, and removes its own folder.
    ~WChildProcess() {
        Kill();
        CloseHandle(m_Process.hThread);
        CloseHandle(m_Process.hProcess);
        if (m_OwnsTemp) {
            std::error_code ignored;
            std::filesystem::remove_all(m_Temp, ignored);
        }
    }

    bool Started() const { return m_Started; }
    DWORD Id() const { return m_Process.dwProcessId; }

    /// Whether the child ended within that time.
    bool EndsWithin(DWORD milliseconds) {
        return WaitForSingleObject(m_Process.hProcess, milliseconds) == WAIT_OBJECT_0;
    }

    /// Waits for the end, at most a minute, and returns the exit status.
    DWORD ExitStatus() {
        EndsWithin(60000);
        DWORD status = 0;
        GetExitCodeProcess(m_Process.hProcess, &status);
        return status;
    }

    /// Ends the child where it stands.
    void Kill() {
        TerminateProcess(m_Process.hProcess, 99);
        EndsWithin(60000);
    }

    /// The child's temporary folder.
    std::filesystem::path const &Temp() const { return m_Temp; }

    /// The child's log, whole.
    std::string Log() const {
        std::ifstream file(m_Temp / "ktap_log.txt", std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    /// What the parent handed to this child; empty in a process that is no child.
    static std::wstring Argument() { return GetVariable(L"KT_CHILD_ARGUMENT"); }

  private:
    static std::filesystem::path MakeTemp() {
        static int count = 0;
        std::filesystem::path const folder =
            std::filesystem::temp_directory_path() /
            ("child" + std::to_string(GetCurrentProcessId()) + "-" + std::to_string(++count));
        std::filesystem::create_directories(folder);
        return folder;
    }

    static std::wstring GetVariable(wchar_t const *name) {
        std::wstring value(32768, L'\0');
        value.resize(GetEnvironmentVariableW(name, value.data(), static_cast<DWORD>(value.size())));
        return value;
    }

    bool m_OwnsTemp;
    std::filesystem::path m_Temp;
    PROCESS_INFORMATION m_Process{};
    bool m_Started = false;
};

/// A named event that parent and child share; set once by the child when it has got somewhere.
class WSignal {
  public:
    explicit WSignal(std::wstring const &name) : m_Event(CreateEventW(nullptr, TRUE, FALSE, name.c_str())) {}
    WSignal(WSignal const &) = delete;
    WSignal &operator=(WSignal const &) = delete;
    ~WSignal() { CloseHandle(m_Event); }

    void Set() { SetEvent(m_Event); }
    bool IsSetWithin(DWORD milliseconds) { return WaitForSingleObject(m_Event, milliseconds) == WAIT_OBJECT_0; }

  private:
    HANDLE m_Event;
};
