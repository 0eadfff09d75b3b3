// OUtfBlocks.h: what the conversions of OUtf*.cpp share: blocks of 16 bytes and the filling of strings.
//
// SSE2, part of every x86-64 processor, is the baseline.

#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <emmintrin.h>
#include <string>

#if defined(__GNUC__)
#define O_INLINE inline __attribute__((always_inline))
// Aligned loads may read past the end of a text, never past the end of its memory page; the sanitizers cannot know.
#define O_READS_WHOLE_BLOCKS __attribute__((no_sanitize("address", "thread")))
#else
#define O_INLINE __forceinline
#define O_READS_WHOLE_BLOCKS
#endif

namespace OUtf {

using Byte = unsigned char;
using Unit = unsigned short;

constexpr Unit kReplacement = 0xFFFD;
constexpr std::size_t kBlock = 16;

O_INLINE __m128i Load(void const *from) { return _mm_loadu_si128(static_cast<__m128i const *>(from)); }
O_INLINE void Store(void *to, __m128i value) { _mm_storeu_si128(static_cast<__m128i *>(to), value); }
O_INLINE unsigned HighBits(__m128i bytes) { return static_cast<unsigned>(_mm_movemask_epi8(bytes)); }
O_INLINE std::size_t TrailingZeros(unsigned mask) { return static_cast<std::size_t>(std::countr_zero(mask)); }

template <typename T> O_INLINE T LoadAs(void const *from) {
    T value;
    std::memcpy(&value, from, sizeof value);
    return value;
}

template <typename T> O_INLINE void StoreAs(void *to, T value) { std::memcpy(to, &value, sizeof value); }

// Makes `text` hold `size` elements that `write(T *)` fills, without clearing them first where the library can do that.
template <typename String, typename Write> void FillExactly(String &text, std::size_t size, Write write) {
#if defined(__cpp_lib_string_resize_and_overwrite)
    text.resize_and_overwrite(size, [&](auto *to, std::size_t) {
        write(to);
        return size;
    });
#else
    text.resize(size);
    write(text.data());
#endif
}

// Sixteen ASCII characters to units.
O_INLINE void WidenBlock(__m128i bytes, Unit *to) {
    Store(to, _mm_unpacklo_epi8(bytes, _mm_setzero_si128()));
    Store(to + 8, _mm_unpackhi_epi8(bytes, _mm_setzero_si128()));
}

// Adds up the 0/1 bytes of at most 255 blocks that were subtracted as 0/-1 masks.
O_INLINE std::size_t SumBytes(__m128i counts) {
    __m128i const sums = _mm_sad_epu8(counts, _mm_setzero_si128());
    return static_cast<std::size_t>(_mm_cvtsi128_si64(sums)) +
           static_cast<std::size_t>(_mm_cvtsi128_si64(_mm_unpackhi_epi64(sums, sums)));
}

O_INLINE bool IsHighSurrogate(unsigned unit) { return (unit & 0xFC00) == 0xD800; }
O_INLINE bool IsLowSurrogate(unsigned unit) { return (unit & 0xFC00) == 0xDC00; }

} // namespace OUtf
