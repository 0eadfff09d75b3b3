// KTTimerService.h: the process-wide timer service.
//
//     kind            fires                           how                                              at most
//     thread timer    each time its interval is over  posts a message to a KTThread                    50
//     single burst    once                            posts a message to a KTThread                    50
//     UI timer        each time its interval is over  calls a function on the thread that created      no limit of
//                                                     the service, inside that thread's message pump   its own
//
// The host creates the service at start-up on the thread that pumps messages, and destroys it there at the end:
//
//     KTCreateTimerService();
//     KTInt64 autosave = 0;
//     KTCreateTimer(&saver, 30'000, &autosave, kSave);    // saver is a KTThread
//     ...
//     saver.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
//     saver.join();
//     KTDestroyTimerService();
//     // and only then is `saver` destroyed, unless its timers were killed before
//
// WRONG: destroying a KTThread that timers still post to. Kill them first, or destroy the service.
//
// WRONG: a UI timer's function that waits for a thread (join, a synchronous post) which itself creates or kills a UI
// timer. The function runs under the lock that the thread then waits for.
//
// Thread timers and single bursts are counted down by the service's own thread, which makes a pass over them about every
// 10 milliseconds. They fire at the first pass after their interval is over, and what is over it is not carried into the
// next period. A countdown that is set between two passes is charged with the whole time between them, so its first
// period may be shorter by up to one pass. Time is UTC time: when the system clock is set forwards, countdowns advance
// by as much; when it is set back, the pass counts as one that took no time.
//
// Intervals are milliseconds. 0 and less fire at every pass; but a single burst of 0 is given up without firing.
//
// A tick of a thread timer is left out while an equal message waits as the receiver's last one
// (KTThread::postMessageIfNotSameAsPreviousMessage), so that a slow receiver is not flooded. A burst is posted in any
// case; one that a full queue drops is not posted again. The message's four parameters are 0.
//
// Ids are greater than 0; 0 means no timer. The two tables count from 1 to 50 each, and an id is used again after its
// timer was killed, or its burst is over. Ids of UI timers are never used again.
//
// Without a service, creating reports the id 0 and all else does nothing.
//
// Threads: any for timers and bursts, and for killing UI timers. UI timers are created by the thread that created the
// service. KTCreateTimerService and KTDestroyTimerService: while no other call of this header is under way.

#pragma once

#include "KTFixedSizedSlots.h"
#include "KTLocks.h"
#include "KTThread.h"
#include "KTTickCount.h"
#include "KTTypes.h"
#include "KTWorkerThread.h"

#include <atomic>
#include <map>
#include <memory>

#include "KTBeginExports.h"

/// What a UI timer calls: with the timer's id and the user data that it was created with.
using KTUITimerCallBack = void (*)(KTInt64 id, void *userData);

/// Makes the service, its hidden window, which belongs to the calling thread, and starts its thread. Does nothing if
/// there is a service. Throws std::bad_alloc, boost::thread_resource_error; there is no service then.
KT_PUBLIC_API void KTCreateTimerService();

/// Ends the service and waits for its thread, which takes a pass at most. All timers are dropped without firing. Does
/// nothing if there is no service. REQUIRES: the thread that created the service; not from a UI timer's function. What
/// handles an exception that ended the service's thread may call it there: then nothing is waited for, and the window
/// stays until the thread that created it ends, as it does after a call on any other thread.
KT_PUBLIC_API void KTDestroyTimerService();

/// Creates a thread timer and stores its id in `id` (0: no service, or 50 such timers already). `thread` must live until
/// the timer is killed or the service destroyed; without a thread (null) the timer runs and posts nothing. `id` may be
/// null for a timer that ends with the service.
KT_PUBLIC_API void KTCreateTimer(KTThread *thread, long interval, KTInt64 *id, KT_THREAD_MESSAGE message);

/// Gives the thread timer a new interval and restarts its countdown. Nothing if no thread timer has the id.
KT_PUBLIC_API void KTAdjustTimer(KTInt64 id, long interval);

/// Restarts the thread timer's countdown from its full interval. Nothing if no thread timer has the id.
KT_PUBLIC_API void KTRestartTimer(KTInt64 id);

/// Ends the thread timer: when this returns it posts no more, though a message may still wait in its thread's queue.
/// Nothing if no thread timer has the id.
KT_PUBLIC_API void KTKillTimer(KTInt64 id);

