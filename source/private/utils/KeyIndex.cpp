// KeyIndex.cpp: the hash of keys, and the table's growth.

#include "KeyIndex.h"

#include <bit>
#include <cstddef>
#include <cstring>
#include <random>
#include <utility>

namespace orvik_private {

namespace {

// The state of SipHash: four words, mixed once for each 8 bytes and three times at the end.
struct SipState {
    std::uint64_t v0, v1, v2, v3;

    void Round() noexcept {
        v0 += v1;
        v1 = std::rotl(v1, 13) ^ v0;
        v0 = std::rotl(v0, 32);
        v2 += v3;
        v3 = std::rotl(v3, 16) ^ v2;
        v0 += v3;
        v3 = std::rotl(v3, 21) ^ v0;
        v2 += v1;
        v1 = std::rotl(v1, 17) ^ v2;
        v2 = std::rotl(v2, 32);
    }

    void Mix(std::uint64_t word) noexcept {
        v3 ^= word;
        Round();
        v0 ^= word;
    }
};

std::uint64_t RandomWord() {
    std::random_device device;
    return std::uint64_t{device()} << 32 | device();
}

// A table is full when three quarters of its slots are taken.
std::uint64_t Room(std::uint64_t slots) noexcept { return slots / 4 * 3; }

} // namespace

KeyIndex::KeyIndex() : m_Secret{RandomWord(), RandomWord()} {}

std::uint32_t KeyIndex::TagOf(std::string_view key) const noexcept {
    SipState state{m_Secret[0] ^ 0x736F6D6570736575, m_Secret[1] ^ 0x646F72616E646F6D, m_Secret[0] ^ 0x6C7967656E657261,
                   m_Secret[1] ^ 0x7465646279746573};
    char const *bytes = key.data();
    std::size_t left = key.size();
    std::uint64_t word = 0;
    for (; left >= sizeof word; bytes += sizeof word, left -= sizeof word) {
        std::memcpy(&word, bytes, sizeof word);
        state.Mix(word);
    }
    word = std::uint64_t{key.size()} << 56;
    for (std::size_t i = 0; i < left; ++i) {
        word |= std::uint64_t{static_cast<unsigned char>(bytes[i])} << (8 * i);
    }
    state.Mix(word);
    state.v2 ^= 0xFF;
    for (int i = 0; i < 3; ++i) {
        state.Round();
    }
    std::uint64_t const hash = state.v0 ^ state.v1 ^ state.v2 ^ state.v3;
    return static_cast<std::uint32_t>(hash ^ hash >> 32);
}

void KeyIndex::Reserve(std::uint64_t count) {
    std::uint64_t slots = m_Mask == 0 ? 0 : m_Mask + 1;
    if (count <= Room(slots)) {
        return;
    }
    constexpr std::uint64_t kFewest = 16;
    slots = kFewest;
    while (Room(slots) < count) {
        slots *= 2;
    }
    std::unique_ptr<Slot[]> const old = std::exchange(m_Slots, std::make_unique_for_overwrite<Slot[]>(slots));
    std::uint64_t const oldSlots = m_Mask == 0 ? 0 : m_Mask + 1;
    m_Mask = slots - 1;
    std::memset(m_Slots.get(), 0xFF, slots * sizeof(Slot));
    for (std::uint64_t i = 0; i < oldSlots; ++i) {
        if (old[i].entry != kNone) {
            Put(old[i]);
        }
    }
}

void KeyIndex::Put(Slot slot) noexcept {
    std::uint64_t at = slot.tag & m_Mask;
    while (m_Slots[at].entry != kNone) {
        at = (at + 1) & m_Mask;
    }
    m_Slots[at] = slot;
}

} // namespace orvik_private
