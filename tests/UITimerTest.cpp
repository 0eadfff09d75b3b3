// UITimerTest.cpp: UI timers, ticked by hand: their ids, what their functions may do, and the lock they run under.

#include "GatedThread.h"
#include "KTTimerService.h"
#include "TestTimerWindow.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <stdexcept>
#include <vector>

namespace {

constexpr long kNever = 1'000'000'000; // milliseconds

// A UI timer whose function is a lambda.
class UITimer {
  public:
    using Function = std::function<void(KTInt64)>;

    explicit UITimer(Function function = [](KTInt64) {}) : m_Function(std::move(function)) {
        KTCreateUITimer(kNever, &id, &Call, this);
    }
    UITimer(UITimer const &) = delete;
    UITimer &operator=(UITimer const &) = delete;
    ~UITimer() = default;

    void Tick() const { TickTimerWindow(id); }
    void Kill() const { KTKillUITimer(id); }

    KTInt64 id = -1;
    int calls = 0;

  private:
    static void Call(KTInt64 calledId, void *userData) {
        auto &timer = *static_cast<UITimer *>(userData);
        EXPECT_EQ(timer.id, calledId);
        ++timer.calls;
        timer.m_Function(calledId);
    }

    Function m_Function;
};

class UITimers : public testing::Test {
  protected:
    UITimers() { KTCreateTimerService(); }
    ~UITimers() override { KTDestroyTimerService(); }
};

// Uses the UI-timer lock on another thread, and says whether it got it.
class Other {
  public:
    Other()
        : m_Thread([this] {
              KTKillUITimer(0);
              m_Done.Set();
          }) {}
    Other(Other const &) = delete;
    Other &operator=(Other const &) = delete;
    ~Other() { m_Thread.join(); }

    bool GetsLock() { return m_Done.IsSet(); }
    bool GetsLockSoon() { return m_Done.IsSet(1, kSoon); }

  private:
    Signal m_Done;
    boost::thread m_Thread;
};

void ExpectLockIsFree() { EXPECT_TRUE(Other().GetsLock()); }

} // namespace

// ---- ids ----

TEST_F(UITimers, IdsRiseAcrossKillsAndFailuresAndServices) {
    KTInt64 const first = UITimer().id;
    EXPECT_LT(0, first);
    EXPECT_EQ(first + 1, UITimer().id);
    KTKillUITimer(first);
    EXPECT_EQ(first + 2, UITimer().id);
    {
        RefusedTimers const refused;
        EXPECT_EQ(0, UITimer().id); // used up first + 3
    }
    EXPECT_EQ(first + 4, UITimer().id);
    KTDestroyTimerService();
    EXPECT_EQ(0, UITimer().id); // used up nothing
    KTCreateTimerService();
    EXPECT_EQ(first + 5, UITimer().id);
}

TEST_F(UITimers, WithoutAWindowNoneIsMadeAndNoIdIsUsedUp) {
    KTInt64 const first = UITimer().id;
    KTDestroyTimerService();
    {
        RefusedTimerWindows const refused;
        KTCreateTimerService();
    }
    ASSERT_NE(nullptr, KTTimerService::GetInstance());
    EXPECT_FALSE(HasTimerWindow());
    EXPECT_EQ(0, UITimer().id);
    KTKillUITimer(first);
    KTDestroyTimerService();
    KTCreateTimerService();
    EXPECT_EQ(first + 1, UITimer().id);
}

TEST_F(UITimers, MayBeManyAndNeedNeitherFunctionNorPlaceForTheId) {
    std::vector<std::unique_ptr<UITimer>> timers;
    for (int i = 0; i < 200; ++i) {
        timers.push_back(std::make_unique<UITimer>());
        ASSERT_EQ(timers[0]->id + i, timers.back()->id);
    }
    for (auto const &timer : timers) {
        timer->Tick();
        EXPECT_EQ(1, timer->calls);
    }
    KTInt64 silent = 0;
    KTCreateUITimer(kNever, &silent, nullptr, nullptr);
    EXPECT_EQ(timers.back()->id + 1, silent);
    TickTimerWindow(silent);
    KTCreateUITimer(kNever, nullptr, nullptr, nullptr);
}

// ---- ticks ----

