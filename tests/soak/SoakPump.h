// SoakPump.h: one turn of a message pump.

#pragma once

/// Dispatches what waits for the calling thread, its timers' messages among it; natively every UI timer ticks.
void PumpSoakMessages();
