// WProcessFigures.cpp: the figures of a Windows process.

#include "ProcessFigures.h"

#include "WHandleCount.h"

#include <windows.h>

#include <psapi.h>
#include <tlhelp32.h>

ProcessFigures ReadProcessFigures() {
    ProcessFigures figures;
    HANDLE const snapshot = CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    for (BOOL more = Thread32First(snapshot, &entry); more != FALSE; more = Thread32Next(snapshot, &entry)) {
        figures.threads += entry.th32OwnerProcessID == GetCurrentProcessId() ? 1 : 0;
    }
    CloseHandle(snapshot);
    figures.handles = CountHandles();
    PROCESS_MEMORY_COUNTERS_EX memory{};
    GetProcessMemoryInfo(GetCurrentProcess(), reinterpret_cast<PROCESS_MEMORY_COUNTERS *>(&memory), sizeof memory);
    // Wine counts no private memory.
    figures.bytes = memory.PrivateUsage != 0 ? memory.PrivateUsage : memory.WorkingSetSize;
    return figures;
}
