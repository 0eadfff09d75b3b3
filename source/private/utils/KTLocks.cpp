// KTLocks.cpp: the handles of mutexes, scoped locks and conditions.
//
// The copy operations are defaulted member by member: they copy the pointer, as the header warns.

#include "KTLocks.h"

#include "KTLocksImpl.h"

#include <boost/date_time/posix_time/posix_time_types.hpp>

KTMutex::KTMutex() : m_Impl(new KTMutexImpl) {}
KTMutex::KTMutex(KTMutex const &other) = default;
KTMutex &KTMutex::operator=(KTMutex const &other) = default;
KTMutex::~KTMutex() { delete m_Impl; }
KTMutexImpl *KTMutex::get() { return m_Impl; }

KTRecursiveMutex::KTRecursiveMutex() : m_Impl(new KTRecursiveMutexImpl) {}
KTRecursiveMutex::KTRecursiveMutex(KTRecursiveMutex const &other) = default;
KTRecursiveMutex &KTRecursiveMutex::operator=(KTRecursiveMutex const &other) = default;
KTRecursiveMutex::~KTRecursiveMutex() { delete m_Impl; }
KTRecursiveMutexImpl *KTRecursiveMutex::get() { return m_Impl; }

KTLock::KTLock(KTMutex &mutex) : m_Impl(new KTLockImpl(mutex.get()->get())) {}
KTLock::KTLock(KTLock const &other) = default;
KTLock &KTLock::operator=(KTLock const &other) = default;
KTLock::~KTLock() { delete m_Impl; }
KTLockImpl *KTLock::get() { return m_Impl; }

void KTLock::lock() { m_Impl->get().lock(); }

void KTLock::unlock() { m_Impl->get().unlock(); }

KTRecursiveLock::KTRecursiveLock(KTRecursiveMutex &mutex) : m_Impl(new KTRecursiveLockImpl(mutex.get()->get())) {}
KTRecursiveLock::KTRecursiveLock(KTRecursiveLock const &other) = default;
KTRecursiveLock &KTRecursiveLock::operator=(KTRecursiveLock const &other) = default;
KTRecursiveLock::~KTRecursiveLock() { delete m_Impl; }
KTRecursiveLockImpl *KTRecursiveLock::get() { return m_Impl; }

void KTRecursiveLock::lock() { m_Impl->get().lock(); }

void KTRecursiveLock::unlock() { m_Impl->get().unlock(); }

KTCondition::KTCondition() : m_Impl(new KTConditionImpl) {}
KTCondition::KTCondition(KTCondition const &other) = default;
KTCondition &KTCondition::operator=(KTCondition const &other) = default;
KTCondition::~KTCondition() { delete m_Impl; }
KTConditionImpl *KTCondition::get() { return m_Impl; }

void KTCondition::wait(KTLock &lock) { m_Impl->get().wait(lock.get()->get()); }

void KTCondition::wait(KTRecursiveLock &lock) { m_Impl->get().wait(lock.get()->get()); }

bool KTCondition::timed_wait(KTLock &lock, int milliseconds) {
    using Clock = boost::posix_time::microsec_clock;
    boost::posix_time::ptime const deadline = Clock::universal_time() + boost::posix_time::milliseconds(milliseconds);
    // Boost's wait for a point in time answers by the clock once it holds the mutex again: a notification in time would
    // count for nothing where the mutex is busy until after the deadline. Its wait for a duration says whether it was
    // woken.
    return m_Impl->get().timed_wait(lock.get()->get(), deadline - Clock::universal_time());
}

void KTCondition::notify_one() { m_Impl->get().notify_one(); }

void KTCondition::notify_all() { m_Impl->get().notify_all(); }
