// OPause_posix.cpp: short sleeps of the native developer build.

#include "OPause.h"

#include <chrono>
#include <thread>

struct OPause::Timer {};

OPause::OPause() = default;
OPause::~OPause() = default;

void OPause::For(KTUInt64 microseconds) noexcept {
    std::this_thread::sleep_for(std::chrono::microseconds(microseconds));
}
