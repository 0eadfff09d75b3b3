// TickLoopTest.cpp: the passes over thread timers and bursts, on a clock that the test writes reading by reading.

#include "KTTickLoop.h"
#include "Receiver.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <deque>
#include <functional>
#include <limits>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using CTimerInfo = KTTimerService::CTimerInfo;
using CTimerSlots = KTTimerService::CTimerSlots;

constexpr KTUInt64 kStart = 1'700'000'000'123'456; // microseconds
constexpr KTInt64 kMillisecond = 1000;
constexpr KTInt64 kSecond = 1'000'000;
constexpr KTInt64 kHour = 3600 * kSecond;

KT_THREAD_MESSAGE Message(int number) { return static_cast<KT_THREAD_MESSAGE>(number); }

// A clock that moves only as the test says: how long the next sleeps take (as long as they should, once nothing is left
// here), and how long each pass works.
class ScriptedTime : public KTTickTime {
  public:
    KTUInt64 Now() override {
        // Each pass reads three times; its work lies between the second and the third.
        if (++m_Readings % 3 == 0 && !work.empty()) {
            now += static_cast<KTUInt64>(work.front());
            work.pop_front();
        }
        return now;
    }

    void Sleep(KTUInt64 start, KTUInt64 deadline) override {
        EXPECT_EQ(now, start);
        asked.push_back(static_cast<KTInt64>(deadline - now));
        if (during) {
            during();
        }
        if (sleeps.empty()) {
            now = deadline;
        } else {
            now += static_cast<KTUInt64>(sleeps.front());
            sleeps.pop_front();
        }
    }

    KTUInt64 now = kStart;
    std::deque<KTInt64> sleeps;
    std::deque<KTInt64> work;
    std::vector<KTInt64> asked; // the length of every sleep
    std::function<void()> during;

  private:
    int m_Readings = 0;
};

class TickLoop : public testing::Test {
  protected:
    KTInt64 Add(CTimerSlots &slots, long milliseconds, int message) {
        CTimerInfo timer{};
        timer.thread = &m_Receiver;
        timer.message = Message(message);
        KTSetTimerInterval(timer, milliseconds);
        return slots.Allocate(timer);
    }
    KTInt64 Repeat(long milliseconds, int message = 100) { return Add(m_Repeating, milliseconds, message); }
    KTInt64 Burst(long milliseconds, int message = 200) { return Add(m_Bursts, milliseconds, message); }

    void Pass() { m_Loop.Pass(m_Lock); }

    // How many posts each of the next passes made.
    std::vector<std::size_t> Posts(int passes) {
        std::vector<std::size_t> counts;
        for (int i = 0; i < passes; ++i) {
            Pass();
            counts.push_back(m_Receiver.Take().size());
        }
        return counts;
    }

    // The countdown in nanoseconds.
    static KTInt64 Remaining(CTimerInfo const &timer) {
        EXPECT_GT(1'000'000'000, timer.remainingNanoseconds);
        return timer.remainingSeconds * 1'000'000'000 + timer.remainingNanoseconds;
    }
    KTInt64 Remaining(KTInt64 id) { return Remaining(m_Repeating.Find(id)); }

    CTimerSlots m_Repeating;
    CTimerSlots m_Bursts;
    Receiver m_Receiver;
    ScriptedTime m_Time;
    KTTickLoop m_Loop{m_Repeating, m_Bursts, m_Time};
    KTRecursiveMutex m_Mutex;
    KTRecursiveLock m_Lock{m_Mutex};
};

} // namespace

// ---- intervals ----

