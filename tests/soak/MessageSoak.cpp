// MessageSoak.cpp: producers, message threads, and the books that both keep.

#include "MessageSoak.h"

#include "KTThread.h"
#include "SoakProgress.h"

#include <boost/thread/thread.hpp>

#include <array>
#include <memory>
#include <random>
#include <sstream>

MessageFigures &MessageFigures::operator+=(MessageFigures const &other) {
    accepted += other.accepted;
    handled += other.handled;
    refused += other.refused;
    synchronous += other.synchronous;
    flushes += other.flushes;
    return *this;
}

namespace {

constexpr std::size_t kProducers = 8;
constexpr std::size_t kThreads = 4;
constexpr std::size_t kKept = 2;                 // the first two threads are not flushed
constexpr std::uint64_t kBetweenStalls = 10'000; // messages
constexpr int kFirstIdentifier = 200;
constexpr int kIdentifiers = 4;
constexpr KTUInt64 kRescuer = kProducers; // the producer number of messages that only release posters

KT_THREAD_MESSAGE Identifier(unsigned int number) {
    return static_cast<KT_THREAD_MESSAGE>(kFirstIdentifier + static_cast<int>(number));
}

// A message thread that compares what it handles with what may come. Messages carry the producer, its running number
// for this thread, and two copies of the number to see torn records.
class Consumer : public KTThread {
  public:
    explicit Consumer(bool isKept) : m_IsKept(isKept) {}

    void processMessage(KTThreadMsg const &msg) override {
        if (msg.message == KT_THREAD_MSG_QUIT || msg.param1 == kRescuer) {
            return;
        }
        if (++handled % kBetweenStalls == 0) {
            KTSleepForDuration(0, 4); // the queue fills meanwhile
        }
        if (msg.param1 > kRescuer || msg.param3 != msg.param2 || msg.param4 != ~msg.param2) {
            ++problems;
            return;
        }
        KTUInt64 &last = lastNumbers[msg.param1];
        bool const isRepeated = msg.param2 == last && last != 0; // a suppressing post that was not suppressed
        bool const isNext = m_IsKept ? msg.param2 == last + 1 : msg.param2 > last;
        if (!isRepeated && !isNext) {
            ++problems;
        }
        last = msg.param2;
    }

    // The thread's own while it runs, everybody's when it has been joined.
    std::array<KTUInt64, kProducers> lastNumbers{};
    std::uint64_t handled = 0;
    std::uint64_t problems = 0;

  private:
    bool m_IsKept;
};

using Consumers = std::array<std::unique_ptr<Consumer>, kThreads>;

class Producer {
  public:
    Producer(Consumers &consumers, std::size_t number, unsigned int seed)
        : m_Consumers(consumers), m_Number(number), m_Random(seed) {}

    void Run(std::atomic<bool> const &stop) {
        while (!stop) {
            PostOne();
            SoakGetsOn(SoakPart::Messages);
        }
    }

    MessageFigures figures;
    std::array<KTUInt64, kThreads> lastNumbers{};

  private:
    unsigned int Draw(unsigned int bound) { return std::uniform_int_distribution(0U, bound - 1)(m_Random); }

    void PostOne() {
        std::size_t const to = Draw(kThreads);
        Consumer &thread = *m_Consumers[to];
        KT_THREAD_MESSAGE const id = Identifier(Draw(kIdentifiers));
        KTUInt64 const number = lastNumbers[to] + 1;
        // Two producers never wait for an answer: they fill the queues.
        unsigned int const kind = m_Number < 2 ? Draw(85) : Draw(100);
        bool isAccepted = true;
        if (kind < 70) {
            isAccepted = thread.postMessage(id, m_Number, number, number, ~number);
        } else if (kind < 85) {
            isAccepted = thread.postMessageIfNotSameAsPreviousMessage(id, m_Number, number, number, ~number);
            if (isAccepted) { // again: suppressed, unless others came between
                thread.postMessageIfNotSameAsPreviousMessage(id, m_Number, number, number, ~number);
            }
        } else if (kind < 98 || to < kKept) {
            lastNumbers[to] = number; // handled before the post returns
            ++figures.synchronous;
            thread.syncPostMessage(id, m_Number, number, number, ~number);
        } else {
            ++figures.flushes;
            if (kind == 98) {
                thread.flushMessageQueueAndPostMessage(id, m_Number, number, number, ~number);
            } else {
                ++figures.synchronous;
                thread.flushMessageQueueAndSyncPostMessage(id, m_Number, number, number, ~number);
            }
        }
        if (isAccepted) {
            lastNumbers[to] = number;
            ++figures.accepted;
        } else {
            ++figures.refused;
            boost::this_thread::yield();
        }
    }

    Consumers &m_Consumers;
    KTUInt64 m_Number;
    std::mt19937 m_Random;
};

// Releases synchronous posters whose message, or whose successor's, was flushed.
void Rescue(Consumers &consumers) {
    for (std::size_t i = kKept; i < kThreads; ++i) {
        for (unsigned int number = 0; number < kIdentifiers; ++number) {
            consumers[i]->postMessage(Identifier(number), kRescuer, 0, 0, 0);
        }
    }
}

// The quit message flushes a full queue, so it waits for room where nothing may be lost.
void Quit(KTThread &thread) {
    while (thread.getPercentageOfMessageQueueThatIsOccupied() == 100) {
        boost::this_thread::yield();
    }
    thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    thread.join();
}

std::string Compare(Consumers const &consumers, std::array<std::unique_ptr<Producer>, kProducers> const &producers) {
    std::ostringstream problems;
    for (std::size_t i = 0; i < kThreads; ++i) {
        if (consumers[i]->problems != 0) {
            problems << "thread " << i << ": " << consumers[i]->problems << " messages torn or out of order\n";
        }
        for (std::size_t p = 0; p < kProducers && i < kKept; ++p) {
            if (consumers[i]->lastNumbers[p] != producers[p]->lastNumbers[i]) {
                problems << "thread " << i << " handled " << consumers[i]->lastNumbers[p] << " messages of producer "
                         << p << ", who posted " << producers[p]->lastNumbers[i] << "\n";
            }
        }
    }
    return problems.str();
}

} // namespace

std::string SoakMessages(unsigned int seed, std::chrono::milliseconds length, std::function<void()> const &turn,
                         MessageFigures &figures) {
    Consumers consumers;
    for (std::size_t i = 0; i < kThreads; ++i) {
        consumers[i] = std::make_unique<Consumer>(i < kKept);
        consumers[i]->start();
    }
    std::array<std::unique_ptr<Producer>, kProducers> producers;
    std::atomic<bool> stop{false};
    std::atomic<std::size_t> running{kProducers};
    boost::thread_group threads;
    for (std::size_t i = 0; i < kProducers; ++i) {
        producers[i] = std::make_unique<Producer>(consumers, i, seed + static_cast<unsigned int>(i));
        threads.create_thread([&stop, &running, producer = producers[i].get()] {
            producer->Run(stop);
            --running;
        });
    }
    auto const end = std::chrono::steady_clock::now() + length;
    while (running != 0) {
        Rescue(consumers);
        turn();
        KTSleepForDuration(0, 2);
        stop = std::chrono::steady_clock::now() >= end;
    }
    threads.join_all();
    for (auto const &consumer : consumers) {
        Quit(*consumer);
        figures.handled += consumer->handled;
    }
    for (auto const &producer : producers) {
        figures += producer->figures;
    }
    return Compare(consumers, producers);
}
