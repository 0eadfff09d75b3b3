// KTClockSample.h: the UTC clock as the since-load clocks count it.

#pragma once

#include "KTTypes.h"

/// One reading of the UTC clock (OClock.h), in two scales.
struct KTClockSample {
    KTUInt32 milliseconds = 0; ///< since 1970: whole seconds times 1000 plus the milliseconds, modulo 2^32
    KTUInt64 ns100 = 0;        ///< since 1970, in 100-nanosecond units: whole microseconds times 10
};

/// Reads the clock now. Any thread.
KTClockSample KTSampleClock();

/// The reading taken when the library was loaded. Any thread.
KTClockSample const &KTLoadSample();
