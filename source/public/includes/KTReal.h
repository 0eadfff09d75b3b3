// KTReal.h: a real number, one double passed by value.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// A real number. Any thread may use its own values; one value is not locked.
class KT_PUBLIC_API KTReal {
  public:
    /// The value 0.
    KTReal() = default;

    /// The given value, NaN and infinities included.
    KTReal(double value) : m_Value(value) {}

    KTReal &operator+=(KTReal const &other);
    KTReal &operator-=(KTReal const &other);
    KTReal &operator*=(KTReal const &other);

    /// Divides as IEEE 754 does: by 0 gives an infinity or NaN, never an error.
    KTReal &operator/=(KTReal const &other);

    /// The number as a double, unchanged.
    double AsDouble() const { return m_Value; }

    /// The number truncated toward zero. A value below -2147483648 or above 2147483647 is reported as an assertion
    /// and gives the nearer limit; NaN gives 0 without a report. The report's message is made with FORMAT_ARGS, so
    /// convert out-of-range values on one thread at a time.
    operator KTInt32() const;

  private:
    double m_Value = 0.0;
};

#include "KTEndExports.h"
