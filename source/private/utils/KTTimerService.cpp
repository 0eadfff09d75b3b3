// KTTimerService.cpp: the one service, its thread, and what is done to its two tables.

#include "KTTimerService.h"

#include "KTThreadGuard.h"
#include "KTTickLoop.h"
#include "KTTimerWindow.h"
#include "OClock.h"
#include "OPause.h"

#include <boost/thread/exceptions.hpp>

namespace {

constinit KTTimerService *service = nullptr;

// The system's clock, and a sleep by it that ends with the service even if the clock stands still.
class SystemTickTime final : public KTTickTime {
  public:
    explicit SystemTickTime(std::atomic<bool> const &isRunning) : m_IsRunning(isRunning) {}

    KTUInt64 Now() override { return OUtcMicroseconds(); }

    void Sleep(KTUInt64 start, KTUInt64 deadline) override {
        for (KTUInt64 now = Now(); now >= start && now < deadline && m_IsRunning; now = Now()) {
            m_Pause.For(deadline - now);
        }
    }

  private:
    std::atomic<bool> const &m_IsRunning;
    OPause m_Pause;
};

} // namespace

// ---- the service ----

KTTimerService::KTTimerService() : KTWorkerThread(kKTThreadPriorityHighest), m_Window(KTCreateTimerWindow()) {}

KTTimerService::~KTTimerService() {
    m_IsRunning = false;
    try {
        join();
    } catch (boost::thread_resource_error const &) { // NOLINT(bugprone-empty-catch)
        // This is the service's thread, where an exception that ended the loop is being handled. It is detached, and what
        // is left of it uses nothing of the service.
    }
    m_Window.reset(); // and with it the system's timers
}

void KTTimerService::run() {
    KTRunGuarded([this] {
        SystemTickTime time(m_IsRunning);
        KTTickLoop loop(m_RepeatingTimers, m_SingleBurstTimers, time);
        KTRecursiveLock lock(m_ThreadTimerMutex);
        while (m_IsRunning) {
            loop.Pass(lock);
        }
    });
}

KTTimerService *KTTimerService::GetInstance() { return service; }

void KTTimerService::CreateInstance() {
    if (service != nullptr) {
        return;
    }
    std::unique_ptr<KTTimerService> created(new KTTimerService);
    created->start();
    service = created.release();
}

void KTTimerService::DestroyInstance() {
    delete service;
    service = nullptr;
}

// ---- the tables ----

KTTimerService::CTimerSlots &KTTimerService::GetSlots(CTimerKind kind) {
    return kind == CTimerKind::Repeating ? m_RepeatingTimers : m_SingleBurstTimers;
}

void KTTimerService::CreateTimer(CTimerKind kind, KTThread *thread, long interval, KTInt64 &id,
                                 KT_THREAD_MESSAGE message) {
    CTimerInfo timer{};
    timer.thread = thread;
    timer.message = message;
    KTSetTimerInterval(timer, interval);
    KTRecursiveLock const lock(m_ThreadTimerMutex);
    id = GetSlots(kind).Allocate(timer);
}

void KTTimerService::AdjustTimer(CTimerKind kind, KTInt64 id, long interval) {
    KTRecursiveLock const lock(m_ThreadTimerMutex);
    KTSetTimerInterval(GetSlots(kind).Find(id), interval);
}

void KTTimerService::RestartTimer(CTimerKind kind, KTInt64 id) {
    KTRecursiveLock const lock(m_ThreadTimerMutex);
    KTReloadTimer(GetSlots(kind).Find(id));
}

void KTTimerService::FreeTimer(CTimerKind kind, KTInt64 id) {
    KTRecursiveLock const lock(m_ThreadTimerMutex);
    GetSlots(kind).Free(id);
}

// ---- the exported functions ----

namespace {

using CTimerKind = KTTimerService::CTimerKind;

void Create(CTimerKind kind, KTThread *thread, long interval, KTInt64 *id, KT_THREAD_MESSAGE message) {
    KTInt64 unwanted = 0;
    KTInt64 &created = id != nullptr ? *id : unwanted;
    created = 0;
    if (service != nullptr) {
        service->CreateTimer(kind, thread, interval, created, message);
    }
}

void Adjust(CTimerKind kind, KTInt64 id, long interval) {
    if (service != nullptr) {
        service->AdjustTimer(kind, id, interval);
    }
}

void Restart(CTimerKind kind, KTInt64 id) {
    if (service != nullptr) {
        service->RestartTimer(kind, id);
    }
}

void Free(CTimerKind kind, KTInt64 id) {
    if (service != nullptr) {
        service->FreeTimer(kind, id);
    }
}

} // namespace

void KTCreateTimerService() { KTTimerService::CreateInstance(); }

void KTDestroyTimerService() { KTTimerService::DestroyInstance(); }

void KTCreateTimer(KTThread *thread, long interval, KTInt64 *id, KT_THREAD_MESSAGE message) {
    Create(CTimerKind::Repeating, thread, interval, id, message);
}

void KTAdjustTimer(KTInt64 id, long interval) { Adjust(CTimerKind::Repeating, id, interval); }

void KTRestartTimer(KTInt64 id) { Restart(CTimerKind::Repeating, id); }

void KTKillTimer(KTInt64 id) { Free(CTimerKind::Repeating, id); }

void KTCreateSingleBurstTimer(KTThread *thread, long interval, KTInt64 *id, KT_THREAD_MESSAGE message) {
    Create(CTimerKind::SingleBurst, thread, interval, id, message);
}

void KTAdjustSingleBurstTimer(KTInt64 id, long interval) { Adjust(CTimerKind::SingleBurst, id, interval); }

void KTRestartSingleBurstTimer(KTInt64 id) { Restart(CTimerKind::SingleBurst, id); }

void KTKillSingleBurstTimer(KTInt64 id) { Free(CTimerKind::SingleBurst, id); }
