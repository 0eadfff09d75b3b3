// KTUnitTraits.h: what std::basic_string needs to hold UTF-16 code units as unsigned short.
//
// The standard only promises std::char_traits for its own character types, so the library brings the traits for its
// units. Units compare as unsigned numbers; there is no locale and no normalisation.
//
// The memory for more units than the string holds inline (7) comes from the library, which keeps a few blocks for each
// thread: most texts live for a moment, and a block at hand takes a fraction of the heap's time. So every text's memory
// is taken and freed on the library's heap, whichever module does it.

#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <ios>
#include <string>

/// Traits of a UTF-16 code unit, with the meaning of the members as in std::char_traits.
struct KTUnitTraits {
    using char_type = unsigned short;
    using int_type = std::uint32_t;
    using off_type = std::streamoff;
    using pos_type = std::streampos;
    using state_type = std::mbstate_t;

    static constexpr void assign(char_type &to, char_type const &from) noexcept { to = from; }
    static constexpr bool eq(char_type a, char_type b) noexcept { return a == b; }
    static constexpr bool lt(char_type a, char_type b) noexcept { return a < b; }

    static constexpr int compare(char_type const *a, char_type const *b, std::size_t count) noexcept {
        for (std::size_t i = 0; i < count; ++i) {
            if (a[i] != b[i]) {
                return a[i] < b[i] ? -1 : 1;
            }
        }
        return 0;
    }

    static constexpr std::size_t length(char_type const *text) noexcept {
        std::size_t count = 0;
        while (text[count] != 0) {
            ++count;
        }
        return count;
    }

    static constexpr char_type const *find(char_type const *text, std::size_t count, char_type const &unit) noexcept {
        for (std::size_t i = 0; i < count; ++i) {
            if (text[i] == unit) {
                return text + i;
            }
        }
        return nullptr;
    }

    static char_type *move(char_type *to, char_type const *from, std::size_t count) noexcept {
        return count == 0 ? to : static_cast<char_type *>(std::memmove(to, from, count * sizeof(char_type)));
    }

    static char_type *copy(char_type *to, char_type const *from, std::size_t count) noexcept {
        Copy(to, from, count);
        return to;
    }

    static constexpr char_type *assign(char_type *to, std::size_t count, char_type unit) noexcept {
        for (std::size_t i = 0; i < count; ++i) {
            to[i] = unit;
        }
        return to;
    }

    static constexpr char_type to_char_type(int_type value) noexcept { return static_cast<char_type>(value); }
    static constexpr int_type to_int_type(char_type unit) noexcept { return unit; }
    static constexpr bool eq_int_type(int_type a, int_type b) noexcept { return a == b; }
    static constexpr int_type eof() noexcept { return 0xFFFFFFFFU; }
    static constexpr int_type not_eof(int_type value) noexcept { return value == eof() ? 0U : value; }

  private:
    // Most texts are short: a call of the general function would cost more than the copy. The blocks do not overlap, as
    // the next copy would have to wait before it can read what two blocks wrote. Not inlined, as compilers that see a
    // text's few units beside the branches for more warn without reason.
    [[gnu::noinline]] static void Copy(char_type *to, char_type const *from, std::size_t count) noexcept {
        if (count >= 32) {
            std::memcpy(to, from, count * sizeof(char_type));
            return;
        }
        CopyBlock<16>(to, from, count);
        CopyBlock<8>(to, from, count);
        CopyBlock<4>(to, from, count);
        CopyBlock<2>(to, from, count);
        CopyBlock<1>(to, from, count);
    }

    // Copies a block if `count` has one of its size, and steps over it.
    template <std::size_t Size>
    static void CopyBlock(char_type *&to, char_type const *&from, std::size_t count) noexcept {
        if ((count & Size) != 0) {
            std::memcpy(to, from, Size * sizeof(char_type));
            to += Size;
            from += Size;
        }
    }
};

#include "KTBeginExports.h"

/// Memory for units: a block of at least `size` bytes, aligned for any standard type. Free it with KTFreeUnits. Throws
/// std::bad_alloc. Any thread.
[[gnu::malloc, gnu::returns_nonnull]] KT_PUBLIC_API void *KTAllocateUnits(std::size_t size);

/// Frees a block from KTAllocateUnits, of which `size` was asked, or keeps it for this thread's next one. The thread
/// need not be the one that allocated it. REQUIRES: block is not null. The system's last error stays as it is.
KT_PUBLIC_API void KTFreeUnits(void *block, std::size_t size) noexcept;

#include "KTEndExports.h"

/// The allocator of units over KTAllocateUnits. It has no state: any of them frees what another one allocated.
template <typename Unit> struct KTUnitAllocator {
    using value_type = Unit;

    constexpr KTUnitAllocator() noexcept = default;
    template <typename Other> constexpr KTUnitAllocator(KTUnitAllocator<Other> const &) noexcept {}

    Unit *allocate(std::size_t count) { return static_cast<Unit *>(KTAllocateUnits(count * sizeof(Unit))); }
    void deallocate(Unit *units, std::size_t count) noexcept { KTFreeUnits(units, count * sizeof(Unit)); }

    /// The most units that an object can hold, as for the standard allocator.
    static constexpr std::size_t max_size() noexcept { return static_cast<std::size_t>(PTRDIFF_MAX) / sizeof(Unit); }

    friend constexpr bool operator==(KTUnitAllocator const &, KTUnitAllocator const &) noexcept { return true; }
};

/// A run of UTF-16 code units, always followed by a terminating zero unit. The storage behind KTString and OString.
using KTUnits = std::basic_string<unsigned short, KTUnitTraits, KTUnitAllocator<unsigned short>>;
