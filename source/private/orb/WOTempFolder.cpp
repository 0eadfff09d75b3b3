// WOTempFolder.cpp: the system's temporary folder.

#include "OTempFiles.h"

#include "WOLongPath.h"

#include <windows.h>

#include <string>

OPath OGetSystemTempFolder() {
    std::wstring folder(MAX_PATH + 1, L'\0');
    DWORD length = GetTempPathW(static_cast<DWORD>(folder.size()), folder.data());
    if (length > folder.size()) { // the size needed, terminating zero included
        folder.resize(length);
        length = GetTempPathW(static_cast<DWORD>(folder.size()), folder.data());
    }
    if (length == 0 || length > folder.size()) {
        return {};
    }
    bool const isRoot = length == 3 && folder[1] == L':';
    if (!isRoot && folder[length - 1] == L'\\') {
        --length;
    }
    return WOMakePath(folder.data(), length);
}
