// OThread.h: what the system can do with the calling thread.

#pragma once

/// How far a thread's priority lies from normal, in the system's steps.
enum class OThreadPriority : int { Lowest = -2, BelowNormal = -1, Normal = 0, AboveNormal = 1, Highest = 2 };

/// Sets the calling thread's priority; a system that refuses leaves it as it is.
void OSetThreadPriority(OThreadPriority priority) noexcept;

/// Lets another thread that is ready run first; returns at once where there is none.
void OYieldThread() noexcept;
