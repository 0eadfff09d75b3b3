// KTWorkerThread.h: a thread that does one piece of work and ends.
//
//     class Indexer : public KTWorkerThread {
//         void run() override;
//     };
//
//     Indexer indexer(kKTThreadPriorityBelowNormal);
//     indexer.start();
//     indexer.join();    // before `indexer` is destroyed
//
// WRONG: destroying a started worker without join(). The destructor neither stops nor joins: the detached thread goes on
// with memory that is gone.
//
// Threads: start(), join() and destruction belong to one thread at a time, the owner's.

#pragma once

#include "KTThreadPriority.h"

#include "KTBeginExports.h"

class KTWorkerThreadImpl;

/// A thread that runs its owner's work once, see the top of this file.
///
/// No exception handler is installed for the work: an exception that leaves run() ends the process, as with any thread.
class KT_PUBLIC_API KTWorkerThread {
  public:
    /// No thread runs yet. Throws std::bad_alloc.
    explicit KTWorkerThread(KTThreadPriorityEnum priority = kKTThreadPriorityUnchanged);

    /// Not copyable: the thread does its work through this very object.
    KTWorkerThread(KTWorkerThread const &other) = delete;
    KTWorkerThread &operator=(KTWorkerThread const &other) = delete;

    // The virtual functions keep this order: hosts rely on it.

    /// REQUIRES: the thread was never started, or has been joined. A thread that still runs is detached, not stopped.
    virtual ~KTWorkerThread();

    /// The work: called once on the new thread, with the priority set; the thread ends when it returns.
    virtual void run() = 0;

    /// Starts the thread. A second start() runs the work again on a second thread; the earlier one is detached, not
    /// stopped. Throws boost::thread_resource_error when the system has no thread left.
    void start();

    /// Waits until the thread has ended; returns at once if start() was never called or the thread was joined already.
    /// Throws boost::thread_resource_error when called on the thread itself.
    void join();

    /// Whether both are the same thread: they refer to the same implementation.
    bool operator==(KTWorkerThread const &other) const;
    bool operator!=(KTWorkerThread const &other) const;

  private:
    KTWorkerThreadImpl *m_Impl;
};

#include "KTEndExports.h"
