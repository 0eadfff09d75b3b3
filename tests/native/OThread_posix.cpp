// OThread_posix.cpp: the calling thread of the native developer build, where priorities are not set: raising them takes
// rights that developers' programs do not have.

#include "OThread.h"

#include <sched.h>

void OSetThreadPriority(OThreadPriority /*priority*/) noexcept {}

void OYieldThread() noexcept { sched_yield(); }