/// The same for single bursts, which have a table and ids of their own. A burst is over, and its id free to be used for
/// another one, at the pass after the one in which it fired; until then, adjusting or restarting makes it fire again.
KT_PUBLIC_API void KTCreateSingleBurstTimer(KTThread *thread, long interval, KTInt64 *id, KT_THREAD_MESSAGE message);
KT_PUBLIC_API void KTAdjustSingleBurstTimer(KTInt64 id, long interval);
KT_PUBLIC_API void KTRestartSingleBurstTimer(KTInt64 id);
KT_PUBLIC_API void KTKillSingleBurstTimer(KTInt64 id);

/// Creates a UI timer and stores its id in `id` (0: no service, its window could not be made, or the system has no timer
/// left, which still uses up an id). `interval` in milliseconds is the system's to round: at least 10, and no more than
/// 2^31 - 1. `callBack` must not let exceptions out; it may create and kill timers, also its own, and run a message pump.
/// `callBack` and `id` may be null: then nothing is called, or stored.
KT_PUBLIC_API void KTCreateUITimer(long interval, KTInt64 *id, KTUITimerCallBack callBack, void *userData);

/// Ends the UI timer: its function is not called again. From other threads this waits while a UI timer's function runs,
/// unless that function has killed its own timer. Nothing if no UI timer has the id.
KT_PUBLIC_API void KTKillUITimer(KTInt64 id);

/// The service. There is one at most, made by KTCreateTimerService; hosts use the functions above.
class KT_PUBLIC_API KTTimerService : public KTWorkerThread {
  public:
    /// A thread timer or single burst. Periods are seconds and a rest in nanoseconds: 0 to 999,000,000 in steps of
    /// 1,000,000, negative for negative intervals. The countdown's rest has steps of 1,000.
    struct CTimerInfo {
        KTThread *thread; ///< receives the messages
        KTInt64 intervalSeconds;
        KTInt32 intervalNanoseconds;
        KTInt64 remainingSeconds;
        KTInt32 remainingNanoseconds;
        KT_THREAD_MESSAGE message;
    };

    using CTimerSlots = KTFixedSizedSlots<CTimerInfo, 50>;

    KTTimerService(KTTimerService const &) = delete;
    KTTimerService &operator=(KTTimerService const &) = delete;

    // The virtual functions keep this order: hosts rely on it.

    ~KTTimerService() override;

    /// The tick loop. What ends it by an exception goes to KTExceptionUtils::HandleException; timers then fire no more.
    void run() override;

    /// The service, null if there is none. Not locked, as it is created and destroyed while nothing else is called.
    static KTTimerService *GetInstance();

    /// KTCreateTimerService and KTDestroyTimerService.
    static void CreateInstance();
    static void DestroyInstance();

    // What the functions above do with this service; `id` is not null here.

    enum class CTimerKind { Repeating, SingleBurst };

    void CreateTimer(CTimerKind kind, KTThread *thread, long interval, KTInt64 &id, KT_THREAD_MESSAGE message);
    void AdjustTimer(CTimerKind kind, KTInt64 id, long interval);
    void RestartTimer(CTimerKind kind, KTInt64 id);
    void FreeTimer(CTimerKind kind, KTInt64 id);
    void CreateUITimer(long interval, KTInt64 &id, KTUITimerCallBack callBack, void *userData);
    void FreeUITimer(KTInt64 id);

    /// Calls the UI timer's function, under the lock; nothing if no timer has the id. The window's thread.
    void DispatchUITimer(KTInt64 id);

  private:
    class CUIDispatch;

    struct CUITimer {
        KTUITimerCallBack callBack;
        void *userData;
    };

    struct CWindowCloser {
        void operator()(void *window) const noexcept;
    };

    KTTimerService();

    CTimerSlots &GetSlots(CTimerKind kind);

    KTRecursiveMutex m_ThreadTimerMutex; // guards both tables
    KTRecursiveMutex m_UITimerMutex;     // guards the map, the current UI timer and its dispatch
    std::atomic<bool> m_IsRunning{true};
    CTimerSlots m_RepeatingTimers;
    CTimerSlots m_SingleBurstTimers;
    std::map<KTInt64, CUITimer> m_UITimers;
    KTInt64 m_CurrentUITimer = 0; // whose function runs, under the lock; 0 otherwise
    std::unique_ptr<void, CWindowCloser> m_Window;
    CUIDispatch *m_UIDispatch = nullptr; // the innermost call of a UI timer's function that holds the lock
};

#include "KTEndExports.h"
