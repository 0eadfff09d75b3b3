// WMessageBox.h: the user, who reads the process's message box and presses OK.

#pragma once

#include <windows.h>

#include <boost/thread/thread.hpp>

#include <functional>
#include <string>

class WMessageBox {
  public:
    /// Waits on a thread of its own for the box with that caption, up to a minute; calls `seen` with its text and
    /// buttons, and presses OK.
    struct Seen {
        std::wstring text;
        int buttons = 0;
    };
    WMessageBox(std::wstring caption, std::function<void(Seen const &)> seen)
        : m_Thread([caption = std::move(caption), seen = std::move(seen)] { Wait(caption, seen); }) {}
    WMessageBox(WMessageBox const &) = delete;
    WMessageBox &operator=(WMessageBox const &) = delete;
    ~WMessageBox() { m_Thread.join(); }

  private:
    static void Wait(std::wstring const &caption, std::function<void(Seen const &)> const &seen) {
        constexpr int kAttempts = 6000;
        for (int attempt = 0; attempt < kAttempts; ++attempt, Sleep(10)) { // a window gives no event
            HWND const box = FindOwn(caption);
            if (box == nullptr || GetDlgItem(box, kText) == nullptr) {
                continue;
            }
            seen(Read(box));
            while (IsWindow(box) != FALSE) {
                PostMessageW(box, WM_COMMAND, IDOK, 0);
                Sleep(10);
            }
            return;
        }
    }

    // Other processes may show boxes with the same caption.
    static HWND FindOwn(std::wstring const &caption) {
        for (HWND box = nullptr; (box = FindWindowExW(nullptr, box, L"#32770", caption.c_str())) != nullptr;) {
            DWORD process = 0;
            GetWindowThreadProcessId(box, &process);
            if (process == GetCurrentProcessId()) {
                return box;
            }
        }
        return nullptr;
    }

    static Seen Read(HWND box) {
        Seen result;
        wchar_t text[4096] = L"";
        result.text.assign(text, static_cast<std::size_t>(GetDlgItemTextW(box, kText, text, 4096)));
        for (HWND child = nullptr; (child = FindWindowExW(box, child, L"Button", nullptr)) != nullptr;) {
            ++result.buttons;
        }
        return result;
    }

    static constexpr int kText = 0xFFFF; // the system's number of the text in a message box

    boost::thread m_Thread;
};
