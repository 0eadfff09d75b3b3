// BenchTimers.cpp: what the timer service costs while nothing happens, and how late its ticks are, beside what is allowed.
//
// No peer does the same work, so the times here are not those of operations: `idle` is the part of a processor that the
// process uses, `late` the lateness of a tick, and the contender `allowed` stands for the limit. Both need a machine that
// does nothing else.

#include "Bench.h"

#include "KTTimerService.h"

#include <windows.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <string>
#include <vector>

namespace bench {

namespace {

constexpr char kGroup[] = "timers";
constexpr char kAllowed[] = "allowed";

constexpr DWORD kMeasured = 3000; // milliseconds
constexpr int kRepetitions = 3;
constexpr int kTimers = 50; // of each kind
constexpr long kHour = 3'600'000;
constexpr double kTick = 0.010; // seconds
constexpr double kLeast = 1e-4; // the system counts processor time coarsely and may show none

constexpr int kFirstMessage = 100;

// All values are identifiers: those of the host's own messages have no names here.
KT_THREAD_MESSAGE Message(int number) {
    // NOLINTNEXTLINE(clang-analyzer-optin.core.EnumCastOutOfRange)
    return static_cast<KT_THREAD_MESSAGE>(kFirstMessage + number);
}

class Service {
  public:
    Service() { KTCreateTimerService(); }
    Service(Service const &) = delete;
    Service &operator=(Service const &) = delete;
    ~Service() { KTDestroyTimerService(); }
};

// Seconds of processor time that this process has used.
double ProcessorSeconds() {
    FILETIME created{};
    FILETIME exited{};
    FILETIME kernel{};
    FILETIME user{};
    GetProcessTimes(GetCurrentProcess(), &created, &exited, &kernel, &user);
    auto const seconds = [](FILETIME const &time) {
        return static_cast<double>((ULONGLONG{time.dwHighDateTime} << 32) | time.dwLowDateTime) * 1e-7;
    };
    return seconds(kernel) + seconds(user);
}

// The part of one processor that the service uses with all its slots taken.
double IdlePart() {
    Service const service;
    for (int i = 0; i < kTimers; ++i) {
        KTInt64 id = 0;
        KTCreateTimer(nullptr, kHour, &id, Message(i));
        KTCreateSingleBurstTimer(nullptr, kHour, &id, Message(i));
    }
    double const before = ProcessorSeconds();
    Sleep(kMeasured);
    return (ProcessorSeconds() - before) * 1000 / kMeasured;
}

// Notes how much later than its interval each tick came after the one before.
class Listener : public KTThread {
  public:
    Listener() { start(); }
    Listener(Listener const &) = delete;
    Listener &operator=(Listener const &) = delete;
    ~Listener() override = default;

    // Ends the thread. The sorted seconds.
    std::vector<double> Finish() {
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
        std::sort(m_Seconds.begin(), m_Seconds.end());
        return m_Seconds;
    }

    // No multiples of a tick.
    static long Interval(int number) { return 51 + 2 * number; }

    void processMessage(KTThreadMsg const &msg) override {
        if (msg.message == KT_THREAD_MSG_QUIT) {
            return;
        }
        int const number = static_cast<int>(msg.message) - kFirstMessage;
        auto const now = std::chrono::steady_clock::now();
        auto &last = m_Last[static_cast<std::size_t>(number)];
        if (last != std::chrono::steady_clock::time_point{}) {
            std::chrono::duration<double> const late = now - last - std::chrono::milliseconds(Interval(number));
            m_Seconds.push_back(std::max(late.count(), 0.0));
        }
        last = now;
    }

  private:
    std::array<std::chrono::steady_clock::time_point, kTimers> m_Last{};
    std::vector<double> m_Seconds;
};

// The lateness that this part of the ticks does not exceed.
double Lateness(double part) {
    Listener listener;
    {
        Service const service;
        for (int i = 0; i < kTimers; ++i) {
            KTInt64 id = 0;
            KTCreateTimer(&listener, Listener::Interval(i), &id, Message(i));
        }
        Sleep(kMeasured);
    }
    std::vector<double> const seconds = listener.Finish();
    return seconds.empty() ? 1.0 : seconds[static_cast<std::size_t>(part * static_cast<double>(seconds.size() - 1))];
}

template <typename Measure> void AddMeasured(Task const &task, char const *contender, Measure measure) {
    PlaceInReport(task, contender);
    std::string const name = task.group + '/' + task.kase + '/' + task.size + '/' + contender;
    benchmark::RegisterBenchmark(name.c_str(),
                                 [measure](benchmark::State &state) {
                                     for (auto _ : state) {
                                         state.SetIterationTime(std::max(measure(), kLeast));
                                     }
                                 })
        ->UseManualTime()
        ->Iterations(1)
        ->Repetitions(kRepetitions);
}

template <typename Measure> void AddLimited(Task const &task, double allowed, Measure measure) {
    AddMeasured(task, kOurs, measure);
    AddMeasured(task, kAllowed, [allowed] { return allowed; });
}

} // namespace

void AddTimerBenchmarks() {
    DescribeGroup(kGroup, "timer service: processor time when idle, and lateness of ticks, against their limits");
    ExpectSpeed(kGroup, kAllowed, 1.0);
    AddLimited({kGroup, "idle", "100-timers"}, 0.01, IdlePart);
    AddLimited({kGroup, "late", "median"}, kTick, [] { return Lateness(0.5); });
    AddLimited({kGroup, "late", "99-percent"}, 2 * kTick, [] { return Lateness(0.99); });
}

} // namespace bench
