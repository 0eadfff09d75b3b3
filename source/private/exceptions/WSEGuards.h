// WSEGuards.h: finding out who waits for a structured exception. Windows half only, GCC's.

#pragma once

#include <windows.h>

/// Looks up what the walk compares with, so that a crash need not. Any thread.
void WPrepareGuardSearch() noexcept;

/// Whether a guarded block of C code (__try and __except) stands between the place of the exception and the first frame
/// of C++ code with destructors or catch clauses. The system's own functions try reads and calls in such blocks and
/// answer with an error; taking their exceptions away would break them. The blocks that every thread begins in do not
/// count. Reads the stack and may fault if that is damaged.
bool WIsGuarded(CONTEXT const &place) noexcept;

/// Whether the address lies in the calling thread's stack, with room for a pointer above it.
bool WIsOnStack(ULONG64 address) noexcept;
