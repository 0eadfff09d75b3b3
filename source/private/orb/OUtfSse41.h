// OUtfSse41.h: the conversions on processors with SSE4.1, whose byte shuffle handles characters of mixed lengths
// without a branch for each. Call these only where HasSse41().

#pragma once

#include "OUtfBlocks.h"

#if defined(_MSC_VER) && !defined(__clang__)
#include <intrin.h>
#define O_SSE41
#else
#define O_SSE41 __attribute__((target("sse4.1")))
#endif
#define O_SSE41_INLINE O_SSE41 O_INLINE

namespace OUtf {

inline bool HasSse41() noexcept {
#if defined(_MSC_VER) && !defined(__clang__)
    static bool const has = [] {
        int registers[4];
        __cpuid(registers, 1);
        return (registers[2] & (1 << 19)) != 0;
    }();
    return has;
#else
    return __builtin_cpu_supports("sse4.1") != 0;
#endif
}

/// How to move the parts of lanes that count to the front, by the lanes' form in eight bits. Two arrays, as shuffles
/// of a whole block each are found and loaded faster.
struct Packings {
    alignas(kBlock) Byte shuffles[256][kBlock];
    Byte sizes[256]; ///< how many parts count
};

struct Utf8Scan {
    std::size_t units; ///< what the text decodes to, if it is well-formed
    bool isWellFormed;
};

/// Checks the bytes and counts their units.
Utf8Scan ScanUtf8Sse41(Byte const *from, std::size_t size) noexcept;

/// Decodes to exactly `count` units. REQUIRES: well-formed text that gives so many.
void DecodeValidSse41(Byte const *from, std::size_t size, Unit *to, std::size_t count) noexcept;

/// Encodes to exactly `size` bytes, unpaired surrogates as U+FFFD. REQUIRES: the units give so many bytes.
void EncodeSse41(Unit const *from, std::size_t count, Byte *to, std::size_t size) noexcept;

} // namespace OUtf
