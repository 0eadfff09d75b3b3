// WORemove.cpp: deleting files and folders by name, links by handle.

#include "WORemove.h"

#include "OCaseFold.h"
#include "OUtf.h"
#include "WOError.h"
#include "WOHandle.h"

#include <windows.h>

#include <winternl.h>

#include <bit>
#include <string>
#include <vector>

namespace {

constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

bool RemoveName(wchar_t const *name, DWORD attributes) {
    bool const isFolder = (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
    return (isFolder ? RemoveDirectoryW(name) : DeleteFileW(name)) != FALSE;
}

// Not every system opens a link when asked for the link: Wine opens what it leads to, and would delete that. So the
// handle has to be known for a link's before anything is deleted through it.
OError RemoveLink(wchar_t const *name) {
    WOHandle const link(CreateFileW(name, DELETE | FILE_READ_ATTRIBUTES, kShareAll, nullptr, OPEN_EXISTING,
                                    FILE_FLAG_OPEN_REPARSE_POINT | FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    BY_HANDLE_FILE_INFORMATION opened{};
    if (!link.IsValid() || GetFileInformationByHandle(link.Get(), &opened) == FALSE) {
        return WOLastError();
    }
    if ((opened.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) == 0) {
        return OError::AccessDenied;
    }
    FILE_DISPOSITION_INFO disposition{};
    disposition.DeleteFile = TRUE;
    bool const deleted =
        SetFileInformationByHandle(link.Get(), FileDispositionInfo, &disposition, sizeof disposition) != FALSE;
    return deleted ? OError::None : WOLastError();
}

// Wine shows the system around it without its links to files, and deletes what they lead to.
bool DoesSystemHideLinks() {
    static bool const hides = GetProcAddress(GetModuleHandleW(L"ntdll"), "wine_get_version") != nullptr;
    return hides;
}

// Where the system finds the name in the end; empty if that cannot be told. The documented call for this fails under
// Wine beyond 260 characters, hence the one underneath.
KTUnits FinalPath(wchar_t const *name) {
    using Query = NTSTATUS(NTAPI *)(HANDLE, OBJECT_INFORMATION_CLASS, void *, ULONG, ULONG *);
    static auto const query = std::bit_cast<Query>(GetProcAddress(GetModuleHandleW(L"ntdll"), "NtQueryObject"));
    constexpr auto kObjectName = static_cast<OBJECT_INFORMATION_CLASS>(1);
    WOHandle const file(CreateFileW(name, FILE_READ_ATTRIBUTES, kShareAll, nullptr, OPEN_EXISTING,
                                    FILE_FLAG_OPEN_REPARSE_POINT | FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    std::vector<UNICODE_STRING> answer((1U << 16) / sizeof(UNICODE_STRING) + 1); // the text follows the first element
    ULONG used = 0;
    auto const size = static_cast<ULONG>(answer.size() * sizeof(UNICODE_STRING));
    if (!file.IsValid() || query == nullptr || query(file.Get(), kObjectName, answer.data(), size, &used) < 0) {
        return {};
    }
    return OFoldCase(OWideToUnits(answer[0].Buffer, answer[0].Length / sizeof(wchar_t)));
}

// Whether a file is found in the folder that its name says, under that name.
bool IsAtItsPlace(std::wstring const &name) {
    std::size_t const separator = name.rfind(L'\\');
    KTUnits expected = FinalPath(name.substr(0, separator + 1).c_str());
    KTUnits const rest = OFoldCase(OWideToUnits(name.data() + separator + 1, name.size() - separator - 1));
    if (!expected.empty() && expected.back() != '\\') {
        expected.push_back('\\');
    }
    return !expected.empty() && FinalPath(name.c_str()) == expected.append(rest);
}

} // namespace

OError WORemove(wchar_t const *name, unsigned long attributes) {
    if ((attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0) {
        return RemoveLink(name);
    }
    if (DoesSystemHideLinks() && (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0 && !IsAtItsPlace(name)) {
        return OError::AccessDenied;
    }
    if (RemoveName(name, attributes)) {
        return OError::None;
    }
    OError const error = WOLastError();
    DWORD const writable = attributes & ~static_cast<DWORD>(FILE_ATTRIBUTE_READONLY);
    if (error != OError::AccessDenied || writable == attributes || SetFileAttributesW(name, writable) == FALSE) {
        return error;
    }
    if (RemoveName(name, attributes)) {
        return OError::None;
    }
    OError const again = WOLastError();
    SetFileAttributesW(name, attributes);
    return again;
}
