// SoakProgress.h: counters that grow as long as the parts of a soak get on; a watchdog looks at them.

#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdint>

enum class SoakPart : std::size_t { Messages, ThreadTimers, Bursts, UITimers };

inline constexpr std::size_t kSoakParts = 4;

inline std::array<std::atomic<std::uint64_t>, kSoakParts> soakProgress{};

inline void SoakGetsOn(SoakPart part) { ++soakProgress[static_cast<std::size_t>(part)]; }
