// SoakMain.cpp: ktsoak [SECONDS [SEED]]
//
// Runs the soaks in rounds of some seconds until the time is over, five minutes by default, and prints what they did.
// The exit status is 0 when nothing was lost that the rules do not lose, nothing came to a standstill, and the process
// holds no more handles, threads and memory than after its first rounds.

#include "KTThread.h"
#include "MessageSoak.h"
#include "ProcessFigures.h"
#include "SoakProgress.h"
#include "TimerSoak.h"

#include <boost/thread/thread.hpp>

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>

namespace {

constexpr std::chrono::milliseconds kRound{2000};
constexpr int kWarmUpRounds = 2;
constexpr int kStandstill = 120; // seconds in which a part does not get on
constexpr std::uint64_t kHandleTolerance = 4;
constexpr std::uint64_t kMemoryTolerance = std::uint64_t{8} << 20;

// Ends the process when nothing moves any more.
class Watchdog {
  public:
    Watchdog() : m_Thread([this] { Watch(); }) {}
    Watchdog(Watchdog const &) = delete;
    Watchdog &operator=(Watchdog const &) = delete;
    ~Watchdog() {
        m_Stop = true;
        m_Thread.join();
    }

  private:
    void Watch() {
        std::array<std::uint64_t, kSoakParts> last{};
        std::array<int, kSoakParts> idle{};
        for (; !m_Stop; KTSleepForDuration(0, 100)) {
            for (std::size_t part = 0; part < kSoakParts; ++part) {
                std::uint64_t const now = soakProgress[part];
                idle[part] = now == last[part] ? idle[part] + 1 : 0;
                last[part] = now;
                if (idle[part] > kStandstill * 10) {
                    std::fprintf(stderr, "ktsoak: standstill of part %d\n", static_cast<int>(part));
                    std::_Exit(1);
                }
            }
        }
    }

    std::atomic<bool> m_Stop{false};
    boost::thread m_Thread;
};

bool Compare(char const *name, std::uint64_t before, std::uint64_t after, std::uint64_t tolerance) {
    std::printf("%-8s %llu, then %llu\n", name, static_cast<unsigned long long>(before),
                static_cast<unsigned long long>(after));
    return after <= before + tolerance;
}

unsigned long long Print(std::uint64_t value) { return value; }

std::string SoakRound(unsigned int seed, MessageFigures &figures, TimerFigures &timerFigures) {
    TimerSoak timers(seed);
    std::string const problems = SoakMessages(seed, kRound, [&timers] { timers.Turn(); }, figures);
    return problems + timers.Finish(timerFigures);
}

int Soak(std::chrono::seconds length, unsigned int seed) {
    std::printf("ktsoak: %lld s, seed %u\n", static_cast<long long>(length.count()), seed);
    MessageFigures figures;
    TimerFigures timers;
    ProcessFigures before;
    int rounds = 0;
    {
        Watchdog const watchdog;
        auto const end = std::chrono::steady_clock::now() + length;
        while (rounds <= kWarmUpRounds || std::chrono::steady_clock::now() < end) {
            std::string const problems = SoakRound(seed + static_cast<unsigned int>(rounds) * 100, figures, timers);
            if (!problems.empty()) {
                std::fprintf(stderr, "ktsoak: round %d\n%s", rounds, problems.c_str());
                return 1;
            }
            if (++rounds == kWarmUpRounds) {
                before = ReadProcessFigures();
            }
        }
        ProcessFigures const after = ReadProcessFigures();
        std::printf("rounds   %d\nmessages %llu accepted, %llu handled, %llu refused by full queues\n"
                    "         %llu synchronous posts, %llu flushes\n",
                    rounds, Print(figures.accepted), Print(figures.handled), Print(figures.refused),
                    Print(figures.synchronous), Print(figures.flushes));
        std::printf("timers   %llu created, %llu refused by full tables, %llu adjusted or restarted, %llu killed\n"
                    "         %llu ticks, %llu bursts, %llu calls of UI timers\n",
                    Print(timers.created), Print(timers.refused), Print(timers.adjusted), Print(timers.killed),
                    Print(timers.ticks), Print(timers.bursts), Print(timers.calls));
        bool isClean = Compare("handles", before.handles, after.handles, kHandleTolerance);
        isClean = Compare("threads", before.threads, after.threads, 0) && isClean;
        isClean = Compare("bytes", before.bytes, after.bytes, kMemoryTolerance) && isClean;
        if (!isClean) {
            std::fputs("ktsoak: something was left behind\n", stderr);
            return 1;
        }
    }
    return 0;
}

} // namespace

int main(int count, char **arguments) {
    int const seconds = count > 1 ? std::atoi(arguments[1]) : 300;
    unsigned int const seed =
        count > 2 ? static_cast<unsigned int>(std::strtoul(arguments[2], nullptr, 10)) : std::random_device()();
    if (seconds <= 0 || count > 3) {
        std::fputs("usage: ktsoak [SECONDS [SEED]]\n", stderr);
        return 2;
    }
    return Soak(std::chrono::seconds(seconds), seed);
}
