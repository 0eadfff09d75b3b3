// KeyIndex.cpp: the hash of keys, and the table's growth.

#include "KeyIndex.h"

#include <cstddef>
#include <cstring>
#include <random>
#include <utility>

namespace orvik_private {

namespace {

std::uint64_t RandomWord() {
    std::random_device device;
    return std::uint64_t{device()} << 32 | device();
}

// A table is full when three quarters of its slots are taken.
std::uint64_t Room(std::uint64_t slots) noexcept { return slots / 4 * 3; }

} // namespace

KeyIndex::KeyIndex() : m_Secret{RandomWord(), RandomWord()} {}

std::uint32_t KeyIndex::TagOf(std::string_view key) const noexcept {
    std::uint64_t const hash = SipHash<1, 3>(m_Secret, key);
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
