// VTable.h: reads the virtual tables of exported classes and compares them with a list of slots, one line a class.
//
//     VTableRow const table = VTableOf<KTFile>({"~", "KTFile::PathChanged(OString const&)"});
//     EXPECT_EQ("", CheckVTable(table));
//
// A table in memory, as the Itanium C++ ABI lays it out; an object's first word points to entry 0:
//
//     -16  i64    offset to the top of the object
//      -8  void*  type information
//       0  void*  entry 0: code of the first virtual function, in the order of declaration; a destructor takes two
//                 entries: the complete one, which destroys, and the deleting one, which also frees
//
// Slots are written as the demangled name of the function that the entry leads to, with these short forms:
//
//     "~"      the class's own destructor, two entries
//     "inline" a function that a header defines, which has no exported name: any code will do, so call it in a test
//     "pure"   a function without an implementation in this class: null, as the linker leaves the compiler's weak
//              reference to the function that would report such a call, or that function
//     "pure ~" the destructor of a class with such functions, two entries of the same kind: no object has this table
//              when a destructor is looked up in it
//
// Only classes with one table are read, that is, without a second base that has virtual functions.

#pragma once

#include "ModuleExports.h"

#include <cstring>
#include <initializer_list>
#include <sstream>
#include <string>
#include <typeinfo>
#include <vector>

namespace ktabi {

/// One row of a list of tables.
struct VTableRow {
    std::string mangledClass;       ///< the class as symbols name it: "7KTMutex"
    std::vector<std::string> slots; ///< see the top of this file
    std::size_t entriesInHeader;    ///< entries according to the header that the host was compiled with
};

/// GoogleTest's name for a row.
inline void PrintTo(VTableRow const &row, std::ostream *out) { *out << row.mangledClass; }

/// The entry that a pointer to a virtual member function stands for; such a pointer's first word is 1 + 8 * entry.
template <typename Member> std::size_t EntryOf(Member member) {
    static_assert(sizeof member == 2 * sizeof(std::size_t));
    std::size_t word = 0;
    std::memcpy(&word, &member, sizeof word);
    return (word - 1) / sizeof(void *);
}

/// Adds one virtual function to a class: it takes the first free entry, so its place is the length of the class's table.
template <typename Class> class FirstFreeEntry : public Class {
  public:
    virtual void KTAbiFirstFreeEntry() = 0;
};

/// Declares the slots of one class, in order.
template <typename Class> VTableRow VTableOf(std::initializer_list<char const *> slots) {
    return {typeid(Class).name(), {slots.begin(), slots.end()}, EntryOf(&FirstFreeEntry<Class>::KTAbiFirstFreeEntry)};
}

/// An object's table: the address of entry 0.
inline void *const *TableOfObject(void const *object) { return *static_cast<void *const *const *>(object); }

/// The table that the library exports for a class, as TableOfObject gives it; null if it exports none.
inline void *const *ExportedTable(std::string const &mangledClass) {
    std::byte *const table = Symbol(Library(), ("_ZTV" + mangledClass).c_str());
    return table == nullptr ? nullptr : reinterpret_cast<void *const *>(table) + 2;
}
template <typename Class> void *const *ExportedTable() { return ExportedTable(typeid(Class).name()); }

/// Calls a function without arguments through an object's table.
inline void CallEntry(void *object, std::size_t entry) {
    reinterpret_cast<void (*)(void *)>(TableOfObject(object)[entry])(object);
}

/// Follows the jump through the import table ("FF 25", offset from the next instruction) that calls into other DLLs
/// are made with.
inline void *FollowImport(void *code) {
    auto const *const bytes = static_cast<unsigned char const *>(code);
    if (bytes[0] != 0xFF || bytes[1] != 0x25) {
        return code;
    }
    std::int32_t offset = 0;
    std::memcpy(&offset, bytes + 2, sizeof offset);
    void *target = nullptr;
    std::memcpy(static_cast<void *>(&target), bytes + 6 + offset, sizeof target);
    return target;
}

/// The entries that the slots take, as symbols or demangled names.
inline std::vector<std::string> ExpectedEntries(VTableRow const &row) {
    bool const nested = row.mangledClass.starts_with('N');
    std::string const scope = nested ? row.mangledClass.substr(1, row.mangledClass.size() - 2) : row.mangledClass;
    std::vector<std::string> entries;
    for (std::string const &slot : row.slots) {
        if (slot == "~") {
            entries.push_back("_ZN" + scope + "D1Ev");
            entries.push_back("_ZN" + scope + "D0Ev");
        } else if (slot == "pure ~") {
            entries.insert(entries.end(), 2, "pure");
        } else {
            entries.push_back(slot);
        }
    }
    return entries;
}

/// Whether one of the exports is that code under that name, a symbol or its demangled form.
inline bool IsExportedAs(void const *code, std::string const &name, std::vector<Export> const &exports) {
    for (Export const &one : exports) {
        if (one.address == code && (one.symbol == name || one.text == name)) {
            return true;
        }
    }
    return false;
}

/// Whether an entry holds the function of that name, the library's own or one inherited from the standard library.
inline bool IsFunction(void *code, std::string const &name, std::vector<Export> const &exports) {
    HMODULE const standardLibrary = GetModuleHandleW(L"libstdc++-6.dll");
    if (name == "pure") {
        return code == nullptr || FollowImport(code) == Symbol(standardLibrary, "__cxa_pure_virtual");
    }
    if (code == nullptr || name == "inline") {
        return code != nullptr;
    }
    if (IsExportedAs(code, name, exports)) {
        return true;
    }
    void *const imported = FollowImport(code);
    return imported != code && IsExportedAs(imported, name, ReadExports(standardLibrary));
}

/// All exported names of an address, for messages.
inline std::string NamesOf(void const *code, std::vector<Export> const &exports) {
    std::string names;
    for (Export const &one : exports) {
        if (one.address == code) {
            names += " " + one.symbol;
        }
    }
    return names.empty() ? " nothing exported" : names;
}

/// Reads the class's table in the library. Returns what is different from the list, one line each: entries, the
/// table's length in the library and its length in the header; nothing if all is as declared.
inline std::string CheckVTable(VTableRow const &row) {
    std::ostringstream problems;
    void *const *const table = ExportedTable(row.mangledClass);
    if (table == nullptr) {
        return "the library exports no table of " + row.mangledClass + "\n";
    }
    if (table[-2] != nullptr) {
        problems << "the offset to the top is not 0\n";
    }
    if (table[-1] != Symbol(Library(), ("_ZTI" + row.mangledClass).c_str())) {
        problems << "the type information is not that of " << row.mangledClass << "\n";
    }
    std::vector<Export> const exports = ReadExports(Library());
    std::vector<std::string> const expected = ExpectedEntries(row);
    for (std::size_t i = 0; i < expected.size(); ++i) {
        if (table[i] != nullptr && !IsCode(table[i])) {
            problems << "the table ends at entry " << i << ", expected " << expected[i] << "\n";
            break;
        }
        if (!IsFunction(table[i], expected[i], exports)) {
            problems << "entry " << i << " is" << NamesOf(table[i], exports) << ", expected " << expected[i] << "\n";
        }
    }
    // What follows a table is padding or the next table's offset to the top: never an address of code.
    if (IsCode(table[expected.size()])) {
        problems << "one more entry:" << NamesOf(table[expected.size()], exports) << "\n";
    }
    if (row.entriesInHeader != expected.size()) {
        problems << "the header declares " << row.entriesInHeader << " entries, expected " << expected.size() << "\n";
    }
    return problems.str();
}

} // namespace ktabi
