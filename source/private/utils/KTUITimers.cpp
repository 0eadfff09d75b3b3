// KTUITimers.cpp: timers that call a function inside the message pump of the thread that created the service.
//
// A function runs under the UI-timer lock. When it kills its own timer, other threads get the lock for the rest of the
// call; every hold is a scoped lock that knows whether it still is one, so that nothing is released twice:
//
//     holds of the window's thread             in the call    after the kill    after the call
//     the dispatch's scoped lock               owned          released          nothing left to release
//     the kill's scoped lock                                  released
//
// Calls nest where a function runs a message pump. Then the current timer is that of the innermost call whose dispatch
// still holds the lock; it is 0 exactly when no dispatch holds the lock.

#include "KTTimerService.h"

#include "KTTimerWindow.h"

namespace {

constinit KTInt64 lastId = 0; // written under the lock of the one service

} // namespace

// One call of a UI timer's function. REQUIRES: `lock` owns the UI-timer lock.
class KTTimerService::CUIDispatch {
  public:
    CUIDispatch(KTTimerService &timers, KTInt64 id, KTRecursiveLock &lock)
        : m_Timers(timers), m_Outer(timers.m_UIDispatch), m_OuterId(timers.m_CurrentUITimer), m_Lock(lock) {
        m_Timers.m_UIDispatch = this;
        m_Timers.m_CurrentUITimer = id;
    }
    CUIDispatch(CUIDispatch const &) = delete;
    CUIDispatch &operator=(CUIDispatch const &) = delete;
    ~CUIDispatch() {
        if (m_HoldsLock) {
            StepBack();
        }
    }

    // Gives up the lock while the function goes on.
    void Release() {
        StepBack();
        m_HoldsLock = false;
        m_Lock.unlock();
    }

  private:
    void StepBack() {
        m_Timers.m_UIDispatch = m_Outer;
        m_Timers.m_CurrentUITimer = m_OuterId;
    }

    KTTimerService &m_Timers;
    CUIDispatch *m_Outer;
    KTInt64 m_OuterId;
    KTRecursiveLock &m_Lock;
    bool m_HoldsLock = true; // the window's thread alone uses this object
};

void KTTimerService::CWindowCloser::operator()(void *window) const noexcept { KTDestroyTimerWindow(window); }

void KTTimerService::CreateUITimer(long interval, KTInt64 &id, KTUITimerCallBack callBack, void *userData) {
    KTRecursiveLock const lock(m_UITimerMutex);
    id = 0;
    if (m_Window == nullptr) {
        return;
    }
    KTInt64 const created = ++lastId; // used up even if the system refuses
    m_UITimers.emplace(created, CUITimer{callBack, userData});
    if (KTSetWindowTimer(m_Window.get(), created, static_cast<KTUInt32>(interval))) {
        id = created;
    } else {
        m_UITimers.erase(created);
    }
}

void KTTimerService::FreeUITimer(KTInt64 id) {
    KTRecursiveLock lock(m_UITimerMutex);
    m_UITimers.erase(id);
    if (m_UIDispatch != nullptr && m_CurrentUITimer == id) {
        m_UIDispatch->Release();
        lock.unlock();
    }
    if (m_Window != nullptr) {
        KTKillWindowTimer(m_Window.get(), id);
    }
}

void KTTimerService::DispatchUITimer(KTInt64 id) {
    KTRecursiveLock lock(m_UITimerMutex);
    auto const found = m_UITimers.find(id);
    if (found == m_UITimers.end()) {
        return;
    }
    CUITimer const timer = found->second; // the call may erase it
    CUIDispatch const dispatch(*this, id, lock);
    if (timer.callBack != nullptr) {
        timer.callBack(id, timer.userData);
    }
}

void KTTimerWindowTicked(KTInt64 id) {
    if (KTTimerService *const service = KTTimerService::GetInstance()) {
        service->DispatchUITimer(id);
    }
}

void KTCreateUITimer(long interval, KTInt64 *id, KTUITimerCallBack callBack, void *userData) {
    KTInt64 unwanted = 0;
    KTInt64 &created = id != nullptr ? *id : unwanted;
    created = 0;
    if (KTTimerService *const service = KTTimerService::GetInstance()) {
        service->CreateUITimer(interval, created, callBack, userData);
    }
}

void KTKillUITimer(KTInt64 id) {
    if (KTTimerService *const service = KTTimerService::GetInstance()) {
        service->FreeUITimer(id);
    }
}
