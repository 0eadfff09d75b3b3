// WKTSystemUtils.cpp: the machine's identifier, the task bar and the first thread, asked of Windows.

#include "KTSystemUtils.h"

#include "KTLogger.h"
#include "WOHandle.h"
#include "WORegistry.h"

#include <windows.h>

#include <tlhelp32.h>

namespace {

// When a thread was created, in 100 ns; the latest time of all if that cannot be asked.
ULONGLONG CreationTime(DWORD thread) {
    WOHandle const handle(OpenThread(THREAD_QUERY_LIMITED_INFORMATION, FALSE, thread));
    FILETIME created{};
    FILETIME exited{};
    FILETIME kernel{};
    FILETIME user{};
    if (!handle.IsValid() || GetThreadTimes(handle.Get(), &created, &exited, &kernel, &user) == FALSE) {
        return ~ULONGLONG{0};
    }
    return (static_cast<ULONGLONG>(created.dwHighDateTime) << 32) | created.dwLowDateTime;
}

// The eldest thread of the process; of several created in one tick of the clock the first that the system lists, which
// it does in the order of creation.
DWORD FindMainThread() {
    WOHandle const snapshot(CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0));
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    DWORD const process = GetCurrentProcessId();
    DWORD eldest = 0;
    ULONGLONG earliest = 0;
    for (BOOL more = Thread32First(snapshot.Get(), &entry); more != FALSE;
         more = Thread32Next(snapshot.Get(), &entry)) {
        if (entry.th32OwnerProcessID != process) {
            continue;
        }
        ULONGLONG const created = CreationTime(entry.th32ThreadID);
        if (eldest == 0 || created < earliest) {
            eldest = entry.th32ThreadID;
            earliest = created;
        }
    }
    return eldest;
}

} // namespace

KTString KTSystemUtils::GetMachineGuid() {
    // The identifier is the machine's, not that of the view that older programs get.
    WORegistryKey const key(HKEY_LOCAL_MACHINE, L"SOFTWARE\\Microsoft\\Cryptography",
                            KEY_QUERY_VALUE | KEY_WOW64_64KEY);
    KTUnits value;
    KTString guid("default");
    if (key.IsOpen() && WOReadText(key.Get(), L"MachineGuid", value)) {
        guid = KTString(OString(std::move(value)));
    } else {
        gKTLogger->Log("KTSystemUtils::GetMachineGuid, Error fetching machine guid!");
        gKTLogger->Log("KTSystemUtils::GetMachineGuid, Setting machine guid to default");
    }
    gKTLogger->Log("Machine Guid: %s", guid.GetUTF8String().c_str());
    return guid;
}

void KTSystemUtils::BounceApplicationTrayIcon(HWND__ *window) {
    FLASHWINFO request{};
    request.cbSize = sizeof request;
    request.hwnd = window;
    request.dwFlags = FLASHW_TRAY | FLASHW_TIMERNOFG;
    FlashWindowEx(&request);
}

bool KTSystemUtils::IsMainThread() {
    static DWORD const mainThread = FindMainThread(); // all threads of the system are listed for it, so only once
    return GetCurrentThreadId() == mainThread;
}
