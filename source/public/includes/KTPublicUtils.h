// KTPublicUtils.h: small helpers without a home of their own.

#pragma once

#include <string>

#include "KTBeginExports.h"

/// Static helpers; any thread.
class KT_PUBLIC_API KTPublicUtils {
  public:
    KTPublicUtils() = delete;

    /// The text, ": " and the number as a standard output stream writes it by default (six significant digits), for
    /// example "fps: 29.97".
    static std::string ConstructLogStr(std::string text, float value);
};

#include "KTEndExports.h"
