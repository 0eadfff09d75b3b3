// WPump.h: the demo's message pump.

#pragma once

/// Dispatches the calling thread's messages, those of its UI timers among them, until QuitPump is called on it.
void PumpMessages();

/// Ends PumpMessages once what it is doing is done.
void QuitPump();
