// TimerServiceTest.cpp: the timer service as hosts call it, on a clock that stands still until the test moves it: every
// pass is then exact, and nobody waits for time.

#include "GatedThread.h"
#include "KTTimerService.h"
#include "Receiver.h"
#include "TestClock.h"
#include "TestTimerWindow.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace {

constexpr KTUInt64 kStart = 1'700'000'000'123'456; // microseconds
constexpr KTInt64 kPass = 10'000;
constexpr long kNever = 1'000'000'000; // milliseconds

KT_THREAD_MESSAGE Message(int number) { return static_cast<KT_THREAD_MESSAGE>(number); }

// Tells when a pass has been made: a timer of 0 milliseconds posts to it at every one.
class Bell : public KTThread {
  public:
    Bell() { start(); }
    Bell(Bell const &) = delete;
    Bell &operator=(Bell const &) = delete;
    ~Bell() override {
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    void processMessage(KTThreadMsg const &msg) override {
        if (msg.message != KT_THREAD_MSG_QUIT) {
            m_Rung.Set();
        }
    }

    // Whether it has rung that often in all.
    bool HasRung(int times) { return m_Rung.IsSet(times); }

  private:
    Signal m_Rung;
};

class Timers : public testing::Test {
  protected:
    Timers() {
        StartService();
        KTCreateTimer(&m_Bell, 0, &m_BellTimer, Message(99));
    }
    ~Timers() override { KTDestroyTimerService(); }

    // Starts the service and waits until it sleeps: it looks at the clock again and again then.
    static void StartService() {
        unsigned int const before = TestClock::Readings();
        KTCreateTimerService();
        while (TestClock::Readings() < before + 3) {
            std::this_thread::yield();
        }
    }

    // Lets the service make one pass after `microseconds`, and waits until it sleeps again.
    void Pass(KTInt64 microseconds = kPass) {
        m_Clock.Advance(microseconds);
        ASSERT_TRUE(m_Bell.HasRung(++m_Passes));
        KTRestartTimer(0); // takes the lock, which the service holds until it has read the clock and sleeps again
    }

    // How many messages each of the next passes posted.
    std::vector<std::size_t> Posts(int passes) {
        std::vector<std::size_t> counts;
        for (int i = 0; i < passes; ++i) {
            Pass();
            counts.push_back(m_Receiver.Take().size());
        }
        return counts;
    }

    KTInt64 Repeat(long interval, int message = 100) {
        KTInt64 id = -1;
        KTCreateTimer(&m_Receiver, interval, &id, Message(message));
        return id;
    }
    KTInt64 Burst(long interval, int message = 200) {
        KTInt64 id = -1;
        KTCreateSingleBurstTimer(&m_Receiver, interval, &id, Message(message));
        return id;
    }

    TestClock m_Clock{kStart};
    Bell m_Bell;
    Receiver m_Receiver;
    KTInt64 m_BellTimer = -1;
    int m_Passes = 0;
};

using Counts = std::vector<std::size_t>;

} // namespace

// ---- without a service ----

TEST(NoTimers, CreatingReportsZeroAndTheRestDoesNothing) {
    ASSERT_EQ(nullptr, KTTimerService::GetInstance());
    Receiver receiver;
    KTInt64 id = -1;
    KTCreateTimer(&receiver, 10, &id, Message(100));
    EXPECT_EQ(0, id);
    id = -1;
    KTCreateSingleBurstTimer(&receiver, 10, &id, Message(100));
    EXPECT_EQ(0, id);
    id = -1;
    KTCreateUITimer(10, &id, [](KTInt64, void *) {}, nullptr);
    EXPECT_EQ(0, id);
    KTCreateTimer(&receiver, 10, nullptr, Message(100));
    KTCreateUITimer(10, nullptr, nullptr, nullptr);
    KTAdjustTimer(1, 10);
    KTRestartTimer(1);
    KTKillTimer(1);
    KTAdjustSingleBurstTimer(1, 10);
    KTRestartSingleBurstTimer(1);
    KTKillSingleBurstTimer(1);
    KTKillUITimer(1);
    KTDestroyTimerService();
    EXPECT_FALSE(HasTimerWindow());
    EXPECT_TRUE(receiver.Take().empty());
}

