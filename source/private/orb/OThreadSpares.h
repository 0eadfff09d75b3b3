// OThreadSpares.h: a few spare blocks of memory for each thread.
//
// A scoped lock owns an implementation object and a text of more than seven units a block for them. Most live for a
// moment, and the heap's call would cost several times what is done with them. Each thread therefore keeps the blocks
// that it last gave back, in lists by size:
//
//     per-thread slot --> OThreadSpares
//                             lists[0]    16 bytes   first --> block --> block --> null     count 2
//                             lists[1]    32 bytes   first --> null                         count 0
//                             lists[2]    48 bytes   ...
//                             lists[15]  256 bytes   first --> block --> null               count 1
//
// The sizes are the heap's own steps: coarser ones would make many texts that are kept take more memory.
// No lock is needed, as only the owning thread touches its lists. A block may be taken by one thread and kept by
// another. Larger blocks come from and go to the global heap, and so does what a list has no room for. Under
// AddressSanitizer nothing is kept, so that it sees the use of a block that was given back.

#pragma once

#include <cstddef>

/// A block of at least `size` bytes, aligned for any standard type: a spare one of this thread, or a new one from the
/// global heap. Throws std::bad_alloc.
void *OTakeBlock(std::size_t size);

/// Gives the block back, which OTakeBlock handed out for the same size, on this thread or another one. This thread
/// keeps it, or frees it when it has enough. REQUIRES: block is not null.
void OGiveBlock(void *block, std::size_t size) noexcept;
