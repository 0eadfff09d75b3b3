// OUtfDecodeSse41.cpp: UTF-8 to UTF-16 by byte shuffles.
//
// The first pass checks and counts 64 bytes at a time. The check follows Keiser and Lemire, "Validating UTF-8 in less
// than one instruction per byte": every error of UTF-8 shows in the first byte's two halves and the second byte's upper
// half, so three table look-ups whose results are and-ed find them, and a comparison with the bytes two and three
// places back finds the rest.
//
// The second pass needs no checks. Every byte gets a lane of 16 bits in which its unit is computed as if a character
// began there; a shuffle from a table then moves the lanes together that really give a unit. Characters of four
// bytes, which give two, have their first unit in the lane of the first byte and their second in that of the second:
//
//     byte at the lane    the unit, from it and the two bytes after it (b, c)
//     0xxxxxxx            00000000 0xxxxxxx
//     110xxxxx            00000xxx xxbbbbbb
//     1110xxxx            xxxxbbbb bbcccccc
//     11110xxx            110110ww wwbbbbcc   where xxxbb = wwww + 1, from the upper bits of b and c
//     10xxxxxx            110111bb bbcccccc   only after 11110xxx
//
// No step waits for the lengths of earlier characters, only for the place where the next unit goes.

#include "OUtfSse41.h"

#include <array>
#include <smmintrin.h>

