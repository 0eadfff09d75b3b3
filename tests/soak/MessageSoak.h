// MessageSoak.h: message threads under everything that producers can do to them at once.
//
//     8 producers --+--> 2 threads that nobody flushes: every message that was accepted is handled, once, in order
//                   +--> 2 threads that are flushed: what is handled comes in order
//
// A flush may discard a message that a synchronous poster waits for; by the rules the poster then waits for the next
// message of that identifier. The soak therefore posts a few of each identifier to the flushed threads all the time.

#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <string>

/// What one round did.
struct MessageFigures {
    std::uint64_t accepted = 0;
    std::uint64_t handled = 0;
    std::uint64_t refused = 0; ///< posts to a full queue
    std::uint64_t synchronous = 0;
    std::uint64_t flushes = 0;

    MessageFigures &operator+=(MessageFigures const &other);
};

/// Runs producers and threads for that long, calling `turn` on the calling thread again and again, and shuts them down in
/// the order a host must. Returns what went wrong, one line each; nothing if all is well.
std::string SoakMessages(unsigned int seed, std::chrono::milliseconds length, std::function<void()> const &turn,
                         MessageFigures &figures);
