// WOPause.cpp: short sleeps by the system's timers.
//
// Sleeping with a time limit ends with the system's clock interrupt, every 15.6 milliseconds on most machines. Timers of
// high resolution do not wait for it; systems before Windows 10 of 2018 do not have them.

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

} // namespace

OPause::OPause() : m_Timer(std::make_unique<Timer>()) {
    m_Timer->handle = WOHandle(CreateWaitableTimerExW(nullptr, nullptr, CREATE_WAITABLE_TIMER_HIGH_RESOLUTION,
                                                      SYNCHRONIZE | TIMER_MODIFY_STATE));
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