TEST_F(UITimers, CallTheirFunctionWithIdAndUserData) {
    UITimer first;
    UITimer second;
    first.Tick();
    EXPECT_EQ(1, first.calls);
    EXPECT_EQ(0, second.calls);
    second.Tick();
    second.Tick();
    EXPECT_EQ(2, second.calls);
    ExpectLockIsFree();
}

TEST_F(UITimers, ATickOfAKilledOrUnknownTimerCallsNothing) {
    UITimer timer;
    timer.Kill();
    timer.Tick(); // it may have been under way
    timer.Kill();
    TickTimerWindow(0);
    TickTimerWindow(timer.id + 1);
    EXPECT_EQ(0, timer.calls);
    ExpectLockIsFree();
}

TEST_F(UITimers, RunTheirFunctionUnderTheLock) {
    std::unique_ptr<Other> other;
    UITimer timer([&](KTInt64) {
        other = std::make_unique<Other>();
        EXPECT_FALSE(other->GetsLockSoon());
    });
    timer.Tick();
    EXPECT_TRUE(other->GetsLock());
}

TEST_F(UITimers, AFunctionThatThrowsGivesTheLockBack) {
#if defined(_WIN32)
    KTTimerService &service = *KTTimerService::GetInstance(); // no exception crosses the system's frames
    UITimer timer([](KTInt64) { throw std::runtime_error("not expected"); });
    EXPECT_THROW(service.DispatchUITimer(timer.id), std::runtime_error);
#else
    UITimer timer([](KTInt64) { throw std::runtime_error("not expected"); });
    EXPECT_THROW(timer.Tick(), std::runtime_error);
#endif
    ExpectLockIsFree();
    UITimer killing([&](KTInt64 id) {
        KTKillUITimer(id);
        throw std::runtime_error("not expected");
    });
    EXPECT_THROW(KTTimerService::GetInstance()->DispatchUITimer(killing.id), std::runtime_error);
    ExpectLockIsFree();
}

// ---- functions that kill ----

TEST_F(UITimers, AFunctionThatKillsItsOwnTimerLetsOthersTakeTheLock) {
    UITimer timer([&](KTInt64 id) {
        KTKillUITimer(id);
        EXPECT_TRUE(Other().GetsLock());
    });
    timer.Tick();
    timer.Tick();
    EXPECT_EQ(1, timer.calls);
    ExpectLockIsFree();
}

TEST_F(UITimers, KillingItsOwnTimerAgainReleasesNothingMore) {
    UITimer timer([&](KTInt64 id) {
        KTKillUITimer(id);
        KTKillUITimer(id);
        KTKillUITimer(id);
        EXPECT_TRUE(Other().GetsLock());
    });
    timer.Tick();
    ExpectLockIsFree();
}

TEST_F(UITimers, AnotherThreadMayKillTheSameTimerMeanwhile) {
    UITimer timer([&](KTInt64 id) {
        KTKillUITimer(id);
        boost::thread([id] { KTKillUITimer(id); }).join();
        EXPECT_TRUE(Other().GetsLock());
    });
    timer.Tick();
    ExpectLockIsFree();
}

TEST_F(UITimers, AFunctionThatKillsAnotherTimerKeepsTheLock) {
    UITimer victim;
    std::unique_ptr<Other> other;
    UITimer timer([&](KTInt64) {
        victim.Kill();
        victim.Tick();
        other = std::make_unique<Other>();
        EXPECT_FALSE(other->GetsLockSoon());
    });
    timer.Tick();
    EXPECT_TRUE(other->GetsLock());
    timer.Tick();
    EXPECT_TRUE(other->GetsLock());
    EXPECT_EQ(0, victim.calls);
    EXPECT_EQ(2, timer.calls);
}

TEST_F(UITimers, AFunctionMayCreateTimersBeforeAndAfterItKillsItsOwn) {
    std::vector<std::unique_ptr<UITimer>> made;
    UITimer victim;
    UITimer timer([&](KTInt64 id) {
        made.push_back(std::make_unique<UITimer>());
        victim.Kill();
        KTKillUITimer(id);
        made.push_back(std::make_unique<UITimer>());
        made[0]->Kill();
        EXPECT_TRUE(Other().GetsLock());
    });
    timer.Tick();
    ASSERT_EQ(2U, made.size());
    EXPECT_EQ(made[0]->id + 1, made[1]->id);
    made[0]->Tick();
    made[1]->Tick();
    EXPECT_EQ(0, made[0]->calls);
    EXPECT_EQ(1, made[1]->calls);
    ExpectLockIsFree();
}

