// OUtfEncodeSse41.cpp: UTF-16 to UTF-8 by byte shuffles.
//
// Eight units are encoded together: each gets a lane with its bytes at the end, and a shuffle from a table moves the
// bytes of all lanes together. No unit but a broken surrogate needs a branch, as each half of a surrogate pair gives
// two of the four bytes. These are the last two bytes that some other unit of three bytes would give, but for three
// bits in the first half's, so that pairs take the way of all others:
//
//     half                              its bytes             the bytes of
//     high  110110ww wwzzzzyy           11110uuu 10uuzzzz     0000000u uuuuzzzz, with 01110000 set in the first
//     low   110111YY YYxxxxxx           10yyYYYY 10xxxxxx     0000yyYY YYxxxxxx, yy from the high half before it
//
// where uuuuu = wwww + 1.

#include "OUtfSse41.h"

#include <smmintrin.h>

namespace OUtf {

namespace {

constexpr std::size_t kUnits = 8; // in a block

O_INLINE __m128i Words(unsigned value) { return _mm_set1_epi16(static_cast<short>(value)); }

// Eight lanes of two bytes; a set bit means that only the first one counts.
constexpr Packings MakeShortPackings() {
    Packings packings{};
    for (unsigned ones = 0; ones < 256; ++ones) {
        Byte *const shuffle = packings.shuffles[ones];
        Byte &size = packings.sizes[ones];
        for (unsigned lane = 0; lane < 8; ++lane) {
            shuffle[size++] = static_cast<Byte>(2 * lane);
            if ((ones >> lane & 1U) == 0) {
                shuffle[size++] = static_cast<Byte>(2 * lane + 1);
            }
        }
    }
    return packings;
}

// Four lanes of four bytes, of which the last 1, 2 or 3 count: bits 0 to 3 mark the lanes of one byte, bits 4 to 7
// those of less than three.
constexpr Packings MakeLongPackings() {
    Packings packings{};
    for (unsigned form = 0; form < 256; ++form) {
        Byte *const shuffle = packings.shuffles[form];
        Byte &size = packings.sizes[form];
        for (unsigned lane = 0; lane < 4; ++lane) {
            bool const one = (form >> lane & 1U) != 0;
            bool const isShort = (form >> (lane + 4) & 1U) != 0;
            for (unsigned byte = one ? 3 : isShort ? 2 : 1; byte < 4; ++byte) {
                shuffle[size++] = static_cast<Byte>(4 * lane + byte);
            }
        }
    }
    return packings;
}

constexpr Packings kShortPackings = MakeShortPackings();
constexpr Packings kLongPackings = MakeLongPackings();

O_SSE41_INLINE Byte *PutPacked(__m128i lanes, Packings const &packings, std::size_t form, Byte *to) {
    Store(to, _mm_shuffle_epi8(lanes, Load(packings.shuffles[form])));
    return to + packings.sizes[form];
}

O_INLINE __m128i AreSurrogates(__m128i units, unsigned first) {
    return _mm_cmpeq_epi16(_mm_and_si128(units, Words(0xFC00)), Words(first));
}

O_SSE41_INLINE bool IsZero(__m128i value) { return _mm_testz_si128(value, value) != 0; }

// Units below U+0800.
O_SSE41_INLINE Byte *PutShort(__m128i units, Byte *to) {
    __m128i const isOne = _mm_cmplt_epi16(units, Words(0x80));
    __m128i const lead = _mm_srli_epi16(units, 6);
    __m128i const tail = _mm_slli_epi16(_mm_and_si128(units, Words(0x3F)), 8);
    __m128i const two = _mm_or_si128(_mm_or_si128(lead, tail), Words(0x80C0));
    __m128i const lanes = _mm_blendv_epi8(two, units, isOne);
    unsigned const ones = HighBits(_mm_packs_epi16(isOne, _mm_setzero_si128()));
    return PutPacked(lanes, kShortPackings, ones, to);
}

// Eight units on their way to up to three bytes each.
struct Lanes {
    __m128i units;
    __m128i isOne;      // gives one byte
    __m128i isShort;    // gives less than three
    __m128i secondBits; // to be set in the second of the three bytes
};

O_SSE41_INLINE Lanes LanesOf(__m128i units) {
    __m128i const zero = _mm_setzero_si128();
    __m128i const isOne = _mm_cmpeq_epi16(_mm_and_si128(units, Words(0xFF80)), zero);
    __m128i const isShort = _mm_cmpeq_epi16(_mm_and_si128(units, Words(0xF800)), zero);
    // In two bytes the lead is the second byte of three with one bit more.
    return {units, isOne, isShort, _mm_and_si128(isShort, Words(0x40))};
}

// Turns the halves of surrogate pairs into the units whose bytes they share, and other surrogates into replacements.
// `before` and `after` hold the neighbours of the units.
O_SSE41_INLINE void TranslateSurrogates(Lanes &l, __m128i isSurrogate, __m128i before, __m128i after) {
    __m128i const isHigh = _mm_and_si128(AreSurrogates(l.units, 0xD800), AreSurrogates(after, 0xDC00));
    __m128i const isLow = _mm_and_si128(AreSurrogates(l.units, 0xDC00), AreSurrogates(before, 0xD800));
    __m128i const isPaired = _mm_or_si128(isHigh, isLow);

    __m128i const high = _mm_srli_epi16(_mm_sub_epi16(l.units, Words(0xD800 - 0x40)), 2); // 0x40: the 1 added to wwww
    __m128i const yy = _mm_slli_epi16(_mm_and_si128(before, Words(0x03)), 10);
    __m128i const low = _mm_or_si128(_mm_and_si128(l.units, Words(0x3FF)), yy);
    __m128i const lowOrLost = _mm_blendv_epi8(Words(kReplacement), low, isLow);
    l.units = _mm_blendv_epi8(l.units, _mm_blendv_epi8(lowOrLost, high, isHigh), isSurrogate);
    l.isShort = _mm_or_si128(l.isShort, isPaired);
    l.secondBits = _mm_or_si128(l.secondBits, _mm_and_si128(isHigh, Words(0x70)));
}

// How many bytes eight units may overwrite: twelve of the first four and a whole block for the others.
constexpr std::ptrdiff_t kWritten = 12 + kBlock;

// Writes the bytes of eight lanes.
O_SSE41_INLINE Byte *PutLong(Lanes const &l, Byte *to) {
    __m128i const six = Words(0x3F);
    __m128i const first = _mm_or_si128(_mm_srli_epi16(l.units, 12), Words(0xE0));
    __m128i const middle = _mm_or_si128(_mm_and_si128(_mm_srli_epi16(l.units, 6), six), Words(0x80));
    __m128i const second = _mm_or_si128(middle, l.secondBits);
    __m128i const tail = _mm_or_si128(_mm_and_si128(l.units, six), Words(0x80));
    __m128i const third = _mm_blendv_epi8(tail, l.units, l.isOne);

    __m128i const lower = _mm_slli_epi16(first, 8);
    __m128i const upper = _mm_or_si128(second, _mm_slli_epi16(third, 8));
    unsigned const forms = HighBits(_mm_packs_epi16(l.isOne, l.isShort));
    std::size_t const lowForm = (forms & 0x0F) | (forms >> 4 & 0xF0);
    std::size_t const highForm = (forms >> 4 & 0x0F) | (forms >> 8 & 0xF0);
    to = PutPacked(_mm_unpacklo_epi16(lower, upper), kLongPackings, lowForm, to);
    return PutPacked(_mm_unpackhi_epi16(lower, upper), kLongPackings, highForm, to);
}

struct Position {
    Unit const *from;
    Byte *to;
    __m128i previous; // the block before `from`
};

// Encodes the eight units at `from`; one more is looked at.
O_SSE41_INLINE void EncodeBlock(Position &p) {
    __m128i const units = Load(p.from);
    __m128i const upperBits = _mm_and_si128(units, Words(0xF800));
    if (IsZero(upperBits)) {
        p.to = PutShort(units, p.to);
    } else {
        Lanes lanes = LanesOf(units);
        __m128i const isSurrogate = _mm_cmpeq_epi16(upperBits, Words(0xD800));
        if (!IsZero(isSurrogate)) {
            TranslateSurrogates(lanes, isSurrogate, _mm_alignr_epi8(units, p.previous, 14), Load(p.from + 1));
        }
        p.to = PutLong(lanes, p.to);
    }
    p.previous = units;
    p.from += kUnits;
}

constexpr std::size_t kAsciiUnits = 32; // packed together

// Packs ASCII, 32 units at a time, until another unit comes or less is left.
O_SSE41_INLINE void PackAscii(Position &p, Unit const *end) {
    Unit const *from = p.from;
    Byte *to = p.to;
    while (static_cast<std::size_t>(end - from) >= kAsciiUnits) {
        __m128i const a = Load(from);
        __m128i const b = Load(from + 8);
        __m128i const c = Load(from + 16);
        __m128i const d = Load(from + 24);
        __m128i const all = _mm_or_si128(_mm_or_si128(a, b), _mm_or_si128(c, d));
        if (!IsZero(_mm_and_si128(all, Words(0xFF80)))) {
            break;
        }
        Store(to, _mm_packus_epi16(a, b));
        Store(to + kBlock, _mm_packus_epi16(c, d));
        from += kAsciiUnits;
        to += kAsciiUnits;
    }
    if (from != p.from) {
        p = {from, to, Load(from - kUnits)};
    }
}

O_SSE41_INLINE bool PackEightAscii(Position &p) {
    __m128i const units = Load(p.from);
    if (!IsZero(_mm_and_si128(units, Words(0xFF80)))) {
        return false;
    }
    _mm_storel_epi64(reinterpret_cast<__m128i *>(p.to), _mm_packus_epi16(units, units));
    p.previous = units;
    p.from += kUnits;
    p.to += kUnits;
    return true;
}

// Encodes up to eight units through memory that may be read and written past its end.
O_SSE41_INLINE void EncodeLast(Position &p, std::size_t left) {
    std::size_t const count = left < kUnits ? left : kUnits;
    Unit units[2 * kUnits] = {};
    Byte bytes[kWritten];
    for (std::size_t i = 0; i <= kUnits && i < left; ++i) {
        units[i] = p.from[i];
    }
    Position r{units, bytes, p.previous};
    EncodeBlock(r);
    std::size_t const size = static_cast<std::size_t>(r.to - bytes) - (kUnits - count); // a byte for each zero
    for (std::size_t i = 0; i < size; ++i) {
        p.to[i] = bytes[i];
    }
    p.previous = r.previous;
    p.from += count;
    p.to += size;
}

} // namespace

O_SSE41 void EncodeSse41(Unit const *from, std::size_t count, Byte *to, std::size_t size) noexcept {
    Unit const *const end = from + count;
    Byte *const toEnd = to + size;
    Position p{from, to, _mm_setzero_si128()};
    for (;;) {
        PackAscii(p, end);
        if (end - p.from <= static_cast<std::ptrdiff_t>(kUnits) || toEnd - p.to < kWritten) {
            break;
        }
        EncodeBlock(p);
    }
    while (p.from != end) {
        auto const left = static_cast<std::size_t>(end - p.from);
        if (left < kUnits || !PackEightAscii(p)) {
            EncodeLast(p, left);
        }
    }
}

} // namespace OUtf
