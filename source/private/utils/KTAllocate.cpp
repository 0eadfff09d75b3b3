// KTAllocate.cpp: the library's global allocation pair.

#include "KTAllocate.h"

#include <new>

void *Allocate(KTUInt64 byteCount) { return ::operator new(static_cast<std::size_t>(byteCount)); }

void Deallocate(void *block) { ::operator delete(block); }