TEST_F(UITimers, KillingIdZeroReleasesNothing) {
    KTKillUITimer(0);
    ExpectLockIsFree();
    std::unique_ptr<Other> other;
    UITimer timer([&](KTInt64) {
        KTKillUITimer(0);
        other = std::make_unique<Other>();
        EXPECT_FALSE(other->GetsLockSoon());
    });
    timer.Tick();
    EXPECT_TRUE(other->GetsLock());
    UITimer killing([&](KTInt64 id) {
        KTKillUITimer(id);
        KTKillUITimer(0);
        EXPECT_TRUE(Other().GetsLock());
    });
    killing.Tick();
    ExpectLockIsFree();
}

TEST_F(UITimers, AKillFromAnotherThreadWaitsForTheFunction) {
    UITimer victim;
    Signal killed;
    boost::thread killer;
    UITimer timer([&](KTInt64) {
        killer = boost::thread([&] {
            victim.Kill();
            killed.Set();
        });
        EXPECT_FALSE(killed.IsSet(1, kSoon));
        victim.Tick(); // so it is still there
    });
    timer.Tick();
    EXPECT_TRUE(killed.IsSet());
    killer.join();
    victim.Tick();
    EXPECT_EQ(1, victim.calls);
}

// ---- functions within functions: a message pump in a UI timer's function ----

TEST_F(UITimers, AnInnerCallThatKillsItsTimerLeavesTheOuterOneItsLock) {
    std::unique_ptr<Other> other;
    UITimer inner([](KTInt64 id) { KTKillUITimer(id); });
    UITimer outer([&](KTInt64) {
        inner.Tick();
        other = std::make_unique<Other>();
        EXPECT_FALSE(other->GetsLockSoon());
    });
    outer.Tick();
    EXPECT_EQ(1, inner.calls);
    EXPECT_TRUE(other->GetsLock());
}

TEST_F(UITimers, AnOuterCallMayStillKillItsTimerAfterAnInnerOne) {
    UITimer inner;
    UITimer outer([&](KTInt64 id) {
        inner.Tick();
        KTKillUITimer(id);
        EXPECT_TRUE(Other().GetsLock());
    });
    outer.Tick();
    ExpectLockIsFree();
}

TEST_F(UITimers, AnInnerCallAfterTheOuterOneKilledItsTimerHasALockOfItsOwn) {
    std::unique_ptr<Other> other;
    UITimer inner([&](KTInt64) {
        other = std::make_unique<Other>();
        EXPECT_FALSE(other->GetsLockSoon());
    });
    UITimer outer([&](KTInt64 id) {
        KTKillUITimer(id);
        inner.Tick();
        EXPECT_TRUE(other->GetsLock());
    });
    outer.Tick();
    EXPECT_EQ(1, inner.calls);
    ExpectLockIsFree();
}

TEST_F(UITimers, AnInnerCallMayKillTheOuterTimer) {
    UITimer outer([](KTInt64) {});
    std::unique_ptr<UITimer> outermost;
    UITimer inner([&](KTInt64 id) {
        outermost->Kill(); // another timer's: nothing is released
        KTKillUITimer(id);
        outermost->Kill(); // now it is the current one
        EXPECT_TRUE(Other().GetsLock());
    });
    outermost = std::make_unique<UITimer>([&](KTInt64) {
        inner.Tick();
        EXPECT_TRUE(Other().GetsLock());
    });
    outermost->Tick();
    outermost->Tick();
    EXPECT_EQ(1, outermost->calls);
    EXPECT_EQ(1, inner.calls);
    ExpectLockIsFree();
}

TEST_F(UITimers, ATimerMayTickWithinItsOwnFunction) {
    UITimer *self = nullptr;
    UITimer timer([&](KTInt64 id) {
        if (self->calls == 1) {
            self->Tick();
            EXPECT_EQ(2, self->calls);
            KTKillUITimer(id);
            EXPECT_TRUE(Other().GetsLock());
        }
    });
    self = &timer;
    timer.Tick();
    EXPECT_EQ(2, timer.calls);
    ExpectLockIsFree();
}
