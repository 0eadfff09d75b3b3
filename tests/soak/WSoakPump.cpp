// WSoakPump.cpp: the message pump of a Windows thread.

#include "SoakPump.h"

#include <windows.h>

void PumpSoakMessages() {
    MSG msg;
    while (PeekMessageW(&msg, nullptr, 0, 0, PM_REMOVE) != FALSE) {
        DispatchMessageW(&msg);
    }
}
