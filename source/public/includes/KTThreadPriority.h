// KTThreadPriority.h: how urgently the system is to run a thread of KTThread.h or KTWorkerThread.h.

#pragma once

/// Priority of a message thread or a worker thread, set on the new thread before it does anything for its owner. Any
/// other value gives the system's normal priority.
enum KTThreadPriorityEnum : int {
    kKTThreadPriorityLowest = 0,      ///< two steps below normal (THREAD_PRIORITY_LOWEST)
    kKTThreadPriorityBelowNormal = 1, ///< one step below normal (THREAD_PRIORITY_BELOW_NORMAL)
    kKTThreadPriorityUnchanged = 2,   ///< left as the system made the thread; the default
    kKTThreadPriorityAboveNormal = 3, ///< one step above normal (THREAD_PRIORITY_ABOVE_NORMAL)
    kKTThreadPriorityHighest = 4      ///< two steps above normal (THREAD_PRIORITY_HIGHEST)
};
