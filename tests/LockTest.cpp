// LockTest.cpp: mutexes, scoped locks and conditions between threads.

#include "KTLocks.h"

#include <boost/date_time/posix_time/posix_time_types.hpp>
#include <boost/thread/lock_types.hpp>
#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <atomic>
#include <deque>
#include <memory>

namespace {

using Clock = boost::posix_time::microsec_clock;

// Whether another thread gets the mutex within the given time. `Lock` is tried by a thread that may stay blocked until
// the caller releases the mutex; the probe then ends by itself.
template <typename Mutex, typename Lock> class Probe {
  public:
    explicit Probe(Mutex &mutex)
        : m_Thread([this, &mutex] {
              Lock const lock(mutex);
              m_Got = true;
          }) {}
    Probe(Probe const &) = delete;
    Probe &operator=(Probe const &) = delete;
    ~Probe() { m_Thread.join(); }

    bool GotWithin(int milliseconds) {
        m_Thread.timed_join(boost::posix_time::milliseconds(milliseconds));
        return m_Got;
    }

  private:
    std::atomic<bool> m_Got{false};
    boost::thread m_Thread;
};

using MutexProbe = Probe<KTMutex, KTLock>;
using RecursiveProbe = Probe<KTRecursiveMutex, KTRecursiveLock>;

constexpr int kSoon = 30;      // milliseconds in which a blocked thread must not get on
constexpr int kAtLast = 60000; // milliseconds in which a free mutex is surely taken

} // namespace

