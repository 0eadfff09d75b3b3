// KTErrorCodes.h: the result code that fallible operations return.

#pragma once

/// Result of an operation that can fail in an expected way. Callers test it against 0. The enum is 32 bits wide and
/// passed by value; no other value is produced anywhere in the library.
enum KTErrorCodeEnum : int {
    kKTErrorNone = 0,         ///< success; also returned by every setter that cannot fail
    kKTErrorFailed = 1,       ///< generic failure: out of range, not readable or writable, already (or not) registered
    kKTErrorFileNotFound = 28 ///< the file that the operation was asked to act on does not exist
};
