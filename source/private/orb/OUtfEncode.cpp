// OUtfEncode.cpp: UTF-16 to UTF-8. One pass counts the bytes, one encodes into storage of exactly that size.
//
// The table of encoded forms stands at the top of OUtfDecode.cpp. On a processor with SSE4.1 the second pass is that of
// OUtfEncodeSse41.cpp.

#include "OUtf.h"
#include "OUtfBlocks.h"
#include "OUtfSse41.h"

using namespace OUtf;

namespace {

O_INLINE __m128i Words(unsigned value) { return _mm_set1_epi16(static_cast<short>(value)); }

O_INLINE __m128i HaveNone(__m128i units, unsigned bits) {
    return _mm_cmpeq_epi16(_mm_and_si128(units, Words(bits)), _mm_setzero_si128());
}

O_INLINE __m128i AreSurrogates(__m128i units, unsigned first) {
    return _mm_cmpeq_epi16(_mm_and_si128(units, Words(0xFC00)), Words(first));
}

// Bytes that eight units do not give of the 24 that they could, in lanes as negative numbers. A pair gives four
// bytes, two less than other units; they are taken off at its first half, so the unit after the eight is looked at.
O_INLINE __m128i BytesSaved(Unit const *from) {
    __m128i const units = Load(from);
    __m128i const saved = _mm_add_epi16(HaveNone(units, 0xFF80), HaveNone(units, 0xF800));
    __m128i const isHigh = AreSurrogates(units, 0xD800);
    if (HighBits(isHigh) == 0) {
        return saved;
    }
    __m128i const isPair = _mm_and_si128(isHigh, AreSurrogates(Load(from + 1), 0xDC00));
    return _mm_add_epi16(saved, _mm_add_epi16(isPair, isPair));
}

constexpr std::size_t kCounted = 32; // units counted together

// Bytes that 32 units give; the unit after them is looked at. Most text needs less than the whole count.
O_INLINE std::size_t CountTogether(Unit const *from) {
    __m128i const a = Load(from);
    __m128i const b = Load(from + 8);
    __m128i const c = Load(from + 16);
    __m128i const d = Load(from + 24);
    __m128i const all = _mm_or_si128(_mm_or_si128(a, b), _mm_or_si128(c, d));
    if (HighBits(HaveNone(all, 0xFF80)) == 0xFFFF) {
        return kCounted;
    }
    bool const isShort = HighBits(HaveNone(all, 0xF800)) == 0xFFFF;
    __m128i const low = isShort ? _mm_add_epi16(HaveNone(a, 0xFF80), HaveNone(b, 0xFF80))
                                : _mm_add_epi16(BytesSaved(from), BytesSaved(from + 8));
    __m128i const high = isShort ? _mm_add_epi16(HaveNone(c, 0xFF80), HaveNone(d, 0xFF80))
                                 : _mm_add_epi16(BytesSaved(from + 16), BytesSaved(from + 24));
    // At most 8 in each lane, so that its upper byte is zero.
    std::size_t const saved = SumBytes(_mm_sub_epi16(_mm_setzero_si128(), _mm_add_epi16(low, high)));
    return (isShort ? 2 : 3) * kCounted - saved;
}

O_INLINE __m128i Merge32(Unit const *from) {
    return _mm_or_si128(_mm_or_si128(Load(from), Load(from + 8)), _mm_or_si128(Load(from + 16), Load(from + 24)));
}

// Number of ASCII units at the front, in steps of 64.
std::size_t CountPlain(Unit const *from, std::size_t count) {
    std::size_t i = 0;
    while (count - i >= 64 &&
           HighBits(HaveNone(_mm_or_si128(Merge32(from + i), Merge32(from + i + 32)), 0xFF80)) == 0xFFFF) {
        i += 64;
    }
    return i;
}

// Bytes that the units give: 1, 2 or 3 each, and 4 instead of 6 for a surrogate pair.
std::size_t CountBytes(Unit const *from, std::size_t count) {
    std::size_t i = CountPlain(from, count);
    std::size_t bytes = i;
    for (; count - i > kCounted; i += kCounted) {
        bytes += CountTogether(from + i);
    }
    __m128i saved = _mm_setzero_si128();
    for (; count - i > 8; i += 8) {
        saved = _mm_sub_epi16(saved, BytesSaved(from + i));
        bytes += 24;
    }
    bytes -= SumBytes(saved);
    for (; i < count; ++i) {
        unsigned const unit = from[i];
        bytes += 1 + static_cast<std::size_t>(unit >= 0x80) + static_cast<std::size_t>(unit >= 0x800);
        if (IsHighSurrogate(unit) && i + 1 < count && IsLowSurrogate(from[i + 1])) {
            bytes -= 2;
        }
    }
    return bytes;
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

std::string OUnitsToUtf8Baseline(unsigned short const *units, std::size_t count) {
    std::string bytes;
    std::size_t const size = CountBytes(units, count);
    FillExactly(bytes, size, [&](char *to) {
        auto *const start = reinterpret_cast<Byte *>(to);
        Encode(Encoder{units, units + count, start, start + size});
    });
    return bytes;
}

std::string OUnitsToUtf8(unsigned short const *units, std::size_t count) {
    if (!HasSse41()) {
        return OUnitsToUtf8Baseline(units, count);
    }
    std::string bytes;
    std::size_t const size = CountBytes(units, count);
    FillExactly(bytes, size, [&](char *to) { EncodeSse41(units, count, reinterpret_cast<Byte *>(to), size); });
    return bytes;
}
