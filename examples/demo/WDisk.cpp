// WDisk.cpp: what the demo asks the disk, by the system's wide-character calls.

#include "WDisk.h"

#include <windows.h>

#include <algorithm>
#include <memory>

namespace {

struct CloseFileHandle {
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};
struct CloseFindHandle {
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { FindClose(handle); }
};
using FileHandle = std::unique_ptr<HANDLE, CloseFileHandle>;
using FindHandle = std::unique_ptr<HANDLE, CloseFindHandle>;

constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

template <typename Handle> Handle Owned(HANDLE handle) {
    return Handle(handle == INVALID_HANDLE_VALUE ? nullptr : handle);
}

// The extended form of a full path; it is the only one without a limit of 260 characters.
std::wstring Extended(KTPath const &path) {
    std::wstring text = path.GetPathAsKTString().GetWstring();
    if (text.starts_with(L"\\\\?\\") || text.starts_with(L"\\\\.\\")) {
        return text;
    }
    return text.starts_with(L"\\\\") ? L"\\\\?\\UNC" + text.substr(1) : L"\\\\?\\" + text;
}

KTPath FullPath(std::wstring const &written) {
    DWORD const size = GetFullPathNameW(written.c_str(), 0, nullptr, nullptr);
    std::wstring full(size, L'\0');
    full.resize(GetFullPathNameW(written.c_str(), size, full.data(), nullptr));
    return KTPath(KTString(full.c_str()));
}

FileHandle OpenFolder(KTPath const &folder) {
    return Owned<FileHandle>(CreateFileW(Extended(folder).c_str(), FILE_READ_ATTRIBUTES, kShareAll, nullptr,
                                         OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr));
}

// Files that a cloud service keeps elsewhere are reparse points too, but no links: they can be walked as usual.
bool IsLink(WIN32_FIND_DATAW const &found) {
    return (found.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0 &&
           (found.dwReserved0 == 0 || IsReparseTagNameSurrogate(found.dwReserved0));
}

DiskEntry EntryOf(WIN32_FIND_DATAW const &found) {
    DiskEntry entry;
    entry.name = KTString(found.cFileName);
    entry.size = (static_cast<KTUInt64>(found.nFileSizeHigh) << 32) | found.nFileSizeLow;
    entry.isFolder = (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
    entry.isLink = IsLink(found);
    return entry;
}

std::string ProblemText(DWORD code) {
    switch (code) {
    case ERROR_FILE_NOT_FOUND:
    case ERROR_PATH_NOT_FOUND:
        return "gone";
    case ERROR_ACCESS_DENIED:
        return "no permission";
    case ERROR_SHARING_VIOLATION:
    case ERROR_LOCK_VIOLATION:
        return "in use";
    default:
        return "cannot be read, error " + std::to_string(code);
    }
}

} // namespace

KTPath DiskFullPath(KTString const &written) {
    KTPath const path = FullPath(written.GetWstring());
    bool const isRooted = written.size() > 1 && written[0] == '/' && written[1] != '/';
    if (isRooted && GetFileAttributesW(Extended(path).c_str()) == INVALID_FILE_ATTRIBUTES) {
        KTPath const aroundWine = FullPath((L"Z:" + written).GetWstring());
        if (DiskIsFolder(aroundWine)) {
            return aroundWine;
        }
    }
    return path;
}

bool DiskIsFolder(KTPath const &path) {
    DWORD const attributes = GetFileAttributesW(Extended(path).c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

std::optional<DiskIdentity> DiskIdentify(KTPath const &folder) {
    FileHandle const handle = OpenFolder(folder);
    BY_HANDLE_FILE_INFORMATION information{};
    if (!handle || GetFileInformationByHandle(handle.get(), &information) == FALSE) {
        return std::nullopt;
    }
    return DiskIdentity{information.dwVolumeSerialNumber,
                        (static_cast<KTUInt64>(information.nFileIndexHigh) << 32) | information.nFileIndexLow};
}

std::optional<std::vector<DiskEntry>> DiskList(KTPath const &folder) {
    KTPath pattern(folder);
    pattern.Append(KTString("*"));
    WIN32_FIND_DATAW found{};
    FindHandle const search = Owned<FindHandle>(
        FindFirstFileExW(Extended(pattern).c_str(), FindExInfoBasic, &found, FindExSearchNameMatch, nullptr, 0));
    if (!search) {
        // An empty root has not even "." in it.
        return GetLastError() == ERROR_FILE_NOT_FOUND ? std::optional<std::vector<DiskEntry>>(std::in_place)
                                                      : std::nullopt;
    }
    std::vector<DiskEntry> entries;
    do {
        DiskEntry entry = EntryOf(found);
        if (entry.name != "." && entry.name != "..") {
            entries.push_back(std::move(entry));
        }
    } while (FindNextFileW(search.get(), &found) != FALSE);
    return entries;
}

DiskBytes DiskRead(KTPath const &file, KTUInt64 limit) {
    DiskBytes result;
    FileHandle const handle = Owned<FileHandle>(CreateFileW(Extended(file).c_str(), GENERIC_READ, kShareAll, nullptr,
                                                            OPEN_EXISTING, FILE_FLAG_SEQUENTIAL_SCAN, nullptr));
    if (!handle) {
        result.problem = ProblemText(GetLastError());
        return result;
    }
    LARGE_INTEGER size{};
    if (GetFileType(handle.get()) != FILE_TYPE_DISK || GetFileSizeEx(handle.get(), &size) == FALSE) {
        result.problem = "not a plain file";
        return result;
    }
    result.size = static_cast<KTUInt64>(size.QuadPart);
    result.bytes.resize(static_cast<std::size_t>(std::min(result.size, limit)));
    std::size_t done = 0;
    while (done < result.bytes.size()) {
        DWORD const wanted = static_cast<DWORD>(std::min<std::size_t>(result.bytes.size() - done, 1U << 20));
        DWORD got = 0;
        if (ReadFile(handle.get(), result.bytes.data() + done, wanted, &got, nullptr) == FALSE) {
            result.problem = ProblemText(GetLastError());
            break;
        }
        if (got == 0) { // the file has become shorter
            break;
        }
        done += got;
    }
    result.bytes.resize(done);
    return result;
}

bool DiskTouch(KTPath const &file) {
    return Owned<FileHandle>(CreateFileW(Extended(file).c_str(), GENERIC_READ | GENERIC_WRITE, kShareAll, nullptr,
                                         OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr)) != nullptr;
}

bool DiskWrite(KTPath const &file, std::string const &bytes) {
    FileHandle const handle = Owned<FileHandle>(CreateFileW(Extended(file).c_str(), GENERIC_WRITE, FILE_SHARE_READ,
                                                            nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    DWORD written = 0;
    return handle != nullptr && bytes.size() <= MAXDWORD &&
           WriteFile(handle.get(), bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr) != FALSE &&
           written == bytes.size();
}
