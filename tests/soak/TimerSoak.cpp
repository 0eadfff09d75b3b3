// TimerSoak.cpp: the users of the timer service, and the books they keep.

#include "TimerSoak.h"

#include "KTTimerService.h"
#include "SoakProgress.h"
#include "SoakPump.h"

#include <boost/thread/thread.hpp>

#include <array>
#include <atomic>
#include <functional>
#include <map>
#include <mutex>
#include <random>
#include <sstream>
#include <vector>

TimerFigures &TimerFigures::operator+=(TimerFigures const &other) {
    created += other.created;
    refused += other.refused;
    adjusted += other.adjusted;
    killed += other.killed;
    ticks += other.ticks;
    bursts += other.bursts;
    calls += other.calls;
    return *this;
}

namespace {

constexpr KTInt64 kSlots = 50;
constexpr std::size_t kUITimers = 20;
constexpr int kLongestInterval = 30;       // milliseconds
constexpr unsigned int kPatience = 60'000; // milliseconds, for what must happen in the end

class Random {
  public:
    explicit Random(unsigned int seed) : m_Engine(seed) {}
    int Draw(int from, int to) { return std::uniform_int_distribution(from, to)(m_Engine); }
    bool IsOneOf(int count) { return Draw(1, count) == 1; }

  private:
    std::mt19937 m_Engine;
};

// ---- the message threads that timers post to ----

constexpr int kFirstNumber = 1000; // below, the messages about what may come

// Param1 is the number, param2 how often it may come at most.
constexpr auto kExpect = static_cast<KT_THREAD_MESSAGE>(100);
constexpr auto kAllowOneMore = static_cast<KT_THREAD_MESSAGE>(101);
constexpr auto kForget = static_cast<KT_THREAD_MESSAGE>(102);
constexpr auto kStartFinale = static_cast<KT_THREAD_MESSAGE>(103); // param1: whether old ticks count

constexpr KTUInt64 kAnyNumber = ~KTUInt64{0};

class Bookkeeper : public KTThread {
  public:
    Bookkeeper() { start(); }
    Bookkeeper(Bookkeeper const &) = delete;
    Bookkeeper &operator=(Bookkeeper const &) = delete;
    ~Bookkeeper() override {
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    // What is told before a timer's messages can come is handled before them.
    void Tell(KT_THREAD_MESSAGE what, int number, KTUInt64 limit = 0) {
        while (!postMessage(what, static_cast<KTUInt64>(number), limit, 0, 0)) {
            boost::this_thread::yield();
        }
    }

    void processMessage(KTThreadMsg const &msg) override {
        auto const number = static_cast<int>(msg.param1);
        if (msg.message == kExpect) {
            m_Expected[number] = {msg.param2, 0};
        } else if (msg.message == kAllowOneMore) {
            ++m_Expected[number].limit;
        } else if (msg.message == kForget) {
            m_Expected.erase(number);
        } else if (msg.message == kStartFinale) {
            StartFinale(msg.param1 != 0);
        } else if (msg.message != KT_THREAD_MSG_QUIT) {
            Count(static_cast<int>(msg.message));
        }
    }

    // Whether every number that is expected has come; waits for them.
    bool SeesAll(bool oldTicksCount) {
        syncPostMessage(kStartFinale, oldTicksCount ? 1 : 0, 0, 0, 0);
        for (unsigned int i = 0; missing != 0; ++i) {
            if (i == kPatience) {
                return false;
            }
            KTSleepForDuration(0, 1);
        }
        return true;
    }

    std::atomic<std::size_t> missing{0};
    std::atomic<std::uint64_t> problems{0};
    std::atomic<std::uint64_t> messages{0};

  private:
    struct Entry {
        KTUInt64 limit = 0;
        KTUInt64 count = 0;
    };

    void Count(int number) {
        ++messages;
        auto const found = m_Expected.find(number);
        if (found == m_Expected.end() || found->second.count == found->second.limit) {
            ++problems;
        } else if (++found->second.count == 1 && m_IsFinale) {
            --missing;
        }
    }

    void StartFinale(bool oldTicksCount) {
        m_IsFinale = true;
        for (auto &[number, entry] : m_Expected) {
            entry.count = oldTicksCount ? entry.count : 0;
            missing += entry.count == 0 && entry.limit != 0 ? 1U : 0U;
        }
    }

    std::map<int, Entry> m_Expected;
    bool m_IsFinale = false;
};

// ---- the users of the two tables ----

class ThreadTimerUser {
  public:
    explicit ThreadTimerUser(unsigned int seed) : m_Random(seed) {}

    void Run(std::atomic<bool> const &stop) {
        while (!stop) {
            Step();
            SoakGetsOn(SoakPart::ThreadTimers);
            KTSleepForDuration(0, 1);
        }
    }

    Bookkeeper keeper;
    TimerFigures figures;
    std::uint64_t problems = 0;

