// OThreadSpares.cpp: the per-thread list of spare blocks.

#include "OThreadSpares.h"

#include <new>

namespace {

constexpr std::size_t kMostSpares = 8; // scoped locks are rarely nested deeper

struct SpareBlock {
    SpareBlock *next;
    std::size_t depth; // blocks in the list from this one on
};

static_assert(sizeof(SpareBlock) <= kOSpareBlockSize);

} // namespace

void *OTakeSpareBlock() {
    auto *const head = static_cast<SpareBlock *>(OGetThreadSpares());
    if (head == nullptr) {
        return ::operator new(kOSpareBlockSize);
    }
    OSetThreadSpares(head->next);
    return head;
}

void OKeepSpareBlock(void *block) noexcept {
    auto *const next = static_cast<SpareBlock *>(OGetThreadSpares());
    std::size_t const depth = next == nullptr ? 1 : next->depth + 1;
    if (depth > kMostSpares || !OSetThreadSpares(::new (block) SpareBlock{next, depth})) {
        ::operator delete(block);
    }
}

void OFreeSpareBlocks(void *head) noexcept {
    for (auto *block = static_cast<SpareBlock *>(head); block != nullptr;) {
        SpareBlock *const next = block->next;
        ::operator delete(block);
        block = next;
    }
}
