// ModuleExports.h: what a loaded DLL exports, read from its export directory in memory.
//
//     DOS header -> e_lfanew -> NT headers -> data directory 0 -> IMAGE_EXPORT_DIRECTORY
//         AddressOfNames[i]         u32   offset of the zero-terminated name
//         AddressOfNameOrdinals[i]  u16   index into AddressOfFunctions
//         AddressOfFunctions[j]     u32   offset of the code or data
//
// Names are demangled, and the standard string types that they are full of are written the way the headers write them.

#pragma once

#include "ModuleHandles.h"

#include <cstdlib>
#include <cxxabi.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace ktabi {

/// One exported name.
struct Export {
    std::string symbol; ///< as in the export directory
    std::string text;   ///< demangled and shortened
    std::byte *address; ///< in this process
    bool code;          ///< a function; data otherwise
};

/// Writes the standard string types as the headers do.
inline std::string ShortenStandardNames(std::string text) {
    static std::pair<char const *, char const *> const names[] = {
        {"std::__cxx11::basic_string<char, std::char_traits<char>, std::allocator<char> >", "std::string"},
        {"std::__cxx11::basic_string<wchar_t, std::char_traits<wchar_t>, std::allocator<wchar_t> >", "std::wstring"},
        {"std::__cxx11::basic_string<unsigned short, KTUnitTraits, KTUnitAllocator<unsigned short> >", "KTUnits"},
        {"std::basic_string_view<char, std::char_traits<char> >", "std::string_view"}};
    for (auto const &[longName, shortName] : names) {
        std::string const wanted = longName;
        for (auto at = text.find(wanted); at != std::string::npos; at = text.find(wanted, at)) {
            text.replace(at, wanted.size(), shortName);
        }
    }
    return text;
}

/// The C++ name behind a symbol; the symbol itself if it is none.
inline std::string Demangle(std::string const &symbol) {
    int status = 0;
    std::unique_ptr<char, decltype(&std::free)> const text(
        symbol.starts_with("_Z") ? abi::__cxa_demangle(symbol.c_str(), nullptr, nullptr, &status) : nullptr,
        &std::free);
    return ShortenStandardNames(text ? text.get() : symbol);
}

/// Whether the page at this address may be executed: tells functions from data, and a table's entries from what follows.
inline bool IsCode(void const *address) {
    MEMORY_BASIC_INFORMATION page{};
    constexpr DWORD executable = PAGE_EXECUTE | PAGE_EXECUTE_READ | PAGE_EXECUTE_READWRITE | PAGE_EXECUTE_WRITECOPY;
    return VirtualQuery(address, &page, sizeof page) != 0 && page.State == MEM_COMMIT &&
           (page.Protect & executable) != 0;
}

/// Everything that the module exports by name, in the order of its directory.
inline std::vector<Export> ReadExports(HMODULE module) {
    auto *const base = reinterpret_cast<std::byte *>(module);
    auto const &directory = *At<IMAGE_EXPORT_DIRECTORY>(base, DataDirectory(base, IMAGE_DIRECTORY_ENTRY_EXPORT));
    auto const *const names = At<DWORD>(base, directory.AddressOfNames);
    auto const *const ordinals = At<WORD>(base, directory.AddressOfNameOrdinals);
    auto const *const functions = At<DWORD>(base, directory.AddressOfFunctions);
    std::vector<Export> exports;
    for (DWORD i = 0; i < directory.NumberOfNames; ++i) {
        std::string const symbol = At<char>(base, names[i]);
        std::byte *const address = base + functions[ordinals[i]];
        exports.push_back({symbol, Demangle(symbol), address, IsCode(address)});
    }
    return exports;
}

/// The names of the DLLs that the module was linked to.
inline std::vector<std::string> ReadImportedModules(HMODULE module) {
    auto *const base = reinterpret_cast<std::byte *>(module);
    std::vector<std::string> modules;
    auto const *entry = At<IMAGE_IMPORT_DESCRIPTOR>(base, DataDirectory(base, IMAGE_DIRECTORY_ENTRY_IMPORT));
    for (; entry->Name != 0; ++entry) {
        modules.emplace_back(At<char>(base, entry->Name));
    }
    return modules;
}

} // namespace ktabi
