// DictionaryConversion.h: texts that are stored multibyte.
//
// An encoding is a number, as the binary form's header has it: 0 is none (UTF-16), 1 UTF-8 (code page 65001), any other
// number the system's ANSI code page (code page 0). Malformed text never fails: what cannot be decoded becomes U+FFFD in
// UTF-8, and whatever the system puts there in the ANSI code page. Any thread.

#pragma once

#include "KTUnitTraits.h"

#include <cstdint>
#include <exception>
#include <string>
#include <string_view>

namespace orvik_private {

using UnitsView = std::basic_string_view<unsigned short, KTUnitTraits>;

/// The units as bytes, in the host's byte order.
inline std::string_view BytesOf(UnitsView units) noexcept {
    return {reinterpret_cast<char const *>(units.data()), units.size() * sizeof(unsigned short)};
}

/// The reverse: where they are if their address is even, else in `scratch`.
UnitsView UnitsOf(std::string_view bytes, KTUnits &scratch);

constexpr int kEncodingNone = 0;
constexpr int kEncodingUtf8 = 1;
constexpr int kEncodingAnsi = 2;

/// A conversion that cannot be done.
class TextConversionException : public std::exception {
  public:
    static constexpr std::uint32_t kBufferTooSmall = 0x42554646; // "BUFF"
    static constexpr std::uint32_t kFailed = 0x6875683F;         // "huh?"

    explicit TextConversionException(std::uint32_t code) noexcept : m_Code(code) {}

    std::uint32_t Code() const noexcept { return m_Code; }
    char const *what() const noexcept override;

  private:
    std::uint32_t m_Code;
};

/// Converts multibyte text into a buffer of `capacity` units and returns how many it gave. Throws
/// TextConversionException: kBufferTooSmall when they do not fit, kFailed when the system refuses (text of 2 GiB and
/// more). REQUIRES: encoding is not kEncodingNone.
std::size_t ConvertMultibyte(int encoding, std::string_view bytes, unsigned short *units, std::size_t capacity);

/// The same into a string of the right size.
KTUnits MultibyteToUnits(int encoding, std::string_view bytes);

/// The text as multibyte. `lossy`, if not null, is set to true when a character has no place in the encoding and
/// another one stands in for it; else it stays as it is. Throws TextConversionException(kFailed) as above.
std::string UnitsToMultibyte(int encoding, UnitsView units, bool *lossy = nullptr);

// ---- the system's part: W files, and a stand-in for the native build ----

/// Units that the ANSI text gives; nothing is written when `capacity` is smaller. -1 when the system refuses.
std::int64_t AnsiToUnits(std::string_view bytes, unsigned short *units, std::size_t capacity);

/// Appends the ANSI form to `bytes`; false when the system refuses.
bool UnitsToAnsi(UnitsView units, std::string &bytes, bool *lossy);

} // namespace orvik_private
