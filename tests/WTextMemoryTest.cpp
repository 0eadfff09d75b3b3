// WTextMemoryTest.cpp: a thread finds the blocks again that it gave back, up to 256 bytes and sixteen of a size; they go
// with the thread; and the system's last error outlives the copying of texts.

#include "KTString.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>
#include <windows.h>

#include <malloc.h>

#include <cstddef>
#include <iterator>
#include <set>
#include <vector>

namespace {

constexpr std::size_t kKept = 16;
constexpr DWORD kError = 1234;
constexpr std::size_t kKeptSizes[] = {16, 32, 64, 128, 256};

std::vector<void *> Allocate(std::size_t count, std::size_t size) {
    std::vector<void *> blocks;
    blocks.reserve(count);
    for (std::size_t i = 0; i < count; ++i) {
        blocks.push_back(KTAllocateUnits(size));
    }
    return blocks;
}

void Free(std::vector<void *> const &blocks, std::size_t size) {
    for (void *const block : blocks) {
        KTFreeUnits(block, size);
    }
}

void InNewThread(void (*body)()) { boost::thread(body).join(); }

// The blocks in use on the heap that the run-time's operators allocate from.
std::size_t BlocksInUse() {
    auto *const heap = reinterpret_cast<HANDLE>(_get_heap_handle()); // NOLINT(performance-no-int-to-ptr)
    std::size_t count = 0;
    PROCESS_HEAP_ENTRY entry{};
    while (HeapWalk(heap, &entry) != FALSE) {
        count += (entry.wFlags & PROCESS_HEAP_ENTRY_BUSY) != 0 ? 1 : 0;
    }
    return count;
}

void FillLists() {
    for (std::size_t const size : kKeptSizes) {
        Free(Allocate(kKept, size), size);
    }
}

// What is left of sixteen blocks that a thread took and gave back after its end had begun.
bool g_WatchesEnd = false;
bool g_SawEnd = false;
std::size_t g_LeftAtEnd = 0;

// The program's own callback at a thread's end comes after those of the libraries.
void NTAPI AtThreadsEnd(void *, DWORD reason, void *) {
    if (reason == DLL_THREAD_DETACH && g_WatchesEnd) {
        std::size_t const before = BlocksInUse();
        void *blocks[kKept];
        for (void *&block : blocks) {
            block = KTAllocateUnits(256);
        }
        for (void *const block : blocks) {
            KTFreeUnits(block, 256);
        }
        g_LeftAtEnd = BlocksInUse() - before;
        g_SawEnd = true;
    }
}

} // namespace

// Among the addresses that the system calls at every thread's start and end.
extern "C" {
extern PIMAGE_TLS_CALLBACK const ktAtThreadsEnd;
[[gnu::section(".CRT$XLY"), gnu::used]] PIMAGE_TLS_CALLBACK const ktAtThreadsEnd = AtThreadsEnd;
}

TEST(TextMemory, NothingIsKeptOnceAThreadsEndHasBegun) {
    g_WatchesEnd = true;
    InNewThread([] { KTString const text("a text that needs memory of its own"); });
    g_WatchesEnd = false;
    ASSERT_TRUE(g_SawEnd);
    EXPECT_EQ(g_LeftAtEnd, 0U);
}

TEST(TextMemory, TheBlockGivenBackLastIsTheNextOne) {
    for (std::size_t const size : kKeptSizes) {
        for (std::size_t const asked : {size, size - 1, size / 2 + 1}) {
            void *const block = KTAllocateUnits(asked);
            KTFreeUnits(block, asked);
            void *const next = KTAllocateUnits(size);
            EXPECT_EQ(block, next) << asked << " of " << size;
            KTFreeUnits(next, size);
        }
    }
}

TEST(TextMemory, AThreadKeepsSixteenBlocksOfASize) {
    InNewThread([] {
        for (std::size_t const size : kKeptSizes) {
            std::vector<void *> const blocks = Allocate(kKept, size);
            Free(blocks, size);
            std::vector<void *> const again = Allocate(kKept, size);
            EXPECT_EQ(std::set(blocks.begin(), blocks.end()), std::set(again.begin(), again.end()));
            Free(again, size);
        }
    });
}

TEST(TextMemory, BlocksGoWithTheirThread) {
    constexpr std::size_t kThreads = 50;
    constexpr std::size_t kEach = kKept * std::size(kKeptSizes);
    InNewThread(&FillLists);
    std::size_t const before = BlocksInUse();
    EXPECT_GT(before, 0U);
    for (std::size_t i = 0; i < kThreads; ++i) {
        InNewThread(&FillLists);
    }
    EXPECT_LT(BlocksInUse(), before + kEach); // what one thread would leave
}

TEST(TextMemory, LastErrorOutlivesTexts) {
    InNewThread([] {
        SetLastError(kError);
        {
            KTString const text("a text that needs memory of its own");
            std::vector<KTString> const copies(40, text);
        }
        EXPECT_EQ(kError, GetLastError());
    });
}
