// AbiHostUnits.h: the translation units of AbiHostUnit.cpp, which use the library with <windows.h> around its headers.

#pragma once

#include <string>

namespace ktabi {

std::string UseLibraryWindowsFirst();
std::string UseLibraryWindowsLast();
std::string UseLibraryWindowsFirstUnicode();
std::string UseLibraryWindowsLastUnicode();

} // namespace ktabi
