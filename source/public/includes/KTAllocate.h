// KTAllocate.h: one heap for the host and the library.
//
// Both functions forward to the run-time's global allocation operators inside the library, so a module can free what
// the library allocated and allocate what the library will free. They add nothing else.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Allocates `byteCount` bytes (0 is allowed and gives a distinct block) with the global allocation operator.
/// Returns the block, aligned for any standard type; free it with Deallocate. Throws std::bad_alloc when memory is
/// short. Any thread.
KT_PUBLIC_API void *Allocate(KTUInt64 byteCount);

/// Frees a block from Allocate (or from the library's global operator new). Null is allowed and does nothing. Never
/// throws. Any thread.
KT_PUBLIC_API void Deallocate(void *block);

#include "KTEndExports.h"
