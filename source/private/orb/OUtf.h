// OUtf.h: conversions between bytes and UTF-16 code units.
//
// The one place where text changes its encoding. All functions are pure: any thread, no state, no locale.

#pragma once

#include "KTUnitTraits.h"

#include <cstddef>
#include <string>
#include <string_view>

/// Number of bytes before the terminating zero. REQUIRES: text is not null.
std::size_t OByteLength(char const *text) noexcept;

/// Number of units before the terminating zero. REQUIRES: text is not null.
std::size_t OUnitLength(unsigned short const *text) noexcept;

/// Decodes UTF-8 (Unicode 15, section 3.9): every maximal ill-formed part of the input becomes one U+FFFD.
KTUnits OUtf8ToUnits(std::string_view bytes);

/// The same for zero-terminated text, which is read once less where it is ASCII. REQUIRES: text is not null.
KTUnits OUtf8TextToUnits(char const *text);

/// Encodes as UTF-8; an unpaired surrogate becomes U+FFFD.
std::string OUnitsToUtf8(unsigned short const *units, std::size_t count);

/// One unit for each byte, sign-extended: 0x41 gives 0x0041, 0xE9 gives 0xFFE9.
KTUnits OWidenSigned(std::string_view bytes);

/// Number of wide characters before the terminating zero. REQUIRES: text is not null.
std::size_t OWideLength(wchar_t const *text) noexcept;

/// One unit for each wide character: its low 16 bits, which is all of it on Windows.
KTUnits OWideToUnits(wchar_t const *text, std::size_t count);

/// One wide character for each unit.
std::wstring OUnitsToWide(unsigned short const *units, std::size_t count);

/// The two conversions as every x86-64 processor can do them. The ones above take these where it has nothing better;
/// apart from that they are for tests.
KTUnits OUtf8ToUnitsBaseline(std::string_view bytes);
std::string OUnitsToUtf8Baseline(unsigned short const *units, std::size_t count);
