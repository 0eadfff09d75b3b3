// WorkerThreadTest.cpp: worker threads, the sleep, the call-back record.

#include "GatedThread.h"
#include "KTCallBack.h"
#include "KTThread.h"
#include "KTWorkerThread.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

namespace {

// Runs what it is given.
class Worker : public KTWorkerThread {
  public:
    explicit Worker(std::function<void()> work) : m_Work(std::move(work)) {}
    void run() override { m_Work(); }

  private:
    std::function<void()> m_Work;
};

std::chrono::milliseconds TimeOf(std::function<void()> const &call) {
    auto const before = std::chrono::system_clock::now();
    call();
    auto const after = std::chrono::system_clock::now();
    return std::chrono::duration_cast<std::chrono::milliseconds>(after - before);
}

} // namespace

TEST(WorkerThread, RunsItsWorkOnceOnAThreadOfItsOwn) {
    int runs = 0;
    std::thread::id runner;
    Worker worker([&] {
        ++runs;
        runner = std::this_thread::get_id();
    });
    worker.join(); // not started: returns
    EXPECT_EQ(0, runs);
    worker.start();
    worker.join();
    EXPECT_EQ(1, runs);
    EXPECT_NE(std::this_thread::get_id(), runner);
    worker.join();
}

TEST(WorkerThread, JoinWaitsForTheEnd) {
    Signal goOn;
    bool isDone = false;
    Worker worker([&] {
        goOn.Wait();
        isDone = true;
    });
    worker.start();
    goOn.Set();
    worker.join();
    EXPECT_TRUE(isDone);
}

TEST(WorkerThread, CannotJoinItself) {
    Signal isStarted;
    bool isRefused = false;
    Worker *self = nullptr;
    Worker worker([&] {
        isStarted.Wait();
        EXPECT_THROW(self->join(), boost::thread_resource_error);
        isRefused = true;
    });
    self = &worker;
    worker.start();
    isStarted.Set();
    worker.join();
    EXPECT_TRUE(isRefused);
}

TEST(WorkerThread, ASecondStartRunsTheWorkAgainAndDetachesTheFirst) {
    struct Shared { // never destroyed: nobody can wait for the end of a detached thread
        Signal begun;
        Signal goOn;
        Signal ended;
        Worker worker{[this] {
            begun.Set();
            goOn.Wait();
            ended.Set();
        }};
    };
    static Shared &shared = *new Shared;
    shared.worker.start();
    ASSERT_TRUE(shared.begun.IsSet(1));
    shared.worker.start();
    ASSERT_TRUE(shared.begun.IsSet(2));
    shared.goOn.Set();
    shared.worker.join();
    EXPECT_TRUE(shared.ended.IsSet(2)); // the first was not stopped
}

TEST(WorkerThread, ADestroyedWorkerIsDetachedAndNotWaitedFor) {
    static Signal &inWork = *new Signal;
    static Signal &never = *new Signal;
    {
        Worker worker([] {
            inWork.Set();
            never.Wait();
        });
        worker.start();
        ASSERT_TRUE(inWork.IsSet());
    }
    SUCCEED(); // the destructor has returned
}

TEST(WorkerThread, WorkersEqualThemselvesOnly) {
    Worker const one([] {});
    Worker const other([] {});
    KTWorkerThread const &same = one;
    EXPECT_TRUE(one == same);
    EXPECT_FALSE(one != same);
    EXPECT_FALSE(one == other);
    EXPECT_TRUE(one != other);
}

// ---- the sleep ----

TEST(Sleep, LastsForSecondsAndMilliseconds) {
    constexpr std::chrono::milliseconds kCoarse{20}; // a system's clock tick
    constexpr std::chrono::seconds kFarTooLong{40};  // less than the seconds that stand for milliseconds here
    auto const milliseconds = TimeOf([] { KTSleepForDuration(0, 120); });
    EXPECT_LE(std::chrono::milliseconds(120) - kCoarse, milliseconds);
    EXPECT_GT(kFarTooLong, milliseconds);
    auto const both = TimeOf([] { KTSleepForDuration(1, 50); });
    EXPECT_LE(std::chrono::milliseconds(1050) - kCoarse, both);
    EXPECT_GT(kFarTooLong, both);
    EXPECT_GT(kFarTooLong, TimeOf([] { KTSleepForDuration(0, 0); }));
}

// On Windows only threads of the library's own copy of Boost.Thread can be interrupted, and hosts have none of those.
#if !defined(_WIN32)
TEST(Sleep, EndsWhenItsThreadIsInterrupted) {
    Signal asleep;
    Signal interrupted;
    boost::thread sleeper([&] {
        asleep.Set();
        try {
            KTSleepForDuration(3600, 0);
        } catch (boost::thread_interrupted const &) {
            interrupted.Set();
        }
    });
    ASSERT_TRUE(asleep.IsSet());
    sleeper.interrupt();
    EXPECT_TRUE(interrupted.IsSet());
    sleeper.join();
}
#endif

// ---- the call-back record ----

TEST(CallBack, HoldsItsKindAndZerosAndIsAssignedMemberByMember) {
    KTCallBack one(static_cast<KTCallBackEnum>(7));
    EXPECT_EQ(7, one.kind);
    EXPECT_EQ(0U, one.data1);
    EXPECT_EQ(0U, one.data2);
    EXPECT_EQ(nullptr, one.context);
    one.data1 = 1;
    one.data2 = 2;
    one.context = &one;
    KTCallBack other(static_cast<KTCallBackEnum>(8));
    KTCallBack const *const result = &(other = one);
    EXPECT_EQ(&other, result);
    EXPECT_EQ(7, other.kind);
    EXPECT_EQ(1U, other.data1);
    EXPECT_EQ(2U, other.data2);
    EXPECT_EQ(&one, other.context);
    KTCallBack const copy(one);
    EXPECT_EQ(2U, copy.data2);
}
