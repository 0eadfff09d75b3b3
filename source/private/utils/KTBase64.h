// KTBase64.h: Base64 with the standard alphabet (RFC 4648, section 4), as KTPublicUtils offers it.
//
//     bytes       aaaaaaaa bbbbbbbb cccccccc
//     characters  aaaaaa aabbbb bbbbcc cccccc       each 6 bits, most significant first, through the alphabet
//
// Encoding pads with "=" to whole groups of four and breaks no lines. Decoding skips white space and "=" anywhere and
// knows no groups: bits are collected over all characters, whole bytes come out, and what is left at the end is dropped.

#pragma once

#include <array>
#include <cstddef>
#include <stdexcept>
#include <string>
#include <string_view>

namespace KTBase64 {

using Byte = unsigned char;

inline constexpr std::string_view kAlphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

/// What no character of the alphabet stands for.
inline constexpr Byte kNoValue = 0xFF;

/// The six bits that each character stands for, or kNoValue.
inline constexpr std::array<Byte, 256> kValues = [] {
    std::array<Byte, 256> values{};
    values.fill(kNoValue);
    for (std::size_t value = 0; value < kAlphabet.size(); ++value) {
        values[static_cast<Byte>(kAlphabet[value])] = static_cast<Byte>(value);
    }
    return values;
}();

/// More bytes than these have no encoded size that a 64-bit number holds.
inline constexpr std::size_t kMostBytes = 0xBFFFFFFFFFFFFFFD;

/// Characters that encode so many bytes. Throws std::length_error for more than kMostBytes.
constexpr std::size_t EncodedSize(std::size_t size) {
    if (size > kMostBytes) {
        throw std::length_error("Converting too large a string to base64.");
    }
    return (size + 2) / 3 * 4;
}

/// Whether the encoder wrote as many characters, padding included, as the text holds. Anything else is reported as an
/// assertion without a message.
bool IsWhole(std::size_t written, std::size_t size);

/// Which code does the long runs: the processor's byte shuffles (SSE4.1) where there are any, or plain tables.
enum class Runs { Fastest, Plain };

/// The bytes as text; empty if IsWhole finds it is not whole. Throws std::length_error.
std::string Encode(std::string_view bytes, Runs runs = Runs::Fastest);

/// The bytes that the text stands for. Throws std::invalid_argument at a character that is neither of the alphabet, nor
/// "=", nor white space to isspace.
std::string Decode(std::string_view text, Runs runs = Runs::Fastest);

// ---- the long runs, in KTBase64Sse41.cpp; call them only where OUtf::HasSse41() ----

inline constexpr std::size_t kRunBytes = 12;      // bytes and characters of one step
inline constexpr std::size_t kRunCharacters = 16; // is also what either step reads and writes

/// Encodes from the front while 16 bytes are left, and returns how many bytes that were, a multiple of kRunBytes.
/// REQUIRES: room for all the characters.
std::size_t EncodeRunSse41(Byte const *from, std::size_t size, char *to) noexcept;

/// Decodes from the front while the next 16 characters are all of the alphabet, and returns how many characters that
/// were. REQUIRES: room for four bytes more than it gives.
std::size_t DecodeRunSse41(Byte const *from, std::size_t size, char *to) noexcept;

} // namespace KTBase64
