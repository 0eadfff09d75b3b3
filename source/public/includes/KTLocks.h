// KTLocks.h: mutexes, scoped locks and conditions between the threads of one process.
//
// Every class is a thin handle: a virtual destructor first in its virtual table and one pointer to an implementation
// object that the handle owns, so that hosts never see the threading library underneath.
//
//     KTMutex mutex;
//     {
//         KTLock lock(mutex);          // acquired here
//         while (queue.empty())
//             condition.wait(lock);    // released while waiting; loop, as wake-ups may be spurious
//     }                                // released here
//
// WRONG: copying a handle. The copy operations exist and copy the pointer only, so two handles then delete one object.
//
// Threads: a mutex and a condition may be used by any thread; a lock object belongs to one thread at a time.

#pragma once

#include "KTBeginExports.h"

class KTMutexImpl;
class KTRecursiveMutexImpl;
class KTLockImpl;
class KTRecursiveLockImpl;
class KTConditionImpl;

/// A mutex that is locked and unlocked only through a KTLock. Destroy it unlocked.
class KT_PUBLIC_API KTMutex {
  public:
    /// Creates an unlocked mutex. Throws std::bad_alloc.
    KTMutex();
    KTMutex(KTMutex const &other);            ///< copies the pointer only, see above
    KTMutex &operator=(KTMutex const &other); ///< copies the pointer only, see above
    virtual ~KTMutex();

    /// The owned implementation object.
    KTMutexImpl *get();

  private:
    KTMutexImpl *m_Impl;
};

/// A mutex that one thread may hold several times; free when it was released as often. Destroy it unlocked.
class KT_PUBLIC_API KTRecursiveMutex {
  public:
    /// Creates an unlocked mutex. Throws std::bad_alloc.
    KTRecursiveMutex();
    KTRecursiveMutex(KTRecursiveMutex const &other);            ///< copies the pointer only, see above
    KTRecursiveMutex &operator=(KTRecursiveMutex const &other); ///< copies the pointer only, see above
    virtual ~KTRecursiveMutex();

    /// The owned implementation object.
    KTRecursiveMutexImpl *get();

  private:
    KTRecursiveMutexImpl *m_Impl;
};

/// Holds a KTMutex for a scope.
class KT_PUBLIC_API KTLock {
  public:
    /// Acquires the mutex at once, blocking until it is free. Throws std::bad_alloc, boost::thread_resource_error.
    explicit KTLock(KTMutex &mutex);
    KTLock(KTLock const &other);            ///< copies the pointer only, see above
    KTLock &operator=(KTLock const &other); ///< copies the pointer only, see above

    /// Releases the mutex if, and only if, this object still owns it.
    virtual ~KTLock();

    /// Acquires the mutex again after unlock(). Throws boost::lock_error, and changes nothing, if this object owns it.
    void lock();

    /// Releases the mutex. Throws boost::lock_error, and changes nothing, if this object does not own it.
    void unlock();

    /// The owned implementation object.
    KTLockImpl *get();

  private:
    KTLockImpl *m_Impl;
};

/// Holds one level of a KTRecursiveMutex for a scope.
class KT_PUBLIC_API KTRecursiveLock {
  public:
    /// Acquires the mutex at once; does not block when this thread holds it already. Throws as KTLock does.
    explicit KTRecursiveLock(KTRecursiveMutex &mutex);
    KTRecursiveLock(KTRecursiveLock const &other);            ///< copies the pointer only, see above
    KTRecursiveLock &operator=(KTRecursiveLock const &other); ///< copies the pointer only, see above

    /// Releases one level if, and only if, this object still owns it.
    virtual ~KTRecursiveLock();

    /// Acquires one level again after unlock(). Throws boost::lock_error, and changes nothing, if this object owns one.
    void lock();

    /// Releases one level. Throws boost::lock_error, and changes nothing, if this object owns none.
    void unlock();

    /// The owned implementation object.
    KTRecursiveLockImpl *get();

  private:
    KTRecursiveLockImpl *m_Impl;
};

/// A condition variable that waits on either kind of lock. Wake-ups may be spurious: wait in a loop.
class KT_PUBLIC_API KTCondition {
  public:
    /// Creates a condition that nobody waits for. Throws std::bad_alloc.
    KTCondition();
    KTCondition(KTCondition const &other);            ///< copies the pointer only, see above
    KTCondition &operator=(KTCondition const &other); ///< copies the pointer only, see above
    virtual ~KTCondition();

    /// Releases the lock's mutex, blocks until notified and acquires it again before returning; no time limit.
    /// REQUIRES: the lock owns its mutex. A recursive lock's mutex is held once: only one level is released.
    void wait(KTLock &lock);
    void wait(KTRecursiveLock &lock);

    /// The same, up to a deadline computed once on entry: the UTC time now plus `milliseconds`. Returns true when woken
    /// before the deadline, however long the mutex is busy then, false when it passed; 0 or less returns false at once
    /// when nobody notifies. The mutex is held again in both cases. A step of the system clock meanwhile changes
    /// nothing. On Windows the system may end the wait late by 32 milliseconds or 5 per cent, at most a second.
    bool timed_wait(KTLock &lock, int milliseconds);

    /// Wakes one waiter; does nothing when nobody waits.
    void notify_one();

    /// Wakes all waiters; does nothing when nobody waits.
    void notify_all();

    /// The owned implementation object.
    KTConditionImpl *get();

  private:
    KTConditionImpl *m_Impl;
};

#include "KTEndExports.h"