TEST_F(TickLoop, IntervalsAreSplitIntoSecondsAndNanoseconds) {
    struct Row {
        long milliseconds;
        KTInt64 seconds;
        KTInt32 nanoseconds;
    };
    for (Row const &row :
         {Row{0, 0, 0}, Row{1, 0, 1'000'000}, Row{999, 0, 999'000'000}, Row{1000, 1, 0}, Row{61'234, 61, 234'000'000},
          Row{2'147'483'647, 2'147'483, 647'000'000}, Row{-1500, -1, -500'000'000}}) {
        CTimerInfo timer{};
        KTSetTimerInterval(timer, row.milliseconds);
        EXPECT_EQ(row.seconds, timer.intervalSeconds) << row.milliseconds;
        EXPECT_EQ(row.nanoseconds, timer.intervalNanoseconds) << row.milliseconds;
        EXPECT_EQ(row.seconds, timer.remainingSeconds) << row.milliseconds;
        EXPECT_EQ(row.nanoseconds, timer.remainingNanoseconds) << row.milliseconds;
    }
}

// ---- the sleep ----

TEST_F(TickLoop, SleepsTenMillisecondsLessTheProcessingOfThePassBefore) {
    m_Time.work = {3 * kMillisecond, 9'999, 0};
    for (int i = 0; i < 4; ++i) {
        Pass();
    }
    EXPECT_EQ((std::vector<KTInt64>{10'000, 7'000, 1, 10'000}), m_Time.asked);
    EXPECT_EQ(kStart + 10'000 + 3'000 + 7'000 + 9'999 + 1 + 10'000, m_Time.now);
}

TEST_F(TickLoop, DoesNotSleepAfterAPassOfTenMillisecondsOrMore) {
    m_Time.work = {10 * kMillisecond, 25 * kMillisecond, 1 * kMillisecond};
    Pass();
    EXPECT_EQ(1U, m_Time.asked.size());
    Pass();
    Pass();
    EXPECT_EQ(1U, m_Time.asked.size());
    Pass();
    EXPECT_EQ((std::vector<KTInt64>{10'000, 9'000}), m_Time.asked);
}

TEST_F(TickLoop, ReleasesTheLockDuringTheSleepAndHoldsItOtherwise) {
    int taken = 0;
    m_Time.during = [&] {
        boost::thread([&] {
            KTRecursiveLock const other(m_Mutex);
            ++taken;
        }).join();
    };
    Pass();
    EXPECT_EQ(1, taken);
    EXPECT_NO_THROW(m_Lock.unlock()); // was held
    m_Lock.lock();
}

TEST_F(TickLoop, ASleepThatThrowsLeavesTheLockReleasedOnce) {
    m_Time.during = [] { throw std::runtime_error("interrupted"); };
    EXPECT_THROW(Pass(), std::runtime_error);
    EXPECT_THROW(m_Lock.unlock(), std::exception); // not held, and its owner knows it
    m_Time.during = nullptr;
    m_Lock.lock();
    Pass();
}

// ---- the elapsed time ----

TEST_F(TickLoop, CountsTheSleepAndTheProcessingOfThePassBefore) {
    KTInt64 const id = Repeat(1000);
    m_Time.sleeps = {12'345, 8 * kMillisecond, 0};
    m_Time.work = {4 * kMillisecond, 0, 0};
    Pass();
    EXPECT_EQ(1'000'000'000 - 12'345'000, Remaining(id));
    Pass(); // 4 of work, 8 of sleep
    EXPECT_EQ(1'000'000'000 - 24'345'000, Remaining(id));
    Pass(); // a sleep that was over at once
    EXPECT_EQ(1'000'000'000 - 24'345'000, Remaining(id));
    Pass();
    EXPECT_EQ(1'000'000'000 - 34'345'000, Remaining(id));
}

TEST_F(TickLoop, CountsLongProcessingWithoutASleep) {
    KTInt64 const id = Repeat(1000);
    m_Time.work = {25 * kMillisecond, 0};
    Pass();
    EXPECT_EQ(990'000'000, Remaining(id));
    Pass();
    EXPECT_EQ(965'000'000, Remaining(id));
    Pass();
    EXPECT_EQ(955'000'000, Remaining(id));
}

TEST_F(TickLoop, AClockThatIsSetBackCountsAsNoTimeAndDoesNotLengthenTheSleep) {
    KTInt64 const id = Repeat(100);
    m_Time.sleeps = {-kHour};
    Pass();
    EXPECT_EQ(100'000'000, Remaining(id));
    m_Time.work = {0, -kHour}; // set back while the third pass works
    Pass();
    Pass();
    Pass();
    EXPECT_EQ(std::vector<KTInt64>(4, 10'000), m_Time.asked);
    EXPECT_EQ(70'000'000, Remaining(id));
}

TEST_F(TickLoop, AClockThatIsSetForwardsLetsTimersFireOnce) {
    Repeat(100);
    Burst(kHour / kMillisecond, 201);
    m_Time.sleeps = {2 * kHour};
    Pass();
    EXPECT_EQ((std::vector<int>{100, 201}), m_Receiver.Take());
    EXPECT_EQ((std::vector<std::size_t>{0, 0, 0, 0, 0, 0, 0, 0, 0, 1}), Posts(10));
}

// ---- the countdown ----

TEST_F(TickLoop, BorrowsASecond) {
    KTInt64 const id = Repeat(2001);
    Pass();
    CTimerInfo const &timer = m_Repeating.Find(id);
    EXPECT_EQ(1, timer.remainingSeconds);
    EXPECT_EQ(991'000'000, timer.remainingNanoseconds);
    EXPECT_EQ(2, timer.intervalSeconds);
    EXPECT_EQ(1'000'000, timer.intervalNanoseconds);
    m_Time.sleeps = {kSecond + 991 * kMillisecond - 1};
    Pass();
    EXPECT_EQ(1'000, Remaining(id)); // a microsecond is left
    EXPECT_TRUE(m_Receiver.Take().empty());
    m_Time.sleeps = {1};
    Pass();
    EXPECT_EQ(1U, m_Receiver.Take().size());
    EXPECT_EQ(2'001'000'000, Remaining(id));
}

TEST_F(TickLoop, WholeSecondsBeyondTheCountdownEndIt) {
    KTInt64 const id = Repeat(1999);
    m_Time.sleeps = {2 * kSecond};
    Pass();
    EXPECT_EQ(1U, m_Receiver.Take().size());
    EXPECT_EQ(1'999'000'000, Remaining(id));
    // With no second left the nanoseconds stop at 0.
    KTInt64 const other = Repeat(500, 101);
    m_Time.sleeps = {999 * kMillisecond};
    Pass();
    EXPECT_EQ(std::vector<int>{101}, m_Receiver.Take());
    EXPECT_EQ(500'000'000, Remaining(other));
    EXPECT_EQ(1'000'000'000, Remaining(id));
}

// ---- thread timers ----

TEST_F(TickLoop, ARepeatingTimerFiresAtTheFirstPassAfterItsIntervalAndDropsWhatIsOver) {
    Repeat(25);
    EXPECT_EQ((std::vector<std::size_t>{0, 0, 1, 0, 0, 1, 0, 0, 1}), Posts(9)); // at 30, 60, 90, not at 30, 50, 80
}

TEST_F(TickLoop, AnIntervalOfWholePassesIsKept) {
    Repeat(20);
    EXPECT_EQ((std::vector<std::size_t>{0, 1, 0, 1, 0, 1}), Posts(6));
}

TEST_F(TickLoop, IntervalsOfZeroAndLessFireAtEveryPass) {
    for (long const milliseconds : {0L, -1L, -1500L}) {
        m_Repeating.Free(1);
        Repeat(milliseconds);
        EXPECT_EQ((std::vector<std::size_t>{1, 1, 1}), Posts(3)) << milliseconds;
    }
    m_Time.sleeps = {0}; // even at one that took no time
    EXPECT_EQ(std::vector<std::size_t>{1}, Posts(1));
}

TEST_F(TickLoop, TheNewestTimerPostsFirst) {
    Repeat(10, 101);
    Repeat(10, 102);
    KTInt64 const third = Repeat(10, 103);
    Burst(10, 201);
    Burst(10, 202);
    Pass();
    EXPECT_EQ((std::vector<int>{103, 102, 101, 202, 201}), m_Receiver.Take());
    m_Repeating.Free(third);
    m_Repeating.Free(1);
    Repeat(10, 104); // in the first timer's slot, but the newest
    Pass();
    EXPECT_EQ((std::vector<int>{104, 102}), m_Receiver.Take());
}

TEST_F(TickLoop, ASlowReceiverGetsOneTick) {
    Receiver slow(false);
    m_Repeating.Find(Repeat(10)).thread = &slow;
    for (int i = 0; i < 5; ++i) {
        Pass();
    }
    EXPECT_EQ(std::vector<int>{100}, slow.Take());
    Pass();
    EXPECT_EQ(std::vector<int>{100}, slow.Take());
}

TEST_F(TickLoop, ATickBehindAnotherMessageIsPosted) {
    Receiver slow(false);
    m_Repeating.Find(Repeat(10, 101)).thread = &slow;
    m_Repeating.Find(Repeat(10, 102)).thread = &slow;
    Pass();
    Pass();
    EXPECT_EQ((std::vector<int>{102, 101, 102, 101}), slow.Take()); // neither is the last one when its turn comes
}

TEST_F(TickLoop, ATickThatAFullQueueDropsStartsANewPeriod) {
    Receiver full(false);
    while (full.postMessage(Message(300), 0, 0, 0, 0)) {
    }
    KTInt64 const id = Repeat(20);
    m_Repeating.Find(id).thread = &full;
    Pass();
    Pass();
    EXPECT_EQ(20'000'000, Remaining(id));
    EXPECT_EQ(1024U, full.Take().size());
}

TEST_F(TickLoop, ATimerWithoutAThreadRunsAndPostsNothing) {
    KTInt64 const id = Repeat(10);
    m_Repeating.Find(id).thread = nullptr;
    m_Bursts.Find(Burst(10)).thread = nullptr;
    Pass();
    EXPECT_EQ(10'000'000, Remaining(id));
    Pass();
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
    EXPECT_TRUE(m_Receiver.Take().empty());
}

// ---- single bursts ----

TEST_F(TickLoop, ABurstFiresOnceAndItsSlotIsFreeAPassLater) {
    EXPECT_EQ(1, Burst(25));
    EXPECT_EQ((std::vector<std::size_t>{0, 0, 1}), Posts(3));
    EXPECT_EQ(1, m_Bursts.GetFirstUsed());
    EXPECT_EQ(std::vector<std::size_t>{0}, Posts(1));
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
    EXPECT_EQ(1, Burst(10));
}

TEST_F(TickLoop, ABurstOfZeroIsGivenUpWithoutFiring) {
    Burst(0);
    EXPECT_EQ((std::vector<std::size_t>{0, 0}), Posts(2));
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
}

TEST_F(TickLoop, ABurstOfANegativeIntervalFiresAtTheNextPass) {
    Burst(-5);
    EXPECT_EQ((std::vector<std::size_t>{1, 0}), Posts(2));
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
}

TEST_F(TickLoop, ABurstThatFiredIsRearmedUntilItsSlotIsFree) {
    KTInt64 const id = Burst(10);
    Pass();
    KTReloadTimer(m_Bursts.Find(id));
    Pass();
    EXPECT_EQ(2U, m_Receiver.Take().size());
    KTSetTimerInterval(m_Bursts.Find(id), 20);
    EXPECT_EQ((std::vector<std::size_t>{0, 1, 0}), Posts(3));
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
}

TEST_F(TickLoop, EveryBurstOfAPassFiresAndIsFreed) {
    for (int i = 0; i < 50; ++i) {
        EXPECT_EQ(i + 1, Burst(i % 2 == 0 ? 10 : 20, 200 + i));
    }
    EXPECT_EQ(0, Burst(10));
    EXPECT_EQ((std::vector<std::size_t>{25, 25, 0}), Posts(3));
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
}

TEST_F(TickLoop, BurstsArePostedEvenIfTheSameOneWaits) {
    Receiver slow(false);
    for (int i = 0; i < 3; ++i) {
        m_Bursts.Find(Burst(10)).thread = &slow;
    }
    Pass();
    EXPECT_EQ(3U, slow.Take().size());
}

TEST_F(TickLoop, ABurstThatAFullQueueDropsIsNotPostedAgain) {
    Receiver full(false);
    while (full.postMessage(Message(300), 0, 0, 0, 0)) {
    }
    m_Bursts.Find(Burst(10)).thread = &full;
    Pass();
    EXPECT_EQ(1024U, full.Take().size());
    Pass();
    EXPECT_TRUE(full.Take().empty());
    EXPECT_EQ(0, m_Bursts.GetFirstUsed());
}
