// OUtf.cpp: lengths of zero-terminated text, and the conversions that are no more than a copy. UTF-8 is in
// OUtfDecode.cpp and OUtfEncode.cpp.

#include "OUtf.h"

#include "OUtfBlocks.h"

#include <cwchar>

using namespace OUtf;

namespace {

// Position of the first zero element, in aligned blocks from the one that holds the first element.
template <typename Compare> O_READS_WHOLE_BLOCKS O_INLINE std::size_t BytesBeforeZero(void const *text, Compare zeros) {
    auto const address = reinterpret_cast<std::uintptr_t>(text);
    auto const *block = reinterpret_cast<__m128i const *>(address & ~static_cast<std::uintptr_t>(kBlock - 1));
    unsigned const skipped = static_cast<unsigned>(address & (kBlock - 1));
    unsigned const first = HighBits(zeros(_mm_load_si128(block))) >> skipped;
    if (first != 0) {
        return TrailingZeros(first);
    }
    unsigned found = 0;
    do {
        found = HighBits(zeros(_mm_load_si128(++block)));
    } while (found == 0);
    return reinterpret_cast<std::uintptr_t>(block) - address + TrailingZeros(found);
}

} // namespace

O_READS_WHOLE_BLOCKS std::size_t OByteLength(char const *text) noexcept {
    return BytesBeforeZero(text, [](__m128i block) { return _mm_cmpeq_epi8(block, _mm_setzero_si128()); });
}

O_READS_WHOLE_BLOCKS std::size_t OUnitLength(unsigned short const *text) noexcept {
    if ((reinterpret_cast<std::uintptr_t>(text) & 1U) != 0) {
        return KTUnitTraits::length(text); // units across the blocks' borders: only from an odd address
    }
    return BytesBeforeZero(text, [](__m128i block) { return _mm_cmpeq_epi16(block, _mm_setzero_si128()); }) /
           sizeof(Unit);
}

KTUnits OWidenSigned(std::string_view bytes) {
    KTUnits units;
    FillExactly(units, bytes.size(), [&](Unit *to) {
        for (char const byte : bytes) {
            *to++ = static_cast<Unit>(
                static_cast<short>(static_cast<signed char>(byte))); // NOLINT(bugprone-signed-char-misuse)
        }
    });
    return units;
}

std::size_t OWideLength(wchar_t const *text) noexcept {
    if constexpr (sizeof(wchar_t) == sizeof(Unit)) {
        return OUnitLength(reinterpret_cast<Unit const *>(text)); // reads whole blocks, whatever their type
    } else {
        return std::wcslen(text);
    }
}

KTUnits OWideToUnits(wchar_t const *text, std::size_t count) {
    KTUnits units;
    FillExactly(units, count, [&](Unit *to) {
        if constexpr (sizeof(wchar_t) == sizeof(Unit)) {
            std::memcpy(to, text, count * sizeof(Unit));
        } else {
            for (std::size_t i = 0; i < count; ++i) {
                to[i] = static_cast<Unit>(text[i]);
            }
        }
    });
    return units;
}

std::wstring OUnitsToWide(unsigned short const *units, std::size_t count) {
    std::wstring text;
    FillExactly(text, count, [&](wchar_t *to) {
        if constexpr (sizeof(wchar_t) == sizeof(Unit)) {
            std::memcpy(to, units, count * sizeof(Unit));
        } else {
            for (std::size_t i = 0; i < count; ++i) {
                to[i] = units[i];
            }
        }
    });
    return text;
}
