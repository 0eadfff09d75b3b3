// KTShortWait.h: waits that are likely to be over before the system could put the thread to sleep and wake it again.
//
// Sleeping and waking costs tens of microseconds, while a mutex of this library is held for some nanoseconds and a
// message is often answered at once. A thread therefore looks again for a moment, letting others run in between, before
// it waits properly. That moment is bounded by a count, so an idle thread does not keep a processor busy.

#pragma once

#include "KTLocks.h"
#include "KTLocksImpl.h"
#include "OThread.h"

#if defined(__x86_64__) || defined(_M_X64)
#include <emmintrin.h>
#endif

/// Looks at `isOver` for a moment. Whether it was.
template <typename Condition> bool KTWaitShortly(Condition const &isOver) {
    constexpr int kPauses = 64; // a microsecond or two, for what another processor is about to do
    constexpr int kYields = 64; // for what a thread that waits for this processor is about to do
    for (int i = 0; i < kPauses + kYields; ++i) {
        if (isOver()) {
            return true;
        }
        if (i >= kPauses) {
            OYieldThread();
        } else {
#if defined(__x86_64__) || defined(_M_X64)
            _mm_pause();
#endif
        }
    }
    return isOver();
}

/// Holds a KTMutex for a short scope without memory of its own; the library's counterpart of KTLock, which hosts use.
class KTShortLock {
  public:
    explicit KTShortLock(KTMutex &mutex) : m_Lock(mutex.get()->get(), boost::try_to_lock) {
        if (!m_Lock && !KTWaitShortly([this] { return m_Lock.try_lock(); })) {
            m_Lock.lock();
        }
    }

    /// KTCondition::wait; wake-ups may be spurious.
    void Wait(KTCondition &condition) { condition.get()->get().wait(m_Lock); }

    void Unlock() { m_Lock.unlock(); }
    void Lock() { m_Lock.lock(); }

  private:
    boost::unique_lock<boost::mutex> m_Lock;
};
