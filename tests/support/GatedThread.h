// GatedThread.h: a message thread whose handler tests let through one message at a time, so that they know what it is
// doing and nobody sleeps.
//
//     GatedThread thread;
//     thread.start();
//     thread.postMessage(kWork, 1, 0, 0, 0);
//     ASSERT_TRUE(thread.Enters(1));    // the handler has the message, and stays in it
//     thread.LetThrough();              // it returns

#pragma once

#include "KTThread.h"

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>
#include <utility>
#include <vector>

/// Something that happens once or several times, and that threads wait for.
class Signal {
  public:
    void Set() {
        std::lock_guard const lock(m_Mutex);
        ++m_Count;
        m_Changed.notify_all();
    }

    /// Whether it has happened that often within the time; a test that waits for what must happen takes the default.
    bool IsSet(int times = 1, std::chrono::milliseconds limit = std::chrono::minutes(1)) {
        std::unique_lock lock(m_Mutex);
        return m_Changed.wait_for(lock, limit, [&] { return m_Count >= times; });
    }

    /// Waits without a limit.
    void Wait(int times = 1) {
        std::unique_lock lock(m_Mutex);
        m_Changed.wait(lock, [&] { return m_Count >= times; });
    }

  private:
    std::mutex m_Mutex;
    std::condition_variable m_Changed;
    int m_Count = 0;
};

/// How long a test looks whether something happens that must not.
constexpr std::chrono::milliseconds kSoon{30};

class GatedThread : public KTThread {
  public:
    using Handler = std::function<void(KTThreadMsg const &)>;

    explicit GatedThread(KTThreadPriorityEnum priority = kKTThreadPriorityUnchanged) : KTThread(priority) {}

    /// Calls `handler` for each message, before the gate.
    void OnMessage(Handler handler) { m_Handler = std::move(handler); }

    /// Whether the handler has been entered that often, all messages counted, within a minute.
    bool Enters(std::size_t count) {
        std::unique_lock lock(m_Mutex);
        return m_Changed.wait_for(lock, std::chrono::minutes(1), [&] { return m_Messages.size() >= count; });
    }

    /// Lets one handler return.
    void LetThrough() {
        std::lock_guard const lock(m_Mutex);
        ++m_Permits;
        m_Changed.notify_all();
    }

    /// Lets every handler return from now on.
    void Open() {
        std::lock_guard const lock(m_Mutex);
        m_IsOpen = true;
        m_Changed.notify_all();
    }

    /// Opens the gate, posts the quit message without flushing anything, and joins.
    void FinishAll() {
        Open();
        while (getPercentageOfMessageQueueThatIsOccupied() == 100) {
            std::this_thread::yield();
        }
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    /// The messages whose handler was entered, in that order.
    std::vector<KTThreadMsg> Messages() {
        std::lock_guard const lock(m_Mutex);
        return m_Messages;
    }

    /// The last of them. REQUIRES: there is one.
    KTThreadMsg LastMessage() {
        std::lock_guard const lock(m_Mutex);
        return m_Messages.back();
    }

    /// All of them, as their first parameters.
    std::vector<KTUInt64> Numbers() {
        std::vector<KTUInt64> numbers;
        for (KTThreadMsg const &msg : Messages()) {
            numbers.push_back(msg.param1);
        }
        return numbers;
    }

    void processMessage(KTThreadMsg const &msg) override {
        {
            std::unique_lock lock(m_Mutex);
            m_Messages.push_back(msg);
            m_Changed.notify_all();
        }
        if (m_Handler) {
            m_Handler(msg);
        }
        std::unique_lock lock(m_Mutex);
        m_Changed.wait(lock, [this] { return m_IsOpen || m_Permits > 0; });
        if (!m_IsOpen) {
            --m_Permits;
        }
    }

  private:
    std::mutex m_Mutex;
    std::condition_variable m_Changed;
    std::vector<KTThreadMsg> m_Messages;
    Handler m_Handler;
    int m_Permits = 0;
    bool m_IsOpen = false;
};
