// KTFileUtil.h: the static toolbox for files and folders.

#pragma once

#include "KTFile.h"

#include "KTBeginExports.h"

/// Well-known folders. All members are static and may be called on any thread.
class KT_PUBLIC_API KTFileUtil {
  public:
    KTFileUtil() = delete;

    /// The system's temporary folder, without a trailing separator; a value that names nothing if the system has none
    /// to offer.
    static KTFile GetSystemTempFolder();
};

#include "KTEndExports.h"
