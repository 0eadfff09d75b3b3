// KeyIndex.h: finds the entry of a key in about constant time, whatever the number of entries.
//
// The file's own hash looks at some five bytes of a key and has 1021 buckets, so its chains grow with the dictionary.
// This index stands beside it and is never written: an open-addressing table with linear probing, at most three quarters
// full, a power of two in size, of
//
//     u32 tag     32 bits of the key's hash; its low bits say where the search begins
//     u32 entry   global index; 0xFFFFFFFF in an empty slot
//
// Keys are hashed with SipHash-1-3 under a random secret, so no file can be made whose keys all meet in one place.

#pragma once

#include "SipHash.h"

#include <cstdint>
#include <memory>
#include <string_view>

namespace orvik_private {

class KeyIndex {
  public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    KeyIndex();

    /// The key's tag under this index's secret.
    std::uint32_t TagOf(std::string_view key) const noexcept;

    /// The entry with that tag for which `isKey(entry)` holds, or kNone.
    template <typename IsKey> std::uint32_t Find(std::uint32_t tag, IsKey const &isKey) const {
        Slot const *const slot = FindSlot(tag, isKey);
        return slot == nullptr ? kNone : slot->entry;
    }

    /// Links an entry. One with the same key gives up its place: it is returned, or kNone.
    template <typename IsKey> std::uint32_t Link(std::uint32_t tag, std::uint32_t entry, IsKey const &isKey) {
        if (Slot *const slot = FindSlot(tag, isKey); slot != nullptr) {
            std::uint32_t const before = slot->entry;
            slot->entry = entry;
            return before;
        }
        Reserve(m_Count + 1);
        Put({tag, entry});
        ++m_Count;
        return kNone;
    }

    /// Asks the processor to fetch the place where a search for that tag begins.
    void Prefetch(std::uint32_t tag) const noexcept {
#if defined(__GNUC__)
        __builtin_prefetch(m_Slots.get() + (tag & m_Mask));
#endif
    }

    /// Makes room for `count` entries in all. Throws std::bad_alloc, and nothing has changed then.
    void Reserve(std::uint64_t count);

    /// Entries linked.
    std::uint64_t Count() const noexcept { return m_Count; }

  private:
    struct Slot {
        std::uint32_t tag;
        std::uint32_t entry;
    };

    template <typename IsKey> Slot *FindSlot(std::uint32_t tag, IsKey const &isKey) const {
        if (m_Mask == 0) {
            return nullptr;
        }
        for (std::uint64_t at = tag & m_Mask;; at = (at + 1) & m_Mask) {
            Slot &slot = m_Slots[at];
            if (slot.entry == kNone) {
                return nullptr;
            }
            if (slot.tag == tag && isKey(slot.entry)) {
                return &slot;
            }
        }
    }

    void Put(Slot slot) noexcept;

    std::unique_ptr<Slot[]> m_Slots;
    std::uint64_t m_Mask = 0; // slots less one; 0 when there are none
    std::uint64_t m_Count = 0;
    SipSecret m_Secret;
};

} // namespace orvik_private
