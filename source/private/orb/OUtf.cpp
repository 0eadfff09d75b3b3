// OUtf.cpp: UTF-8 and UTF-16, fast where text is plain and exact where it is broken.
//
// Decoding takes three passes over memory that mostly stays in the cache: find the end, count the units that the bytes
// will give, decode into storage of exactly that size. Counting assumes well-formed text; the decoder stops at the first
// ill-formed byte, and only then a slow pass counts again with replacements and decodes the rest.
//
//     code points          UTF-8 bytes                          UTF-16 units
//     U+0000..U+007F       0xxxxxxx                             1
//     U+0080..U+07FF       110xxxxx 10xxxxxx                    1
//     U+0800..U+FFFF       1110xxxx 10xxxxxx 10xxxxxx           1   (surrogates excluded)
//     U+10000..U+10FFFF    11110xxx 10xxxxxx 10xxxxxx 10xxxxxx  2   (a surrogate pair)
//
// SSE2, part of every x86-64 processor, does sixteen ASCII characters or eight two-byte characters at a time.

#include "OUtf.h"

#include <bit>
#include <cstdint>
#include <cstring>
#include <cwchar>
#include <emmintrin.h>

#if defined(__GNUC__)
#define O_INLINE inline __attribute__((always_inline))
// Aligned loads may read past the end of a text, never past the end of its memory page; the sanitizers cannot know.
#define O_READS_WHOLE_BLOCKS __attribute__((no_sanitize("address", "thread")))
#else
#define O_INLINE __forceinline
#define O_READS_WHOLE_BLOCKS
#endif

