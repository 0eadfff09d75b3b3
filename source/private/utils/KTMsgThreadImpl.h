// KTMsgThreadImpl.h: the implementation of a message thread: its queue, its loop, and the synchronous posters' rendezvous.
//
// A synchronous poster and the loop meet in one slot, guarded by the synchronous-post mutex:
//
//     poster                                      loop
//     take the synchronous-post mutex             take a message from the queue
//     append to the queue                         let the owner handle it
//     awaited slot = identifier                   take the synchronous-post mutex
//     wait until the slot has been cleared        slot == identifier: clear it, notify all
//     release the mutex                           release the mutex
//
// The poster holds the mutex from before appending until it waits, so the loop cannot look at the slot too early. A
// later poster writes its own identifier over an earlier one's: both are then released by the later one's message. Lock
// order: synchronous-post mutex, then queue mutex; the loop never holds both.

#pragma once

#include "KTMsgQueue.h"
#include "KTThreadImpl.h"

#include <atomic>

class KTMsgThreadImpl : public KTThreadImpl {
  public:
    KTMsgThreadImpl(KTThread &owner, KTThreadPriorityEnum priority) : KTThreadImpl(priority), m_Owner(owner) {}

    // Virtual functions in the order of the table.
    ~KTMsgThreadImpl() override;

    /// The message loop, up to the quit message.
    void run() override;

    KTMsgQueue &Queue() { return m_Queue; }

    /// Appends as soon as there is room, then waits until a message with that identifier has been handled.
    void PostAndWait(KTThreadMsg const &msg);

    /// Makes `msg` the only message, then waits in the same way.
    void FlushPostAndWait(KTThreadMsg const &msg);

  private:
    void HandleMessages();
    void WaitUntilHandled(KTShortLock &lock, KT_THREAD_MESSAGE message);
    void ReleasePosters(KT_THREAD_MESSAGE message);

    KTThread &m_Owner;
    KTMsgQueue m_Queue;
    KTMutex m_SyncMutex;
    KTCondition m_SyncCondition;
    KT_THREAD_MESSAGE m_Awaited{};       // 0 when nobody waits
    std::atomic<KTUInt64> m_Releases{0}; // how often the slot was cleared; written under the mutex
};
