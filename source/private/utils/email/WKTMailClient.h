// WKTMailClient.h: the mail program that the machine uses by default. Windows half only.
//
//     HKEY_LOCAL_MACHINE\Software\Clients\Mail            (unnamed) = NAME
//     HKEY_LOCAL_MACHINE\Software\Clients\Mail\NAME       DLLPath, PreFirstRun

#pragma once

#include <optional>
#include <string>

struct WKTMailClient {
    std::wstring name;
    std::wstring dllPath;     ///< its Simple MAPI library, variables of the environment expanded
    std::wstring preFirstRun; ///< its advice to a user who has not set it up yet; empty if it has none
};

/// The default mail program. None if a key or the name is missing, the name is empty, or DLLPath is not a text.
/// PreFirstRun may be missing. Any thread.
std::optional<WKTMailClient> WKTFindMailClient();
