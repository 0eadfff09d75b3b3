// OTestTimerWindow.h: what the native stand-in of the timer window offers to tests. Nothing ticks by itself.

#pragma once

#include "KTTypes.h"

#include <map>

/// Calls the window's procedure with a tick, on the calling thread; nothing if there is no window.
void OTickTestTimer(KTInt64 id);

/// The timers that the window has, with their intervals in milliseconds. Any thread.
std::map<KTInt64, KTUInt32> OTestTimers();

/// Whether there is a window.
bool OHasTestTimerWindow();

/// Lets the next windows, or the next timers, be refused; true takes effect until false.
void ORefuseTestTimerWindows(bool refuse);
void ORefuseTestTimers(bool refuse);
