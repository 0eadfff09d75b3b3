// ModuleHandles.h: finds the loaded library and the tables inside its image.

#pragma once

#include <windows.h>

#include <cstddef>

namespace ktabi {

/// The library as the loader placed it in this process; null if it is not there.
inline HMODULE Library() { return GetModuleHandleW(L"KTPublic.dll"); }

/// The object at an offset of an image.
template <typename T> T *At(std::byte *base, std::size_t offset) { return reinterpret_cast<T *>(base + offset); }

/// The offset of one of an image's data directories.
inline std::size_t DataDirectory(std::byte *base, int index) {
    auto const &dos = *At<IMAGE_DOS_HEADER>(base, 0);
    auto const &headers = *At<IMAGE_NT_HEADERS64>(base, static_cast<std::size_t>(dos.e_lfanew));
    return headers.OptionalHeader.DataDirectory[index].VirtualAddress;
}

/// The address of an exported function or datum, by its symbol; null if there is none.
inline std::byte *Symbol(HMODULE module, char const *name) {
    return reinterpret_cast<std::byte *>(GetProcAddress(module, name));
}

} // namespace ktabi
