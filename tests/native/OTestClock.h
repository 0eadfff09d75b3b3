// OTestClock.h: what the native stand-in of the clock offers to tests.

#pragma once

#include "KTTypes.h"

/// OUtcMicroseconds gives this from now on; 0 gives it back to the system's clock. Any thread.
void OSetTestClock(KTUInt64 microseconds);

/// How often the clock has been read. Any thread.
unsigned int OTestClockReadings();
