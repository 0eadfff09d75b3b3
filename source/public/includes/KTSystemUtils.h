// KTSystemUtils.h: services of the system and of the machine that have no class of their own.
//
// A protected text on a stream:
//
//     i32    n, number of protected bytes, in the stream's byte order
//     u8[n]  what the system made of the text's UTF-16 units and a terminating zero unit
//
// Only the same user on the same machine can read it again; the system decides how it is protected and notices every
// change to it.
//
// Threads: every operation may be called on any thread; a stream belongs to one thread at a time.

#pragma once

#include "IKTStream.h"
#include "KTErrorCodes.h"
#include "KTString.h"

struct HWND__; // what the system's HWND points to

#include "KTBeginExports.h"

class KT_PUBLIC_API KTSystemUtils {
  public:
    KTSystemUtils() = delete;

    /// A new globally unique identifier (RFC 4122) as the system writes it: lower-case hexadecimal groups of 8, 4, 4, 4
    /// and 12 digits joined by hyphens, without braces. Empty, with an assertion in the log, if the system cannot make
    /// one ("Failed to generate a GUID") or write it ("Failed to convert GUID to string"). Throws std::bad_alloc.
    static KTString CreateGUID();

    /// The identifier that this machine got when the system was installed on it. "default" if it cannot be read. Logs
    /// what it returns, after two lines that say so if it could not be read. Throws std::bad_alloc.
    static KTString GetMachineGuid();

    /// Protects the text with the user's system credentials and writes it at the stream's position. kKTErrorFailed if
    /// the stream does not write, with nothing written; if the system refuses, with nothing written; or if the stream
    /// took less than it was given, which leaves an incomplete value there. Never asks the user. Throws std::bad_alloc.
    static KTErrorCodeEnum EncryptStringUsingSystemCredentials(KTString const &text, IKTStream &stream);

    /// Reads what EncryptStringUsingSystemCredentials wrote. kKTErrorFailed, with `text` unchanged, if the stream does
    /// not read or ends too early, and for anything that the same user did not protect on this machine or that was
    /// changed since. What was protected by others without a terminating zero is refused, too, with the assertion
    /// "string is not null terminated". No count is taken on trust: memory is used for bytes that really come. Where it
    /// fails, the stream's position is somewhere in the value. Never asks the user. Throws std::bad_alloc.
    static KTErrorCodeEnum DecryptStringUsingSystemCredentials(IKTStream &stream, KTString &text);

    /// Flashes the window's task-bar button until the window comes to the foreground. Null and what is no window are
    /// ignored. Does not wait for the window's thread.
    static void BounceApplicationTrayIcon(HWND__ *window);

    /// Whether the calling thread is the process's first one. If that has ended before the first call of this operation,
    /// the eldest thread then alive stands in for it.
    static bool IsMainThread();

    // ---- not implemented on this system ----

    /// Reports an assertion and returns false.
    static bool GetAppFocused();

    /// Reports an assertion and returns false.
    static bool IsConnectedToNetwork();

    /// Reports an assertion, opens nothing and returns kKTErrorFailed.
    static KTErrorCodeEnum OpenURL(KTString const &url);
};

#include "KTEndExports.h"