TEST(Lock, HoldsTheMutexUntilDestroyed) {
    KTMutex mutex;
    auto lock = std::make_unique<KTLock>(mutex);
    MutexProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    lock.reset();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(Lock, HoldsTheMutexUntilUnlocked) {
    KTMutex mutex;
    KTLock lock(mutex);
    MutexProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    lock.unlock();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(Lock, CanBeTakenAgain) {
    KTMutex mutex;
    KTLock lock(mutex);
    lock.unlock();
    lock.lock();
    MutexProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    lock.unlock();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(Lock, MisuseThrowsAndChangesNothing) {
    KTMutex mutex;
    {
        KTLock lock(mutex);
        EXPECT_THROW(lock.lock(), boost::lock_error);
        MutexProbe probe(mutex);
        EXPECT_FALSE(probe.GotWithin(kSoon)); // still held
        lock.unlock();
        EXPECT_THROW(lock.unlock(), boost::lock_error);
        EXPECT_TRUE(probe.GotWithin(kAtLast));
        EXPECT_THROW(lock.unlock(), boost::lock_error);
    }
}

TEST(Lock, TheDestructorReleasesOnceAfterUnlock) {
    KTMutex mutex;
    auto first = std::make_unique<KTLock>(mutex);
    first->unlock();
    KTLock const second(mutex);
    first.reset(); // does not own: must not release what `second` holds
    MutexProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    const_cast<KTLock &>(second).unlock();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(Lock, ManyMayBeHeldAtOnceAndReleasedInAnyOrder) {
    constexpr std::size_t kMany = 40; // more than a thread keeps spare blocks for
    std::deque<KTMutex> mutexes(kMany);
    for (int round = 0; round < 3; ++round) {
        std::deque<std::unique_ptr<KTLock>> locks;
        for (KTMutex &mutex : mutexes) {
            locks.push_back(std::make_unique<KTLock>(mutex));
        }
        for (std::size_t i = 0; i < kMany; ++i) {
            locks[(i * 7) % kMany].reset();
        }
    }
    for (KTMutex &mutex : mutexes) {
        KTLock const free(mutex);
    }
}

TEST(Lock, MayBeDestroyedByAnotherThread) {
    KTMutex mutex;
    for (int i = 0; i < 100; ++i) {
        auto lock = std::make_unique<KTLock>(mutex);
        lock->unlock();
        boost::thread([&] { lock.reset(); }).join();
    }
    KTLock const free(mutex);
}

TEST(Lock, OutlivesItsMutexWhenItDoesNotOwnIt) {
    auto mutex = std::make_unique<KTMutex>();
    KTLock lock(*mutex);
    lock.unlock();
    mutex.reset();
    EXPECT_THROW(lock.unlock(), boost::lock_error);
}

TEST(Lock, ExcludesThreadsFromOneAnother) {
    KTMutex mutex;
    long counter = 0;
    boost::thread_group threads;
    for (int i = 0; i < 8; ++i) {
        threads.create_thread([&] {
            for (int j = 0; j < 5000; ++j) {
                KTLock const lock(mutex);
                ++counter;
            }
        });
    }
    threads.join_all();
    EXPECT_EQ(counter, 40000);
}

TEST(RecursiveLock, OneThreadMayHoldSeveral) {
    KTRecursiveMutex mutex;
    auto outer = std::make_unique<KTRecursiveLock>(mutex);
    auto inner = std::make_unique<KTRecursiveLock>(mutex);
    RecursiveProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    inner.reset();
    EXPECT_FALSE(probe.GotWithin(kSoon));
    outer.reset();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(RecursiveLock, TheLevelsAreReleasedInAnyOrder) {
    KTRecursiveMutex mutex;
    KTRecursiveLock outer(mutex);
    KTRecursiveLock inner(mutex);
    RecursiveProbe probe(mutex);
    outer.unlock();
    EXPECT_FALSE(probe.GotWithin(kSoon));
    inner.unlock();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
    outer.lock();
    outer.unlock();
}

TEST(RecursiveLock, MisuseThrowsAndChangesNothing) {
    KTRecursiveMutex mutex;
    KTRecursiveLock lock(mutex);
    EXPECT_THROW(lock.lock(), boost::lock_error);
    RecursiveProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    lock.unlock();
    EXPECT_THROW(lock.unlock(), boost::lock_error);
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(Condition, NotifyWithoutWaitersDoesNothing) {
    KTCondition condition;
    condition.notify_one();
    condition.notify_all();
    KTMutex mutex;
    KTLock lock(mutex);
    EXPECT_FALSE(condition.timed_wait(lock, 0)); // an earlier notification is not kept
}

TEST(Condition, AnExpiredWaitReturnsFalseAndHoldsTheMutex) {
    KTMutex mutex;
    KTCondition condition;
    KTLock lock(mutex);
    EXPECT_FALSE(condition.timed_wait(lock, 0));
    EXPECT_FALSE(condition.timed_wait(lock, -100));
    boost::posix_time::ptime const start = Clock::universal_time();
    EXPECT_FALSE(condition.timed_wait(lock, 60));
    EXPECT_GE((Clock::universal_time() - start).total_milliseconds(), 55);
    EXPECT_THROW(lock.lock(), boost::lock_error); // owned again
    MutexProbe probe(mutex);
    EXPECT_FALSE(probe.GotWithin(kSoon));
    lock.unlock();
    EXPECT_TRUE(probe.GotWithin(kAtLast));
}

TEST(Condition, ANotificationWakesAWaiterBeforeTheDeadline) {
    KTMutex mutex;
    KTCondition condition;
    bool ready = false;
    boost::thread notifier([&] {
        KTLock lock(mutex); // not before the waiter waits
        ready = true;
        condition.notify_one();
    });
    bool inTime = true;
    {
        KTLock lock(mutex);
        while (!ready && inTime) {
            inTime = condition.timed_wait(lock, kAtLast);
        }
        EXPECT_THROW(lock.lock(), boost::lock_error); // owned again
    }
    notifier.join();
    EXPECT_TRUE(inTime);
}

TEST(Condition, ANotificationInTimeCountsAlthoughTheMutexIsBusyUntilAfterTheDeadline) {
    constexpr int kMilliseconds = 300;
    for (bool inTime = false; !inTime;) {
        KTMutex mutex;
        KTCondition condition;
        KTLock lock(mutex);
        boost::posix_time::ptime const deadline =
            Clock::universal_time() + boost::posix_time::milliseconds(kMilliseconds);
        boost::thread notifier([&] {
            KTLock const busy(mutex); // not before the waiter waits
            condition.notify_one();
            inTime = Clock::universal_time() < deadline; // else once more: the machine was too slow
            boost::this_thread::sleep(deadline + boost::posix_time::milliseconds(50));
        });
        bool const woken = condition.timed_wait(lock, kMilliseconds);
        notifier.join();
        EXPECT_EQ(woken || !inTime, true);
    }
}

TEST(Condition, WaitReleasesTheMutexMeanwhile) {
    KTMutex mutex;
    KTCondition condition;
    int turn = 0;
    boost::thread other([&] {
        KTLock lock(mutex);
        while (turn != 1) {
            condition.wait(lock);
        }
        turn = 2;
        condition.notify_all();
    });
    {
        KTLock lock(mutex);
        turn = 1;
        condition.notify_all();
        while (turn != 2) {
            condition.wait(lock);
        }
    }
    other.join();
    EXPECT_EQ(turn, 2);
}

TEST(Condition, WaitsOnARecursiveLock) {
    KTRecursiveMutex mutex;
    KTCondition condition;
    bool ready = false;
    boost::thread notifier([&] {
        KTRecursiveLock const lock(mutex);
        ready = true;
        condition.notify_one();
    });
    {
        KTRecursiveLock lock(mutex);
        while (!ready) {
            condition.wait(lock);
        }
        EXPECT_THROW(lock.lock(), boost::lock_error); // owned again
    }
    notifier.join();
    EXPECT_TRUE(ready);
}

TEST(Condition, NotifyAllWakesEveryWaiter) {
    KTMutex mutex;
    KTCondition condition;
    bool go = false;
    int waiting = 0;
    int woken = 0;
    boost::thread_group threads;
    for (int i = 0; i < 6; ++i) {
        threads.create_thread([&] {
            KTLock lock(mutex);
            ++waiting;
            while (!go) {
                condition.wait(lock);
            }
            ++woken;
        });
    }
    for (bool all = false; !all;) {
        KTLock const lock(mutex);
        all = waiting == 6;
        go = all;
    }
    condition.notify_all();
    threads.join_all();
    EXPECT_EQ(woken, 6);
}

TEST(Condition, CarriesAQueueBetweenThreads) {
    KTMutex mutex;
    KTCondition condition;
    std::deque<int> queue;
    constexpr int kItems = 20000;
    long sum = 0;
    boost::thread consumer([&] {
        for (int i = 0; i < kItems; ++i) {
            KTLock lock(mutex);
            while (queue.empty()) {
                condition.wait(lock);
            }
            sum += queue.front();
            queue.pop_front();
        }
    });
    for (int i = 0; i < kItems; ++i) {
        KTLock const lock(mutex);
        queue.push_back(i);
        condition.notify_one();
    }
    consumer.join();
    EXPECT_EQ(sum, static_cast<long>(kItems) * (kItems - 1) / 2);
}
