// ProcessFigures.h: what a process holds of the system's resources, to see whether a soak leaves any behind.

#pragma once

#include <cstdint>

struct ProcessFigures {
    std::uint64_t handles = 0; ///< system handles; natively open files
    std::uint64_t threads = 0;
    std::uint64_t bytes = 0; ///< private memory; natively 0, as the address sanitizer looks for leaks there
};

/// The figures of this process now.
ProcessFigures ReadProcessFigures();
