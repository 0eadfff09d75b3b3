// ODigest_posix.cpp: the digests for the native developer build, by the steps of FIPS 180-4.

#include "ODigest.h"

#include <array>
#include <bit>
#include <cstdint>
#include <vector>

namespace {

using Word = std::uint32_t;

constexpr std::array<Word, 64> kSha256Words = {
    0x428a2f98, 0x71374491, 0xb5c0fbcf, 0xe9b5dba5, 0x3956c25b, 0x59f111f1, 0x923f82a4, 0xab1c5ed5,
    0xd807aa98, 0x12835b01, 0x243185be, 0x550c7dc3, 0x72be5d74, 0x80deb1fe, 0x9bdc06a7, 0xc19bf174,
    0xe49b69c1, 0xefbe4786, 0x0fc19dc6, 0x240ca1cc, 0x2de92c6f, 0x4a7484aa, 0x5cb0a9dc, 0x76f988da,
    0x983e5152, 0xa831c66d, 0xb00327c8, 0xbf597fc7, 0xc6e00bf3, 0xd5a79147, 0x06ca6351, 0x14292967,
    0x27b70a85, 0x2e1b2138, 0x4d2c6dfc, 0x53380d13, 0x650a7354, 0x766a0abb, 0x81c2c92e, 0x92722c85,
    0xa2bfe8a1, 0xa81a664b, 0xc24b8b70, 0xc76c51a3, 0xd192e819, 0xd6990624, 0xf40e3585, 0x106aa070,
    0x19a4c116, 0x1e376c08, 0x2748774c, 0x34b0bcb5, 0x391c0cb3, 0x4ed8aa4a, 0x5b9cca4f, 0x682e6ff3,
    0x748f82ee, 0x78a5636f, 0x84c87814, 0x8cc70208, 0x90befffa, 0xa4506ceb, 0xbef9a3f7, 0xc67178f2};

Word ReadWord(unsigned char const *from) {
    return (Word{from[0]} << 24) | (Word{from[1]} << 16) | (Word{from[2]} << 8) | Word{from[3]};
}

void Sha1Block(std::vector<Word> &hash, unsigned char const *block) {
    std::array<Word, 80> w{};
    for (std::size_t t = 0; t < 16; ++t) {
        w[t] = ReadWord(block + 4 * t);
    }
    for (std::size_t t = 16; t < 80; ++t) {
        w[t] = std::rotl(w[t - 3] ^ w[t - 8] ^ w[t - 14] ^ w[t - 16], 1);
    }
    Word a = hash[0];
    Word b = hash[1];
    Word c = hash[2];
    Word d = hash[3];
    Word e = hash[4];
    for (std::size_t t = 0; t < 80; ++t) {
        Word const f = t < 20   ? (b & c) ^ (~b & d)
                       : t < 40 ? b ^ c ^ d
                       : t < 60 ? (b & c) ^ (b & d) ^ (c & d)
                                : b ^ c ^ d;
        constexpr std::array<Word, 4> kRounds = {0x5a827999, 0x6ed9eba1, 0x8f1bbcdc, 0xca62c1d6};
        Word const next = std::rotl(a, 5) + f + e + kRounds[t / 20] + w[t];
        e = d;
        d = c;
        c = std::rotl(b, 30);
        b = a;
        a = next;
    }
    std::array<Word, 5> const result = {a, b, c, d, e};
    for (std::size_t i = 0; i < result.size(); ++i) {
        hash[i] += result[i];
    }
}

void Sha256Block(std::vector<Word> &hash, unsigned char const *block) {
    std::array<Word, 64> w{};
    for (std::size_t t = 0; t < 16; ++t) {
        w[t] = ReadWord(block + 4 * t);
    }
    for (std::size_t t = 16; t < 64; ++t) {
        Word const s0 = std::rotr(w[t - 15], 7) ^ std::rotr(w[t - 15], 18) ^ (w[t - 15] >> 3);
        Word const s1 = std::rotr(w[t - 2], 17) ^ std::rotr(w[t - 2], 19) ^ (w[t - 2] >> 10);
        w[t] = w[t - 16] + s0 + w[t - 7] + s1;
    }
    std::array<Word, 8> v{};
    for (std::size_t i = 0; i < v.size(); ++i) {
        v[i] = hash[i];
    }
    for (std::size_t t = 0; t < 64; ++t) {
        Word const sum1 = std::rotr(v[4], 6) ^ std::rotr(v[4], 11) ^ std::rotr(v[4], 25);
        Word const t1 = v[7] + sum1 + ((v[4] & v[5]) ^ (~v[4] & v[6])) + kSha256Words[t] + w[t];
        Word const sum0 = std::rotr(v[0], 2) ^ std::rotr(v[0], 13) ^ std::rotr(v[0], 22);
        Word const t2 = sum0 + ((v[0] & v[1]) ^ (v[0] & v[2]) ^ (v[1] & v[2]));
        v = {t1 + t2, v[0], v[1], v[2], v[3] + t1, v[4], v[5], v[6]};
    }
    for (std::size_t i = 0; i < v.size(); ++i) {
        hash[i] += v[i];
    }
}

} // namespace

struct ODigest::State {
    std::vector<Word> hash;
    std::vector<unsigned char> rest; // less than a block
    std::uint64_t bits = 0;

    void Block(ODigestKind kind, unsigned char const *block) {
        if (kind == ODigestKind::Sha1) {
            Sha1Block(hash, block);
        } else {
            Sha256Block(hash, block);
        }
    }
};

void ODigest::DeleteState::operator()(State *state) const noexcept { delete state; }

ODigest::ODigest(ODigestKind kind) : m_Kind(kind), m_State(new State) {
    if (kind == ODigestKind::Sha1) {
        m_State->hash = {0x67452301, 0xefcdab89, 0x98badcfe, 0x10325476, 0xc3d2e1f0};
    } else {
        m_State->hash = {0x6a09e667, 0xbb67ae85, 0x3c6ef372, 0xa54ff53a,
                         0x510e527f, 0x9b05688c, 0x1f83d9ab, 0x5be0cd19};
    }
}

void ODigest::Add(void const *bytes, std::size_t size) {
    auto const *next = static_cast<unsigned char const *>(bytes);
    m_State->bits += std::uint64_t{size} * 8;
    for (; size != 0; --size) {
        if (m_State->rest.empty() && size >= kOShaBlock) {
            m_State->Block(m_Kind, next);
            next += kOShaBlock;
            size -= kOShaBlock - 1;
            continue;
        }
        m_State->rest.push_back(*next++);
        if (m_State->rest.size() == kOShaBlock) {
            m_State->Block(m_Kind, m_State->rest.data());
            m_State->rest.clear();
        }
    }
}

void ODigest::Finish(unsigned char *digest) {
    std::uint64_t const bits = m_State->bits;
    unsigned char const one = 0x80;
    unsigned char const zero = 0;
    Add(&one, 1);
    while (m_State->rest.size() != kOShaBlock - 8) {
        Add(&zero, 1);
    }
    for (int shift = 56; shift >= 0; shift -= 8) {
        auto const byte = static_cast<unsigned char>(bits >> shift);
        Add(&byte, 1);
    }
    for (Word const word : m_State->hash) {
        for (int shift = 24; shift >= 0; shift -= 8) {
            *digest++ = static_cast<unsigned char>(word >> shift);
        }
    }
}
