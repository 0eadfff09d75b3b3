// WOFileHandle.cpp: open files, by the system's calls.

#include "OFileHandle.h"

#include "WOLongPath.h"

#include <windows.h>

#include <limits>
#include <new>

namespace {

DWORD DispositionOf(ODisposition disposition) {
    switch (disposition) {
    case ODisposition::CreateAlways:
        return CREATE_ALWAYS;
    case ODisposition::OpenExisting:
        return OPEN_EXISTING;
    case ODisposition::TruncateExisting:
        return TRUNCATE_EXISTING;
    case ODisposition::OpenAlways:
        break;
    }
    return OPEN_ALWAYS;
}

DWORD MethodOf(OMoveFrom from) {
    return from == OMoveFrom::Beginning ? FILE_BEGIN : from == OMoveFrom::End ? FILE_END : FILE_CURRENT;
}

} // namespace

OFileHandle OOpenFile(OPath const &path, unsigned int access, ODisposition disposition, unsigned int flags) try {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return INVALID_HANDLE_VALUE;
    }
    DWORD const wanted =
        ((access & kOAccessRead) != 0 ? GENERIC_READ : 0U) | ((access & kOAccessWrite) != 0 ? GENERIC_WRITE : 0U);
    return CreateFileW(name.c_str(), wanted, FILE_SHARE_READ, nullptr, DispositionOf(disposition), flags, nullptr);
} catch (std::bad_alloc const &) {
    return INVALID_HANDLE_VALUE;
}

bool OIsOpen(OFileHandle handle) noexcept { return handle != nullptr && handle != INVALID_HANDLE_VALUE; }

bool OCloseFile(OFileHandle handle) noexcept { return CloseHandle(handle) != FALSE; }

OTransfer OReadFile(OFileHandle handle, void *buffer, std::uint32_t count) noexcept {
    DWORD moved = 0;
    bool const succeeded = ReadFile(handle, buffer, count, &moved, nullptr) != FALSE;
    return {succeeded, moved};
}

OTransfer OWriteFile(OFileHandle handle, void const *buffer, std::uint32_t count) noexcept {
    DWORD moved = 0;
    bool const succeeded = WriteFile(handle, buffer, count, &moved, nullptr) != FALSE;
    return {succeeded, moved};
}

bool OMoveFilePointer(OFileHandle handle, std::int64_t distance, OMoveFrom from, std::uint32_t &position) noexcept {
    // Without a high half the system refuses places beyond 4 GiB itself. A distance that needs one comes from two
    // positions below 4 GiB, and so leads to one.
    bool const isShort = distance >= std::numeric_limits<LONG>::min() && distance <= std::numeric_limits<LONG>::max();
    LONG high = static_cast<LONG>(distance >> 32);
    SetLastError(NO_ERROR);
    DWORD const low = SetFilePointer(handle, static_cast<LONG>(distance), isShort ? nullptr : &high, MethodOf(from));
    if (low == INVALID_SET_FILE_POINTER && GetLastError() != NO_ERROR) {
        return false;
    }
    position = low;
    return true;
}

bool OGetOpenFileSize(OFileHandle handle, std::uint64_t &size) noexcept {
    LARGE_INTEGER bytes;
    if (GetFileSizeEx(handle, &bytes) == FALSE) {
        return false;
    }
    size = static_cast<std::uint64_t>(bytes.QuadPart);
    return true;
}

bool OSetEndOfFile(OFileHandle handle) noexcept { return SetEndOfFile(handle) != FALSE; }
