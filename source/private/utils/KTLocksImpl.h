// KTLocksImpl.h: the implementation objects behind the handles of KTLocks.h, over Boost.Thread.

#pragma once

#include "OThreadSpares.h"

#include <boost/thread/condition_variable.hpp>
#include <boost/thread/lock_types.hpp>
#include <boost/thread/mutex.hpp>
#include <boost/thread/recursive_mutex.hpp>

class KTMutexImpl {
  public:
    boost::mutex &get() { return m_Mutex; }

  private:
    boost::mutex m_Mutex;
};

class KTRecursiveMutexImpl {
  public:
    boost::recursive_mutex &get() { return m_Mutex; }

  private:
    boost::recursive_mutex m_Mutex;
};

/// A scoped lock's implementation: the mutex and whether it is owned. Made and destroyed for every scope, so its memory
/// comes from the thread's spare blocks.
template <typename Mutex> class KTScopedLockImpl {
  public:
    explicit KTScopedLockImpl(Mutex &mutex) : m_Lock(mutex) {}

    boost::unique_lock<Mutex> &get() { return m_Lock; }

    // NOLINTNEXTLINE(misc-new-delete-overloads): its counterpart takes the size, too
    static void *operator new(std::size_t size) { return OTakeBlock(size); }
    static void operator delete(void *block, std::size_t size) { OGiveBlock(block, size); }

  private:
    boost::unique_lock<Mutex> m_Lock;
};

class KTLockImpl : public KTScopedLockImpl<boost::mutex> {
    using KTScopedLockImpl::KTScopedLockImpl;
};

class KTRecursiveLockImpl : public KTScopedLockImpl<boost::recursive_mutex> {
    using KTScopedLockImpl::KTScopedLockImpl;
};

class KTConditionImpl {
  public:
    boost::condition_variable_any &get() { return m_Condition; }

  private:
    boost::condition_variable_any m_Condition;
};
