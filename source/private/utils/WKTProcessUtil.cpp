// WKTProcessUtil.cpp: processes by the system's snapshots, windows in their order on the screen.

#include "KTProcessUtil.h"

#include "WOHandle.h"
#include "WOLongPath.h"

#include <windows.h>

#include <psapi.h>
#include <tlhelp32.h>

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

namespace {

constexpr DWORD kLongestPath = 32'768; // wide characters, the terminating zero included

bool IsSameName(std::wstring_view a, std::wstring_view b) {
    return a.size() == b.size() && CompareStringOrdinal(a.data(), static_cast<int>(a.size()), b.data(),
                                                        static_cast<int>(b.size()), TRUE) == CSTR_EQUAL;
}

// None, with the system's error number, if there is no such process. The system passes over an id's last two bits, so
// that the number next to an id opens its process.
WOHandle OpenToAsk(DWORD process, DWORD access = 0) {
    WOHandle opened(OpenProcess(PROCESS_QUERY_LIMITED_INFORMATION | access, FALSE, process));
    if (opened.IsValid() && GetProcessId(opened.Get()) != process) {
        opened.Close();
        SetLastError(ERROR_INVALID_PARAMETER);
    }
    return opened;
}

// Empty if the process may not be asked.
std::wstring ImagePath(HANDLE process) {
    std::wstring path(kLongestPath, L'\0');
    DWORD length = kLongestPath;
    if (QueryFullProcessImageNameW(process, 0, path.data(), &length) == FALSE) {
        return {};
    }
    path.resize(length);
    return path;
}

// Calls visit(entry) for every process until it returns false. A process that has ended has no threads any more, but is
// listed as long as somebody holds a handle of it.
template <typename Visit> void VisitProcesses(Visit visit) {
    WOHandle const snapshot(CreateToolhelp32Snapshot(TH32CS_SNAPPROCESS, 0));
    PROCESSENTRY32W entry{};
    entry.dwSize = sizeof entry;
    for (BOOL more = Process32FirstW(snapshot.Get(), &entry); more != FALSE;
         more = Process32NextW(snapshot.Get(), &entry)) {
        if (entry.cntThreads != 0 && !visit(entry)) {
            return;
        }
    }
}

std::vector<DWORD> ProcessesByName(std::wstring_view name) {
    std::vector<DWORD> found;
    VisitProcesses([&](PROCESSENTRY32W const &entry) {
        if (IsSameName(entry.szExeFile, name)) {
            found.push_back(entry.th32ProcessID);
        }
        return true;
    });
    return found;
}

std::vector<DWORD> ProcessesByPath(std::wstring const &path) {
    // The name is there without opening the process, so that only few must be.
    std::vector<DWORD> found = ProcessesByName(std::wstring_view(path).substr(path.rfind(L'\\') + 1));
    std::erase_if(found, [&](DWORD process) {
        WOHandle const handle = OpenToAsk(process);
        return !handle.IsValid() || !IsSameName(ImagePath(handle.Get()), path);
    });
    return found;
}

// With the names that the disk has for short ones; as it is if nothing is there.
std::wstring LongNames(std::wstring const &path) {
    std::wstring full(kLongestPath, L'\0');
    DWORD const length = GetLongPathNameW(path.c_str(), full.data(), kLongestPath);
    if (length == 0 || length > kLongestPath) {
        return path;
    }
    full.resize(length);
    return full;
}

// A search through the windows from the front to the back; the condition must not throw, as the system calls it.
template <typename Condition> struct WindowSearch {
    Condition isWanted;
    HWND found = nullptr;

    static BOOL CALLBACK Visit(HWND window, LPARAM argument) {
        auto &search = *reinterpret_cast<WindowSearch *>(argument);
        if (IsWindowVisible(window) == FALSE || GetWindow(window, GW_OWNER) != nullptr || !search.isWanted(window)) {
            return TRUE;
        }
        search.found = window;
        return FALSE;
    }
};

template <typename Condition> HWND FindTopWindow(Condition isWanted) {
    WindowSearch<Condition> search{isWanted};
    EnumWindows(WindowSearch<Condition>::Visit, reinterpret_cast<LPARAM>(&search));
    return search.found;
}

HWND WindowOf(std::vector<DWORD> const &processes) {
    if (processes.empty()) {
        return nullptr;
    }
    return FindTopWindow([&](HWND window) {
        DWORD process = 0;
        GetWindowThreadProcessId(window, &process);
        return std::find(processes.begin(), processes.end(), process) != processes.end();
    });
}

bool RectangleOf(HWND window, RECT &rectangle) {
    RECT place{};
    if (window == nullptr || GetWindowRect(window, &place) == FALSE) {
        return false;
    }
    rectangle = place;
    return true;
}

// Whether both belong to the same session of a user; yes if the system does not tell.
bool IsSameSession(DWORD a, DWORD b) {
    DWORD first = 0;
    DWORD second = 0;
    return ProcessIdToSessionId(a, &first) == FALSE || ProcessIdToSessionId(b, &second) == FALSE || first == second;
}

} // namespace

