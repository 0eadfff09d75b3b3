// KTReal.cpp: the checked conversion and the compound operators.

#include "KTReal.h"

#include "KTAssert.h"

#include <cmath>
#include <limits>

namespace {

constexpr double kLowest = -2147483648.0;
constexpr double kHighest = 2147483647.0;
constexpr char kReportPath[] = "source/public/includes/KTReal";

} // namespace

KTReal &KTReal::operator+=(KTReal const &other) {
    m_Value += other.m_Value;
    return *this;
}

KTReal &KTReal::operator-=(KTReal const &other) {
    m_Value -= other.m_Value;
    return *this;
}

KTReal &KTReal::operator*=(KTReal const &other) {
    m_Value *= other.m_Value;
    return *this;
}

KTReal &KTReal::operator/=(KTReal const &other) {
    m_Value /= other.m_Value;
    return *this;
}

KTReal::operator KTInt32() const {
    if (std::isnan(m_Value)) {
        return 0;
    }
    if (m_Value < kLowest) {
        KTAssertFailed(FORMAT_ARGS("Value %4.4f is too small to convert to KTInt32", m_Value), kReportPath, 431);
        return std::numeric_limits<KTInt32>::min();
    }
    if (m_Value > kHighest) {
        KTAssertFailed(FORMAT_ARGS("Value %4.4f is too large to convert to KTInt32", m_Value), kReportPath, 432);
        return std::numeric_limits<KTInt32>::max();
    }
    return static_cast<KTInt32>(m_Value);
}