namespace OUtf {

namespace {

constexpr std::size_t kWide = 64; // bytes looked at together

using Shuffle = std::array<Byte, kBlock>;

O_INLINE __m128i Bytes(unsigned value) { return _mm_set1_epi8(static_cast<char>(value)); }
O_INLINE __m128i Words(unsigned value) { return _mm_set1_epi16(static_cast<short>(value)); }
O_INLINE __m128i LoadTable(Shuffle const &shuffle) { return Load(shuffle.data()); }

// ---- the check ----

// The kinds of error that a pair of neighbouring bytes can show.
constexpr Byte kTooShort = 0x01;       // a lead byte without a continuation
constexpr Byte kTooLong = 0x02;        // ASCII and a continuation
constexpr Byte kOverlong3 = 0x04;      // E0 and less than A0
constexpr Byte kTooLarge = 0x08;       // F4 and more than 8F, or F5 and more
constexpr Byte kSurrogate = 0x10;      // ED and more than 9F
constexpr Byte kOverlong2 = 0x20;      // C0, C1
constexpr Byte kTooLargeOrFour = 0x40; // F5 and more with 80..8F, and overlong: F0 with the same
constexpr Byte kTwoTails = 0x80;       // two continuations: right only in three or four bytes
constexpr Byte kAnyLow = kTooShort | kTooLong | kTwoTails;

constexpr Shuffle MakeFirstHigh() {
    Shuffle table{};
    for (std::size_t high = 0; high < 16; ++high) {
        table[high] = high < 0x8 ? kTooLong : high < 0xC ? kTwoTails : kTooShort;
    }
    table[0xC] |= kOverlong2;
    table[0xE] |= kOverlong3 | kSurrogate;
    table[0xF] |= kTooLarge | kTooLargeOrFour;
    return table;
}

constexpr Shuffle MakeFirstLow() {
    Shuffle table{};
    for (std::size_t low = 0; low < 16; ++low) {
        table[low] = static_cast<Byte>(kAnyLow | (low >= 4 ? kTooLarge : 0) | (low >= 5 ? kTooLargeOrFour : 0));
    }
    table[0x0] |= kOverlong2 | kOverlong3 | kTooLargeOrFour;
    table[0x1] |= kOverlong2;
    table[0xD] |= kSurrogate;
    return table;
}

constexpr Shuffle MakeSecondHigh() {
    Shuffle table{};
    for (std::size_t high = 0; high < 16; ++high) {
        bool const isTail = high >= 0x8 && high < 0xC;
        table[high] = isTail ? static_cast<Byte>(kTooLong | kOverlong2 | kTwoTails) : kTooShort;
    }
    table[0x8] |= kOverlong3 | kTooLargeOrFour;
    table[0x9] |= kOverlong3 | kTooLarge;
    table[0xA] |= kSurrogate | kTooLarge;
    table[0xB] |= kSurrogate | kTooLarge;
    return table;
}

constexpr Shuffle kFirstHigh = MakeFirstHigh();
constexpr Shuffle kFirstLow = MakeFirstLow();
constexpr Shuffle kSecondHigh = MakeSecondHigh();

// Non-zero bytes where `bytes`, which follow `previous`, are ill-formed.
O_SSE41_INLINE __m128i ErrorsIn(__m128i bytes, __m128i previous) {
    __m128i const nibble = Bytes(0x0F);
    __m128i const first = _mm_alignr_epi8(bytes, previous, 15);
    __m128i const firstHigh = _mm_shuffle_epi8(LoadTable(kFirstHigh), _mm_and_si128(_mm_srli_epi16(first, 4), nibble));
    __m128i const firstLow = _mm_shuffle_epi8(LoadTable(kFirstLow), _mm_and_si128(first, nibble));
    __m128i const secondHigh =
        _mm_shuffle_epi8(LoadTable(kSecondHigh), _mm_and_si128(_mm_srli_epi16(bytes, 4), nibble));
    __m128i const pairs = _mm_and_si128(_mm_and_si128(firstHigh, firstLow), secondHigh);
    // A byte two places after a lead of three or more, or three places after a lead of four, has its top bit set here;
    // just there two continuations in a row are right.
    __m128i const third = _mm_subs_epu8(_mm_alignr_epi8(bytes, previous, 14), Bytes(0xE0 - 0x80));
    __m128i const fourth = _mm_subs_epu8(_mm_alignr_epi8(bytes, previous, 13), Bytes(0xF0 - 0x80));
    return _mm_xor_si128(_mm_and_si128(_mm_or_si128(third, fourth), Bytes(0x80)), pairs);
}

struct Scanner {
    __m128i errors = _mm_setzero_si128();
    __m128i previous = _mm_setzero_si128();
    std::size_t units = 0;
};

// Non-zero where the block ends within a character.
O_INLINE __m128i IncompleteAtEnd(__m128i block) {
    __m128i const most = _mm_setr_epi8(-1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, -1, static_cast<char>(0xEF),
                                       static_cast<char>(0xDF), static_cast<char>(0xBF));
    return _mm_subs_epu8(block, most);
}

// Checks 16 bytes and subtracts from the counts one for each byte that is no continuation, and one more for each lead
// of four.
O_SSE41_INLINE __m128i ScanBlock(Scanner &s, __m128i block, __m128i counts) {
    s.errors = _mm_or_si128(s.errors, ErrorsIn(block, s.previous));
    s.previous = block;
    __m128i const starts = _mm_cmpgt_epi8(block, Bytes(0xBF));
    __m128i const fours = _mm_cmpeq_epi8(_mm_max_epu8(block, Bytes(0xF0)), block);
    return _mm_sub_epi8(_mm_sub_epi8(counts, starts), fours);
}

// Checks and counts 64 bytes.
O_SSE41_INLINE void ScanWide(Scanner &s, Byte const *from) {
    __m128i const a = Load(from);
    __m128i const b = Load(from + kBlock);
    __m128i const c = Load(from + 2 * kBlock);
    __m128i const d = Load(from + 3 * kBlock);
    if (HighBits(_mm_or_si128(_mm_or_si128(a, b), _mm_or_si128(c, d))) == 0) {
        s.errors = _mm_or_si128(s.errors, IncompleteAtEnd(s.previous));
        s.previous = d;
        s.units += kWide;
        return;
    }
    __m128i counts = ScanBlock(s, a, _mm_setzero_si128());
    counts = ScanBlock(s, b, counts);
    counts = ScanBlock(s, c, counts);
    s.units += SumBytes(ScanBlock(s, d, counts));
}

// ---- the conversion ----

// A bit for each of eight lanes that gives a unit. What lies behind the units does not matter.
constexpr Packings MakePackings() {
    Packings packings{};
    for (unsigned lanes = 0; lanes < 256; ++lanes) {
        Byte *shuffle = packings.shuffles[lanes];
        Byte &size = packings.sizes[lanes];
        for (unsigned lane = 0; lane < 8; ++lane) {
            if ((lanes >> lane & 1U) != 0) {
                *shuffle++ = static_cast<Byte>(2 * lane);
                *shuffle++ = static_cast<Byte>(2 * lane + 1);
                ++size;
            }
        }
    }
    return packings;
}

constexpr Packings kPackings = MakePackings();

O_SSE41_INLINE __m128i LanesAt(Byte const *from) {
    return _mm_cvtepu8_epi16(_mm_loadl_epi64(reinterpret_cast<__m128i const *>(from)));
}

// The longest characters of some bytes.
enum class Longest { kTwo, kThree, kFour };

// The unit of each of eight bytes.
template <Longest kLongest> O_SSE41_INLINE __m128i UnitsAt(Byte const *from) {
    __m128i const six = Words(0x3F);
    __m128i const a = LanesAt(from);
    __m128i const b = _mm_and_si128(LanesAt(from + 1), six);
    __m128i const two = _mm_or_si128(_mm_slli_epi16(_mm_and_si128(a, Words(0x1F)), 6), b);
    if constexpr (kLongest == Longest::kTwo) {
        return _mm_blendv_epi8(a, two, _mm_cmpgt_epi16(a, Words(0x7F)));
    }
    __m128i const c = _mm_and_si128(LanesAt(from + 2), six);
    __m128i const bc = _mm_or_si128(_mm_slli_epi16(b, 6), c);
    __m128i const three = _mm_or_si128(_mm_slli_epi16(a, 12), bc);
    __m128i const isThree = _mm_cmpgt_epi16(a, Words(0xDF));
    __m128i longer = three;
    if constexpr (kLongest == Longest::kFour) {
        __m128i const abc = _mm_or_si128(_mm_slli_epi16(_mm_and_si128(a, Words(0x07)), 8), _mm_srli_epi16(bc, 4));
        __m128i const high = _mm_add_epi16(abc, Words(0xD800 - (0x10000 >> 10)));
        longer = _mm_blendv_epi8(three, high, _mm_cmpgt_epi16(a, Words(0xEF)));
    }
    __m128i const units = _mm_blendv_epi8(two, longer, isThree);
    if constexpr (kLongest == Longest::kThree) {
        return _mm_blendv_epi8(a, units, _mm_cmpgt_epi16(a, Words(0x7F)));
    }
    __m128i const low = _mm_or_si128(_mm_and_si128(bc, Words(0x3FF)), Words(0xDC00));
    __m128i const lower = _mm_blendv_epi8(a, low, _mm_cmpgt_epi16(a, Words(0x7F)));
    return _mm_blendv_epi8(lower, units, _mm_cmpgt_epi16(a, Words(0xBF)));
}

// Decodes the lanes of eight bytes that are set in the low bits of `lanes`. Writes eight units, whatever their number.
template <Longest kLongest> O_SSE41_INLINE Unit *DecodeEight(Byte const *from, std::uint64_t lanes, Unit *to) {
    std::size_t const form = lanes & 0xFF;
    Store(to, _mm_shuffle_epi8(UnitsAt<kLongest>(from), Load(kPackings.shuffles[form])));
    return to + kPackings.sizes[form];
}

struct Position {
    Byte const *from;
    Unit *to;
    std::uint64_t lowUnit; // 1 where the byte before `from` begins a character of four, whose second unit comes now
};

// A bit for each byte that is no continuation.
O_INLINE std::uint64_t StartsIn(__m128i block) { return HighBits(_mm_cmpgt_epi8(block, Bytes(0xBF))); }

// A bit for each byte that is as large or larger.
O_INLINE std::uint64_t AtLeast(__m128i block, unsigned least) {
    return HighBits(_mm_cmpeq_epi8(_mm_max_epu8(block, Bytes(least)), block));
}

template <Longest kLongest> O_SSE41_INLINE void DecodeLanes(Position &p, std::uint64_t lanes, std::size_t bytes) {
    for (std::size_t i = 0; i < bytes; i += 8, lanes >>= 8) {
        p.to = DecodeEight<kLongest>(p.from + i, lanes, p.to);
    }
    p.from += bytes;
}

// Decodes 64 bytes; the longest character among them decides how.
O_SSE41_INLINE void DecodeWide(Position &p) {
    __m128i const a = Load(p.from);
    __m128i const b = Load(p.from + kBlock);
    __m128i const c = Load(p.from + 2 * kBlock);
    __m128i const d = Load(p.from + 3 * kBlock);
    __m128i const largest = _mm_max_epu8(_mm_max_epu8(a, b), _mm_max_epu8(c, d));
    if (HighBits(largest) == 0) {
        WidenBlock(a, p.to);
        WidenBlock(b, p.to + kBlock);
        WidenBlock(c, p.to + 2 * kBlock);
        WidenBlock(d, p.to + 3 * kBlock);
        p.from += kWide;
        p.to += kWide;
        return;
    }
    std::uint64_t const starts = StartsIn(a) | StartsIn(b) << 16 | StartsIn(c) << 32 | StartsIn(d) << 48;
    if (p.lowUnit != 0 || AtLeast(largest, 0xF0) != 0) {
        std::uint64_t const fours =
            AtLeast(a, 0xF0) | AtLeast(b, 0xF0) << 16 | AtLeast(c, 0xF0) << 32 | AtLeast(d, 0xF0) << 48;
        std::uint64_t const lanes = starts | fours << 1 | p.lowUnit;
        p.lowUnit = fours >> 63;
        DecodeLanes<Longest::kFour>(p, lanes, kWide);
    } else if (AtLeast(largest, 0xE0) != 0) {
        DecodeLanes<Longest::kThree>(p, starts, kWide);
    } else {
        DecodeLanes<Longest::kTwo>(p, starts, kWide);
    }
}

// What must be left for decoding 64 bytes in place: the last eight of them are then followed by bytes enough to be read
// and to give the eight units that a store may write, three bytes for each.
constexpr std::size_t kReach = 96;

// Decodes eight bytes without writing at `toEnd` or behind it, where padding would give units.
template <Longest kLongest>
O_SSE41_INLINE Unit *DecodeEightWithin(Byte const *from, std::uint64_t lanes, Unit *to, Unit *toEnd) {
    if (toEnd - to >= 8) {
        return DecodeEight<kLongest>(from, lanes, to);
    }
    Unit units[8];
    Unit const *const unitsEnd = DecodeEight<kLongest>(from, lanes, units);
    for (Unit const *unit = units; unit != unitsEnd && to != toEnd; ++unit) {
        *to++ = *unit;
    }
    return to;
}

// Decodes 16 bytes of any kind; two more are looked at. Writes nothing from `toEnd` on.
O_SSE41_INLINE void DecodeBlock(Position &p, Unit *toEnd) {
    __m128i const bytes = Load(p.from);
    std::uint64_t const lanes = StartsIn(bytes) | p.lowUnit;
    if (p.lowUnit == 0 && AtLeast(bytes, 0xE0) == 0) {
        p.to = DecodeEightWithin<Longest::kTwo>(p.from, lanes, p.to, toEnd);
        p.to = DecodeEightWithin<Longest::kTwo>(p.from + 8, lanes >> 8, p.to, toEnd);
    } else if (p.lowUnit == 0 && AtLeast(bytes, 0xF0) == 0) {
        p.to = DecodeEightWithin<Longest::kThree>(p.from, lanes, p.to, toEnd);
        p.to = DecodeEightWithin<Longest::kThree>(p.from + 8, lanes >> 8, p.to, toEnd);
    } else {
        std::uint64_t const fours = AtLeast(bytes, 0xF0);
        p.lowUnit = fours >> 15;
        p.to = DecodeEightWithin<Longest::kFour>(p.from, lanes | fours << 1, p.to, toEnd);
        p.to = DecodeEightWithin<Longest::kFour>(p.from + 8, (lanes | fours << 1) >> 8, p.to, toEnd);
    }
    p.from += kBlock;
}

} // namespace

O_SSE41 Utf8Scan ScanUtf8Sse41(Byte const *from, std::size_t size) noexcept {
    Scanner s;
    Byte const *const end = from + size;
    for (; static_cast<std::size_t>(end - from) >= kWide; from += kWide) {
        ScanWide(s, from);
    }
    __m128i counts = _mm_setzero_si128();
    for (; static_cast<std::size_t>(end - from) >= kBlock; from += kBlock) {
        counts = ScanBlock(s, Load(from), counts);
    }
    auto const left = static_cast<std::size_t>(end - from);
    if (left != 0) {
        Byte rest[kBlock] = {}; // the zeros turn a character cut short into an error and count as units
        std::memcpy(rest, from, left);
        counts = ScanBlock(s, Load(rest), counts);
        s.units -= kBlock - left;
    }
    s.units += SumBytes(counts);
    s.errors = _mm_or_si128(s.errors, IncompleteAtEnd(s.previous));
    bool const isWellFormed = _mm_testz_si128(s.errors, s.errors) != 0;
    return {s.units, isWellFormed};
}

O_SSE41 void DecodeValidSse41(Byte const *from, std::size_t size, Unit *to, std::size_t count) noexcept {
    Byte const *const end = from + size;
    Unit *const toEnd = to + count;
    Position p{from, to, 0};
    while (static_cast<std::size_t>(end - p.from) >= kReach) {
        DecodeWide(p);
    }
    while (end - p.from >= static_cast<std::ptrdiff_t>(kBlock + 2)) {
        DecodeBlock(p, toEnd);
    }
    // The rest goes through memory that may be read past its end.
    auto const left = static_cast<std::size_t>(end - p.from);
    Byte rest[2 * kBlock + 2] = {};
    if (left != 0) {
        std::memcpy(rest, p.from, left);
        p.from = rest;
        DecodeBlock(p, toEnd);
    }
    if (left > kBlock) {
        DecodeBlock(p, toEnd);
    }
}

} // namespace OUtf
