// OThreadSpares_posix.cpp: the spare list's slot in the compiler's thread-local storage for the native developer build.

#include "OThreadSpares.h"

namespace {

struct Slot {
    ~Slot() {
        OFreeSpareBlocks(head);
        head = nullptr;
        ended = true;
    }

    void *head = nullptr;
    bool ended = false; // locks taken after this point find no slot
};

thread_local Slot t_Slot;

} // namespace

void *OGetThreadSpares() noexcept { return t_Slot.head; }

bool OSetThreadSpares(void *head) noexcept {
    if (!t_Slot.ended) {
        t_Slot.head = head;
    }
    return !t_Slot.ended;
}
