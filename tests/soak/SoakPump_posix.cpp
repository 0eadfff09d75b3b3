// SoakPump_posix.cpp: the stand-in's timers of the native developer build, ticked one after another.

#include "SoakPump.h"

#include "OTestTimerWindow.h"

void PumpSoakMessages() {
    for (auto const &[id, interval] : OTestTimers()) {
        OTickTestTimer(id);
    }
}