  private:
    void Step() {
        KTInt64 const id = m_Random.Draw(1, kSlots);
        bool const isUsed = m_Numbers[Index(id)] != 0;
        if (m_Random.IsOneOf(2)) {
            Create();
        } else if (isUsed && m_Random.IsOneOf(3)) {
            KTKillTimer(id);
            keeper.Tell(kForget, m_Numbers[Index(id)]);
            m_Numbers[Index(id)] = 0;
            --m_Used;
            ++figures.killed;
        } else {
            ++figures.adjusted;
            if (m_Random.IsOneOf(2)) {
                KTAdjustTimer(id, m_Random.Draw(0, kLongestInterval)); // also ids without a timer
            } else {
                KTRestartTimer(id);
            }
        }
    }

    void Create() {
        int const number = m_NextNumber++;
        keeper.Tell(kExpect, number, kAnyNumber);
        KTInt64 id = -1;
        KTCreateTimer(&keeper, m_Random.Draw(0, kLongestInterval), &id, static_cast<KT_THREAD_MESSAGE>(number));
        bool const isRight = m_Used == kSlots ? id == 0 : id >= 1 && id <= kSlots && m_Numbers[Index(id)] == 0;
        problems += isRight ? 0U : 1U;
        if (id == 0) {
            keeper.Tell(kForget, number);
            ++figures.refused;
            return;
        }
        ++figures.created;
        ++m_Used;
        m_Numbers[Index(id)] = number;
    }

    static std::size_t Index(KTInt64 id) { return static_cast<std::size_t>(id); }

    Random m_Random;
    std::array<int, kSlots + 1> m_Numbers{}; // by id
    KTInt64 m_Used = 0;
    int m_NextNumber = kFirstNumber;
};

class BurstUser {
  public:
    explicit BurstUser(unsigned int seed) : m_Random(seed) {}

    void Run(std::atomic<bool> const &stop) {
        while (!stop) {
            // A full queue would lose bursts, as the rules say.
            if (keeper.getPercentageOfMessageQueueThatIsOccupied() < 25) {
                Step();
            }
            SoakGetsOn(SoakPart::Bursts);
            KTSleepForDuration(0, 1);
        }
    }

    Bookkeeper keeper;
    TimerFigures figures;
    std::uint64_t problems = 0;

  private:
    void Step() {
        auto const id = static_cast<std::size_t>(m_Random.Draw(1, kSlots));
        int const number = m_Numbers[id]; // of the last burst that got the id; it may be over
        if (number == 0 || m_Random.IsOneOf(2)) {
            Create();
        } else if (m_Random.IsOneOf(3)) {
            KTKillSingleBurstTimer(static_cast<KTInt64>(id));
            keeper.Tell(kForget, number);
            m_Numbers[id] = 0;
            ++figures.killed;
        } else {
            ++figures.adjusted;
            keeper.Tell(kAllowOneMore, number);
            if (m_Random.IsOneOf(2)) {
                KTAdjustSingleBurstTimer(static_cast<KTInt64>(id), m_Random.Draw(1, kLongestInterval));
            } else {
                KTRestartSingleBurstTimer(static_cast<KTInt64>(id));
            }
        }
    }

    void Create() {
        int const number = m_NextNumber++;
        keeper.Tell(kExpect, number, 1);
        KTInt64 id = -1;
        KTCreateSingleBurstTimer(&keeper, m_Random.Draw(1, kLongestInterval), &id,
                                 static_cast<KT_THREAD_MESSAGE>(number));
        if (id == 0) {
            keeper.Tell(kForget, number);
            ++figures.refused;
        } else if (id < 0 || id > kSlots) {
            ++problems;
        } else {
            ++figures.created;
            m_Numbers[static_cast<std::size_t>(id)] = number;
        }
    }

    Random m_Random;
    std::array<int, kSlots + 1> m_Numbers{}; // by id
    int m_NextNumber = kFirstNumber;
};

// ---- the users of UI timers ----

class UITimerUser {
  public:
    explicit UITimerUser(unsigned int seed) : m_Random(seed) {}

    // The part of the thread that created the service.
    void Turn() {
        while (!m_Random.IsOneOf(4)) {
            Create();
        }
        if (m_Random.IsOneOf(4)) {
            KillOne(m_Random);
        }
        PumpSoakMessages();
        SoakGetsOn(SoakPart::UITimers);
    }

    // The other thread.
    void RunKiller(std::atomic<bool> const &stop, unsigned int seed) {
        Random random(seed);
        while (!stop) {
            KillOne(random);
            KTSleepForDuration(0, 20);
        }
    }

    // Whether every timer that lives ticks once more; pumps until they have.
    bool SeesAll() {
        m_IsFinale = true;
        for (Timer *const timer : m_Alive) {
            timer->isSeen = false;
        }
        auto const isMissing = [this] {
            for (Timer const *const timer : m_Alive) {
                if (!timer->isSeen) {
                    return true;
                }
            }
            return false;
        };
        for (unsigned int i = 0; isMissing(); ++i) {
            if (i == kPatience) {
                return false;
            }
            PumpSoakMessages();
            KTSleepForDuration(0, 1);
        }
        return true;
    }

