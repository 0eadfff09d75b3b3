// KTTimerWindow.h: the hidden window that brings UI timers into its thread's message pump; seam to the system.

#pragma once

#include "KTTypes.h"

/// Makes the window; it belongs to the calling thread. Null if the system refuses.
void *KTCreateTimerWindow() noexcept;

/// Destroys the window and all its timers. Does nothing on another thread than the one that made it: windows are their
/// threads'.
void KTDestroyTimerWindow(void *window) noexcept;

/// Makes the window call KTTimerWindowTicked with `id` each time the interval is over. Whether the system could.
bool KTSetWindowTimer(void *window, KTInt64 id, KTUInt32 milliseconds) noexcept;

/// Ends it; nothing if there is no timer with that id. Any thread.
void KTKillWindowTimer(void *window, KTInt64 id) noexcept;

/// Called by the window, on its thread. A tick that was under way when its timer was killed may still come.
void KTTimerWindowTicked(KTInt64 id);
