// KTTickLoop.h: the passes over thread timers and single bursts, without thread and clock of their own.
//
//     first reading            second reading               end reading
//     |---- sleep, unlocked ---|---- count down and post ---|         |---- sleep ...
//                              |<----- processing --------->|
//     |<------- elapsed, with the processing of the pass before ----->|
//
// The sleep is shortened by the processing of the pass before, so that passes start every 10 milliseconds; after a pass
// that took longer than that there is none.

#pragma once

#include "KTTimerService.h"
#include "KTTypes.h"

/// What the loop needs from its surroundings; tests bring their own.
class KTTickTime {
  public:
    virtual ~KTTickTime() = default;

    /// The UTC time in microseconds.
    virtual KTUInt64 Now() = 0;

    /// Returns when Now() has reached `deadline`, or has been set back behind `start`, which was read before.
    virtual void Sleep(KTUInt64 start, KTUInt64 deadline) = 0;
};

/// Sets interval and countdown of a timer; negative intervals have a negative rest as well.
void KTSetTimerInterval(KTTimerService::CTimerInfo &timer, long milliseconds);

/// Sets the countdown back to the interval.
void KTReloadTimer(KTTimerService::CTimerInfo &timer);

class KTTickLoop {
  public:
    KTTickLoop(KTTimerService::CTimerSlots &repeating, KTTimerService::CTimerSlots &bursts, KTTickTime &time)
        : m_Repeating(repeating), m_Bursts(bursts), m_Time(time) {}

    /// One pass. REQUIRES: `lock` is owned and guards both tables; it is released during the sleep only.
    void Pass(KTRecursiveLock &lock);

  private:
    void CountDownRepeating(KTUInt64 elapsed);
    void CountDownBursts(KTUInt64 elapsed);

    KTTimerService::CTimerSlots &m_Repeating;
    KTTimerService::CTimerSlots &m_Bursts;
    KTTickTime &m_Time;
    KTUInt64 m_Processing = 0; // of the pass before, in microseconds
};
