// TickCountTest.cpp: the clocks since load, the time keeper that stands on them, and the state machine.

#include "KTException.h"
#include "KTSimpleTimeKeeper.h"
#include "KTStateMachine.h"
#include "KTTickCount.h"
#include "LogLines.h"
#include "TestClock.h"

#include <gtest/gtest.h>

#include <chrono>
#include <limits>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

constexpr KTUInt64 kStart = 1'700'000'000'123'456; // microseconds; any time will do
constexpr KTInt64 kMillisecond = 1000;
constexpr KTInt64 kWrap = KTInt64{1} << 32; // milliseconds

std::vector<std::string> &Reports() {
    static std::vector<std::string> reports;
    return reports;
}

void Keep(std::string const &report) { Reports().push_back(report); }

// A clock that stands still, and a time keeper that was started by it and reports to Keep.
class TimeKeeper : public testing::Test {
  protected:
    TimeKeeper() { Reports().clear(); }

    std::string ReportAfter(KTInt64 milliseconds, std::string const &name = "load") {
        Reports().clear();
        {
            KTSimpleTimeKeeper keeper(name);
            keeper.SetDumpFunction(&Keep);
            m_Clock.Advance(milliseconds * kMillisecond);
        }
        return Reports().size() == 1 ? Reports()[0] : "";
    }

    TestClock m_Clock{kStart};
};

// What Validate or ValidateAny threw.
template <typename Call> void ExpectInvalidState(int line, Call const &call) {
    try {
        call();
        ADD_FAILURE() << "nothing thrown";
    } catch (KTLCException const &exception) {
        EXPECT_EQ(KTString("kKTSMExceptionInvalidState"), exception.GetReason());
        EXPECT_EQ(KTString("KTStateMachine"), exception.GetFile()); // the base name of the path
        EXPECT_EQ(line, exception.GetLine());
    }
}

} // namespace

// ---- the clocks ----

