// KTUnitTraits.cpp: the memory of texts.

#include "KTUnitTraits.h"

#include "OThreadSpares.h"

void *KTAllocateUnits(std::size_t size) { return OTakeBlock(size); }

void KTFreeUnits(void *block, std::size_t size) noexcept { OGiveBlock(block, size); }
