// SipHash.h: SipHash-c-d, the keyed hash of J.-P. Aumasson and D. J. Bernstein ("SipHash: a fast short-input PRF",
// 2012): c rounds for each 8 bytes, d at the end. Who does not know the secret cannot make inputs that collide. Pure.

#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace orvik_private {

/// 128 bits, the first 64 of which are bytes 0 to 7 of the published form, least significant first.
struct SipSecret {
    std::uint64_t first = 0;
    std::uint64_t second = 0;
};

class SipState {
  public:
    explicit SipState(SipSecret const &secret) noexcept
        : m_V0(secret.first ^ 0x736F6D6570736575), m_V1(secret.second ^ 0x646F72616E646F6D),
          m_V2(secret.first ^ 0x6C7967656E657261), m_V3(secret.second ^ 0x7465646279746573) {}

    template <int Rounds> void Mix(std::uint64_t word) noexcept {
        m_V3 ^= word;
        for (int i = 0; i < Rounds; ++i) {
            Round();
        }
        m_V0 ^= word;
    }

    template <int Rounds> std::uint64_t Finish() noexcept {
        m_V2 ^= 0xFF;
        for (int i = 0; i < Rounds; ++i) {
            Round();
        }
        return m_V0 ^ m_V1 ^ m_V2 ^ m_V3;
    }

  private:
    void Round() noexcept {
        m_V0 += m_V1;
        m_V1 = std::rotl(m_V1, 13) ^ m_V0;
        m_V0 = std::rotl(m_V0, 32);
        m_V2 += m_V3;
        m_V3 = std::rotl(m_V3, 16) ^ m_V2;
        m_V0 += m_V3;
        m_V3 = std::rotl(m_V3, 21) ^ m_V0;
        m_V2 += m_V1;
        m_V1 = std::rotl(m_V1, 17) ^ m_V2;
        m_V2 = std::rotl(m_V2, 32);
    }

    std::uint64_t m_V0, m_V1, m_V2, m_V3;
};

/// The 8 bytes at `bytes` as a number, the least significant one first.
inline std::uint64_t SipWord(char const *bytes) noexcept {
    std::uint64_t word = 0;
    if constexpr (std::endian::native == std::endian::little) {
        std::memcpy(&word, bytes, sizeof word);
    } else {
        for (unsigned i = 0; i < sizeof word; ++i) {
            word |= std::uint64_t{static_cast<unsigned char>(bytes[i])} << (8 * i);
        }
    }
    return word;
}

/// The last word: the bytes that no whole word took, and the length above them. Where there are 8 bytes they are read
/// at once, with some of the word before, which are shifted out.
inline std::uint64_t SipLastWord(std::string_view bytes) noexcept {
    std::size_t const left = bytes.size() % 8;
    std::uint64_t word = 0;
    if (left != 0 && bytes.size() >= 8) {
        word = SipWord(bytes.data() + bytes.size() - 8) >> (8 * (8 - left));
    } else {
        for (std::size_t i = 0; i < left; ++i) {
            word |= std::uint64_t{static_cast<unsigned char>(bytes[i])} << (8 * i);
        }
    }
    return word | std::uint64_t{bytes.size()} << 56;
}

template <int Rounds, int LastRounds> std::uint64_t SipHash(SipSecret const &secret, std::string_view bytes) noexcept {
    SipState state(secret);
    for (std::size_t at = 0; at + 8 <= bytes.size(); at += 8) {
        state.Mix<Rounds>(SipWord(bytes.data() + at));
    }
    state.Mix<Rounds>(SipLastWord(bytes));
    return state.Finish<LastRounds>();
}

} // namespace orvik_private
