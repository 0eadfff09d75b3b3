// KTFixedSizedSlots.h: a table of a fixed number of slots that elements are put into and taken out of in constant time.
//
// All memory is in the object; nothing is allocated. A slot with index i is known outside by the id i + 1; the id 0 means
// none. Two lists run through the slots by index, -1 being the end:
//
//     free list, linked forwards            used list, linked both ways, the newest element first
//     m_FirstFree -> 4 -> 0 -> 5 -> ...     m_FirstUsed -> 3 <-> 1 <-> 2
//
// A fresh table's free list is 0, 1, ..., N - 1, so that ids are handed out from 1 on; a freed slot is the next one that
// is handed out again.
//
// Threads: one at a time; whoever shares a table locks it.

#pragma once

#include "KTTypes.h"

template <typename T, int N> class KTFixedSizedSlots {
    static_assert(N > 0);

  public:
    static constexpr KTInt64 kNone = 0;

    /// All slots are free and their elements zeroed.
    KTFixedSizedSlots() {
        for (int index = 0; index < N - 1; ++index) {
            m_Slots[index].nextFree = index + 1;
        }
    }
    KTFixedSizedSlots(KTFixedSizedSlots const &) = default;
    KTFixedSizedSlots &operator=(KTFixedSizedSlots const &) = default;
    virtual ~KTFixedSizedSlots() = default;

    /// Puts a copy of `element` into the first free slot and places it before all others. Returns the slot's id; 0, with
    /// nothing changed, when all N slots are taken.
    KTInt64 Allocate(T const &element) {
        KTInt32 const index = m_FirstFree;
        if (index == kEnd) {
            return kNone;
        }
        CSlot &slot = m_Slots[index];
        m_FirstFree = slot.nextFree;
        slot = {element, kEnd, m_FirstUsed, kEnd};
        if (m_FirstUsed != kEnd) {
            m_Slots[m_FirstUsed].previous = index;
        }
        m_FirstUsed = index;
        return ToId(index);
    }

    /// The element with this id. For an id that no element has, the scratch element, whose changes nobody sees.
    T &Find(KTInt64 id) { return IsUsed(id) ? m_Slots[ToIndex(id)].element : m_Scratch; }

    /// Takes out the element with this id and zeroes its slot. False for an id outside 1 to N. Freeing a slot that is
    /// free already changes nothing.
    bool Free(KTInt64 id) {
        if (!IsInRange(id)) {
            return false;
        }
        if (IsUsed(id)) {
            KTInt32 const index = ToIndex(id);
            Unlink(m_Slots[index]);
            m_Slots[index] = {T{}, kEnd, kEnd, m_FirstFree};
            m_FirstFree = index;
        }
        return true;
    }

    /// The id of the newest element, and of the next older one than that with id `id`; 0 at the end. REQUIRES: an element
    /// has the id. Taking out an element leaves the walk over the others as it is, so ask for the next one first.
    KTInt64 GetFirstUsed() const { return ToId(m_FirstUsed); }
    KTInt64 GetNextUsed(KTInt64 id) const { return ToId(m_Slots[ToIndex(id)].next); }

    /// N.
    KTInt32 GetCapacity() const { return m_Capacity; }

  private:
    static constexpr KTInt32 kEnd = -1;

    struct CSlot {
        T element{};
        KTInt32 previous = kEnd; ///< in the used list
        KTInt32 next = kEnd;     ///< in the used list
        KTInt32 nextFree = kEnd;
    };

    static constexpr KTInt64 ToId(KTInt32 index) { return KTInt64{index} + 1; }
    static constexpr KTInt32 ToIndex(KTInt64 id) { return static_cast<KTInt32>(id - 1); }
    static constexpr bool IsInRange(KTInt64 id) { return id >= 1 && id <= N; }

    // Only the head of the used list has no previous element there.
    bool IsUsed(KTInt64 id) const {
        return IsInRange(id) && (m_FirstUsed == ToIndex(id) || m_Slots[ToIndex(id)].previous != kEnd);
    }

    void Unlink(CSlot const &slot) {
        if (slot.previous == kEnd) {
            m_FirstUsed = slot.next;
        } else {
            m_Slots[slot.previous].next = slot.next;
        }
        if (slot.next != kEnd) {
            m_Slots[slot.next].previous = slot.previous;
        }
    }

    T m_Scratch{};
    CSlot m_Slots[N];
    KTInt32 m_Capacity = N;
    KTInt32 m_FirstFree = 0;
    KTInt32 m_FirstUsed = kEnd;
};