// ---- the service ----

TEST_F(Timers, ASecondServiceIsNotMade) {
    KTTimerService *const service = KTTimerService::GetInstance();
    ASSERT_NE(nullptr, service);
    KTInt64 const id = Repeat(10);
    KTCreateTimerService();
    EXPECT_EQ(service, KTTimerService::GetInstance());
    EXPECT_EQ(id + 1, Repeat(10, 101)); // the same tables
    EXPECT_EQ(Counts{2}, Posts(1));
}

TEST_F(Timers, ArmedTimersAreDroppedWithTheService) {
    Repeat(20);
    Burst(20);
    KTInt64 ui = 0;
    KTCreateUITimer(10, &ui, [](KTInt64, void *) { FAIL(); }, nullptr);
    m_Clock.Advance(15'000); // the last pass may still come
    KTDestroyTimerService();
    EXPECT_EQ(nullptr, KTTimerService::GetInstance());
    EXPECT_FALSE(HasTimerWindow());
    m_Clock.Advance(1'000'000);
    EXPECT_TRUE(m_Receiver.Take().empty());
    KTDestroyTimerService();
    // A new one starts with empty tables.
    KTCreateTimerService();
    EXPECT_TRUE(HasTimerWindow());
    EXPECT_EQ(1, Repeat(kNever));
    EXPECT_EQ(1, Burst(kNever));
}

TEST_F(Timers, AServiceCanBeMadeAgainAndAgain) {
    for (int i = 0; i < 20; ++i) {
        KTDestroyTimerService();
        KTCreateTimerService();
        EXPECT_EQ(1, Repeat(10));
    }
}

// ---- thread timers ----

TEST_F(Timers, FireAtTheFirstPassAfterTheirIntervalAndGoOn) {
    Repeat(25);
    EXPECT_EQ((Counts{0, 0, 1, 0, 0, 1, 0, 0, 1}), Posts(9));
}

TEST_F(Timers, ATimerOfASecondFiresOnceASecond) {
    Repeat(1000);
    std::size_t posts = 0;
    for (int pass = 1; pass <= 300; ++pass) {
        Pass();
        posts += pass % 50 == 0 ? m_Receiver.Take().size() : 0;
    }
    EXPECT_EQ(3U, posts);
}

TEST_F(Timers, ATimerOfZeroFiresAtEveryPass) {
    Repeat(0);
    EXPECT_EQ((Counts{1, 1, 1}), Posts(3));
}

TEST_F(Timers, AWaitingTickIsNotPostedTwice) {
    GatedThread slow;
    slow.start();
    KTInt64 id = 0;
    KTCreateTimer(&slow, 10, &id, Message(100));
    Pass();
    ASSERT_TRUE(slow.Enters(1)); // its handler stays in the first tick
    for (int i = 0; i < 5; ++i) {
        Pass(); // one tick waits
    }
    KTKillTimer(id);
    slow.FinishAll();
    std::vector<KTThreadMsg> const messages = slow.Messages();
    ASSERT_EQ(3U, messages.size());
    EXPECT_EQ(Message(100), messages[1].message);
    EXPECT_EQ(KT_THREAD_MSG_QUIT, messages[2].message);
}

TEST_F(Timers, AnAdjustedTimerStartsANewPeriodOfTheNewLength) {
    KTInt64 const id = Repeat(50);
    EXPECT_EQ((Counts{0, 0}), Posts(2));
    KTAdjustTimer(id, 30);
    EXPECT_EQ((Counts{0, 0, 1, 0, 0, 1}), Posts(6));
    KTAdjustTimer(id, 1020);
    Pass(1'010'000);
    EXPECT_TRUE(m_Receiver.Take().empty());
    EXPECT_EQ(Counts{1}, Posts(1));
}

TEST_F(Timers, ARestartedTimerStartsItsPeriodAgain) {
    KTInt64 const id = Repeat(30);
    EXPECT_EQ((Counts{0, 0}), Posts(2));
    KTRestartTimer(id);
    EXPECT_EQ((Counts{0, 0, 1, 0, 0, 1}), Posts(6));
}

TEST_F(Timers, AKilledTimerFiresNoMoreAndItsIdIsUsedNext) {
    KTInt64 const first = Repeat(10, 101);
    KTInt64 const second = Repeat(10, 102);
    EXPECT_EQ((Counts{2}), Posts(1));
    KTKillTimer(first);
    Pass();
    EXPECT_EQ(std::vector<int>{102}, m_Receiver.Take());
    EXPECT_EQ(first, Repeat(kNever));
    EXPECT_EQ(second + 1, Repeat(kNever));
}

TEST_F(Timers, TheFiftyFirstTimerIsRefused) {
    EXPECT_EQ(1, m_BellTimer);
    for (KTInt64 id = 2; id <= 50; ++id) {
        ASSERT_EQ(id, Repeat(kNever));
    }
    EXPECT_EQ(0, Repeat(kNever));
    KTKillTimer(7);
    EXPECT_EQ(7, Repeat(10));
    EXPECT_EQ(0, Repeat(kNever));
    EXPECT_EQ(Counts{1}, Posts(1));
    EXPECT_EQ(1, Burst(kNever)); // the other table has room
}

TEST_F(Timers, UnknownIdsChangeNothing) {
    KTInt64 const id = Repeat(20);
    for (KTInt64 const unknown : {KTInt64{0}, KTInt64{51}, KTInt64{-1}, KTInt64{40}, KTInt64{1} << 40}) {
        KTAdjustTimer(unknown, 1);
        KTRestartTimer(unknown);
        KTKillTimer(unknown);
        KTAdjustSingleBurstTimer(unknown, 1);
        KTRestartSingleBurstTimer(unknown);
        KTKillSingleBurstTimer(unknown);
    }
    EXPECT_EQ((Counts{0, 1, 0, 1}), Posts(4));
    EXPECT_EQ(id + 1, Repeat(kNever));
    EXPECT_EQ(1, Burst(kNever));
}

TEST_F(Timers, ATimerKilledTwiceTakesNoOtherAlong) {
    KTInt64 const first = Repeat(10, 101);
    Repeat(10, 102);
    KTKillTimer(first);
    KTKillTimer(first);
    Pass();
    EXPECT_EQ(std::vector<int>{102}, m_Receiver.Take());
    EXPECT_EQ(first, Repeat(10, 103));
    EXPECT_EQ(first + 2, Repeat(10, 104));
}

TEST_F(Timers, NeitherThreadNorPlaceForTheIdIsNeeded) {
    KTCreateTimer(nullptr, 10, nullptr, Message(100));
    KTCreateSingleBurstTimer(nullptr, 10, nullptr, Message(100));
    Pass();
    Pass();
    EXPECT_EQ(m_BellTimer + 2, Repeat(kNever)); // the timer is there
    EXPECT_EQ(1, Burst(kNever));                // the burst is over
}

// ---- single bursts ----

TEST_F(Timers, ABurstFiresOnce) {
    EXPECT_EQ(1, Burst(25));
    EXPECT_EQ((Counts{0, 0, 1, 0, 0, 0, 0}), Posts(7));
    EXPECT_EQ(1, Burst(kNever)); // its id is free
}

TEST_F(Timers, ABurstIsRearmedWithinThePassAfterItFired) {
    KTInt64 const id = Burst(20);
    EXPECT_EQ((Counts{0, 1}), Posts(2));
    EXPECT_EQ(id + 1, Burst(kNever)); // its id is not yet free
    KTRestartSingleBurstTimer(id);
    EXPECT_EQ((Counts{0, 1}), Posts(2));
    KTAdjustSingleBurstTimer(id, 30);
    EXPECT_EQ((Counts{0, 0, 1, 0}), Posts(4));
    KTRestartSingleBurstTimer(id); // too late
    EXPECT_EQ((Counts{0, 0, 0, 0}), Posts(4));
    EXPECT_EQ(id, Burst(kNever));
}

TEST_F(Timers, ABurstIsAdjustedAndRestartedBeforeItFires) {
    KTInt64 const id = Burst(30);
    EXPECT_EQ((Counts{0, 0}), Posts(2));
    KTRestartSingleBurstTimer(id);
    EXPECT_EQ((Counts{0, 0}), Posts(2));
    KTAdjustSingleBurstTimer(id, 20);
    EXPECT_EQ((Counts{0, 1, 0}), Posts(3));
}

TEST_F(Timers, ABurstOfZeroIsGivenUp) {
    EXPECT_EQ(1, Burst(0));
    EXPECT_EQ(Counts{0}, Posts(1));
    EXPECT_EQ(1, Burst(kNever));
}

TEST_F(Timers, AKilledBurstDoesNotFire) {
    KTInt64 const id = Burst(10);
    KTKillSingleBurstTimer(id);
    EXPECT_EQ((Counts{0, 0}), Posts(2));
    EXPECT_EQ(id, Burst(kNever));
}

TEST_F(Timers, TheFiftyFirstBurstIsRefused) {
    for (KTInt64 id = 1; id <= 50; ++id) {
        ASSERT_EQ(id, Burst(20));
    }
    EXPECT_EQ(0, Burst(20));
    EXPECT_EQ((Counts{0, 50, 0}), Posts(3));
    EXPECT_EQ(1, Burst(kNever)); // they were freed from the newest to the oldest
}

TEST_F(Timers, TimersAndBurstsHaveIdsOfTheirOwn) {
    KTInt64 const timer = Repeat(10, 101);
    KTInt64 burst = Burst(kNever);
    while (burst != timer) {
        burst = Burst(kNever);
    }
    KTKillSingleBurstTimer(burst);
    EXPECT_EQ(Counts{1}, Posts(1));
    burst = Burst(20, 201);
    EXPECT_EQ(timer, burst);
    KTKillTimer(timer);
    Pass();
    Pass();
    EXPECT_EQ(std::vector<int>{201}, m_Receiver.Take());
}

// ---- time ----

TEST_F(Timers, DoNotWaitForAClockThatWasSetBack) {
    Repeat(20);
    EXPECT_EQ((Counts{0, 1}), Posts(2));
    Pass(-3'600'000'000);
    EXPECT_TRUE(m_Receiver.Take().empty());
    EXPECT_EQ((Counts{0, 1, 0, 1}), Posts(4));
}

TEST_F(Timers, FireOnceWhenTheClockIsSetForwards) {
    Repeat(20);
    Burst(1'000'000);
    Pass(3'600'000'000);
    EXPECT_EQ((std::vector<int>{100, 200}), m_Receiver.Take());
    EXPECT_EQ((Counts{0, 1, 0, 1}), Posts(4));
}

TEST_F(Timers, NoPassIsMadeBeforeTenMillisecondsAreOver) {
    m_Clock.Advance(kPass - 1);
    std::this_thread::sleep_for(kSoon);
    EXPECT_TRUE(m_Receiver.Take().empty());
    Repeat(0);
    Pass(1);
    EXPECT_EQ(1U, m_Receiver.Take().size());
}

// ---- threads ----

TEST_F(Timers, AnyThreadMayUseThemAndHandlersToo) {
    GatedThread host;
    KTInt64 fromHandler = 0;
    host.Open();
    host.OnMessage([&](KTThreadMsg const &msg) {
        if (msg.message == Message(100)) {
            KTCreateSingleBurstTimer(&m_Receiver, 10, &fromHandler, Message(201));
        }
    });
    host.start();
    KTInt64 id = 0;
    boost::thread([&] { KTCreateTimer(&host, 10, &id, Message(100)); }).join();
    Pass();
    ASSERT_TRUE(host.Enters(1));
    boost::thread([&] { KTKillTimer(id); }).join();
    host.FinishAll();
    EXPECT_EQ(1, fromHandler);
    Pass();
    EXPECT_EQ(std::vector<int>{201}, m_Receiver.Take());
}
