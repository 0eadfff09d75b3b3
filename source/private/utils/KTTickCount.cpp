// KTTickCount.cpp: samples of the UTC clock, and the time since the one taken at load.

#include "KTTickCount.h"

#include "KTClockSample.h"
#include "OClock.h"

namespace {

constexpr KTUInt64 kMicrosecondsPerMillisecond = 1000;
constexpr KTUInt64 kNs100PerMicrosecond = 10;

KTClockSample const kLoadSample = KTSampleClock();

} // namespace

KTClockSample KTSampleClock() {
    KTUInt64 const now = OUtcMicroseconds();
    return {static_cast<KTUInt32>(now / kMicrosecondsPerMillisecond), now * kNs100PerMicrosecond};
}

KTClockSample const &KTLoadSample() { return kLoadSample; }

long KTGetTickCountSinceAppStartTime() {
    return static_cast<KTInt32>(KTSampleClock().milliseconds - kLoadSample.milliseconds);
}

KTUInt64 KTGetTickCountSinceAppStartTimeNS100() { return KTSampleClock().ns100 - kLoadSample.ns100; }
