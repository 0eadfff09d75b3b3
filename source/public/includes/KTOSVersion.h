// KTOSVersion.h: which Windows this is.
//
// The true version: not the one that the system claims towards programs whose manifest does not name it.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Any thread; nothing throws.
class KT_PUBLIC_API KTOSVersion {
  public:
    /// A version such as 10.0.19045. All zero if the system does not tell.
    struct Version {
        KTUInt32 majorVersion = 0;
        KTUInt32 minorVersion = 0;
        KTUInt32 buildNumber = 0;
        bool isServer = false; ///< a server or a domain controller; their version numbers are those of a workstation
    };

    KTOSVersion() = delete;

    /// The version of the running system.
    static Version GetOSVersion();

    // ---- exactly this one, on a workstation; false for later ones ----

    /// Windows XP: 5.1, or 5.2, which its 64-bit edition is.
    static bool IsXP();

    /// Windows Vista: 6.0.
    static bool IsVista();

    /// Windows 7: 6.1.
    static bool IsWin7();
};

#include "KTEndExports.h"
