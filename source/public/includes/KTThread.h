// KTThread.h: threads with a message queue of their own.
//
// A host derives from KTThread and handles messages; any thread posts them. They are handled one after another, in the
// order they were queued, until the quit message has been handled.
//
//     class Saver : public KTThread {
//         void processMessage(KTThreadMsg const &msg) override;
//     };
//
//     Saver saver;
//     saver.start();
//     saver.postMessage(kSaveDocument, document, 0, 0, 0);    // false: the queue is full, nothing was queued
//     saver.syncPostMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);  // or postMessage
//     saver.join();                                           // before `saver` is destroyed
//
// WRONG: destroying a started thread without the quit message and join(). The destructor neither stops nor joins: the
// detached thread goes on with memory that is gone.
//
// WRONG: a synchronous post from processMessage to the same thread. It waits for itself for ever.
//
// WRONG: relying on a synchronous post to wait for one particular message. It waits until a message with its identifier
// has been handled, whoever posted that one; see syncPostMessage.
//
// The queue is a ring of 1024 records, allocated with the thread object and never grown; posting and taking allocate
// nothing:
//
//     slot      0        1        ...       1023
//           [ record | record | ... ... | record ]     head: next to take; tail: next free; both modulo 1024
//
//     record, 40 bytes
//          0  i32    message
//          8  u64    param1
//         16  u64    param2
//         24  u64    param3
//         32  u64    param4
//
// Threads: any number may post to one KTThread and ask for its occupancy. start(), join() and destruction belong to one
// thread at a time, the owner's. The library's locks are never held while processMessage runs.

#pragma once

#include "KTThreadPriority.h"
#include "KTTypes.h"

#include "KTBeginExports.h"

class KTMsgThreadImpl;

/// Identifies a message. All values but the quit message are the host's, who gives them names and meanings of its own:
/// static_cast<KT_THREAD_MESSAGE>(100). 0 is a message like others, but a synchronous post of it does not wait.
enum KT_THREAD_MESSAGE : int {
    KT_THREAD_MSG_QUIT = 14 ///< after it has been handled the thread ends
};

/// A message: copied into the queue and out of it.
struct KTThreadMsg {
    KT_THREAD_MESSAGE message; ///< identifier
    KTUInt64 param1;           ///< free arguments; what they point to belongs to poster and handler
    KTUInt64 param2;
    KTUInt64 param3;
    KTUInt64 param4;
};

/// A thread that handles messages, see the top of this file.
///
/// An exception that leaves processMessage ends the thread: a KTException goes to KTExceptionUtils::HandleException;
/// any other becomes a KTFatalException with the fatal-error message's key, which goes there. What is still queued is
/// never handled then, posts still fill the queue, and synchronous posters wait for ever.
class KT_PUBLIC_API KTThread {
  public:
    /// Makes the queue; no thread runs yet, but messages can be posted. Throws std::bad_alloc.
    explicit KTThread(KTThreadPriorityEnum priority = kKTThreadPriorityUnchanged);

    /// Not copyable: the thread handles messages through this very object.
    KTThread(KTThread const &other) = delete;
    KTThread &operator=(KTThread const &other) = delete;

    // The virtual functions keep this order: hosts rely on it.

    /// REQUIRES: no post is under way, and the thread was never started, or has been joined. A thread that still runs
    /// is detached, not stopped, and uses freed memory.
    virtual ~KTThread();

    /// flushMessageQueueAndPostMessage, then waits as syncPostMessage does. Posters that wait for room in syncPostMessage
    /// are not woken by the flush; they go on when the thread takes the next message.
    virtual void flushMessageQueueAndSyncPostMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2,
                                                     KTUInt64 param3, KTUInt64 param4);

    /// Handles one message, on this thread, without any of the library's locks held: it may post to any thread, its own
    /// included, but synchronously to others only.
    virtual void processMessage(KTThreadMsg const &msg) = 0;

    /// Starts the thread. A second start() makes a second thread on the same queue: the earlier one is detached, not
    /// stopped, and both take messages until each has handled a quit message; join() then waits for the later one only.
    /// Throws boost::thread_resource_error when the system has no thread left.
    void start();

    /// Waits until the thread has ended; returns at once if start() was never called or the thread was joined already.
    /// Throws boost::thread_resource_error when called on the thread itself.
    void join();

    /// Queues a message and does not wait for it. Returns false, and drops it, when 1024 messages wait. The quit
    /// message is never dropped: a full queue is flushed, which leaves it alone in the queue, and the result is true.
    /// Any thread, the handler's too.
    bool postMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2, KTUInt64 param3, KTUInt64 param4);

    /// postMessage, unless the queue is not empty and the message equals, in all five fields, what stands in the ring's
    /// slot before the tail (if the tail is not slot 0) or in its last slot, 1023: then nothing is queued and the result
    /// is true, also when the queue is full. The last slot counts even if its record was handled long ago, or never
    /// written: a message of zeros is therefore suppressed while any message waits on a fresh thread. Any thread.
    bool postMessageIfNotSameAsPreviousMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2,
                                               KTUInt64 param3, KTUInt64 param4);

    /// Queues a message, waiting without time limit while the queue is full (the quit message flushes it instead), and
    /// then waits without time limit until this thread has handled a message with that identifier: the first one
    /// handled from then on, even if it was posted earlier and by somebody else. With identifier 0 it returns when the
    /// message is queued. One slot serves all synchronous posters of a thread: a later poster's identifier replaces an
    /// earlier one's, and both are then released by the first handled message with the later identifier.
    ///
    /// Never returns if the thread was not started, or ends before it has handled the message that would release the
    /// caller. So synchronous posters are to be done before the quit message is posted: one that posts behind it waits
    /// for ever, and so does a synchronous post of the quit message then. Any thread but this one.
    void syncPostMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2, KTUInt64 param3, KTUInt64 param4);

    /// Discards every waiting message and queues this one as the only one. Returns true. Posters that wait for room are
    /// not woken by it. Any thread.
    bool flushMessageQueueAndPostMessage(KT_THREAD_MESSAGE message, KTUInt64 param1, KTUInt64 param2, KTUInt64 param3,
                                         KTUInt64 param4);

    /// Waiting messages as a percentage of 1024, rounded down: 10 messages are 0 percent. Any thread; of the moment.
    unsigned int getPercentageOfMessageQueueThatIsOccupied();

    /// Whether both are the same thread: they refer to the same implementation.
    bool operator==(KTThread const &other) const;
    bool operator!=(KTThread const &other) const;

  private:
    KTMsgThreadImpl *m_Impl;
};

/// Blocks the calling thread until the UTC time is that of the call plus `seconds` and `milliseconds`, at microsecond
/// resolution. A step of the system clock moves the end with it. Any thread. The sleep is an interruption point of the
/// library's own copy of Boost.Thread: where host and library share one copy, interrupting the calling boost::thread ends
/// it with boost::thread_interrupted. KTPublic.dll has a copy to itself, whose threads no host can interrupt.
KT_PUBLIC_API void KTSleepForDuration(unsigned long seconds, unsigned long milliseconds);

#include "KTEndExports.h"
