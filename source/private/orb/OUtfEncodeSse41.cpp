// OUtfEncodeSse41.cpp: UTF-16 to UTF-8 by byte shuffles.
//
// Eight units are encoded together: each gets a lane with its bytes at the end, and a shuffle from a table moves the bytes
// of all lanes together. Surrogates need no step of their own, as each half of a pair gives two of the four bytes:
//
//     high   110110 wwwwzzzzyy          gives   11110uuu 10uuzzzz      where uuuuu = wwww + 1
//     low    110111 YYYYxxxxxx          gives   10yyYYYY 10xxxxxx      yy from the unit before

#include "OUtfSse41.h"

#include <array>
#include <smmintrin.h>

namespace OUtf {

namespace {

constexpr std::size_t kUnits = 8; // in a block

O_INLINE __m128i Words(unsigned value) { return _mm_set1_epi16(static_cast<short>(value)); }

// How to move the bytes of a block's lanes together.
struct Packing {
    std::array<Byte, kBlock> shuffle;
    Byte size; // bytes that the lanes give
};

// Eight lanes of two bytes; a set bit means that only the first one counts.
constexpr auto MakeShortPackings() {
    std::array<Packing, 256> packings{};
    for (unsigned ones = 0; ones < packings.size(); ++ones) {
        Packing &packing = packings[ones];
        packing.shuffle.fill(0x80);
        for (unsigned lane = 0; lane < 8; ++lane) {
            packing.shuffle[packing.size++] = static_cast<Byte>(2 * lane);
            if ((ones >> lane & 1U) == 0) {
                packing.shuffle[packing.size++] = static_cast<Byte>(2 * lane + 1);
            }
        }
    }
    return packings;
}

// Four lanes of four bytes, of which the last 1, 2 or 3 count: bits 0 to 3 mark the lanes of one byte, bits 4 to 7 those
// of three.
constexpr auto MakeLongPackings() {
    std::array<Packing, 256> packings{};
    for (unsigned form = 0; form < packings.size(); ++form) {
        Packing &packing = packings[form];
        packing.shuffle.fill(0x80);
        for (unsigned lane = 0; lane < 4; ++lane) {
            bool const one = (form >> lane & 1U) != 0;
            bool const three = (form >> (lane + 4) & 1U) != 0;
            for (unsigned byte = one ? 3 : three ? 1 : 2; byte < 4; ++byte) {
                packing.shuffle[packing.size++] = static_cast<Byte>(4 * lane + byte);
            }
        }
    }
    return packings;
}

constexpr auto kShortPackings = MakeShortPackings();
constexpr auto kLongPackings = MakeLongPackings();

O_SSE41_INLINE Byte *PutPacked(__m128i lanes, Packing const &packing, Byte *to) {
    Store(to, _mm_shuffle_epi8(lanes, Load(packing.shuffle.data())));
    return to + packing.size;
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
    return PutPacked(lanes, kShortPackings[ones], to);
}

// The three bytes of each unit, still in lanes of 16 bits.
struct Lanes {
    __m128i units;
    __m128i first;
    __m128i second;
    __m128i third;
    __m128i isPaired; // half of a surrogate pair: the second and third byte count
};

// Gives the halves of surrogate pairs their bytes and makes a replacement of every other surrogate. `before` and `after`
// hold the neighbours of the units.
O_SSE41_INLINE Lanes SurrogateLanes(__m128i units, __m128i before, __m128i after) {
    __m128i const isHigh = _mm_and_si128(AreSurrogates(units, 0xD800), AreSurrogates(after, 0xDC00));
    __m128i const isLow = _mm_and_si128(AreSurrogates(units, 0xDC00), AreSurrogates(before, 0xD800));
    __m128i const isSurrogate = _mm_cmpeq_epi16(_mm_and_si128(units, Words(0xF800)), Words(0xD800));
    __m128i const isPaired = _mm_or_si128(isHigh, isLow);

    __m128i const uzy = _mm_sub_epi16(units, Words(0xD800 - 0x40)); // the 1 added to wwww
    __m128i const highSecond = _mm_or_si128(_mm_srli_epi16(uzy, 8), Words(0xF0));
    __m128i const highThird = _mm_or_si128(_mm_and_si128(_mm_srli_epi16(uzy, 2), Words(0x3F)), Words(0x80));
    __m128i const yy = _mm_slli_epi16(_mm_and_si128(before, Words(0x03)), 4);
    __m128i const lowSecond =
        _mm_or_si128(_mm_or_si128(_mm_and_si128(_mm_srli_epi16(units, 6), Words(0x0F)), yy), Words(0x80));
    __m128i const lowThird = _mm_or_si128(_mm_and_si128(units, Words(0x3F)), Words(0x80));

    return {_mm_blendv_epi8(units, Words(kReplacement), _mm_andnot_si128(isPaired, isSurrogate)), _mm_setzero_si128(),
            _mm_blendv_epi8(lowSecond, highSecond, isHigh), _mm_blendv_epi8(lowThird, highThird, isHigh), isPaired};
}

// Fills in the lanes of all units but the paired surrogates and packs them. The result may reach 28 bytes past `to`.
O_SSE41_INLINE Byte *PutLong(Lanes const &l, Byte *to) {
    __m128i const zero = _mm_setzero_si128();
    __m128i const isOne = _mm_cmpeq_epi16(_mm_and_si128(l.units, Words(0xFF80)), zero);
    __m128i const isBelowThree = _mm_cmpeq_epi16(_mm_and_si128(l.units, Words(0xF800)), zero);
    __m128i const isThree = _mm_andnot_si128(_mm_or_si128(isBelowThree, l.isPaired), _mm_cmpeq_epi16(zero, zero));

    __m128i const first = _mm_or_si128(_mm_srli_epi16(l.units, 12), Words(0xE0));
    // In two bytes the lead is the second byte of three with one bit more.
    __m128i const leadBit = _mm_and_si128(isBelowThree, Words(0x40));
    __m128i const middle = _mm_and_si128(_mm_srli_epi16(l.units, 6), Words(0x3F));
    __m128i const second = _mm_or_si128(_mm_or_si128(middle, leadBit), Words(0x80));
    __m128i const tail = _mm_or_si128(_mm_and_si128(l.units, Words(0x3F)), Words(0x80));
    __m128i const third = _mm_blendv_epi8(tail, l.units, isOne);

    __m128i const lower = _mm_slli_epi16(first, 8);
    __m128i const upper = _mm_or_si128(_mm_blendv_epi8(second, l.second, l.isPaired),
                                       _mm_slli_epi16(_mm_blendv_epi8(third, l.third, l.isPaired), 8));
    unsigned const forms = HighBits(_mm_packs_epi16(isOne, isThree));
    to = PutPacked(_mm_unpacklo_epi16(lower, upper), kLongPackings[(forms & 0x0F) | (forms >> 4 & 0xF0)], to);
    return PutPacked(_mm_unpackhi_epi16(lower, upper), kLongPackings[(forms >> 4 & 0x0F) | (forms >> 8 & 0xF0)], to);
}

struct Position {
    Unit const *from;
    Byte *to;
    __m128i previous; // the block before `from`
};

// Encodes the eight units at `from`; one more is looked at.
O_SSE41_INLINE void EncodeBlock(Position &p) {
    __m128i const units = Load(p.from);
    __m128i const zero = _mm_setzero_si128();
    if (IsZero(_mm_and_si128(units, Words(0xFF80)))) {
        _mm_storel_epi64(reinterpret_cast<__m128i *>(p.to), _mm_packus_epi16(units, units));
        p.to += kUnits;
    } else if (IsZero(_mm_and_si128(units, Words(0xF800)))) {
        p.to = PutShort(units, p.to);
    } else if (IsZero(_mm_cmpeq_epi16(_mm_and_si128(units, Words(0xF800)), Words(0xD800)))) {
        p.to = PutLong({units, zero, zero, zero, zero}, p.to);
    } else {
        __m128i const before = _mm_alignr_epi8(units, p.previous, 14);
        p.to = PutLong(SurrogateLanes(units, before, Load(p.from + 1)), p.to);
    }
    p.previous = units;
    p.from += kUnits;
}

constexpr std::size_t kAsciiUnits = 32; // packed together

O_SSE41_INLINE bool PackAscii(Position &p) {
    __m128i const a = Load(p.from);
    __m128i const b = Load(p.from + 8);
    __m128i const c = Load(p.from + 16);
    __m128i const d = Load(p.from + 24);
    __m128i const all = _mm_or_si128(_mm_or_si128(a, b), _mm_or_si128(c, d));
    if (!IsZero(_mm_and_si128(all, Words(0xFF80)))) {
        return false;
    }
    Store(p.to, _mm_packus_epi16(a, b));
    Store(p.to + kBlock, _mm_packus_epi16(c, d));
    p.previous = d;
    p.from += kAsciiUnits;
    p.to += kAsciiUnits;
    return true;
}

// What must be left for encoding in place: PutLong's 28 bytes are there then, as each unit gives a byte at least.
constexpr std::size_t kReach = 33;

} // namespace

O_SSE41 void EncodeSse41(Unit const *from, std::size_t count, Byte *to, std::size_t size) noexcept {
    Unit const *const end = from + count;
    Byte *const toEnd = to + size;
    Position p{from, to, _mm_setzero_si128()};
    while (static_cast<std::size_t>(end - p.from) >= kReach) {
        if (!PackAscii(p)) {
            EncodeBlock(p);
        }
    }
    // The rest goes through memory that may be read and written past its end.
    auto const left = static_cast<std::size_t>(end - p.from);
    if (left == 0) {
        return;
    }
    alignas(kBlock) Unit rest[kReach + 2 * kUnits] = {};
    alignas(kBlock) Byte bytes[4 * kReach + 2 * kBlock];
    std::memcpy(rest, p.from, left * sizeof(Unit));
    Position r{rest, bytes, p.previous};
    while (r.from < rest + left) {
        EncodeBlock(r);
    }
    std::memcpy(p.to, bytes, static_cast<std::size_t>(toEnd - p.to));
}

} // namespace OUtf
