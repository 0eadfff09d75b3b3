// WDumpWriter.h: the system's writer of crash dumps. Windows half only.

#pragma once

#include <windows.h>

/// Loads the writer, which lives in a library of its own, so that a crash need not wait for the loader. Later calls do
/// nothing. True if it is there. Any thread.
bool WLoadDumpWriter() noexcept;

/// Writes a dump of this process, whose current thread raised the exception of `pointers` (null: none), to a file that
/// is open for writing. Whether it was written; if not, the system's error number goes to `error`, which may be 0 all the
/// same. Any thread, one at a time.
bool WWriteDump(HANDLE file, EXCEPTION_POINTERS *pointers, DWORD &error) noexcept;
