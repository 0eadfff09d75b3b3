// BenchLocks.cpp: an uncontended lock held for a scope and a notification that nobody waits for, beside the threading
// library underneath, whose code the compiler can inline here while ours is a call into the DLL.

#include "Bench.h"

#include "KTLocks.h"

#include <boost/thread/condition_variable.hpp>
#include <boost/thread/lock_types.hpp>
#include <boost/thread/mutex.hpp>
#include <boost/thread/recursive_mutex.hpp>

namespace bench {

namespace {

constexpr char kGroup[] = "locks";
constexpr char kBoost[] = "boost";

template <typename Mutex, typename Lock> void AddScope(char const *kase, char const *contender) {
    Add({kGroup, kase, "uncontended"}, contender, [](benchmark::State &state) {
        Mutex mutex;
        for (auto _ : state) {
            Lock lock(mutex);
            benchmark::DoNotOptimize(&lock);
        }
    });
}

template <typename Condition> void AddNotify(char const *contender) {
    Add({kGroup, "notify-one", "no-waiter"}, contender, [](benchmark::State &state) {
        Condition condition;
        for (auto _ : state) {
            condition.notify_one();
            benchmark::ClobberMemory();
        }
    });
}

} // namespace

void AddLockBenchmarks() {
    DescribeGroup(kGroup, "KTLock, KTRecursiveLock and KTCondition");
    ExpectSpeed(kGroup, kBoost, 0.5);
    AddScope<KTMutex, KTLock>("lock", kOurs);
    AddScope<boost::mutex, boost::unique_lock<boost::mutex>>("lock", kBoost);
    AddScope<KTRecursiveMutex, KTRecursiveLock>("recursive-lock", kOurs);
    AddScope<boost::recursive_mutex, boost::unique_lock<boost::recursive_mutex>>("recursive-lock", kBoost);
    AddNotify<KTCondition>(kOurs);
    AddNotify<boost::condition_variable_any>(kBoost);
}

} // namespace bench
