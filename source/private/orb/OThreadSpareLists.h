// OThreadSpareLists.h: the lists behind OThreadSpares.h, for the platform file that knows where a thread has its own.
//
// All is inline: taking a block and giving it back is a matter of some ten instructions, and of no more than one call.

#pragma once

#include "OThreadSpares.h"

#include <cstddef>
#include <new>

#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define KT_UNDER_ADDRESS_SANITIZER
#endif
#elif defined(__SANITIZE_ADDRESS__)
#define KT_UNDER_ADDRESS_SANITIZER
#endif

#if defined(KT_UNDER_ADDRESS_SANITIZER)
constexpr bool kOKeepsSpareBlocks = false;
#else
constexpr bool kOKeepsSpareBlocks = true;
#endif

/// What the blocks' sizes are multiples of, in bytes.
constexpr std::size_t kOSpareBlockStep = 16;

/// Largest block in bytes that a thread keeps.
constexpr std::size_t kOLargestSpareBlock = 256;

/// Most blocks that a thread keeps of each size.
constexpr unsigned kOMostSpareBlocks = 8;

/// One thread's spare blocks.
class OThreadSpares {
  public:
    /// Keeps none.
    OThreadSpares() noexcept = default;

    OThreadSpares(OThreadSpares const &) = delete;
    OThreadSpares &operator=(OThreadSpares const &) = delete;

    /// Frees all blocks.
    ~OThreadSpares();

    /// A kept block of the list, or null if there is none.
    void *Take(std::size_t list) noexcept {
        List &blocks = m_Lists[list];
        Block *const block = blocks.first;
        if (block != nullptr) {
            blocks.first = block->next;
            --blocks.count;
        }
        return block;
    }

    /// Keeps the block in the list. Returns false, and leaves it to the caller, when the list is full.
    bool Keep(std::size_t list, void *block) noexcept {
        List &blocks = m_Lists[list];
        if (blocks.count >= kOMostSpareBlocks) {
            return false;
        }
        blocks.first = ::new (block) Block{blocks.first};
        ++blocks.count;
        return true;
    }

    /// Frees all blocks, and keeps none from now on: for a thread that ends.
    void Close() noexcept;

  private:
    struct Block {
        Block *next;
    };

    struct List {
        Block *first = nullptr;
        unsigned count = 0;
    };

    List m_Lists[kOLargestSpareBlock / kOSpareBlockStep];
};

// Whether blocks of the size are kept at all.
constexpr bool OIsSpareSize(std::size_t size) { return kOKeepsSpareBlocks && size <= kOLargestSpareBlock; }

// The list whose blocks are the first to hold so many bytes: 0 for up to 16, 1 for up to 32 and so on.
constexpr std::size_t OSpareListFor(std::size_t size) { return size == 0 ? 0 : (size - 1) / kOSpareBlockStep; }

constexpr std::size_t OSpareBlockSize(std::size_t list) { return (list + 1) * kOSpareBlockStep; }

static_assert(OSpareListFor(0) == 0 && OSpareListFor(16) == 0 && OSpareListFor(17) == 1);
static_assert(OSpareBlockSize(OSpareListFor(255)) == 256);

/// What OTakeBlock does; find() returns this thread's spare blocks, or null where there are none.
template <typename Find> void *OTakeBlockFrom(Find const &find, std::size_t size) {
    if (!OIsSpareSize(size)) {
        return ::operator new(size);
    }
    OThreadSpares *const spares = find();
    void *const block = spares == nullptr ? nullptr : spares->Take(OSpareListFor(size));
    return block == nullptr ? ::operator new(OSpareBlockSize(OSpareListFor(size))) : block;
}

/// What OGiveBlock does.
template <typename Find> void OGiveBlockTo(Find const &find, void *block, std::size_t size) noexcept {
    OThreadSpares *const spares = OIsSpareSize(size) ? find() : nullptr;
    if (spares == nullptr || !spares->Keep(OSpareListFor(size), block)) {
        ::operator delete(block);
    }
}
