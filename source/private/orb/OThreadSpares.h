// OThreadSpares.h: a few spare blocks of memory for each thread.
//
// A scoped lock owns an implementation object, so taking a lock would allocate memory each time; on an uncontended mutex
// that costs several times what the mutex itself does. Each thread therefore keeps the blocks of its last few locks:
//
//     per-thread slot --> block [ next | depth ] --> block [ next | depth ] --> null
//
// No lock is needed, as only the owning thread touches its list. A block may be taken by one thread and kept by another.

#pragma once

#include <cstddef>

/// Size of every spare block in bytes.
constexpr std::size_t kOSpareBlockSize = 16;

/// A spare block of this thread, or a new one from the global heap. Throws std::bad_alloc.
void *OTakeSpareBlock();

/// Keeps the block for this thread's next OTakeSpareBlock, or frees it when the thread has enough.
void OKeepSpareBlock(void *block) noexcept;

// ---- for the platform file behind this header ----

/// The head of this thread's list; null at first, and always where the system has no slot left.
void *OGetThreadSpares() noexcept;

/// Sets the head of this thread's list. Returns false, and changes nothing, where the system has no slot left.
bool OSetThreadSpares(void *head) noexcept;

/// Frees a thread's whole list; the platform file calls it when the thread ends.
void OFreeSpareBlocks(void *head) noexcept;
