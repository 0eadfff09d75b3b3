// WorkQueue.h: hands work from one thread to several.

#pragma once

#include "KTLocks.h"

#include <deque>
#include <optional>
#include <utility>

/// A queue that any thread may fill and any thread may empty.
template <typename Work> class WorkQueue {
  public:
    void Push(Work work) {
        KTLock const lock(m_Mutex);
        m_Works.push_back(std::move(work));
        m_Changed.notify_one();
    }

    /// Nothing will be pushed any more; what is in the queue can still be taken.
    void Close() {
        KTLock const lock(m_Mutex);
        m_IsClosed = true;
        m_Changed.notify_all();
    }

    /// The next work; waits for it. Nothing when the queue is closed and empty.
    std::optional<Work> Pop() {
        KTLock lock(m_Mutex);
        while (m_Works.empty() && !m_IsClosed) {
            m_Changed.wait(lock);
        }
        if (m_Works.empty()) {
            return std::nullopt;
        }
        Work work = std::move(m_Works.front());
        m_Works.pop_front();
        return work;
    }

  private:
    KTMutex m_Mutex;
    KTCondition m_Changed;
    std::deque<Work> m_Works;
    bool m_IsClosed = false;
};
