// WPump.cpp: the message pump, by the system's calls.

#include "WPump.h"

#include <windows.h>

void PumpMessages() {
    MSG message;
    while (GetMessageW(&message, nullptr, 0, 0) > 0) {
        TranslateMessage(&message);
        DispatchMessageW(&message);
    }
}

void QuitPump() { PostQuitMessage(0); }
