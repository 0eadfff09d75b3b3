// KTMsgQueue.h: the bounded queue of a message thread.
//
// A ring that is allocated once and starts with zeroed records; records stay in their slots after they were taken:
//
//     slot   0     1     2     3     4          1023
//          [   ][   ][ a ][ b ][   ]    ...    [    ]         count 2
//                     head        tail
//
// One mutex guards ring, indices and count. Threads: any, for every operation.

#pragma once

#include "KTLocks.h"
#include "KTShortWait.h"
#include "KTThread.h"

#include <atomic>
#include <cstddef>
#include <memory>

class KTMsgQueue {
  public:
    static constexpr std::size_t kCapacity = 1024;

    /// Throws std::bad_alloc.
    KTMsgQueue();

    /// Appends and wakes the consumers. When the queue is full: the quit message flushes it (the result is true), any
    /// other is dropped (false).
    bool Append(KTThreadMsg const &msg);

    /// Append, unless the queue is not empty and `msg` equals the record before the tail (if the tail is not slot 0) or
    /// the record in the last slot, whatever became of that one: then true, with nothing appended.
    bool AppendIfNotSameAsPrevious(KTThreadMsg const &msg);

    /// Makes `msg` the only message, in slot 0, and wakes the consumers, but nobody who waits for room.
    void FlushAndAppend(KTThreadMsg const &msg);

    /// Waits while the queue is full. There need not be room any more when it returns.
    void WaitForRoom();

    /// The first message; waits for one. Wakes those who wait for room.
    KTThreadMsg Take();

    std::size_t GetCount();
    std::size_t GetCapacity();

  private:
    bool IsFull() const { return m_Count == kCapacity; }
    bool IsSameAsPrevious(KTThreadMsg const &msg) const;
    bool AppendLocked(KTThreadMsg const &msg);
    void FlushAndAppendLocked(KTThreadMsg const &msg);

    std::unique_ptr<KTThreadMsg[]> m_Records;
    std::size_t m_Head = 0;
    std::size_t m_Tail = 0;
    std::atomic<std::size_t> m_Count{0}; // written under the mutex; read without it where a thread is about to wait
    KTMutex m_Mutex;
    KTCondition m_NotFull;
    KTCondition m_NotEmpty;
};
