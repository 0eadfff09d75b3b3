// WImportHook.h: sees what a loaded library calls in the system, by replacing an entry of its import table for a time.

#pragma once

#include <windows.h>

#include <cstring>

/// The library's import table entry for the system function `name`; null if it imports none of that name.
inline void **FindImport(wchar_t const *library, char const *name) {
    auto *const base = reinterpret_cast<char *>(GetModuleHandleW(library));
    auto const *const dos = reinterpret_cast<IMAGE_DOS_HEADER const *>(base);
    auto const *const headers = reinterpret_cast<IMAGE_NT_HEADERS const *>(base + dos->e_lfanew);
    auto const &imports = headers->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT];
    auto const *module = reinterpret_cast<IMAGE_IMPORT_DESCRIPTOR const *>(base + imports.VirtualAddress);
    for (; module->Name != 0; ++module) {
        auto const *names = reinterpret_cast<IMAGE_THUNK_DATA const *>(base + module->OriginalFirstThunk);
        auto *addresses = reinterpret_cast<IMAGE_THUNK_DATA *>(base + module->FirstThunk);
        for (; names->u1.AddressOfData != 0; ++names, ++addresses) {
            if (IMAGE_SNAP_BY_ORDINAL(names->u1.Ordinal)) {
                continue;
            }
            auto const *const entry = reinterpret_cast<IMAGE_IMPORT_BY_NAME const *>(base + names->u1.AddressOfData);
            if (std::strcmp(reinterpret_cast<char const *>(entry->Name), name) == 0) {
                return reinterpret_cast<void **>(&addresses->u1.Function);
            }
        }
    }
    return nullptr;
}

/// Makes the library call `replacement` instead of the system function `name` while this object lives.
class WImportHook {
  public:
    template <typename Function> WImportHook(wchar_t const *library, char const *name, Function *replacement)
        : m_Entry(FindImport(library, name)) {
        if (m_Entry != nullptr) {
            m_Original = Write(reinterpret_cast<void *>(replacement));
        }
    }
    WImportHook(WImportHook const &) = delete;
    WImportHook &operator=(WImportHook const &) = delete;
    ~WImportHook() {
        if (m_Entry != nullptr) {
            Write(m_Original);
        }
    }

    /// Whether the library imports the function at all.
    bool IsActive() const { return m_Entry != nullptr; }

  private:
    void *Write(void *value) {
        DWORD protection = 0;
        VirtualProtect(static_cast<void *>(m_Entry), sizeof *m_Entry, PAGE_READWRITE, &protection);
        void *const previous = *m_Entry;
        *m_Entry = value;
        VirtualProtect(static_cast<void *>(m_Entry), sizeof *m_Entry, protection, &protection);
        return previous;
    }

    void **m_Entry;
    void *m_Original = nullptr;
};
