// WTextMemoryTest.cpp: a thread finds the blocks again that it gave back, up to 256 bytes and eight of a size; they go
// with the thread; and the system's last error outlives the copying of texts.

#include "KTString.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>
#include <windows.h>

#include <malloc.h>

#include <atomic>
#include <cstddef>
#include <iterator>
#include <set>
#include <vector>

namespace {

constexpr std::size_t kKept = 8;
constexpr DWORD kError = 1234;
constexpr std::size_t kKeptSizes[] = {16, 32, 48, 64, 80, 96, 112, 128, 144, 160, 176, 192, 208, 224, 240, 256};

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

// ---- the end of a thread, as a program's own thread-local texts meet it: behind the libraries' entry points ----

std::atomic<DWORD> endingThread{0}; // whose end is looked at
std::size_t blocksBeforeEnd = 0;
std::size_t blocksAfterEnd = 0;

void NTAPI OnThreadEnd(PVOID, DWORD reason, PVOID) {
    if (reason == DLL_THREAD_DETACH && GetCurrentThreadId() == endingThread) {
        blocksBeforeEnd = BlocksInUse();
        FillLists();
        blocksAfterEnd = BlocksInUse();
    }
}

// Among the program's thread-local storage callbacks.
[[gnu::section(".CRT$XLE"), gnu::used]] PIMAGE_TLS_CALLBACK onThreadEnd = &OnThreadEnd;

} // namespace

TEST(TextMemory, TheBlockGivenBackLastIsTheNextOne) {
    for (std::size_t const size : kKeptSizes) {
        for (std::size_t const asked : {size, size - 1, size - 15}) {
            void *const block = KTAllocateUnits(asked);
            KTFreeUnits(block, asked);
            void *const next = KTAllocateUnits(size);
            EXPECT_EQ(block, next) << asked << " of " << size;
            KTFreeUnits(next, size);
        }
    }
}

TEST(TextMemory, AThreadKeepsEightBlocksOfASize) {
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

TEST(TextMemory, AThreadThatEndsKeepsNothing) {
    InNewThread([] { endingThread = GetCurrentThreadId(); });
    EXPECT_GT(blocksBeforeEnd, 0U); // it was seen
    EXPECT_EQ(blocksBeforeEnd, blocksAfterEnd);
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
