// OStreamReport.h: the reports of streams and transports, which throw no lack of memory.

#pragma once

#include "KTAssert.h"

#include <new>

/// Reports an assertion. The report itself may need memory: without any it is left out. Other exceptions are faults, and
/// pass through to the crash handling.
inline void OStreamReport(char const *message, char const *path, int line) {
    try {
        KTAssertFailed(message, path, line);
    } catch (std::bad_alloc const &) { // NOLINT(bugprone-empty-catch)
    }
}
