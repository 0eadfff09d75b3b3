// KTBase64Sse41.cpp: Base64 in steps of 12 bytes and 16 characters, by byte shuffles and multiplications that move bits.
//
// The method is that of Mula and Lemire, "Faster Base64 Encoding and Decoding Using AVX2 Instructions" (2018), in blocks
// of 16 bytes. Within each lane of 32 bits, lowest bit at the right:
//
//     encoding   bytes in order b a c b     bbbbBBBB aaaaaaAA ccCCCCCC bbbbBBBB
//                values (6 bits each)       00CCCCCC 00BBBBcc 00AAbbbb 00aaaaaa
//     decoding   values                     00dddddd 00cccccc 00bbbbbb 00aaaaaa
//                24 bits                    00000000 aaaaaabb bbbbcccc ccdddddd

#include "KTBase64.h"

#include "OUtfSse41.h"

#include <smmintrin.h>

namespace {

using KTBase64::Byte;
using OUtf::Load;
using OUtf::Store;

using Table = std::array<Byte, OUtf::kBlock>;

O_INLINE __m128i Bytes(int value) { return _mm_set1_epi8(static_cast<char>(value)); }
O_INLINE __m128i LoadTable(Table const &table) { return Load(table.data()); }

// ---- encoding ----

constexpr Table kSpread = {1, 0, 2, 1, 4, 3, 5, 4, 7, 6, 8, 7, 10, 9, 11, 10};

// What is added to a value to get its character, by the value's range:
//     0          26..51: a..z
//     1..12      52..63: 0..9, +, /   (value - 51)
//     13         0..25: A..Z
constexpr Table kToCharacter = [] {
    Table table{};
    table[0] = 'a' - 26;
    for (int value = 52; value < 64; ++value) {
        table[static_cast<std::size_t>(value - 51)] =
            static_cast<Byte>(KTBase64::kAlphabet[static_cast<std::size_t>(value)] - value);
    }
    table[13] = 'A';
    return table;
}();

O_SSE41_INLINE __m128i EncodeBlock(__m128i bytes) {
    __m128i const spread = _mm_shuffle_epi8(bytes, LoadTable(kSpread));
    __m128i const upper = _mm_mulhi_epu16(_mm_and_si128(spread, _mm_set1_epi32(0x0FC0FC00)),
                                          _mm_set1_epi32(0x04000040)); // first and third value
    __m128i const lower = _mm_mullo_epi16(_mm_and_si128(spread, _mm_set1_epi32(0x003F03F0)),
                                          _mm_set1_epi32(0x01000010)); // second and fourth value
    __m128i const values = _mm_or_si128(upper, lower);
    __m128i const isUpperCase = _mm_cmpgt_epi8(Bytes(26), values);
    __m128i const range = _mm_or_si128(_mm_subs_epu8(values, Bytes(51)), _mm_and_si128(isUpperCase, Bytes(13)));
    return _mm_add_epi8(values, _mm_shuffle_epi8(LoadTable(kToCharacter), range));
}

// ---- decoding ----

// Which of the five kinds of upper half a character has: the alphabet takes other lower halves in each.
constexpr Byte KindOf(unsigned high) {
    switch (high) {
    case 2: // + and /
        return 0x01;
    case 3: // digits
        return 0x02;
    case 4: // A to O and a to o
    case 6:
        return 0x04;
    case 5: // P to Z and p to z
    case 7:
        return 0x08;
    default:
        return 0x10;
    }
}

constexpr Table kKinds = [] {
    Table table{};
    for (unsigned high = 0; high < 16; ++high) {
        table[high] = KindOf(high);
    }
    return table;
}();

// The kinds in which a lower half does not make a character of the alphabet.
constexpr Table kIllegal = [] {
    Table table{};
    for (unsigned low = 0; low < 16; ++low) {
        for (unsigned high = 0; high < 16; ++high) {
            if (KTBase64::kValues[high * 16 + low] == KTBase64::kNoValue) {
                table[low] = static_cast<Byte>(table[low] | KindOf(high));
            }
        }
    }
    return table;
}();

// What is added to a character to get its value, by its upper half; "/", whose value does not follow from "+"'s, has
// the free place below.
constexpr Table kToValue = [] {
    Table table{};
    for (unsigned high = 2; high < 8; ++high) {
        unsigned const character = high == 2 ? '+' : high * 16 + (high == 3 ? 0U : 1U);
        table[high] = static_cast<Byte>(KTBase64::kValues[character] - character);
    }
    table[1] = static_cast<Byte>(KTBase64::kValues[Byte{'/'}] - Byte{'/'});
    return table;
}();

constexpr Table kPack = {2, 1, 0, 6, 5, 4, 10, 9, 8, 14, 13, 12, 0x80, 0x80, 0x80, 0x80};

// The twelve bytes of sixteen characters; false if not all are of the alphabet.
O_SSE41_INLINE bool DecodeBlock(__m128i characters, __m128i &bytes) {
    __m128i const half = Bytes(0x0F);
    __m128i const high = _mm_and_si128(_mm_srli_epi32(characters, 4), half);
    __m128i const low = _mm_and_si128(characters, half);
    __m128i const kinds = _mm_shuffle_epi8(LoadTable(kKinds), high);
    __m128i const illegal = _mm_shuffle_epi8(LoadTable(kIllegal), low);
    if (_mm_testz_si128(kinds, illegal) == 0) {
        return false;
    }
    __m128i const isSlash = _mm_cmpeq_epi8(characters, Bytes('/')); // 0 or -1
    __m128i const change = _mm_shuffle_epi8(LoadTable(kToValue), _mm_add_epi8(high, isSlash));
    __m128i const values = _mm_add_epi8(characters, change);
    __m128i const pairs = _mm_maddubs_epi16(values, _mm_set1_epi32(0x01400140));
    __m128i const groups = _mm_madd_epi16(pairs, _mm_set1_epi32(0x00011000));
    bytes = _mm_shuffle_epi8(groups, LoadTable(kPack));
    return true;
}

} // namespace

O_SSE41 std::size_t KTBase64::EncodeRunSse41(Byte const *from, std::size_t size, char *to) noexcept {
    Byte const *const begin = from;
    for (; size >= OUtf::kBlock; size -= kRunBytes) {
        Store(to, EncodeBlock(Load(from)));
        from += kRunBytes;
        to += kRunCharacters;
    }
    return static_cast<std::size_t>(from - begin);
}

O_SSE41 std::size_t KTBase64::DecodeRunSse41(Byte const *from, std::size_t size, char *to) noexcept {
    Byte const *const begin = from;
    __m128i bytes;
    for (; size >= kRunCharacters && DecodeBlock(Load(from), bytes); size -= kRunCharacters) {
        Store(to, bytes);
        from += kRunCharacters;
        to += kRunBytes;
    }
    return static_cast<std::size_t>(from - begin);
}
