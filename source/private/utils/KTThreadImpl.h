// KTThreadImpl.h: the implementation objects of message threads and worker threads.

#pragma once

#include "KTThreadPriority.h"

#include <boost/thread/thread.hpp>

#include <memory>

/// A thread that can be started: its priority and its thread object.
class KTThreadImpl {
  public:
    explicit KTThreadImpl(KTThreadPriorityEnum priority) : m_Priority(priority) {}
    KTThreadImpl(KTThreadImpl const &) = delete;
    KTThreadImpl &operator=(KTThreadImpl const &) = delete;

    // Virtual functions in the order of the table.

    /// Detaches a running thread.
    virtual ~KTThreadImpl();

    /// The body of the thread.
    virtual void run() = 0;

    /// Runs `run` on a new thread; a thread that was started before is detached, once the new one is there.
    void Start();

    /// Waits for the thread last started, if there is one.
    void Join();

  protected:
    /// Sets the calling thread's priority.
    void ApplyPriority() const;

  private:
    KTThreadPriorityEnum m_Priority;
    std::unique_ptr<boost::thread> m_Thread;
};
