// OThreadSpares_posix.cpp: a thread's spare blocks in the compiler's thread-local storage for the native developer
// build.

#include "OThreadSpares.h"

namespace {

struct Slot {
    ~Slot() { ended = true; }

    OThreadSpares spares;
    bool ended = false; // blocks given back after this point find no slot
};

thread_local Slot t_Slot;

} // namespace

OThreadSpares *OGetThreadSpares() noexcept { return t_Slot.ended ? nullptr : &t_Slot.spares; }
