// OByteOrder.h: numbers as a stream holds them.

#pragma once

#include <bit>
#include <cstdint>

static_assert(std::endian::native == std::endian::little, "streams store numbers as they are in memory");

/// The number with its bytes in the other order.
inline short OReversed(short value) noexcept {
    auto const bits = static_cast<std::uint16_t>(value);
    return static_cast<short>(static_cast<std::uint16_t>(bits << 8 | bits >> 8));
}
inline int OReversed(int value) noexcept {
    auto const bits = static_cast<std::uint32_t>(value);
    return static_cast<int>(bits << 24 | (bits & 0xFF00U) << 8 | (bits >> 8 & 0xFF00U) | bits >> 24);
}
inline long long OReversed(long long value) noexcept {
    auto const bits = static_cast<std::uint64_t>(value);
    auto const low = static_cast<std::uint32_t>(OReversed(static_cast<int>(bits >> 32)));
    auto const high = static_cast<std::uint32_t>(OReversed(static_cast<int>(bits & 0xFFFFFFFFU)));
    return static_cast<long long>(static_cast<std::uint64_t>(high) << 32 | low);
}

/// The number with its upper half below its lower one, as it lies in a stream without swapping.
inline long long OHalvesExchanged(long long value) noexcept {
    return static_cast<long long>(std::rotl(static_cast<std::uint64_t>(value), 32));
}

/// The two halves of a 64-bit number, and the number that they make.
inline int OHighHalf(long long value) noexcept { return static_cast<int>(value >> 32); }
inline int OLowHalf(long long value) noexcept { return static_cast<int>(static_cast<std::uint32_t>(value)); }
inline long long OJoined(int high, int low) noexcept {
    return static_cast<long long>(static_cast<std::uint64_t>(static_cast<std::uint32_t>(high)) << 32 |
                                  static_cast<std::uint32_t>(low));
}

/// The bytes that `count` elements of an array take: none for a negative count, and those of the most whole elements
/// that an unsigned 32-bit number can count.
template <typename Element> unsigned int OArrayBytes(int count) noexcept {
    constexpr std::uint64_t size = sizeof(Element);
    constexpr std::uint64_t most = UINT32_MAX / size;
    std::uint64_t const elements = count < 0 ? 0 : static_cast<std::uint64_t>(count);
    return static_cast<unsigned int>((elements < most ? elements : most) * size);
}
