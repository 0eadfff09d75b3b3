// WHandlesLeft.h: shows handles that an operation leaves open.

#pragma once

#include <windows.h>

#include <gtest/gtest.h>

#include <cstdint>

/// The number of the next handle that the system gives this process. It gives the lowest one that is free, so the number
/// grows with every handle that stays open. (Not every system counts a process's handles.)
inline std::uintptr_t NextHandle() {
    HANDLE const event = CreateEventW(nullptr, TRUE, FALSE, nullptr);
    auto const number = reinterpret_cast<std::uintptr_t>(event);
    CloseHandle(event);
    return number;
}

/// Each handle is as many numbers behind the one before.
inline constexpr std::uintptr_t kHandleStep = 4;

/// Runs the operation many times and expects as many open handles afterwards. What is opened once and kept is opened by
/// the first runs, which are not counted.
template <typename Operation> void ExpectNoHandleLeft(Operation operation) {
    constexpr int kRuns = 20;
    for (int i = 0; i < 3; ++i) {
        operation();
    }
    std::uintptr_t const before = NextHandle();
    ASSERT_NE(0U, before);
    for (int i = 0; i < kRuns; ++i) {
        operation();
    }
    EXPECT_LT(NextHandle(), before + kHandleStep * kRuns / 2); // the system itself may open some meanwhile
}
