// WKTTimerWindow.cpp: the hidden window, by the system's own calls.

#include "KTTimerWindow.h"

#include <windows.h>

namespace {

constexpr wchar_t kClassName[] = L"InvisibleTimerServiceClass";
constexpr wchar_t kWindowName[] = L"InvisibleTimerService";

static_assert(sizeof(WNDCLASSEXW) == 80);
static_assert((WS_POPUP | WS_BORDER | WS_SYSMENU) == 0x80880000);

LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM first, LPARAM second) {
    if (message != WM_TIMER) {
        return DefWindowProcW(window, message, first, second);
    }
    KTTimerWindowTicked(static_cast<KTInt64>(first));
    return 0;
}

} // namespace

void *KTCreateTimerWindow() noexcept {
    WNDCLASSEXW description{};
    description.cbSize = sizeof description;
    description.lpfnWndProc = Procedure;
    description.lpszClassName = kClassName;
    RegisterClassExW(&description); // fails if a window of another thread was left behind; then the class is there
    return CreateWindowExW(0, kClassName, kWindowName, WS_POPUP | WS_BORDER | WS_SYSMENU, 6, 8, 10, 10, nullptr,
                           nullptr, nullptr, nullptr);
}

void KTDestroyTimerWindow(void *window) noexcept {
    DestroyWindow(static_cast<HWND>(window));
    // The class belongs to the program and would outlive a library that is unloaded, with its procedure gone.
    UnregisterClassW(kClassName, nullptr);
}

bool KTSetWindowTimer(void *window, KTInt64 id, KTUInt32 milliseconds) noexcept {
    return SetTimer(static_cast<HWND>(window), static_cast<UINT_PTR>(id), milliseconds, nullptr) != 0;
}

void KTKillWindowTimer(void *window, KTInt64 id) noexcept {
    KillTimer(static_cast<HWND>(window), static_cast<UINT_PTR>(id));
}
