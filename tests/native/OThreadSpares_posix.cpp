// OThreadSpares_posix.cpp: a thread's spare blocks in the compiler's thread-local storage for the native developer
// build.

#include "OThreadSpareLists.h"

namespace {

struct Slot {
    ~Slot() { ended = true; }

    OThreadSpares spares;
    bool ended = false; // blocks given back after this point find no slot
};

thread_local Slot t_Slot;

OThreadSpares *FindThreadSpares() noexcept { return t_Slot.ended ? nullptr : &t_Slot.spares; }

} // namespace

void *OTakeBlock(std::size_t size) { return OTakeBlockFrom(FindThreadSpares, size); }

void OGiveBlock(void *block, std::size_t size) noexcept { OGiveBlockTo(FindThreadSpares, block, size); }
