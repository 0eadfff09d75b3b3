// WOVolume.cpp: the disks under the paths.

#include "OFolder.h"

#include "WOLongPath.h"

#include <windows.h>

#include <string>

namespace {

bool IsDrive(std::wstring const &full) { return full.size() >= 2 && full[1] == L':'; }

} // namespace

std::uint64_t OGetFreeSpace(OPath const &path) {
    // A file has no free space of its own, and what is to be written may have no folder yet.
    for (OPath place = OGetFullPath(path); !place.IsEmpty(); place = place.GetParent()) {
        WOLongPath const name(place);
        DWORD const attributes = GetFileAttributesW(name.c_str());
        if (attributes == INVALID_FILE_ATTRIBUTES || (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0) {
            continue;
        }
        std::wstring folder = name.c_str();
        if (!folder.ends_with(L'\\')) {
            folder.push_back(L'\\'); // shares are asked for so
        }
        ULARGE_INTEGER available{};
        return GetDiskFreeSpaceExW(folder.c_str(), &available, nullptr, nullptr) != FALSE ? available.QuadPart : 0;
    }
    return 0;
}

bool OIsOnServer(OPath const &path) {
    std::wstring const full = WOGetFullText(path);
    if (full.empty()) {
        return false;
    }
    if (IsDrive(full)) {
        wchar_t const root[] = {full[0], L':', L'\\', 0};
        return GetDriveTypeW(root) == DRIVE_REMOTE;
    }
    return full.starts_with(L"\\\\") && full[2] != L'?';
}
