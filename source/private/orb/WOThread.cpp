// WOThread.cpp: the calling thread, by the system's own calls.

#include "OThread.h"

#include <windows.h>

static_assert(static_cast<int>(OThreadPriority::Lowest) == THREAD_PRIORITY_LOWEST);
static_assert(static_cast<int>(OThreadPriority::BelowNormal) == THREAD_PRIORITY_BELOW_NORMAL);
static_assert(static_cast<int>(OThreadPriority::Normal) == THREAD_PRIORITY_NORMAL);
static_assert(static_cast<int>(OThreadPriority::AboveNormal) == THREAD_PRIORITY_ABOVE_NORMAL);
static_assert(static_cast<int>(OThreadPriority::Highest) == THREAD_PRIORITY_HIGHEST);

void OSetThreadPriority(OThreadPriority priority) noexcept {
    SetThreadPriority(GetCurrentThread(), static_cast<int>(priority));
}

void OYieldThread() noexcept { SwitchToThread(); }
