// WDumpWriter.cpp: MiniDumpWriteDump of the system's own dbghelp.dll, which stays loaded once it was.

#include "WDumpWriter.h"

#include <dbghelp.h>

#include <bit>

namespace {

using WriteDump = decltype(&MiniDumpWriteDump);

struct Writer {
    WriteDump write = nullptr;
    DWORD error = 0;
};

// Only the system's folder is looked into: a library of that name beside a document must not be run.
Writer Load() noexcept {
    HMODULE const library = LoadLibraryExW(L"dbghelp.dll", nullptr, LOAD_LIBRARY_SEARCH_SYSTEM32);
    if (library == nullptr) {
        return {nullptr, GetLastError()};
    }
    auto const write = std::bit_cast<WriteDump>(GetProcAddress(library, "MiniDumpWriteDump"));
    return {write, write == nullptr ? GetLastError() : 0};
}

Writer const &GetWriter() noexcept {
    static Writer const writer = Load();
    return writer;
}

} // namespace

bool WLoadDumpWriter() noexcept { return GetWriter().write != nullptr; }

bool WWriteDump(HANDLE file, EXCEPTION_POINTERS *pointers, DWORD &error) noexcept {
    Writer const &writer = GetWriter();
    if (writer.write == nullptr) {
        error = writer.error;
        return false;
    }
    MINIDUMP_EXCEPTION_INFORMATION information{GetCurrentThreadId(), pointers, FALSE};
    BOOL const isWritten = writer.write(GetCurrentProcess(), GetCurrentProcessId(), file, MiniDumpNormal,
                                        pointers == nullptr ? nullptr : &information, nullptr, nullptr);
    error = isWritten != FALSE ? ERROR_SUCCESS : GetLastError();
    return isWritten != FALSE;
}
