// KTTickCount.h: the time since the library was loaded.
//
// Both clocks compare the UTC time, at microsecond resolution, with a sample taken when the library was loaded. Being
// based on wall-clock time, both move when the system clock is set, also backwards.
//
// Threads: any.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Milliseconds since the library was loaded: the difference of two millisecond counts since 1970, each kept modulo
/// 2^32 and subtracted in 32-bit arithmetic. After 2^31 - 1 milliseconds (some 24 days) it wraps around to -2^31.
KT_PUBLIC_API long KTGetTickCountSinceAppStartTime();

/// 100-nanosecond units since the library was loaded, in steps of 10; wraps around below 0.
KT_PUBLIC_API KTUInt64 KTGetTickCountSinceAppStartTimeNS100();

#include "KTEndExports.h"
