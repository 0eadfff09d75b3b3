// KTWorkerThread.cpp: a thread that runs its owner's work once.

#include "KTWorkerThread.h"

#include "KTThreadImpl.h"

class KTWorkerThreadImpl : public KTThreadImpl {
  public:
    KTWorkerThreadImpl(KTWorkerThread &owner, KTThreadPriorityEnum priority) : KTThreadImpl(priority), m_Owner(owner) {}

    void run() override {
        ApplyPriority();
        m_Owner.run();
    }

  private:
    KTWorkerThread &m_Owner;
};

KTWorkerThread::KTWorkerThread(KTThreadPriorityEnum priority) : m_Impl(new KTWorkerThreadImpl(*this, priority)) {}

KTWorkerThread::~KTWorkerThread() { delete m_Impl; }

void KTWorkerThread::start() { m_Impl->Start(); }

void KTWorkerThread::join() { m_Impl->Join(); }

bool KTWorkerThread::operator==(KTWorkerThread const &other) const { return m_Impl == other.m_Impl; }

bool KTWorkerThread::operator!=(KTWorkerThread const &other) const { return m_Impl != other.m_Impl; }
