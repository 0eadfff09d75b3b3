// WOFileSystem.cpp: one file or folder, by the system's wide-character calls.

#include "OFileSystem.h"

#include "WOError.h"
#include "WOHandle.h"
#include "WOLongPath.h"
#include "WORemove.h"

#include <windows.h>

namespace {

constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

std::uint64_t Joined(DWORD high, DWORD low) { return (static_cast<std::uint64_t>(high) << 32) | low; }

std::uint64_t CountOf(FILETIME const &time) { return Joined(time.dwHighDateTime, time.dwLowDateTime); }

// Files that a cloud service keeps elsewhere are reparse points too, but neither links nor different from others here:
// what may be done to a link may be done to them.
bool IsLink(DWORD attributes) { return (attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0; }

bool IsFolder(DWORD attributes) { return (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0; }

// The system denies this itself, unless the user or the disk has rights beyond the attribute.
bool IsReadOnly(WOLongPath const &name) {
    DWORD const attributes = GetFileAttributesW(name.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && !IsFolder(attributes) &&
           (attributes & FILE_ATTRIBUTE_READONLY) != 0;
}

// A folder in the way is denied access by the system, which callers want to tell from a missing permission.
OError OpenError(WOLongPath const &name) {
    OError const error = WOLastError();
    if (error != OError::AccessDenied) {
        return error;
    }
    DWORD const attributes = GetFileAttributesW(name.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && IsFolder(attributes) ? OError::IsAFolder : error;
}

} // namespace

bool OExists(OPath const &path) {
    WOLongPath const name(path);
    return name.IsValid() && GetFileAttributesW(name.c_str()) != INVALID_FILE_ATTRIBUTES;
}

OError OGetFacts(OPath const &path, OFileFacts &facts) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return OError::InvalidName;
    }
    WIN32_FILE_ATTRIBUTE_DATA data;
    if (GetFileAttributesExW(name.c_str(), GetFileExInfoStandard, &data) == FALSE) {
        return WOLastError();
    }
    facts.isFolder = IsFolder(data.dwFileAttributes);
    facts.isLink = IsLink(data.dwFileAttributes);
    facts.isReadOnly = (data.dwFileAttributes & FILE_ATTRIBUTE_READONLY) != 0;
    facts.size = facts.isFolder ? 0 : Joined(data.nFileSizeHigh, data.nFileSizeLow);
    facts.created = CountOf(data.ftCreationTime);
    facts.modified = CountOf(data.ftLastWriteTime);
    facts.accessed = CountOf(data.ftLastAccessTime);
    return OError::None;
}

OError OCheckFolder(OPath const &path) {
    OFileFacts facts;
    OError const error = OGetFacts(path, facts);
    return error == OError::None && !facts.isFolder ? OError::NotAFolder : error;
}

OError OMakeFile(OPath const &path, bool replace) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return OError::InvalidName;
    }
    if (replace && IsReadOnly(name)) {
        return OError::AccessDenied;
    }
    WOHandle const file(CreateFileW(name.c_str(), GENERIC_WRITE, replace ? FILE_SHARE_READ : kShareAll, nullptr,
                                    replace ? CREATE_ALWAYS : CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr));
    return file.IsValid() ? OError::None : OpenError(name);
}

OError OTouch(OPath const &path) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return OError::InvalidName;
    }
    WOHandle const file(CreateFileW(name.c_str(), FILE_WRITE_ATTRIBUTES, kShareAll, nullptr, OPEN_EXISTING,
                                    FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    FILETIME now;
    GetSystemTimeAsFileTime(&now);
    return file.IsValid() && SetFileTime(file.Get(), nullptr, &now, &now) != FALSE ? OError::None : WOLastError();
}

OError ODelete(OPath const &path) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return OError::InvalidName;
    }
    DWORD const attributes = GetFileAttributesW(name.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES) {
        return WOLastError();
    }
    return WORemove(name.c_str(), attributes);
}

OError OTryOpen(OPath const &path, OFile::AccessMode access, OFile::ShareMode share) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return OError::InvalidName;
    }
    if ((access & OFile::kAccessWrite) != 0 && IsReadOnly(name)) {
        return OError::AccessDenied;
    }
    DWORD const wanted = ((access & OFile::kAccessRead) != 0 ? GENERIC_READ : 0) |
                         ((access & OFile::kAccessWrite) != 0 ? GENERIC_WRITE : 0);
    DWORD const shared = ((share & OFile::kShareRead) != 0 ? FILE_SHARE_READ : 0) |
                         ((share & OFile::kShareWrite) != 0 ? FILE_SHARE_WRITE : 0) |
                         ((share & OFile::kShareDelete) != 0 ? FILE_SHARE_DELETE : 0);
    WOHandle const file(
        CreateFileW(name.c_str(), wanted, shared, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    return file.IsValid() ? OError::None : OpenError(name);
}
