// WOPause.cpp: short sleeps by the system's timers.
//
// Sleeping with a time limit ends with the system's clock interrupt, every 15.6 milliseconds on most machines. Timers of
// high resolution do not wait for it. Windows has them since 2018; elsewhere asking for one gives nothing, or an ordinary
// timer, which would only be a more expensive way to sleep.

#include "OPause.h"

#include "WOHandle.h"

#include <windows.h>

#if !defined(CREATE_WAITABLE_TIMER_HIGH_RESOLUTION)
#define CREATE_WAITABLE_TIMER_HIGH_RESOLUTION 0x00000002
#endif

struct OPause::Timer {
    WOHandle handle;
};

namespace {

constexpr KTUInt64 kMicrosecondsPerMillisecond = 1000;
constexpr LONGLONG kCountsPerMicrosecond = 10;
constexpr DWORD kNoSuchFlag = 0x40000000;

WOHandle MakeTimer(DWORD flags) {
    return WOHandle(CreateWaitableTimerExW(nullptr, nullptr, flags, SYNCHRONIZE | TIMER_MODIFY_STATE));
}

// A system that takes any flag does not know this one either.
bool ChecksFlags() { return !MakeTimer(kNoSuchFlag).IsValid(); }

} // namespace

OPause::OPause() : m_Timer(std::make_unique<Timer>()) {
    if (ChecksFlags()) {
        m_Timer->handle = MakeTimer(CREATE_WAITABLE_TIMER_HIGH_RESOLUTION);
    }
}

OPause::~OPause() = default;

void OPause::For(KTUInt64 microseconds) noexcept {
    LARGE_INTEGER due;
    due.QuadPart = -static_cast<LONGLONG>(microseconds) * kCountsPerMicrosecond; // below 0: from now
    if (m_Timer->handle.IsValid() &&
        SetWaitableTimer(m_Timer->handle.Get(), &due, 0, nullptr, nullptr, FALSE) != FALSE) {
        WaitForSingleObject(m_Timer->handle.Get(), INFINITE);
    } else {
        Sleep(static_cast<DWORD>((microseconds + kMicrosecondsPerMillisecond - 1) / kMicrosecondsPerMillisecond));
    }
}
