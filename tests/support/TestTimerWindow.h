// TestTimerWindow.h: ticks the timer service's hidden window without waiting for time, on the calling thread, which must
// be the one that created the service.
//
// On Windows the window is found by its class and gets the message that a timer would send; natively the stand-in is
// asked. The system's own ticks come through a message pump only, so none comes while a test does not pump.

#pragma once

#include "KTTypes.h"

#if defined(_WIN32)

#include "WImportHook.h"

#include <string_view>

/// This process's window, or null. Other test programs may have theirs at the same time.
inline HWND FindTimerWindow() {
    HWND found = nullptr;
    auto const look = [](HWND window, LPARAM result) -> BOOL {
        wchar_t name[64]{};
        DWORD process = 0;
        GetWindowThreadProcessId(window, &process);
        bool const isOurs = process == GetCurrentProcessId() && GetClassNameW(window, name, 64) != 0 &&
                            std::wstring_view(name) == L"InvisibleTimerServiceClass";
        if (isOurs) {
            *reinterpret_cast<HWND *>(result) = window;
        }
        return isOurs ? FALSE : TRUE;
    };
    EnumWindows(look, reinterpret_cast<LPARAM>(&found));
    return found;
}

inline void TickTimerWindow(KTInt64 id) { SendMessageW(FindTimerWindow(), WM_TIMER, static_cast<WPARAM>(id), 0); }

inline bool HasTimerWindow() { return FindTimerWindow() != nullptr; }

/// While it lives the system makes no window, or no timer.
class RefusedTimerWindows {
    static HWND WINAPI Refuse(DWORD, LPCWSTR, LPCWSTR, DWORD, int, int, int, int, HWND, HMENU, HINSTANCE, LPVOID) {
        return nullptr;
    }
    WImportHook m_Hook{L"KTPublic.dll", "CreateWindowExW", Refuse};
};

class RefusedTimers {
    static UINT_PTR WINAPI Refuse(HWND, UINT_PTR, UINT, TIMERPROC) { return 0; }
    WImportHook m_Hook{L"KTPublic.dll", "SetTimer", Refuse};
};

#else

#include "OTestTimerWindow.h"

inline void TickTimerWindow(KTInt64 id) { OTickTestTimer(id); }

inline bool HasTimerWindow() { return OHasTestTimerWindow(); }

class RefusedTimerWindows {
  public:
    RefusedTimerWindows() { ORefuseTestTimerWindows(true); }
    RefusedTimerWindows(RefusedTimerWindows const &) = delete;
    RefusedTimerWindows &operator=(RefusedTimerWindows const &) = delete;
    ~RefusedTimerWindows() { ORefuseTestTimerWindows(false); }
};

class RefusedTimers {
  public:
    RefusedTimers() { ORefuseTestTimers(true); }
    RefusedTimers(RefusedTimers const &) = delete;
    RefusedTimers &operator=(RefusedTimers const &) = delete;
    ~RefusedTimers() { ORefuseTestTimers(false); }
};

#endif
