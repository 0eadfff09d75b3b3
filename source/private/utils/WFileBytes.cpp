// WFileBytes.cpp: the bytes of open files on Windows, for the dictionary's engine and the tools beside it.

#include "WFileBytes.h"

#include <algorithm>
#include <utility>

namespace orvik_private {

namespace {

// One system call does not take all that memory can hold.
DWORD AtOnce(std::size_t count) { return static_cast<DWORD>(std::min(count, std::size_t{1} << 30)); }

} // namespace

WFileSource::WFileSource(WOHandle handle, std::uint64_t size) : m_Handle(std::move(handle)), m_Size(size) {}

std::size_t WFileSource::Read(void *bytes, std::size_t count) {
    DWORD got = 0;
    if (ReadFile(m_Handle.Get(), bytes, AtOnce(count), &got, nullptr) == FALSE) {
        m_Failed = true;
        return 0;
    }
    return got;
}

WOHandle OpenToRead(wchar_t const *name, std::uint64_t &size) {
    WOHandle handle(CreateFileW(name, GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_DELETE, nullptr, OPEN_EXISTING,
                                FILE_FLAG_SEQUENTIAL_SCAN, nullptr));
    LARGE_INTEGER bytes{};
    if (!handle.IsValid() || GetFileSizeEx(handle.Get(), &bytes) == FALSE) {
        DWORD const error = GetLastError(); // closing may change it
        handle.Close();
        SetLastError(error);
        return {};
    }
    size = static_cast<std::uint64_t>(bytes.QuadPart);
    return handle;
}

bool WriteWhole(WOHandle const &handle, char const *bytes, std::size_t count) {
    while (count != 0) {
        DWORD done = 0;
        if (WriteFile(handle.Get(), bytes, AtOnce(count), &done, nullptr) == FALSE || done == 0) {
            return false;
        }
        bytes += done;
        count -= done;
    }
    return true;
}

} // namespace orvik_private
