// WODebugOutput.cpp: the debugger output, sent only where somebody watches.
//
// Without a debugger the system's call raises an exception, swallows it and looks for a monitor by three named objects:
// up to a hundred times the cost of the file line. Two cheaper questions come first. A monitor announces itself by the
// event that this file opens.

#include "WODebugOutput.h"

#include "ODebugText.h"
#include "WOHandle.h"

#include <atomic>

namespace {

constexpr ULONGLONG kMonitorCheckInterval = 100; // milliseconds

std::atomic<ULONGLONG> g_NextMonitorCheck{0};
std::atomic<bool> g_MonitorRuns{false};

bool DoesMonitorRun() noexcept {
    ULONGLONG const now = GetTickCount64();
    ULONGLONG due = g_NextMonitorCheck.load(std::memory_order_relaxed);
    // One thread asks the system, the others go on with the last answer.
    if (now >= due && g_NextMonitorCheck.compare_exchange_strong(due, now + kMonitorCheckInterval)) {
        WOHandle const event(OpenEventW(SYNCHRONIZE, FALSE, L"DBWIN_BUFFER_READY"));
        g_MonitorRuns.store(event.IsValid(), std::memory_order_relaxed);
    }
    return g_MonitorRuns.load(std::memory_order_relaxed);
}

} // namespace

bool WOIsDebugOutputWatched() noexcept { return IsDebuggerPresent() != FALSE || DoesMonitorRun(); }

void WODebugOutput(std::wstring const &text) noexcept {
    OutputDebugStringW(text.c_str());
    OutputDebugStringW(L"\n");
}

void ODebugText(char const *text) noexcept { OutputDebugStringA(text); }
