// WHandleCount.h: how many system handles this process holds. Wine answers GetProcessHandleCount with 0, so the values
// that handles have are tried one after another.

#pragma once

#include <windows.h>

#include <cstddef>

/// Handles among the first 4096 values, which are multiples of 4.
inline std::size_t CountHandles() {
    constexpr ULONG_PTR kValues = 4096;
    std::size_t count = 0;
    for (ULONG_PTR value = 1; value <= kValues; ++value) {
        DWORD flags = 0;
        count += GetHandleInformation(reinterpret_cast<HANDLE>(value * 4), &flags) != FALSE ? 1 : 0;
    }
    return count;
}
