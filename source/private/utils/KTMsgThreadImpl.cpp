// KTMsgThreadImpl.cpp: the message loop and the synchronous posts.

#include "KTMsgThreadImpl.h"

#include "KTThreadGuard.h"

namespace {

constexpr KT_THREAD_MESSAGE kNobodyWaits{};

} // namespace

KTMsgThreadImpl::~KTMsgThreadImpl() = default;

void KTMsgThreadImpl::run() {
    KTRunGuarded([this] {
        ApplyPriority();
        HandleMessages();
    });
}

void KTMsgThreadImpl::HandleMessages() {
    KT_THREAD_MESSAGE handled{};
    do {
        KTThreadMsg const msg = m_Queue.Take();
        m_Owner.processMessage(msg);
        handled = msg.message;
        ReleasePosters(handled);
    } while (handled != KT_THREAD_MSG_QUIT);
}

void KTMsgThreadImpl::ReleasePosters(KT_THREAD_MESSAGE message) {
    KTShortLock const lock(m_SyncMutex);
    if (m_Awaited == message && m_Awaited != kNobodyWaits) {
        m_Awaited = kNobodyWaits;
        ++m_Releases;
        m_SyncCondition.notify_all();
    }
}

void KTMsgThreadImpl::PostAndWait(KTThreadMsg const &msg) {
    KTShortLock lock(m_SyncMutex);
    while (!m_Queue.Append(msg)) {
        // The loop needs the mutex to finish its message; only then does it make room.
        lock.Unlock();
        m_Queue.WaitForRoom();
        lock.Lock();
    }
    WaitUntilHandled(lock, msg.message);
}

void KTMsgThreadImpl::FlushPostAndWait(KTThreadMsg const &msg) {
    KTShortLock lock(m_SyncMutex);
    m_Queue.FlushAndAppend(msg);
    WaitUntilHandled(lock, msg.message);
}

void KTMsgThreadImpl::WaitUntilHandled(KTShortLock &lock, KT_THREAD_MESSAGE message) {
    if (message == kNobodyWaits) {
        return; // and the slot stays with whoever waits, or its poster would wait for ever
    }
    // Counting the releases, a poster that wakes late is not held by the next poster's identifier in the slot.
    KTUInt64 const before = m_Releases;
    auto const isReleased = [this, before] { return m_Releases != before; };
    m_Awaited = message;
    lock.Unlock();
    KTWaitShortly(isReleased);
    lock.Lock();
    while (!isReleased()) {
        lock.Wait(m_SyncCondition);
    }
}
