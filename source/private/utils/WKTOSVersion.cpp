// WKTOSVersion.cpp: the version as the kernel knows it. GetVersionEx answers what the program's manifest can bear.

#include "KTOSVersion.h"

#include <windows.h>

#include <winternl.h>

extern "C" __declspec(dllimport) NTSTATUS NTAPI RtlGetVersion(OSVERSIONINFOW *version);

namespace {

bool IsWorkstation(KTUInt32 majorVersion, KTUInt32 minorVersion) {
    KTOSVersion::Version const version = KTOSVersion::GetOSVersion();
    return version.majorVersion == majorVersion && version.minorVersion == minorVersion && !version.isServer;
}

} // namespace

KTOSVersion::Version KTOSVersion::GetOSVersion() {
    OSVERSIONINFOEXW info{};
    info.dwOSVersionInfoSize = sizeof info;
    if (RtlGetVersion(reinterpret_cast<OSVERSIONINFOW *>(&info)) < 0) {
        return {};
    }
    return {info.dwMajorVersion, info.dwMinorVersion, info.dwBuildNumber, info.wProductType != VER_NT_WORKSTATION};
}

bool KTOSVersion::IsXP() { return IsWorkstation(5, 1) || IsWorkstation(5, 2); }

bool KTOSVersion::IsVista() { return IsWorkstation(6, 0); }

bool KTOSVersion::IsWin7() { return IsWorkstation(6, 1); }
