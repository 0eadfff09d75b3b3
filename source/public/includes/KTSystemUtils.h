// KTSystemUtils.h: services of the system and of the machine that have no class of their own.

#pragma once

#include "KTString.h"

#include "KTBeginExports.h"

class KT_PUBLIC_API KTSystemUtils {
  public:
    KTSystemUtils() = delete;

    /// A new globally unique identifier (RFC 4122) as the system writes it: lower-case hexadecimal groups of 8, 4, 4, 4
    /// and 12 digits joined by hyphens, without braces. Empty, with an assertion in the log, if the system cannot make
    /// one ("Failed to generate a GUID") or write it ("Failed to convert GUID to string"). Throws std::bad_alloc. Any
    /// thread.
    static KTString CreateGUID();
};

#include "KTEndExports.h"
