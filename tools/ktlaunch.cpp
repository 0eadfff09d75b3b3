// ktlaunch: starts a program with a temporary folder of its own.
//
//     ktlaunch FOLDER PROGRAM [ARGS...]
//
// Every load of the library empties the log in the temporary folder, so programs that run side by side need separate
// ones. Under Wine the variables come from the prefix and cannot be set from outside; hence this launcher. It sets TEMP
// and TMP to FOLDER, which must exist, passes the rest of its command line on untouched, ends the program when it is
// ended itself, and returns the program's exit status (125 if the program could not be started).

#include <windows.h>

#include <cstdio>
#include <cwctype>

namespace {

constexpr int kCannotStart = 125;

// The command line behind its first argument, which may be quoted.
wchar_t *SkipArgument(wchar_t *text) {
    bool quoted = false;
    while (*text != 0 && (quoted || !std::iswspace(*text))) {
        quoted = quoted != (*text == L'"');
        ++text;
    }
    while (std::iswspace(*text)) {
        ++text;
    }
    return text;
}

// A job that ends its processes when its last handle, ours, is closed.
HANDLE CreateKillingJob() {
    HANDLE const job = CreateJobObjectW(nullptr, nullptr);
    JOBOBJECT_EXTENDED_LIMIT_INFORMATION limits{};
    limits.BasicLimitInformation.LimitFlags = JOB_OBJECT_LIMIT_KILL_ON_JOB_CLOSE;
    SetInformationJobObject(job, JobObjectExtendedLimitInformation, &limits, sizeof limits);
    return job;
}

} // namespace

int wmain(int count, wchar_t **arguments) {
    if (count < 3) {
        std::fputs("usage: ktlaunch FOLDER PROGRAM [ARGS...]\n", stderr);
        return kCannotStart;
    }
    SetEnvironmentVariableW(L"TEMP", arguments[1]);
    SetEnvironmentVariableW(L"TMP", arguments[1]);
    HANDLE const job = CreateKillingJob();
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION process{};
    wchar_t *const command = SkipArgument(SkipArgument(GetCommandLineW()));
    if (!CreateProcessW(nullptr, command, nullptr, nullptr, TRUE, CREATE_SUSPENDED, nullptr, nullptr, &startup,
                        &process)) {
        std::fprintf(stderr, "ktlaunch: cannot start %ls (error %lu)\n", arguments[2], GetLastError());
        return kCannotStart;
    }
    AssignProcessToJobObject(job, process.hProcess);
    ResumeThread(process.hThread);
    WaitForSingleObject(process.hProcess, INFINITE);
    DWORD status = kCannotStart;
    GetExitCodeProcess(process.hProcess, &status);
    CloseHandle(process.hThread);
    CloseHandle(process.hProcess);
    CloseHandle(job);
    return static_cast<int>(status);
}
