// OUtfDecode.cpp: UTF-8 to UTF-16, fast where text is plain and exact where it is broken.
//
// Decoding takes two passes over memory that mostly stays in the cache: count the units that the bytes will give,
// decode into storage of exactly that size. Counting assumes well-formed text; the decoder stops at the first
// ill-formed byte, and only then a slow pass counts again with replacements and decodes the rest.
//
//     code points          UTF-8 bytes                          UTF-16 units
//     U+0000..U+007F       0xxxxxxx                             1
//     U+0080..U+07FF       110xxxxx 10xxxxxx                    1
//     U+0800..U+FFFF       1110xxxx 10xxxxxx 10xxxxxx           1   (surrogates excluded)
//     U+10000..U+10FFFF    11110xxx 10xxxxxx 10xxxxxx 10xxxxxx  2   (a surrogate pair)
//
// Well-formed text on a processor with SSE4.1 never gets here: OUtfDecodeSse41.cpp does both passes.

#include "OUtf.h"
#include "OUtfBlocks.h"
#include "OUtfSse41.h"

using namespace OUtf;

namespace {

// ---- counting ----

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

// ---- ASCII ----

// A bit for each byte that is ASCII and not zero.
O_INLINE unsigned PlainBytes(__m128i block) { return HighBits(_mm_cmpgt_epi8(block, _mm_setzero_si128())); }

O_READS_WHOLE_BLOCKS O_INLINE bool ArePlain(__m128i const *four) {
    __m128i const zero = _mm_setzero_si128();
    __m128i const low = _mm_and_si128(_mm_cmpgt_epi8(four[0], zero), _mm_cmpgt_epi8(four[1], zero));
    __m128i const high = _mm_and_si128(_mm_cmpgt_epi8(four[2], zero), _mm_cmpgt_epi8(four[3], zero));
    return HighBits(_mm_and_si128(low, high)) == 0xFFFF;
}

// Length of the ASCII text before the first other byte or the terminating zero. Reads aligned blocks from the one that
// holds the first byte, and four of them at once where they cannot reach into another memory page.
O_READS_WHOLE_BLOCKS std::size_t PlainLength(char const *text) {
    constexpr std::uintptr_t kFour = 4 * kBlock;
    auto const address = reinterpret_cast<std::uintptr_t>(text);
    auto const *block = reinterpret_cast<__m128i const *>(address & ~static_cast<std::uintptr_t>(kBlock - 1));
    unsigned const skipped = static_cast<unsigned>(address & (kBlock - 1));
    unsigned other = ~(PlainBytes(*block) >> skipped) & (0xFFFFU >> skipped);
    if (other != 0) {
        return TrailingZeros(other);
    }
    do {
        ++block;
        if (reinterpret_cast<std::uintptr_t>(block) % kFour == 0) {
            while (ArePlain(block)) {
                block += 4;
            }
        }
        other = ~PlainBytes(*block) & 0xFFFFU;
    } while (other == 0);
    return reinterpret_cast<std::uintptr_t>(block) - address + TrailingZeros(other);
}

void WidenPlain(Byte const *from, std::size_t size, Unit *to) {
    if (size < kBlock) {
        for (std::size_t i = 0; i < size; ++i) {
            to[i] = from[i];
        }
        return;
    }
    std::size_t i = 0;
    for (; size - i >= 2 * kBlock; i += 2 * kBlock) {
        WidenBlock(Load(from + i), to + i);
        WidenBlock(Load(from + i + kBlock), to + i + kBlock);
    }
    if (size - i >= kBlock) {
        WidenBlock(Load(from + i), to + i);
    }
    // The last block overlaps what is done.
    WidenBlock(Load(from + size - kBlock), to + size - kBlock);
}

} // namespace

KTUnits OUtf8ToUnitsBaseline(std::string_view bytes) {
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

KTUnits OUtf8ToUnits(std::string_view bytes) {
    auto const *const from = reinterpret_cast<Byte const *>(bytes.data());
    if (HasSse41()) {
        Utf8Scan const scan = ScanUtf8Sse41(from, bytes.size());
        if (scan.isWellFormed) {
            KTUnits units;
            FillExactly(units, scan.units, [&](Unit *to) { DecodeValidSse41(from, bytes.size(), to, scan.units); });
            return units;
        }
    }
    return OUtf8ToUnitsBaseline(bytes);
}

KTUnits OUtf8TextToUnits(char const *text) {
    std::size_t const plain = PlainLength(text);
    if (text[plain] != 0) {
        return OUtf8ToUnits({text, plain + OByteLength(text + plain)});
    }
    KTUnits units;
    FillExactly(units, plain, [&](Unit *to) { WidenPlain(reinterpret_cast<Byte const *>(text), plain, to); });
    return units;
}