    TimerFigures figures; // the calling thread's
    std::atomic<std::uint64_t> problems{0};
    std::atomic<std::uint64_t> killed{0};

  private:
    struct Timer {
        UITimerUser *user = nullptr;
        KTInt64 id = 0;
        std::atomic<bool> isKilled{false};
        bool isSeen = false;
    };

    static void Tick(KTInt64 id, void *data) {
        auto &timer = *static_cast<Timer *>(data);
        timer.user->Ticked(timer, id);
    }

    void Ticked(Timer &timer, KTInt64 id) {
        ++figures.calls;
        timer.isSeen = true;
        problems += timer.id != id || timer.isKilled ? 1U : 0U;
        if (m_IsFinale) {
            return;
        }
        if (m_Random.IsOneOf(20)) {
            Kill(timer); // its own
        }
        if (m_Random.IsOneOf(10)) {
            Create();
        }
        if (m_Random.IsOneOf(20)) {
            KillOne(m_Random);
        }
        if (m_Random.IsOneOf(20)) {
            Kill(timer);
        }
    }

    void Create() {
        {
            std::lock_guard const lock(m_Mutex);
            if (m_Alive.size() >= kUITimers) {
                return;
            }
        }
        Timer &timer = *m_All.emplace_back(std::make_unique<Timer>());
        timer.user = this;
        KTCreateUITimer(m_Random.Draw(1, kLongestInterval), &timer.id, Tick, &timer);
        problems += timer.id <= m_LastId ? 1U : 0U;
        m_LastId = timer.id;
        ++figures.created;
        std::lock_guard const lock(m_Mutex);
        m_Alive.push_back(&timer);
    }

    void KillOne(Random &random) {
        Timer *timer = nullptr;
        {
            std::lock_guard const lock(m_Mutex);
            if (m_Alive.empty()) {
                return;
            }
            timer = m_Alive[static_cast<std::size_t>(random.Draw(0, static_cast<int>(m_Alive.size()) - 1))];
        }
        Kill(*timer);
    }

    // The list's mutex is not held while the service is called: functions take it under the service's lock.
    void Kill(Timer &timer) {
        KTKillUITimer(timer.id);
        timer.isKilled = true;
        std::lock_guard const lock(m_Mutex);
        killed += std::erase(m_Alive, &timer);
    }

    Random m_Random;
    std::mutex m_Mutex; // guards m_Alive
    std::vector<Timer *> m_Alive;
    std::vector<std::unique_ptr<Timer>> m_All; // also those that were killed: a tick that came late would be seen
    KTInt64 m_LastId = 0;
    bool m_IsFinale = false;
};

} // namespace

struct TimerSoak::Parts {
    explicit Parts(unsigned int seed) : threadTimers(seed), bursts(seed + 1), uiTimers(seed + 2) {}

    ThreadTimerUser threadTimers;
    BurstUser bursts;
    UITimerUser uiTimers;
    std::atomic<bool> stop{false};
    boost::thread_group threads;
};

TimerSoak::TimerSoak(unsigned int seed) : m_Parts(std::make_unique<Parts>(seed)) {
    KTCreateTimerService();
    Parts &parts = *m_Parts;
    parts.threads.create_thread([&parts] { parts.threadTimers.Run(parts.stop); });
    parts.threads.create_thread([&parts] { parts.bursts.Run(parts.stop); });
    parts.threads.create_thread([&parts, seed] { parts.uiTimers.RunKiller(parts.stop, seed + 3); });
}

TimerSoak::~TimerSoak() {
    m_Parts->stop = true;
    m_Parts->threads.join_all();
    KTDestroyTimerService();
}

void TimerSoak::Turn() { m_Parts->uiTimers.Turn(); }

std::string TimerSoak::Finish(TimerFigures &figures) {
    Parts &parts = *m_Parts;
    parts.stop = true;
    parts.threads.join_all();
    std::ostringstream problems;
    auto const expect = [&problems](bool isRight, char const *problem) {
        if (!isRight) {
            problems << problem << "\n";
        }
    };
    expect(parts.bursts.keeper.SeesAll(true), "a burst did not fire");
    expect(parts.threadTimers.keeper.SeesAll(false), "a thread timer does not tick");
    expect(parts.uiTimers.SeesAll(), "a UI timer does not tick");
    expect(parts.threadTimers.problems == 0, "a thread timer got a wrong id");
    expect(parts.bursts.problems == 0, "a burst got a wrong id");
    expect(parts.threadTimers.keeper.problems == 0, "a killed thread timer ticked");
    expect(parts.bursts.keeper.problems == 0, "a burst fired that was killed, or once too often");
    expect(parts.uiTimers.problems == 0, "a killed UI timer ticked, or an id did not rise");
    figures += parts.threadTimers.figures;
    figures += parts.bursts.figures;
    figures += parts.uiTimers.figures;
    figures.killed += parts.uiTimers.killed;
    figures.ticks += parts.threadTimers.keeper.messages;
    figures.bursts += parts.bursts.keeper.messages;
    return problems.str();
}
