// InterpolationMode.h: the process-wide interpolation mode in tests.

#pragma once

#include "KTException.h"
#include "KTInterpolator.h"

#include <gtest/gtest.h>

/// Sets the mode and puts the former one back at the end of the scope.
class ScopedInterpolationMode {
  public:
    explicit ScopedInterpolationMode(KTInterpolationModeEnum mode) { KTInterpolator::SetInterpolationMode(mode); }
    ScopedInterpolationMode(ScopedInterpolationMode const &) = delete;
    ScopedInterpolationMode &operator=(ScopedInterpolationMode const &) = delete;
    ~ScopedInterpolationMode() { KTInterpolator::SetInterpolationMode(m_Former); }

  private:
    KTInterpolationModeEnum const m_Former = KTInterpolator::GetInterpolationMode();
};

inline constexpr auto kUnknownMode = static_cast<KTInterpolationModeEnum>(2);

/// Expects the call to throw the internal error of the graphics values at that line.
template <typename Call> void ExpectInternalError(int line, Call const &call) {
    try {
        call();
        ADD_FAILURE() << "nothing was thrown, expected line " << line;
    } catch (KTLCException const &error) {
        EXPECT_EQ(error.GetReason(), KTString("kKTErrorInternal"));
        EXPECT_EQ(error.GetFile(), KTString("KTGraphicsStructs"));
        EXPECT_EQ(error.GetLine(), line);
    }
}
