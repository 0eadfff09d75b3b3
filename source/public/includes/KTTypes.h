// KTTypes.h: the fixed-width names that the library's interfaces are written in.

#pragma once

#include <cstdint>

/// Signed 32-bit integer.
using KTInt32 = std::int32_t;

/// Unsigned 32-bit integer.
using KTUInt32 = std::uint32_t;

/// Signed 64-bit integer.
using KTInt64 = std::int64_t;

/// Unsigned 64-bit integer.
using KTUInt64 = std::uint64_t;

/// 16-bit boolean: 0 is false, anything else is true; the library itself returns 0 or 1. The usual result type of
/// predicates and of stream booleans.
using KTBool16 = short;
