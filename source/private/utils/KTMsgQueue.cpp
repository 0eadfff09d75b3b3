// KTMsgQueue.cpp: the ring of messages.

#include "KTMsgQueue.h"

namespace {

std::size_t Next(std::size_t slot) { return (slot + 1) % KTMsgQueue::kCapacity; }

bool AreSame(KTThreadMsg const &one, KTThreadMsg const &other) {
    return one.message == other.message && one.param1 == other.param1 && one.param2 == other.param2 &&
           one.param3 == other.param3 && one.param4 == other.param4;
}

} // namespace

KTMsgQueue::KTMsgQueue() : m_Records(std::make_unique<KTThreadMsg[]>(kCapacity)) {}

bool KTMsgQueue::Append(KTThreadMsg const &msg) {
    KTShortLock const lock(m_Mutex);
    return AppendLocked(msg);
}

bool KTMsgQueue::AppendIfNotSameAsPrevious(KTThreadMsg const &msg) {
    KTShortLock const lock(m_Mutex);
    return IsSameAsPrevious(msg) || AppendLocked(msg);
}

void KTMsgQueue::FlushAndAppend(KTThreadMsg const &msg) {
    KTShortLock const lock(m_Mutex);
    FlushAndAppendLocked(msg);
}

void KTMsgQueue::WaitForRoom() {
    KTWaitShortly([this] { return !IsFull(); });
    KTShortLock lock(m_Mutex);
    while (IsFull()) {
        lock.Wait(m_NotFull);
    }
}

KTThreadMsg KTMsgQueue::Take() {
    KTWaitShortly([this] { return m_Count != 0; });
    KTShortLock lock(m_Mutex);
    while (m_Count == 0) {
        lock.Wait(m_NotEmpty);
    }
    KTThreadMsg const msg = m_Records[m_Head];
    m_Head = Next(m_Head);
    --m_Count;
    m_NotFull.notify_all();
    return msg;
}

std::size_t KTMsgQueue::GetCount() {
    KTShortLock const lock(m_Mutex);
    return m_Count;
}

std::size_t KTMsgQueue::GetCapacity() {
    KTShortLock const lock(m_Mutex);
    return kCapacity;
}

bool KTMsgQueue::IsSameAsPrevious(KTThreadMsg const &msg) const {
    if (m_Count == 0) {
        return false;
    }
    return (m_Tail != 0 && AreSame(m_Records[m_Tail - 1], msg)) || AreSame(m_Records[kCapacity - 1], msg);
}

bool KTMsgQueue::AppendLocked(KTThreadMsg const &msg) {
    if (IsFull()) {
        if (msg.message != KT_THREAD_MSG_QUIT) {
            return false;
        }
        FlushAndAppendLocked(msg);
        return true;
    }
    m_Records[m_Tail] = msg;
    m_Tail = Next(m_Tail);
    ++m_Count;
    m_NotEmpty.notify_all();
    return true;
}

void KTMsgQueue::FlushAndAppendLocked(KTThreadMsg const &msg) {
    m_Records[0] = msg;
    m_Head = 0;
    m_Tail = 1;
    m_Count = 1;
    m_NotEmpty.notify_all();
}