KTUInt32 KTProcessUtil::GetCurrentProcessPID() { return GetCurrentProcessId(); }

bool KTProcessUtil::IsAnotherMeRunning() {
    DWORD const self = GetCurrentProcessId();
    std::vector<DWORD> const same = ProcessesByPath(ImagePath(GetCurrentProcess()));
    return std::any_of(same.begin(), same.end(),
                       [self](DWORD process) { return process != self && IsSameSession(process, self); });
}

bool KTProcessUtil::Is64BitOS() {
    SYSTEM_INFO info{};
    GetNativeSystemInfo(&info);
    return info.wProcessorArchitecture != PROCESSOR_ARCHITECTURE_INTEL &&
           info.wProcessorArchitecture != PROCESSOR_ARCHITECTURE_ARM;
}

KTUInt64 KTProcessUtil::GetProcessMemoryUsage(KTUInt32 processId) {
    WOHandle const process = OpenToAsk(processId);
    PROCESS_MEMORY_COUNTERS counters{};
    counters.cb = sizeof counters;
    if (!process.IsValid() || GetProcessMemoryInfo(process.Get(), &counters, sizeof counters) == FALSE) {
        return 0;
    }
    return counters.WorkingSetSize;
}

bool KTProcessUtil::IsProcessOpen(KTString const &imageName) {
    std::wstring const name = imageName.GetWstring();
    bool found = false;
    VisitProcesses([&](PROCESSENTRY32W const &entry) {
        found = IsSameName(entry.szExeFile, name);
        return !found;
    });
    return found;
}

bool KTProcessUtil::IsProcessRunning(KTUInt32 processId) {
    WOHandle const process = OpenToAsk(processId, SYNCHRONIZE);
    if (!process.IsValid()) {
        return GetLastError() == ERROR_ACCESS_DENIED; // it is there, but belongs to others
    }
    return WaitForSingleObject(process.Get(), 0) == WAIT_TIMEOUT;
}

HWND__ *KTProcessUtil::GetTopWindowFromProcessID(KTUInt32 processId) { return WindowOf({processId}); }

HWND__ *KTProcessUtil::GetProcessWidnowUsingProcessImagePath(KTString const &imagePath) {
    std::wstring const path = WOGetFullText(OPath(imagePath.GetOString()));
    return path.empty() ? nullptr : WindowOf(ProcessesByPath(LongNames(path)));
}

bool KTProcessUtil::GetProcessWindowRectUsingProcessImageName(KTString const &imageName, tagRECT &rectangle) {
    return RectangleOf(WindowOf(ProcessesByName(imageName.GetWstring())), rectangle);
}

bool KTProcessUtil::GetProcessWindowRectUsingWindowTitle(KTString const &title, tagRECT &rectangle) {
    std::wstring const wanted = title.GetWstring();
    if (wanted.empty()) {
        return false;
    }
    // Room for one more character than wanted shows a longer title. The text that the system keeps of the window is
    // taken, not the window asked, which may hang.
    std::vector<wchar_t> buffer(wanted.size() + 2);
    HWND const window = FindTopWindow([&](HWND candidate) {
        int const length = InternalGetWindowText(candidate, buffer.data(), static_cast<int>(buffer.size()));
        return length > 0 && IsSameName(std::wstring_view(buffer.data(), static_cast<std::size_t>(length)), wanted);
    });
    return RectangleOf(window, rectangle);
}
