// OThreadSpares.cpp: the per-thread lists of spare blocks.

#include "OThreadSpares.h"

#include <new>

namespace {

#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define KT_UNDER_ADDRESS_SANITIZER
#endif
#elif defined(__SANITIZE_ADDRESS__)
#define KT_UNDER_ADDRESS_SANITIZER
#endif

#if defined(KT_UNDER_ADDRESS_SANITIZER)
constexpr bool kKeepsBlocks = false;
#else
constexpr bool kKeepsBlocks = true;
#endif

// The list whose blocks are the first to hold so many bytes: 0 for up to 16, 1 for up to 32 and so on.
constexpr std::size_t ListFor(std::size_t size) { return size == 0 ? 0 : (size - 1) / kOSpareBlockStep; }

constexpr std::size_t BlockSize(std::size_t list) { return (list + 1) * kOSpareBlockStep; }

static_assert(ListFor(0) == 0 && ListFor(16) == 0 && ListFor(17) == 1 && BlockSize(ListFor(255)) == 256);

constexpr bool IsKept(std::size_t size) { return kKeepsBlocks && size <= kOLargestSpareBlock; }

} // namespace

void *OTakeBlock(std::size_t size) {
    if (!IsKept(size)) {
        return ::operator new(size);
    }
    OThreadSpares *const spares = OGetThreadSpares();
    void *const block = spares == nullptr ? nullptr : spares->Take(ListFor(size));
    return block == nullptr ? ::operator new(BlockSize(ListFor(size))) : block;
}

void OGiveBlock(void *block, std::size_t size) noexcept {
    OThreadSpares *const spares = IsKept(size) ? OGetThreadSpares() : nullptr;
    if (spares == nullptr || !spares->Keep(ListFor(size), block)) {
        ::operator delete(block);
    }
}

OThreadSpares::~OThreadSpares() { Close(); }

void *OThreadSpares::Take(std::size_t list) noexcept {
    List &blocks = m_Lists[list];
    Block *const block = blocks.first;
    if (block != nullptr) {
        blocks.first = block->next;
        --blocks.count;
    }
    return block;
}

bool OThreadSpares::Keep(std::size_t list, void *block) noexcept {
    List &blocks = m_Lists[list];
    if (blocks.count >= kOMostSpareBlocks) {
        return false;
    }
    blocks.first = ::new (block) Block{blocks.first};
    ++blocks.count;
    return true;
}

void OThreadSpares::Close() noexcept {
    for (List &blocks : m_Lists) {
        while (blocks.first != nullptr) {
            Block *const block = blocks.first;
            blocks.first = block->next;
            ::operator delete(block);
        }
        blocks.count = kOMostSpareBlocks;
    }
}
