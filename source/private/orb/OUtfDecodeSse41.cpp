// OUtfDecodeSse41.cpp: UTF-8 to UTF-16 by byte shuffles.
//
// The first pass checks and counts 64 bytes at a time. The check follows Keiser and Lemire, "Validating UTF-8 in less
// than one instruction per byte": every error of UTF-8 shows in the first byte's two halves and the second byte's upper
// half, so three table look-ups whose results are and-ed find them, and a comparison with the bytes two and three places
// back finds the rest.
//
// The second pass needs no checks. It takes windows of twelve bytes: a bit for every byte that ends a character forms an
// index of 12 bits, and a table says how to shuffle the window's first characters into equal lanes.
//
//     kind       characters   of bytes   lanes       condition
//     narrow     6            1 to 2     16 bits     the first six characters are that short
//     medium     4            1 to 3     32 bits     the first four are
//     wide       3            1 to 4     32 bits     always: three characters fit into twelve bytes

#include "OUtfSse41.h"

#include <array>
#include <smmintrin.h>

namespace OUtf {

namespace {

constexpr std::size_t kWide = 64; // bytes looked at together

using Shuffle = std::array<Byte, kBlock>;

O_INLINE __m128i Bytes(unsigned value) { return _mm_set1_epi8(static_cast<char>(value)); }
O_INLINE __m128i Words(unsigned value) { return _mm_set1_epi16(static_cast<short>(value)); }
O_INLINE __m128i Longs(unsigned value) { return _mm_set1_epi32(static_cast<int>(value)); }
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
    __m128i const secondHigh = _mm_shuffle_epi8(LoadTable(kSecondHigh), _mm_and_si128(_mm_srli_epi16(bytes, 4), nibble));
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

// Checks and counts 64 bytes.
O_SSE41_INLINE void ScanWide(Scanner &s, Byte const *from) {
    __m128i const blocks[] = {Load(from), Load(from + kBlock), Load(from + 2 * kBlock), Load(from + 3 * kBlock)};
    __m128i const all = _mm_or_si128(_mm_or_si128(blocks[0], blocks[1]), _mm_or_si128(blocks[2], blocks[3]));
    if (HighBits(all) == 0) {
        s.errors = _mm_or_si128(s.errors, IncompleteAtEnd(s.previous));
        s.units += kWide;
    } else {
        // A unit for each byte that is no continuation, and one more for each lead of four.
        __m128i counts = _mm_setzero_si128();
        __m128i previous = s.previous;
        for (__m128i const block : blocks) {
            s.errors = _mm_or_si128(s.errors, ErrorsIn(block, previous));
            __m128i const starts = _mm_cmpgt_epi8(block, Bytes(0xBF));
            __m128i const fours = _mm_cmpeq_epi8(_mm_max_epu8(block, Bytes(0xF0)), block);
            counts = _mm_sub_epi8(_mm_sub_epi8(counts, starts), fours);
            previous = block;
        }
        s.units += SumBytes(counts);
    }
    s.previous = blocks[3];
}

// ---- the windows ----

constexpr std::size_t kWindow = 12;
constexpr std::size_t kNarrowShuffles = 64; // 2^6
constexpr std::size_t kMediumShuffles = 81; // 3^4
constexpr std::size_t kWideShuffles = 64;   // 4^3

struct Window {
    Byte shuffle;  // narrow ones first, then medium, then wide
    Byte consumed; // bytes
};

// Takes `count` lanes of characters up to `longest` bytes; `form` numbers the lengths in the base `longest`.
constexpr Shuffle MakeShuffle(std::size_t form, std::size_t count, std::size_t longest, std::size_t laneSize) {
    Shuffle shuffle{};
    shuffle.fill(0x80); // a zero byte
    std::size_t at = 0;
    for (std::size_t lane = 0; lane < count; ++lane, form /= longest) {
        std::size_t const length = form % longest + 1;
        at += length;
        for (std::size_t i = 0; i < length; ++i) {
            shuffle[lane * laneSize + i] = static_cast<Byte>(at - 1 - i); // the last byte first
        }
    }
    return shuffle;
}

constexpr auto MakeShuffles() {
    std::array<Shuffle, kNarrowShuffles + kMediumShuffles + kWideShuffles> shuffles{};
    std::size_t at = 0;
    for (std::size_t form = 0; form < kNarrowShuffles; ++form) {
        shuffles[at++] = MakeShuffle(form, 6, 2, 2);
    }
    for (std::size_t form = 0; form < kMediumShuffles; ++form) {
        shuffles[at++] = MakeShuffle(form, 4, 3, 4);
    }
    for (std::size_t form = 0; form < kWideShuffles; ++form) {
        shuffles[at++] = MakeShuffle(form, 3, 4, 4);
    }
    return shuffles;
}

// Tries to take `count` characters of up to `longest` bytes; `window.consumed` stays 0 where they are not there.
constexpr Window TakeWindow(unsigned ends, std::size_t count, std::size_t longest, std::size_t firstShuffle) {
    std::size_t form = 0;
    std::size_t weight = 1;
    std::size_t at = 0;
    for (std::size_t i = 0; i < count; ++i, weight *= longest) {
        std::size_t length = 1;
        while (at + length <= kWindow && (ends >> (at + length - 1) & 1U) == 0) {
            ++length;
        }
        if (length > longest || at + length > kWindow) {
            return {0, 0};
        }
        form += (length - 1) * weight;
        at += length;
    }
    return {static_cast<Byte>(firstShuffle + form), static_cast<Byte>(at)};
}

constexpr auto MakeWindows() {
    std::array<Window, 1U << kWindow> windows{};
    for (unsigned ends = 0; ends < windows.size(); ++ends) {
        Window window = TakeWindow(ends, 6, 2, 0);
        if (window.consumed == 0) {
            window = TakeWindow(ends, 4, 3, kNarrowShuffles);
        }
        if (window.consumed == 0) {
            window = TakeWindow(ends, 3, 4, kNarrowShuffles + kMediumShuffles);
        }
        windows[ends] = window;
    }
    return windows;
}

// Moves three lanes of 32 bits together: the lanes whose bit is set keep both halves, the others the lower one.
constexpr auto MakePairPacking() {
    std::array<Shuffle, 8> packing{};
    for (unsigned pairs = 0; pairs < packing.size(); ++pairs) {
        packing[pairs].fill(0x80);
        std::size_t at = 0;
        for (unsigned lane = 0; lane < 3; ++lane) {
            unsigned const bytes = (pairs >> lane & 1U) != 0 ? 4 : 2;
            for (unsigned i = 0; i < bytes; ++i) {
                packing[pairs][at++] = static_cast<Byte>(lane * 4 + i);
            }
        }
    }
    return packing;
}

alignas(kBlock) constexpr auto kShuffles = MakeShuffles();
constexpr auto kWindows = MakeWindows();
alignas(kBlock) constexpr auto kPairPacking = MakePairPacking();
constexpr Byte kUnitsOfPairs[] = {3, 4, 4, 5, 4, 5, 5, 6};

O_SSE41_INLINE Unit *PutNarrow(__m128i lanes, Unit *to) {
    __m128i const tail = _mm_and_si128(lanes, Words(0x007F));
    __m128i const lead = _mm_srli_epi16(_mm_and_si128(lanes, Words(0x1F00)), 2);
    Store(to, _mm_or_si128(tail, lead));
    return to + 6;
}

O_SSE41_INLINE Unit *PutMedium(__m128i lanes, Unit *to) {
    __m128i const tail = _mm_and_si128(lanes, Longs(0x00007F));
    __m128i const middle = _mm_srli_epi32(_mm_and_si128(lanes, Longs(0x003F00)), 2);
    __m128i const lead = _mm_srli_epi32(_mm_and_si128(lanes, Longs(0x0F0000)), 4);
    __m128i const units = _mm_or_si128(_mm_or_si128(tail, middle), lead);
    Store(to, _mm_packus_epi32(units, units));
    return to + 4;
}

O_SSE41_INLINE Unit *PutWide(__m128i lanes, Unit *to) {
    // The third byte from the end is a continuation or the lead of three, whose bit 5 does not count.
    __m128i const leadOfThree = _mm_srli_epi32(_mm_and_si128(lanes, Longs(0x400000)), 1);
    __m128i const third = _mm_srli_epi32(_mm_and_si128(_mm_xor_si128(lanes, leadOfThree), Longs(0x3F0000)), 4);
    __m128i const tail = _mm_and_si128(lanes, Longs(0x7F));
    __m128i const second = _mm_srli_epi32(_mm_and_si128(lanes, Longs(0x3F00)), 2);
    __m128i const lead = _mm_srli_epi32(_mm_and_si128(lanes, Longs(0x07000000)), 6);
    __m128i const points = _mm_or_si128(_mm_or_si128(tail, second), _mm_or_si128(third, lead));

    __m128i const isPair = _mm_cmpgt_epi32(points, Longs(0xFFFF));
    __m128i const high = _mm_add_epi32(_mm_srli_epi32(points, 10), Longs(0xD800 - (0x10000 >> 10)));
    __m128i const low = _mm_slli_epi32(_mm_or_si128(_mm_and_si128(points, Longs(0x3FF)), Longs(0xDC00)), 16);
    __m128i const units = _mm_blendv_epi8(points, _mm_or_si128(high, low), isPair);
    unsigned const pairs = static_cast<unsigned>(_mm_movemask_ps(_mm_castsi128_ps(isPair))) & 7U;
    Store(to, _mm_shuffle_epi8(units, LoadTable(kPairPacking[pairs])));
    return to + kUnitsOfPairs[pairs];
}

O_INLINE void WidenBlock(__m128i bytes, Unit *to) {
    Store(to, _mm_unpacklo_epi8(bytes, _mm_setzero_si128()));
    Store(to + 8, _mm_unpackhi_epi8(bytes, _mm_setzero_si128()));
}

struct Position {
    Byte const *from;
    Unit *to;
};

// Decodes a character or more of 64 bytes that hold not only ASCII, until `limit` bytes or a little more are taken.
// REQUIRES: limit <= 48, so that every window finds its 16 bits of `ends`.
O_SSE41_INLINE Position DecodeWindows(Position p, std::uint64_t ends, std::size_t limit) {
    Byte const *const stop = p.from + limit;
    do {
        __m128i const bytes = Load(p.from);
        if ((ends & 0xFFFF) == 0xFFFF) {
            WidenBlock(bytes, p.to);
            p.from += kBlock;
            p.to += kBlock;
            ends >>= kBlock;
            continue;
        }
        Window const window = kWindows[ends & 0xFFF];
        __m128i const lanes = _mm_shuffle_epi8(bytes, LoadTable(kShuffles[window.shuffle]));
        if (window.shuffle < kNarrowShuffles) {
            p.to = PutNarrow(lanes, p.to);
        } else if (window.shuffle < kNarrowShuffles + kMediumShuffles) {
            p.to = PutMedium(lanes, p.to);
        } else {
            p.to = PutWide(lanes, p.to);
        }
        p.from += window.consumed;
        ends >>= window.consumed;
    } while (p.from < stop);
    return p;
}

// A bit for each byte that is no continuation.
O_INLINE std::uint64_t StartsIn(__m128i block) { return HighBits(_mm_cmpgt_epi8(block, Bytes(0xBF))); }

// Decodes until `stop` is reached or passed. REQUIRES: 80 bytes may be read, and 64 units written, from any place before
// `stop`.
O_SSE41 Position DecodeBlocks(Position p, Byte const *stop) {
    while (p.from < stop) {
        __m128i const a = Load(p.from);
        __m128i const b = Load(p.from + kBlock);
        __m128i const c = Load(p.from + 2 * kBlock);
        __m128i const d = Load(p.from + 3 * kBlock);
        if (HighBits(_mm_or_si128(_mm_or_si128(a, b), _mm_or_si128(c, d))) == 0) {
            WidenBlock(a, p.to);
            WidenBlock(b, p.to + kBlock);
            WidenBlock(c, p.to + 2 * kBlock);
            WidenBlock(d, p.to + 3 * kBlock);
            p.from += kWide;
            p.to += kWide;
            continue;
        }
        std::uint64_t const starts = StartsIn(a) | StartsIn(b) << 16 | StartsIn(c) << 32 | StartsIn(d) << 48;
        auto const left = static_cast<std::size_t>(stop - p.from);
        p = DecodeWindows(p, starts >> 1, left < 48 ? left : 48);
    }
    return p;
}

constexpr std::size_t kReach = 80; // what DecodeBlocks may read

} // namespace

O_SSE41 Utf8Scan ScanUtf8Sse41(Byte const *from, std::size_t size) noexcept {
    Scanner s;
    Byte const *const end = from + size;
    for (; static_cast<std::size_t>(end - from) >= kWide; from += kWide) {
        ScanWide(s, from);
    }
    // At least one zero follows the rest, which turns a character cut short into an error.
    auto const left = static_cast<std::size_t>(end - from);
    alignas(kBlock) Byte rest[kWide] = {};
    if (left != 0) {
        std::memcpy(rest, from, left);
    }
    ScanWide(s, rest);
    bool const isWellFormed = _mm_testz_si128(s.errors, s.errors) != 0;
    return {s.units - (kWide - left), isWellFormed};
}

O_SSE41 void DecodeValidSse41(Byte const *from, std::size_t size, Unit *to, std::size_t count) noexcept {
    Byte const *const end = from + size;
    Unit *const toEnd = to + count;
    if (size >= kReach) {
        // From here on every byte is still followed by enough: 32 bytes left give more than the 8 units of a store.
        Position const p = DecodeBlocks({from, to}, end - kReach + 1);
        from = p.from;
        to = p.to;
    }
    // The rest goes through memory that may be read and written past its end.
    alignas(kBlock) Byte rest[2 * kReach] = {};
    alignas(kBlock) Unit units[2 * kReach];
    auto const left = static_cast<std::size_t>(end - from);
    if (left != 0) {
        std::memcpy(rest, from, left);
        DecodeBlocks({rest, units}, rest + left);
        std::memcpy(to, units, static_cast<std::size_t>(toEnd - to) * sizeof(Unit));
    }
}

} // namespace OUtf
