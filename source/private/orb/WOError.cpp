// WOError.cpp: what the system's error codes mean to the file layer.

#include "WOError.h"

namespace {

constexpr DWORD kDiskQuotaExceeded = 1295; // MinGW's headers leave this one out

} // namespace

OError WOErrorOf(DWORD code) noexcept {
    switch (code) {
    case ERROR_SUCCESS:
        return OError::None;
    case ERROR_FILE_NOT_FOUND:
    case ERROR_PATH_NOT_FOUND:
        return OError::NotFound;
    case ERROR_INVALID_NAME:
    case ERROR_BAD_PATHNAME:
    case ERROR_FILENAME_EXCED_RANGE:
        return OError::InvalidName;
    case ERROR_DIRECTORY:
        return OError::NotAFolder;
    case ERROR_FILE_EXISTS:
    case ERROR_ALREADY_EXISTS:
        return OError::AlreadyExists;
    case ERROR_ACCESS_DENIED:
    case ERROR_WRITE_PROTECT:
    case ERROR_PRIVILEGE_NOT_HELD:
        return OError::AccessDenied;
    case ERROR_SHARING_VIOLATION:
    case ERROR_LOCK_VIOLATION:
    case ERROR_USER_MAPPED_FILE:
        return OError::InUse;
    case ERROR_DISK_FULL:
    case ERROR_HANDLE_DISK_FULL:
    case kDiskQuotaExceeded:
        return OError::DiskFull;
    case ERROR_NOT_READY:
    case ERROR_INVALID_DRIVE:
    case ERROR_BAD_NETPATH:
    case ERROR_BAD_NET_NAME:
    case ERROR_NETNAME_DELETED:
    case ERROR_NETWORK_UNREACHABLE:
    case ERROR_DEV_NOT_EXIST:
    case ERROR_NO_MEDIA_IN_DRIVE:
        return OError::NotReady;
    case ERROR_DIR_NOT_EMPTY:
        return OError::NotEmpty;
    default:
        return OError::Failed;
    }
}

OError WOLastError() noexcept {
    DWORD const code = GetLastError();
    return code == ERROR_SUCCESS ? OError::Failed : WOErrorOf(code); // called after a failure only
}
