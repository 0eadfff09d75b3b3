// AbiExportsTest.cpp: the names that the library exports, against the list in tests/abi/exports.txt, and the version in
// its resources.
//
// The list has one line for each function and datum, demangled and sorted by bytes; constructors and destructors, which
// have several symbols, once. Data begin with "data". Names of std:: and boost:: types are left out: they come with
// the compiler and Boost and are no promise of ours.
//
// To renew the list after a wanted change, run the test and copy what it found over the list:
//
//     ./kt test -R test_abi; cp build/windows/temp/test_abi/exports.txt tests/abi/
//
// A line that disappears breaks every host that uses it.

#include "AbiExportsList.h"
#include "KTPublic.h"
#include "ModuleExports.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <sstream>
#include <string>
#include <string_view>

using namespace ktabi;

namespace {

bool IsForeign(std::string_view text) {
    for (std::string_view const kind : {"typeinfo for ", "typeinfo name for ", "vtable for ", "VTT for "}) {
        if (text.starts_with(kind)) {
            text.remove_prefix(kind.size());
        }
    }
    return text.starts_with("std::") || text.starts_with("boost::") || text.starts_with("__gnu_cxx::");
}

std::set<std::string> FoundLines() {
    std::set<std::string> lines;
    for (Export const &one : ReadExports(Library())) {
        if (!IsForeign(one.text)) {
            lines.insert((one.code ? "" : "data ") + one.text);
        }
    }
    return lines;
}

std::set<std::string> ListedLines() {
    std::set<std::string> lines;
    std::istringstream list(kAbiExportsList);
    for (std::string line; std::getline(list, line);) {
        if (!line.empty()) {
            lines.insert(line);
        }
    }
    return lines;
}

// The lines of `a` that are not in `b`.
std::string Difference(std::set<std::string> const &a, std::set<std::string> const &b) {
    std::vector<std::string> lines;
    std::set_difference(a.begin(), a.end(), b.begin(), b.end(), std::back_inserter(lines));
    std::string text;
    for (std::string const &line : lines) {
        text += "    " + line + "\n";
    }
    return text;
}

// One text of the library's version resource.
std::wstring VersionText(wchar_t const *name) {
    wchar_t path[MAX_PATH] = L"";
    GetModuleFileNameW(Library(), path, MAX_PATH);
    DWORD ignored = 0;
    std::vector<std::byte> data(GetFileVersionInfoSizeW(path, &ignored));
    if (data.empty() || GetFileVersionInfoW(path, 0, static_cast<DWORD>(data.size()), data.data()) == FALSE) {
        return L"no version resource";
    }
    void *text = nullptr;
    UINT length = 0;
    std::wstring const block = std::wstring(L"\\StringFileInfo\\040904B0\\") + name;
    if (VerQueryValueW(data.data(), block.c_str(), &text, &length) == FALSE) {
        return L"no such text";
    }
    return static_cast<wchar_t const *>(text);
}

TEST(AbiExportsTest, AreThoseOfTheList) {
    std::set<std::string> const found = FoundLines();
    std::set<std::string> const listed = ListedLines();
    auto const copy = std::filesystem::temp_directory_path() / "exports.txt";
    std::ofstream renewed(copy, std::ios::binary);
    for (std::string const &line : found) {
        renewed << line << '\n';
    }
    EXPECT_EQ("", Difference(listed, found)) << "no longer exported; the found list is in " << copy;
    EXPECT_EQ("", Difference(found, listed)) << "exported but not listed; the found list is in " << copy;
}

TEST(AbiExportsTest, DataAreReachedThroughTheHeaders) {
    EXPECT_EQ(static_cast<void *>(&gKTLogger), Symbol(Library(), "gKTLogger"));
    EXPECT_EQ(static_cast<void *>(&WKTLogger::creator), Symbol(Library(), "_ZN9WKTLogger7creatorE"));
    EXPECT_FALSE(IsCode(static_cast<void const *>(&gKTLogger)));
    EXPECT_FALSE(IsCode(&WKTLogger::creator));
    EXPECT_NE(nullptr, gKTLogger);
}

// Exceptions cross the boundary and memory is shared because host and library use the same run-time DLLs.
TEST(AbiExportsTest, RuntimeIsSharedWithTheHost) {
    for (HMODULE const module : {Library(), GetModuleHandleW(nullptr)}) {
        std::vector<std::string> const imports = ReadImportedModules(module);
        for (char const *const name : {"libstdc++-6.dll", "libgcc_s_seh-1.dll", "msvcrt.dll"}) {
            EXPECT_EQ(1, std::count(imports.begin(), imports.end(), name)) << name;
        }
    }
}

TEST(AbiExportsTest, VersionIsInTheResources) {
    EXPECT_EQ(L"1.0.0", VersionText(L"FileVersion"));
    EXPECT_EQ(L"1.0.0", VersionText(L"ProductVersion"));
    EXPECT_EQ(L"KTPublic", VersionText(L"ProductName"));
    EXPECT_EQ(L"KTPublic.dll", VersionText(L"OriginalFilename"));

    wchar_t path[MAX_PATH] = L"";
    GetModuleFileNameW(Library(), path, MAX_PATH);
    DWORD ignored = 0;
    std::vector<std::byte> data(GetFileVersionInfoSizeW(path, &ignored));
    ASSERT_FALSE(data.empty());
    ASSERT_NE(FALSE, GetFileVersionInfoW(path, 0, static_cast<DWORD>(data.size()), data.data()));
    void *fixed = nullptr;
    UINT length = 0;
    ASSERT_NE(FALSE, VerQueryValueW(data.data(), L"\\", &fixed, &length));
    auto const &numbers = *static_cast<VS_FIXEDFILEINFO const *>(fixed);
    EXPECT_EQ(0x00010000U, numbers.dwFileVersionMS);
    EXPECT_EQ(0x00000000U, numbers.dwFileVersionLS);
    EXPECT_EQ(static_cast<DWORD>(VFT_DLL), numbers.dwFileType);
}

} // namespace
