// KTApplicationLaunchUtil.h: starting other programs.

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"
#include "KTTypes.h"

#include <vector>

#include "KTBeginExports.h"

class KT_PUBLIC_API KTApplicationLaunchUtil {
  public:
    KTApplicationLaunchUtil() = delete;

    /// Starts the program and does not wait for it. `path` names its executable file, in every form that KTFileUtil
    /// takes; relative ones are completed from the current folder, and no other folder is searched. ".exe" is appended
    /// unless the path ends in it, in any case. The program gets each argument as one, blanks and quotation marks
    /// included, as programs take their command line apart by the run-time's rules; it inherits the current folder and
    /// the environment, but no handle. Its process id, which is never 0, goes to `processId` unless that is null.
    ///
    /// kKTErrorFileNotFound if that file does not exist or is a folder, also for an empty path; kKTErrorFailed if the
    /// system cannot start it: it is no program, needs more rights than this process has, the command line is longer
    /// than 32,766 units, or an argument has a zero inside. `processId` is left alone then. Any thread. Throws
    /// std::bad_alloc.
    static KTErrorCodeEnum LaunchApplication(KTString const &path, std::vector<KTString> const &arguments = {},
                                             KTUInt32 *processId = nullptr);
};

#include "KTEndExports.h"
