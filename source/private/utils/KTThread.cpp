// KTThread.cpp: the handle of a message thread.

#include "KTThread.h"

#include "KTMsgThreadImpl.h"

KTThread::KTThread(KTThreadPriorityEnum priority) : m_Impl(new KTMsgThreadImpl(*this, priority)) {}

KTThread::~KTThread() { delete m_Impl; }

void KTThread::start() { m_Impl->Start(); }

void KTThread::join() { m_Impl->Join(); }

bool KTThread::postMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2, KTUInt64 param3,
                           KTUInt64 param4) {
    return m_Impl->Queue().Append({message, param1, param2, param3, param4});
}

bool KTThread::postMessageIfNotSameAsPreviousMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2,
                                                     KTUInt64 param3, KTUInt64 param4) {
    return m_Impl->Queue().AppendIfNotSameAsPrevious({message, param1, param2, param3, param4});
}

void KTThread::syncPostMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2, KTUInt64 param3,
                               KTUInt64 param4) {
    m_Impl->PostAndWait({message, param1, param2, param3, param4});
}

bool KTThread::flushMessageQueueAndPostMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2,
                                               KTUInt64 param3, KTUInt64 param4) {
    m_Impl->Queue().FlushAndAppend({message, param1, param2, param3, param4});
    return true;
}

void KTThread::flushMessageQueueAndSyncPostMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2,
                                                   KTUInt64 param3, KTUInt64 param4) {
    m_Impl->FlushPostAndWait({message, param1, param2, param3, param4});
}

unsigned int KTThread::getPercentageOfMessageQueueThatIsOccupied() {
    constexpr std::size_t kHundredPercent = 100;
    std::size_t const count = m_Impl->Queue().GetCount();
    std::size_t const capacity = m_Impl->Queue().GetCapacity();
    return capacity == 0 ? 0 : static_cast<unsigned int>(count * kHundredPercent / capacity);
}

bool KTThread::operator==(KTThread const &other) const { return m_Impl == other.m_Impl; }

bool KTThread::operator!=(KTThread const &other) const { return m_Impl != other.m_Impl; }
