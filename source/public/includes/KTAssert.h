// KTAssert.h: assertions that log and go on, and the two message formatters.
//
// A failed assertion never stops the program and shows nothing to the user: it becomes one line in the process-wide
// log (KTLogger.h) and execution continues after the check. The reporting path is fixed on purpose, so the switches
// below exist for callers that expect them and change nothing.
//
//     if (offset > size)
//         KTAssertFailed("", "source/private/streams/MemXferBytes", 117);
//         -> log line "Assert failed:  at source/private/streams/MemXferBytes:117"
//
// Threads: reporting may happen on any thread (the logger writes whole lines). The formatters share one buffer each
// across all threads and do not lock: format on one thread at a time, or copy the result at once.

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"

#include "KTBeginExports.h"

/// Reports a failed assertion as one log line, "Assert failed: MESSAGE at PATH:LINE", or "Assert failed at PATH:LINE"
/// when `message` is null. A site without a message of its own passes "" and so gets two blanks before "at". Writes
/// nothing while logging is disabled. `path` is the source path without its extension, `line` the report's own fixed
/// number. REQUIRES: path is not null. Never throws on purpose; returns in every case. Any thread.
KT_PUBLIC_API void KTAssertFailed(char const *message, char const *path, KTInt32 line);

/// Does nothing: neither the format nor the values are read. Any thread.
KT_PUBLIC_API void KTAssertFail(char const *format, ...);

/// Formats like printf into one static buffer of 2048 bytes and returns that buffer; the next call overwrites it.
/// Longer output is cut to 2047 bytes without notice. A null format gives an empty text. REQUIRES: the format fits its
/// values. Allocates nothing. One thread at a time.
KT_PUBLIC_API char *FORMAT_ARGS(char const *format, ...);

/// Formats like printf into a growing buffer (4096 bytes at first, 4096 more at each attempt, up to 4,100,096, kept
/// until the process ends) and returns the text decoded from UTF-8. A null format gives an empty string. Output past
/// the last size is cut and reported as the assertion "Buffer not sufficient". WRONG: a format that expands to no
/// characters at all, such as "" or "%s" with "": the call then never returns. Throws std::bad_alloc when memory is
/// short. One thread at a time.
KT_PUBLIC_API KTString FORMAT_ARGS2(char const *format, ...);

/// Whether assertions are enabled: always false. Any thread.
KT_PUBLIC_API bool const IsAssertsEnabled();

/// Does nothing. Any thread.
KT_PUBLIC_API void EnableAsserts(bool enable);

/// The path of the assertion log: always empty. Any thread.
KT_PUBLIC_API KTString const GetAssertionLogPath();

/// Does nothing; the path is not stored. Any thread.
KT_PUBLIC_API void SetAssertionLogPath(KTString const &path);

/// Does nothing. Any thread.
KT_PUBLIC_API void InitializeDefaultAssertionPath();

/// Function that clients of the address-lookup hook set and call; the meaning of its three texts and of its result is
/// theirs.
using KTBibAddressProc = void *(*)(char const *, char const *, char const *);

/// Stores the process-wide address-lookup hook (null allowed) and returns kKTErrorNone. The library itself never
/// calls it. Not locked: set it before other threads read it.
KT_PUBLIC_API KTErrorCodeEnum SetKTBibAddressProc(KTBibAddressProc proc);

/// The hook that was stored last, or null. Not locked, see SetKTBibAddressProc.
KT_PUBLIC_API KTBibAddressProc GetKTBibAddressProc();

#include "KTEndExports.h"