namespace {

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

// ---- counting ----

// Adds up the 0/1 bytes of at most 255 blocks that were subtracted as 0/-1 masks.
O_INLINE std::size_t SumBytes(__m128i counts) {
    __m128i const sums = _mm_sad_epu8(counts, _mm_setzero_si128());
    return static_cast<std::size_t>(_mm_cvtsi128_si64(sums)) +
           static_cast<std::size_t>(_mm_cvtsi128_si64(_mm_unpackhi_epi64(sums, sums)));
}

// Units that well-formed UTF-8 gives: one for each byte that starts a character, one more for each that starts a
// four-byte character.
std::size_t CountUnits(Byte const *from, std::size_t size) {
    std::size_t units = 0;
    Byte const *const end = from + size;
    __m128i const lastContinuation = _mm_set1_epi8(static_cast<char>(0xBF));
    __m128i const firstOfFour = _mm_set1_epi8(static_cast<char>(0xF0));
    while (static_cast<std::size_t>(end - from) >= kBlock) {
        std::size_t const left = static_cast<std::size_t>(end - from) / kBlock;
        std::size_t blocks = left < 127 ? left : 127; // each block adds at most 2 to a counter of 8 bits
        __m128i counts = _mm_setzero_si128();
        for (; blocks != 0; --blocks, from += kBlock) {
            __m128i const bytes = Load(from);
            __m128i const starts = _mm_cmpgt_epi8(bytes, lastContinuation);
            __m128i const fours = _mm_cmpeq_epi8(_mm_max_epu8(bytes, firstOfFour), bytes);
            counts = _mm_sub_epi8(_mm_sub_epi8(counts, starts), fours);
        }
        units += SumBytes(counts);
    }
    for (; from != end; ++from) {
        units += static_cast<std::size_t>((*from & 0xC0) != 0x80) + static_cast<std::size_t>(*from >= 0xF0);
    }
    return units;
}

O_INLINE bool IsHighSurrogate(unsigned unit) { return (unit & 0xFC00) == 0xD800; }
O_INLINE bool IsLowSurrogate(unsigned unit) { return (unit & 0xFC00) == 0xDC00; }

// Bytes that the units give: 1, 2 or 3 each, and 4 instead of 6 for a surrogate pair.
std::size_t CountBytes(Unit const *from, std::size_t count) {
    std::size_t bytes = count;
    std::size_t i = 0;
    __m128i const zero = _mm_setzero_si128();
    __m128i const surrogateBits = _mm_set1_epi16(static_cast<short>(0xFC00));
    __m128i const high = _mm_set1_epi16(static_cast<short>(0xD800));
    __m128i const low = _mm_set1_epi16(static_cast<short>(0xDC00));
    while (count - i > 8) { // one unit past the block is read, for the second half of a pair
        std::size_t const left = (count - i - 1) / 8;
        std::size_t blocks =
            left < 63 ? left : 63; // each block adds at most 2 to each byte of a counter, bias included
        __m128i extra = zero;
        __m128i pairs = zero;
        for (; blocks != 0; --blocks, i += 8) {
            __m128i const units = Load(from + i);
            __m128i const next = Load(from + i + 1);
            __m128i const two = _mm_cmpeq_epi16(_mm_and_si128(units, _mm_set1_epi16(static_cast<short>(0xFF80))), zero);
            __m128i const three =
                _mm_cmpeq_epi16(_mm_and_si128(units, _mm_set1_epi16(static_cast<short>(0xF800))), zero);
            __m128i const pair = _mm_and_si128(_mm_cmpeq_epi16(_mm_and_si128(units, surrogateBits), high),
                                               _mm_cmpeq_epi16(_mm_and_si128(next, surrogateBits), low));
            extra = _mm_add_epi16(_mm_add_epi16(extra, _mm_set1_epi16(2)), _mm_add_epi16(two, three));
            pairs = _mm_sub_epi16(pairs, pair);
        }
        bytes += SumBytes(extra);
        bytes -= 2 * SumBytes(pairs);
    }
    for (; i < count; ++i) {
        unsigned const unit = from[i];
        bytes += static_cast<std::size_t>(unit >= 0x80) + static_cast<std::size_t>(unit >= 0x800);
        if (IsHighSurrogate(unit) && i + 1 < count && IsLowSurrogate(from[i + 1])) {
            bytes -= 2;
        }
    }
    return bytes;
}

// ---- decoding ----

struct Decoder {
    Byte const *from;
    Byte const *end;
    Unit *to;
    Unit *toEnd; // storage may be written up to here
};

O_INLINE bool IsContinuation(unsigned byte) { return (byte & 0xC0) == 0x80; }

// Copies ASCII until another byte comes or less than a block is left on either side.
O_INLINE void TakeAscii(Decoder &d) {
    __m128i const zero = _mm_setzero_si128();
    while (static_cast<std::size_t>(d.end - d.from) >= 2 * kBlock &&
           static_cast<std::size_t>(d.toEnd - d.to) >= 2 * kBlock) {
        __m128i const a = Load(d.from);
        __m128i const b = Load(d.from + kBlock);
        if (HighBits(_mm_or_si128(a, b)) != 0) {
            break;
        }
        Store(d.to, _mm_unpacklo_epi8(a, zero));
        Store(d.to + 8, _mm_unpackhi_epi8(a, zero));
        Store(d.to + 16, _mm_unpacklo_epi8(b, zero));
        Store(d.to + 24, _mm_unpackhi_epi8(b, zero));
        d.from += 2 * kBlock;
        d.to += 2 * kBlock;
    }
    while (static_cast<std::size_t>(d.end - d.from) >= kBlock && static_cast<std::size_t>(d.toEnd - d.to) >= kBlock) {
        __m128i const bytes = Load(d.from);
        Store(d.to, _mm_unpacklo_epi8(bytes, zero));
        Store(d.to + 8, _mm_unpackhi_epi8(bytes, zero));
        unsigned const other = HighBits(bytes);
        std::size_t const plain = other == 0 ? kBlock : TrailingZeros(other);
        d.from += plain;
        d.to += plain;
        if (other != 0) {
            return;
        }
    }
}

// Takes two-byte characters, eight at a time: each 16-bit lane holds a lead byte (low) and a continuation byte (high).
O_INLINE void TakeTwoByteRun(Decoder &d) {
    while (static_cast<std::size_t>(d.end - d.from) >= kBlock && d.toEnd - d.to >= 8) {
        __m128i const lanes = Load(d.from);
        __m128i const shape = _mm_and_si128(lanes, _mm_set1_epi16(static_cast<short>(0xC0E0)));
        __m128i const wellShaped = _mm_cmpeq_epi16(shape, _mm_set1_epi16(static_cast<short>(0x80C0)));
        __m128i const overlong = _mm_cmpeq_epi16(_mm_and_si128(lanes, _mm_set1_epi16(0x001E)), _mm_setzero_si128());
        unsigned const bad = ~HighBits(_mm_andnot_si128(overlong, wellShaped)) & 0xFFFFU;
        __m128i const lead = _mm_slli_epi16(_mm_and_si128(lanes, _mm_set1_epi16(0x001F)), 6);
        __m128i const tail = _mm_and_si128(_mm_srli_epi16(lanes, 8), _mm_set1_epi16(0x003F));
        Store(d.to, _mm_or_si128(lead, tail));
        std::size_t const bytes = bad == 0 ? kBlock : TrailingZeros(bad);
        d.from += bytes;
        d.to += bytes / 2;
        if (bad != 0) {
            return;
        }
    }
}

// Takes three-byte characters while at least four bytes are left to load.
O_INLINE void TakeThreeByteRun(Decoder &d) {
    while (d.end - d.from >= 4) {
        auto const word = LoadAs<std::uint32_t>(d.from);
        unsigned const unit = ((word & 0x0F) << 12) | ((word >> 2) & 0x0FC0) | ((word >> 16) & 0x3F);
        if ((word & 0xC0C0F0) != 0x8080E0 || unit < 0x800 || (unit & 0xF800) == 0xD800) {
            return;
        }
        *d.to++ = static_cast<Unit>(unit);
        d.from += 3;
    }
}

O_INLINE void PutPair(Unit *to, unsigned codePoint) {
    std::uint32_t const offset = codePoint - 0x10000;
    StoreAs<std::uint32_t>(to, (0xD800 + (offset >> 10)) | ((0xDC00 + (offset & 0x3FF)) << 16));
}

// Takes four-byte characters.
O_INLINE void TakeFourByteRun(Decoder &d) {
    while (d.end - d.from >= 4) {
        auto const word = LoadAs<std::uint32_t>(d.from);
        unsigned const codePoint =
            ((word & 0x07) << 18) | ((word & 0x3F00) << 4) | ((word >> 10) & 0x0FC0) | ((word >> 24) & 0x3F);
        if ((word & 0xC0C0C0F8) != 0x808080F0 || codePoint - 0x10000 > 0xFFFFF) {
            return;
        }
        PutPair(d.to, codePoint);
        d.to += 2;
        d.from += 4;
    }
}

// One character of any length with its bounds checked. `length` 0 means ill-formed.
struct Character {
    unsigned codePoint;
    unsigned length;
};

Character TakeOne(Byte const *from, Byte const *end) {
    unsigned const lead = from[0];
    auto const left = static_cast<std::size_t>(end - from);
    if (lead < 0x80) {
        return {lead, 1};
    }
    if (lead >= 0xC2 && lead < 0xE0 && left >= 2 && IsContinuation(from[1])) {
        return {((lead & 0x1FU) << 6) | (from[1] & 0x3FU), 2};
    }
    if ((lead & 0xF0) == 0xE0 && left >= 3 && IsContinuation(from[1]) && IsContinuation(from[2])) {
        unsigned const value = ((lead & 0x0FU) << 12) | ((from[1] & 0x3FU) << 6) | (from[2] & 0x3FU);
        return {value, value >= 0x800 && (value & 0xF800) != 0xD800 ? 3U : 0U};
    }
    if ((lead & 0xF8) == 0xF0 && left >= 4 && IsContinuation(from[1]) && IsContinuation(from[2]) &&
        IsContinuation(from[3])) {
        unsigned const value =
            ((lead & 0x07U) << 18) | ((from[1] & 0x3FU) << 12) | ((from[2] & 0x3FU) << 6) | (from[3] & 0x3FU);
        return {value, value >= 0x10000 && value <= 0x10FFFF ? 4U : 0U};
    }
    return {kReplacement, 0};
}

// Decodes until the end or the first ill-formed byte.
void DecodeWellFormed(Decoder &d) {
    while (d.from != d.end) {
        TakeAscii(d);
        if (d.from == d.end) {
            return;
        }
        if (*d.from >= 0xC2 && *d.from < 0xE0) {
            TakeTwoByteRun(d);
        } else if (*d.from >= 0xE0 && *d.from < 0xF0) {
            TakeThreeByteRun(d);
        } else if (*d.from >= 0xF0) {
            TakeFourByteRun(d);
        }
        // What the runs leave: the last bytes of the text, single characters, and everything ill-formed.
        if (d.from == d.end) {
            return;
        }
        Character const one = TakeOne(d.from, d.end);
        if (one.length == 0) {
            return;
        }
        if (one.codePoint >= 0x10000) {
            PutPair(d.to, one.codePoint);
            d.to += 2;
        } else {
            *d.to++ = static_cast<Unit>(one.codePoint);
        }
        d.from += one.length;
    }
}

// Length of the maximal ill-formed part at `from`: the longest prefix of a well-formed sequence, and at least one byte.
std::size_t IllFormedLength(Byte const *from, Byte const *end) {
    unsigned const lead = from[0];
    if (lead < 0xC2 || lead > 0xF4 || end - from < 2) {
        return 1;
    }
    // The second byte's range depends on the lead (Unicode 15, table 3-7).
    unsigned const lowest = lead == 0xE0 ? 0xA0 : lead == 0xF0 ? 0x90 : 0x80;
    unsigned const highest = lead == 0xED ? 0x9F : lead == 0xF4 ? 0x8F : 0xBF;
    if (from[1] < lowest || from[1] > highest) {
        return 1;
    }
    std::size_t const expected = lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : 4;
    std::size_t length = 2;
    while (length < expected && from + length != end && IsContinuation(from[length])) {
        ++length;
    }
    return length;
}

// Counts the units of text that is not well-formed, replacements included.
std::size_t CountUnitsWithReplacements(Byte const *from, Byte const *end) {
    std::size_t units = 0;
    while (from != end) {
        Character const one = TakeOne(from, end);
        units += one.length == 4 ? 2 : 1;
        from += one.length != 0 ? one.length : IllFormedLength(from, end);
    }
    return units;
}

KTUnits DecodeWithReplacements(Byte const *from, Byte const *end) {
    KTUnits units;
    std::size_t const count = CountUnitsWithReplacements(from, end);
    FillExactly(units, count, [&](Unit *to) {
        Decoder d{from, end, to, to + count};
        for (;;) {
            DecodeWellFormed(d);
            if (d.from == end) {
                return;
            }
            *d.to++ = kReplacement;
            d.from += IllFormedLength(d.from, end);
        }
    });
    return units;
}

// ---- encoding ----

struct Encoder {
    Unit const *from;
    Unit const *end;
    Byte *to;
    Byte *toEnd;
};

O_INLINE bool HasBlock(Encoder const &e, std::size_t units, std::size_t bytes) {
    return static_cast<std::size_t>(e.end - e.from) >= units && static_cast<std::size_t>(e.toEnd - e.to) >= bytes;
}

// Packs ASCII until another unit comes or less than a block is left on either side.
O_INLINE void PutAscii(Encoder &e) {
    __m128i const other = _mm_set1_epi16(static_cast<short>(0xFF80));
    __m128i const zero = _mm_setzero_si128();
    while (HasBlock(e, 2 * kBlock, 2 * kBlock)) {
        __m128i const a = Load(e.from);
        __m128i const b = Load(e.from + 8);
        __m128i const c = Load(e.from + 16);
        __m128i const d = Load(e.from + 24);
        __m128i const all = _mm_or_si128(_mm_or_si128(a, b), _mm_or_si128(c, d));
        if (HighBits(_mm_cmpeq_epi16(_mm_and_si128(all, other), zero)) != 0xFFFF) {
            break;
        }
        Store(e.to, _mm_packus_epi16(a, b));
        Store(e.to + kBlock, _mm_packus_epi16(c, d));
        e.from += 2 * kBlock;
        e.to += 2 * kBlock;
    }
    while (HasBlock(e, 8, 8)) {
        __m128i const units = Load(e.from);
        _mm_storel_epi64(reinterpret_cast<__m128i *>(e.to), _mm_packus_epi16(units, units));
        unsigned const bad = ~HighBits(_mm_cmpeq_epi16(_mm_and_si128(units, other), zero)) & 0xFFFFU;
        std::size_t const plain = bad == 0 ? 8 : TrailingZeros(bad) / 2;
        e.from += plain;
        e.to += plain;
        if (bad != 0) {
            return;
        }
    }
}

// Writes units U+0080..U+07FF, eight at a time: the lead byte goes to the low half of each lane.
O_INLINE void PutTwoByteRun(Encoder &e) {
    __m128i const zero = _mm_setzero_si128();
    while (HasBlock(e, 8, kBlock)) {
        __m128i const units = Load(e.from);
        __m128i const small = _mm_cmpeq_epi16(_mm_and_si128(units, _mm_set1_epi16(static_cast<short>(0xFF80))), zero);
        __m128i const fits = _mm_cmpeq_epi16(_mm_and_si128(units, _mm_set1_epi16(static_cast<short>(0xF800))), zero);
        unsigned const bad = ~HighBits(_mm_andnot_si128(small, fits)) & 0xFFFFU;
        __m128i const lead = _mm_srli_epi16(units, 6);
        __m128i const tail = _mm_slli_epi16(_mm_and_si128(units, _mm_set1_epi16(0x003F)), 8);
        Store(e.to, _mm_or_si128(_mm_or_si128(lead, tail), _mm_set1_epi16(static_cast<short>(0x80C0))));
        std::size_t const bytes = bad == 0 ? kBlock : TrailingZeros(bad);
        e.from += bytes / 2;
        e.to += bytes;
        if (bad != 0) {
            return;
        }
    }
}

O_INLINE void PutThree(Byte *to, unsigned unit) {
    to[0] = static_cast<Byte>(0xE0 | (unit >> 12));
    to[1] = static_cast<Byte>(0x80 | ((unit >> 6) & 0x3F));
    to[2] = static_cast<Byte>(0x80 | (unit & 0x3F));
}

// Writes units from U+0800 that are no surrogates, while four bytes may be stored for each.
O_INLINE void PutThreeByteRun(Encoder &e) {
    while (e.from != e.end && e.toEnd - e.to >= 4) {
        unsigned const unit = *e.from;
        if (unit < 0x800 || (unit & 0xF800) == 0xD800) {
            return;
        }
        StoreAs<std::uint32_t>(e.to, 0x8080E0U | (unit >> 12) | ((unit << 2) & 0x3F00) | ((unit & 0x3F) << 16));
        e.to += 3;
        ++e.from;
    }
}

O_INLINE void PutFour(Byte *to, unsigned high, unsigned low) {
    std::uint32_t const point = 0x10000 + ((high - 0xD800) << 10) + (low - 0xDC00);
    StoreAs<std::uint32_t>(to, 0x808080F0U | (point >> 18) | ((point >> 4) & 0x3F00) | ((point << 10) & 0x3F0000) |
                                   ((point & 0x3F) << 24));
}

// Writes the units at `from` that make up one character.
O_INLINE void PutOne(Encoder &e) {
    unsigned const unit = *e.from++;
    if (unit < 0x80) {
        *e.to++ = static_cast<Byte>(unit);
    } else if (unit < 0x800) {
        e.to[0] = static_cast<Byte>(0xC0 | (unit >> 6));
        e.to[1] = static_cast<Byte>(0x80 | (unit & 0x3F));
        e.to += 2;
    } else if (IsHighSurrogate(unit) && e.from != e.end && IsLowSurrogate(*e.from)) {
        PutFour(e.to, unit, *e.from++);
        e.to += 4;
    } else {
        PutThree(e.to, (unit & 0xF800) == 0xD800 ? kReplacement : unit);
        e.to += 3;
    }
}

void Encode(Encoder e) {
    while (e.from != e.end) {
        PutAscii(e);
        if (e.from == e.end) {
            return;
        }
        if (*e.from >= 0x800) {
            PutThreeByteRun(e);
        } else if (*e.from >= 0x80) {
            PutTwoByteRun(e);
        }
        if (e.from != e.end) {
            PutOne(e);
        }
    }
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

KTUnits OUtf8ToUnits(std::string_view bytes) {
    auto const *const from = reinterpret_cast<Byte const *>(bytes.data());
    auto const *const end = from + bytes.size();
    std::size_t const count = CountUnits(from, bytes.size());
    KTUnits units;
    bool wellFormed = true;
    FillExactly(units, count, [&](Unit *to) {
        Decoder d{from, end, to, to + count};
        DecodeWellFormed(d);
        wellFormed = d.from == end;
    });
    return wellFormed ? units : DecodeWithReplacements(from, end);
}

std::string OUnitsToUtf8(unsigned short const *units, std::size_t count) {
    std::string bytes;
    std::size_t const size = CountBytes(units, count);
    FillExactly(bytes, size, [&](char *to) {
        auto *const start = reinterpret_cast<Byte *>(to);
        Encode(Encoder{units, units + count, start, start + size});
    });
    return bytes;
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
