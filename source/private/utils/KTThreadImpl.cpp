// KTThreadImpl.cpp: starting, joining, detaching; priorities.

#include "KTThreadImpl.h"

#include "OThread.h"

// Destroying a thread object detaches the thread in the version of the interface that Boost.Thread offers by default.
static_assert(BOOST_THREAD_VERSION == 2);

KTThreadImpl::~KTThreadImpl() = default;

void KTThreadImpl::Start() {
    auto thread = std::make_unique<boost::thread>([this] { run(); });
    m_Thread = std::move(thread);
}

void KTThreadImpl::Join() {
    if (m_Thread != nullptr) {
        m_Thread->join();
    }
}

void KTThreadImpl::ApplyPriority() const {
    switch (m_Priority) {
    case kKTThreadPriorityLowest:
        OSetThreadPriority(OThreadPriority::Lowest);
        break;
    case kKTThreadPriorityBelowNormal:
        OSetThreadPriority(OThreadPriority::BelowNormal);
        break;
    case kKTThreadPriorityUnchanged:
        break;
    case kKTThreadPriorityAboveNormal:
        OSetThreadPriority(OThreadPriority::AboveNormal);
        break;
    case kKTThreadPriorityHighest:
        OSetThreadPriority(OThreadPriority::Highest);
        break;
    default:
        OSetThreadPriority(OThreadPriority::Normal);
        break;
    }
}