TEST(TickCount, CountsFromTheLoadOfTheLibrary) {
    long const first = KTGetTickCountSinceAppStartTime();
    KTUInt64 const firstNs100 = KTGetTickCountSinceAppStartTimeNS100();
    EXPECT_LE(0, first);
    EXPECT_GT(24 * 3600 * 1000, first); // not since some epoch
    EXPECT_LE(static_cast<KTUInt64>(first), firstNs100 / 10'000 + 1);
}

TEST(TickCount, CountsMillisecondsAndHundredsOfNanoseconds) {
    TestClock clock(kStart);
    long const before = KTGetTickCountSinceAppStartTime();
    KTUInt64 const beforeNs100 = KTGetTickCountSinceAppStartTimeNS100();
    clock.Advance(543); // 123.999 milliseconds
    EXPECT_EQ(before, KTGetTickCountSinceAppStartTime());
    EXPECT_EQ(beforeNs100 + 5430, KTGetTickCountSinceAppStartTimeNS100());
    clock.Advance(1); // 124.000
    EXPECT_EQ(before + 1, KTGetTickCountSinceAppStartTime());
    EXPECT_EQ(beforeNs100 + 5440, KTGetTickCountSinceAppStartTimeNS100());
    clock.Advance(3'600'000 * kMillisecond);
    EXPECT_EQ(before + 1 + 3'600'000, KTGetTickCountSinceAppStartTime());
    EXPECT_EQ(beforeNs100 + 5440 + 36'000'000'000, KTGetTickCountSinceAppStartTimeNS100());
}

TEST(TickCount, MillisecondsWrapAroundInThirtyTwoBits) {
    TestClock clock(kStart);
    long const before = KTGetTickCountSinceAppStartTime();
    KTUInt64 const beforeNs100 = KTGetTickCountSinceAppStartTimeNS100();
    clock.Advance(kWrap * kMillisecond);
    EXPECT_EQ(before, KTGetTickCountSinceAppStartTime());
    EXPECT_EQ(beforeNs100 + static_cast<KTUInt64>(kWrap) * 10'000, KTGetTickCountSinceAppStartTimeNS100());
    // Just before and just behind half of the scale.
    clock.Set(kStart);
    clock.Advance((std::numeric_limits<KTInt32>::max() - before) * kMillisecond);
    EXPECT_EQ(std::numeric_limits<KTInt32>::max(), KTGetTickCountSinceAppStartTime());
    clock.Advance(kMillisecond);
    EXPECT_EQ(std::numeric_limits<KTInt32>::min(), KTGetTickCountSinceAppStartTime());
}

TEST(TickCount, MovesBackWithTheSystemsClock) {
    TestClock clock(kStart);
    long const before = KTGetTickCountSinceAppStartTime();
    KTUInt64 const beforeNs100 = KTGetTickCountSinceAppStartTimeNS100();
    clock.Advance(-5000 * kMillisecond);
    EXPECT_EQ(before - 5000, KTGetTickCountSinceAppStartTime());
    EXPECT_EQ(beforeNs100 - 50'000'000, KTGetTickCountSinceAppStartTimeNS100());
}

// ---- the time keeper ----

TEST_F(TimeKeeper, MeasuresSecondsSinceItsStartOrReset) {
    KTSimpleTimeKeeper keeper("load");
    keeper.SetDumpFunction(&Keep);
    EXPECT_EQ(0.0, keeper.GetElapsedTime());
    m_Clock.Advance(1500 * kMillisecond);
    EXPECT_EQ(1.5, keeper.GetElapsedTime());
    EXPECT_EQ(1.5, keeper.GetElapsedTime());
    keeper.Reset();
    EXPECT_EQ(0.0, keeper.GetElapsedTime());
    m_Clock.Advance(1 * kMillisecond);
    EXPECT_EQ(0.001, keeper.GetElapsedTime());
    m_Clock.Advance(-3001 * kMillisecond);
    EXPECT_EQ(-3.0, keeper.GetElapsedTime()); // the system clock was set back
}

TEST_F(TimeKeeper, MeasuresAcrossTheWrapOfTheClock) {
    m_Clock.Advance((std::numeric_limits<KTInt32>::max() - KTGetTickCountSinceAppStartTime()) * kMillisecond);
    KTSimpleTimeKeeper keeper("load");
    keeper.SetDumpFunction(&Keep);
    m_Clock.Advance(2000 * kMillisecond);
    EXPECT_EQ(2.0, keeper.GetElapsedTime());
}

TEST_F(TimeKeeper, ReportsWithSixSignificantDigits) {
    EXPECT_EQ("PROFILE: Time taken by load = 1.5\n", ReportAfter(1500));
    EXPECT_EQ("PROFILE: Time taken by load = 0\n", ReportAfter(0));
    EXPECT_EQ("PROFILE: Time taken by load = 0.001\n", ReportAfter(1));
    EXPECT_EQ("PROFILE: Time taken by load = 123.456\n", ReportAfter(123'456));
    EXPECT_EQ("PROFILE: Time taken by load = 1234.57\n", ReportAfter(1'234'567));
    EXPECT_EQ("PROFILE: Time taken by load = 1.23457e+06\n", ReportAfter(1'234'567'890));
    EXPECT_EQ("PROFILE: Time taken by load = -2\n", ReportAfter(-2000));
    EXPECT_EQ("PROFILE: Time taken by pages and sounds = 2\n", ReportAfter(2000, "pages and sounds"));
    EXPECT_EQ("PROFILE: Time taken by  = 2\n", ReportAfter(2000, ""));
}

TEST_F(TimeKeeper, ReportsOnce) {
    {
        KTSimpleTimeKeeper keeper("load");
        keeper.SetDumpFunction(&Keep);
        m_Clock.Advance(1000 * kMillisecond);
        keeper.DoDumping();
        ASSERT_EQ(1U, Reports().size());
        EXPECT_EQ("PROFILE: Time taken by load = 1\n", Reports()[0]);
        m_Clock.Advance(1000 * kMillisecond);
        keeper.DoDumping();
        keeper.Reset(); // does not make it report again
        keeper.DoDumping();
    }
    EXPECT_EQ(1U, Reports().size());
}

TEST_F(TimeKeeper, WithoutNameAndFunctionNothingIsReportedAndNothingIsLost) {
    {
        KTSimpleTimeKeeper const silent;
    }
    EXPECT_TRUE(Reports().empty());
    KTSimpleTimeKeeper keeper;
    keeper.DoDumping(); // does not count as reported
    keeper.SetDumpFunction(&Keep);
    m_Clock.Advance(500 * kMillisecond);
    keeper.DoDumping();
    ASSERT_EQ(1U, Reports().size());
    EXPECT_EQ("PROFILE: Time taken by  = 0.5\n", Reports()[0]);
}

TEST_F(TimeKeeper, AReportThatTheFunctionThrowsAtIsMadeAgain) {
    static bool refuses;
    refuses = true;
    KTSimpleTimeKeeper keeper("load");
    keeper.SetDumpFunction([](std::string const &report) {
        if (refuses) {
            throw std::runtime_error("the disk is full");
        }
        Keep(report);
    });
    EXPECT_THROW(keeper.DoDumping(), std::runtime_error);
    EXPECT_TRUE(Reports().empty());
    refuses = false;
    m_Clock.Advance(500 * kMillisecond);
    keeper.DoDumping();
    ASSERT_EQ(1U, Reports().size());
    EXPECT_EQ("PROFILE: Time taken by load = 0.5\n", Reports()[0]);
}

// ---- the state machine ----

TEST(StateMachine, HoldsAnyState) {
    KTStateMachine machine(3);
    EXPECT_EQ(3, machine.Get());
    machine.Set(-1);
    EXPECT_EQ(-1, machine.Get());
    machine.Set(std::numeric_limits<int>::min());
    EXPECT_EQ(std::numeric_limits<int>::min(), machine.Get());
    KTStateMachine const copy(machine);
    EXPECT_EQ(machine.Get(), copy.Get());
    KTStateMachine assigned(1);
    EXPECT_EQ(&assigned, &(assigned = copy));
    EXPECT_EQ(machine.Get(), assigned.Get());
    IKTStateMachineRO const &view = machine;
    EXPECT_EQ(machine.Get(), view.Get());
}

TEST(StateMachine, ValidateThrowsUnlessTheStateIsTheOneExpected) {
    KTStateMachine machine(5);
    IKTStateMachineRO const &view = machine;
    EXPECT_NO_THROW(view.Validate(5));
    ExpectInvalidState(52, [&] { view.Validate(4); });
    ExpectInvalidState(52, [&] { view.Validate(-1); });
    EXPECT_EQ(5, machine.Get());
    machine.Set(-1);
    EXPECT_NO_THROW(view.Validate(-1)); // only lists cannot hold it
}

TEST(StateMachine, AnUnexpectedStateIsThrownAndNotLogged) {
    LogLines log;
    KTStateMachine const machine(5);
    EXPECT_THROW(machine.Validate(4), KTLCException);
    EXPECT_THROW(machine.ValidateAny(4, -1), KTLCException);
    EXPECT_EQ(std::vector<std::string>{}, log.Take());
}

TEST(StateMachine, ValidateAnyLooksForTheStateInTheList) {
    KTStateMachine machine(5);
    EXPECT_NO_THROW(machine.ValidateAny(3, 5, -1));
    EXPECT_NO_THROW(machine.ValidateAny(5, -1));
    EXPECT_NO_THROW(machine.ValidateAny(5)); // found before the end is looked for
    EXPECT_NO_THROW(machine.ValidateAny(1, 2, 3, 4, 5, 6, 7, 8, 9, -1));
    machine.Set(4);
    ExpectInvalidState(71, [&] { machine.ValidateAny(3, 5, -1); });
    ExpectInvalidState(71, [&] { machine.ValidateAny(-1); });
    ExpectInvalidState(71, [&] { machine.ValidateAny(-1, 4, -1); });    // the list has ended
    ExpectInvalidState(71, [&] { machine.ValidateAny(3, -1, 4, -1); }); // here too
    EXPECT_EQ(4, machine.Get());
    machine.Set(-1);
    ExpectInvalidState(71, [&] { machine.ValidateAny(-1); }); // always
    ExpectInvalidState(71, [&] { machine.ValidateAny(3, -1); });
}
