// UnitMemory.cpp: the memory of texts, from the heap. The library's functions would make this program load it.

#include "KTUnitTraits.h"

#include <new>

void *KTAllocateUnits(std::size_t size) { return ::operator new(size); }

void KTFreeUnits(void *block, std::size_t) noexcept { ::operator delete(block); }
