// OThreadSpares.cpp: the end of a thread's spare blocks.

#include "OThreadSpareLists.h"

#include <new>

OThreadSpares::~OThreadSpares() { Close(); }

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
