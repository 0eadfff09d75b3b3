// BenchThreads.cpp: messages to a thread, beside the system's message queue and beside a ring of the same size made of
// std::mutex and std::condition_variable.
//
// `post` is the rate of one producer and one thread that handles: the producer posts as fast as it can and, where the
// queue is full, tries again (the ring's producer waits for room). `sync` is a message and the wait until it has been
// handled.

#include "Bench.h"

#include "KTThread.h"

#include <windows.h>

#include <array>
#include <atomic>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <thread>

namespace bench {

namespace {

constexpr char kGroup[] = "threads";
constexpr char kSystem[] = "system";
constexpr char kStandard[] = "std";

constexpr auto kWork = static_cast<KT_THREAD_MESSAGE>(100);

void LetOthersRun() { SwitchToThread(); }

// The library's thread: counts what it handles.
class OurThread : public KTThread {
  public:
    OurThread() { start(); }
    OurThread(OurThread const &) = delete;
    OurThread &operator=(OurThread const &) = delete;
    ~OurThread() override {
        syncPostMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    void Post(KTUInt64 number) {
        while (!postMessage(kWork, number, 0, 0, 0)) {
            LetOthersRun();
        }
    }
    void PostAndWait(KTUInt64 number) { syncPostMessage(kWork, number, 0, 0, 0); }

    void processMessage(KTThreadMsg const &msg) override { benchmark::DoNotOptimize(m_Sum += msg.param1); }

  private:
    KTUInt64 m_Sum = 0;
};

// The system's message queue.
class SystemThread {
  public:
    SystemThread()
        : m_Thread([this] {
              MSG msg;
              PeekMessageW(&msg, nullptr, 0, 0, PM_NOREMOVE); // makes the queue
              m_Id = GetCurrentThreadId();
              while (GetMessageW(&msg, nullptr, 0, 0) > 0) {
                  benchmark::DoNotOptimize(m_Sum += msg.wParam);
              }
          }) {
        while (m_Id == 0) {
            LetOthersRun();
        }
    }
    SystemThread(SystemThread const &) = delete;
    SystemThread &operator=(SystemThread const &) = delete;
    ~SystemThread() {
        while (PostThreadMessageW(m_Id, WM_QUIT, 0, 0) == FALSE) {
            LetOthersRun();
        }
        m_Thread.join();
    }

    void Post(KTUInt64 number) {
        while (PostThreadMessageW(m_Id, WM_APP, number, 0) == FALSE) {
            LetOthersRun();
        }
    }

  private:
    std::atomic<DWORD> m_Id{0};
    KTUInt64 m_Sum = 0;
    std::thread m_Thread;
};

// What one would write with the standard library.
class StandardThread {
  public:
    StandardThread() : m_Ring(std::make_unique<Ring>()), m_Thread([this] { Run(); }) {}
    StandardThread(StandardThread const &) = delete;
    StandardThread &operator=(StandardThread const &) = delete;
    ~StandardThread() {
        Append({KT_THREAD_MSG_QUIT, 0, 0, 0, 0});
        m_Thread.join();
    }

    void Post(KTUInt64 number) { Append({kWork, number, 0, 0, 0}); }

    void PostAndWait(KTUInt64 number) {
        std::unique_lock lock(m_HandledMutex);
        m_IsHandled = false;
        Append({kWork, number, 1, 0, 0});
        m_Handled.wait(lock, [this] { return m_IsHandled; });
    }

  private:
    using Ring = std::array<KTThreadMsg, 1024>;

    void Append(KTThreadMsg const &msg) {
        std::unique_lock lock(m_Mutex);
        m_NotFull.wait(lock, [this] { return m_Count < m_Ring->size(); });
        (*m_Ring)[m_Tail] = msg;
        m_Tail = (m_Tail + 1) % m_Ring->size();
        ++m_Count;
        m_NotEmpty.notify_all();
    }

    KTThreadMsg Take() {
        std::unique_lock lock(m_Mutex);
        m_NotEmpty.wait(lock, [this] { return m_Count != 0; });
        KTThreadMsg const msg = (*m_Ring)[m_Head];
        m_Head = (m_Head + 1) % m_Ring->size();
        --m_Count;
        m_NotFull.notify_all();
        return msg;
    }

    void Run() {
        KTThreadMsg msg{};
        while ((msg = Take()).message != KT_THREAD_MSG_QUIT) {
            benchmark::DoNotOptimize(m_Sum += msg.param1);
            if (msg.param2 != 0) {
                std::lock_guard const lock(m_HandledMutex);
                m_IsHandled = true;
                m_Handled.notify_all();
            }
        }
    }

    std::unique_ptr<Ring> m_Ring;
    std::size_t m_Head = 0;
    std::size_t m_Tail = 0;
    std::size_t m_Count = 0;
    std::mutex m_Mutex;
    std::condition_variable m_NotFull;
    std::condition_variable m_NotEmpty;
    std::mutex m_HandledMutex;
    std::condition_variable m_Handled;
    bool m_IsHandled = false;
    KTUInt64 m_Sum = 0;
    std::thread m_Thread;
};

template <typename Thread> void AddPost(char const *contender) {
    Add({kGroup, "post", "one-producer"}, contender, [](benchmark::State &state) {
        Thread thread;
        KTUInt64 number = 0;
        for (auto _ : state) {
            thread.Post(++number);
        }
    });
}

template <typename Thread> void AddSync(char const *contender) {
    Add({kGroup, "sync", "round-trip"}, contender, [](benchmark::State &state) {
        Thread thread;
        KTUInt64 number = 0;
        for (auto _ : state) {
            thread.PostAndWait(++number);
        }
    });
}

} // namespace

void AddThreadBenchmarks() {
    DescribeGroup(kGroup, "KTThread: messages from one producer, and a synchronous post");
    ExpectSpeed(kGroup, kSystem, 2.0);
    ExpectSpeed(kGroup, kStandard, 1.0); // of both tasks, where 1 / 1.2 would do for the round trip
    AddPost<OurThread>(kOurs);
    AddPost<SystemThread>(kSystem);
    AddPost<StandardThread>(kStandard);
    AddSync<OurThread>(kOurs);
    AddSync<StandardThread>(kStandard);
}

} // namespace bench
