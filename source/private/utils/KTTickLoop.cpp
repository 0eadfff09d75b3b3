// KTTickLoop.cpp: the countdown of thread timers and single bursts.

#include "KTTickLoop.h"

namespace {

using CTimerInfo = KTTimerService::CTimerInfo;
using CTimerSlots = KTTimerService::CTimerSlots;

constexpr KTUInt64 kPass = 10'000; // microseconds

constexpr long kMillisecondsPerSecond = 1000;
constexpr KTUInt64 kMicrosecondsPerSecond = 1'000'000;
constexpr KTInt32 kNanosecondsPerSecond = 1'000'000'000;
constexpr KTInt32 kNanosecondsPerMillisecond = 1'000'000;
constexpr KTInt32 kNanosecondsPerMicrosecond = 1000;

// A clock that was set back in between gives 0: otherwise countdowns would grow, and the loop sleep, by as much.
KTUInt64 SpanOf(KTUInt64 from, KTUInt64 to) { return to > from ? to - from : 0; }

bool IsOver(CTimerInfo const &timer) { return timer.remainingSeconds == 0 && timer.remainingNanoseconds == 0; }

// Subtracts microseconds from the countdown, at most down to 0. Whether it is over.
bool CountDown(CTimerInfo &timer, KTUInt64 elapsed) {
    timer.remainingSeconds -= static_cast<KTInt64>(elapsed / kMicrosecondsPerSecond);
    if (timer.remainingSeconds < 0) {
        timer.remainingSeconds = 0;
        timer.remainingNanoseconds = 0;
        return true;
    }
    timer.remainingNanoseconds -= static_cast<KTInt32>(elapsed % kMicrosecondsPerSecond) * kNanosecondsPerMicrosecond;
    if (timer.remainingNanoseconds < 0) {
        if (timer.remainingSeconds > 0) {
            --timer.remainingSeconds;
            timer.remainingNanoseconds += kNanosecondsPerSecond;
        } else {
            timer.remainingNanoseconds = 0;
        }
    }
    return IsOver(timer);
}

} // namespace

void KTSetTimerInterval(CTimerInfo &timer, long milliseconds) {
    timer.intervalSeconds = milliseconds / kMillisecondsPerSecond;
    timer.intervalNanoseconds =
        static_cast<KTInt32>(milliseconds % kMillisecondsPerSecond) * kNanosecondsPerMillisecond;
    KTReloadTimer(timer);
}

void KTReloadTimer(CTimerInfo &timer) {
    timer.remainingSeconds = timer.intervalSeconds;
    timer.remainingNanoseconds = timer.intervalNanoseconds;
}

void KTTickLoop::Pass(KTRecursiveLock &lock) {
    KTUInt64 const first = m_Time.Now();
    if (m_Processing < kPass) {
        lock.unlock();
        m_Time.Sleep(first, first + kPass - m_Processing);
        lock.lock();
    }
    KTUInt64 const second = m_Time.Now();
    KTUInt64 const elapsed = m_Processing + SpanOf(first, second);
    CountDownRepeating(elapsed);
    CountDownBursts(elapsed);
    m_Processing = SpanOf(second, m_Time.Now());
}

void KTTickLoop::CountDownRepeating(KTUInt64 elapsed) {
    for (KTInt64 id = m_Repeating.GetFirstUsed(); id != CTimerSlots::kNone; id = m_Repeating.GetNextUsed(id)) {
        CTimerInfo &timer = m_Repeating.Find(id);
        if (!CountDown(timer, elapsed)) {
            continue;
        }
        if (timer.thread != nullptr) {
            timer.thread->postMessageIfNotSameAsPreviousMessage(timer.message, 0, 0, 0, 0);
        }
        KTReloadTimer(timer);
    }
}

void KTTickLoop::CountDownBursts(KTUInt64 elapsed) {
    for (KTInt64 id = m_Bursts.GetFirstUsed(); id != CTimerSlots::kNone;) {
        KTInt64 const next = m_Bursts.GetNextUsed(id);
        CTimerInfo &timer = m_Bursts.Find(id);
        if (IsOver(timer)) {
            m_Bursts.Free(id); // it fired in the pass before
        } else if (CountDown(timer, elapsed) && timer.thread != nullptr) {
            timer.thread->postMessage(timer.message, 0, 0, 0, 0);
        }
        id = next;
    }
}
