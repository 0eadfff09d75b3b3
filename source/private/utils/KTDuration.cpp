// KTDuration.cpp: durations and their rounding to tenths of a second.

#include "KTDuration.h"

#include "KTAssert.h"

#include <cmath>
#include <limits>

namespace {

constexpr double kHalfTenth = 0.05;
constexpr double kTenthsPerSecond = 10.0;
constexpr double kTolerance = 0.00001; // amounts nearer than this are the same; also counts as not negative

// Rounds half away from zero. What an int cannot hold gives the nearer limit: the plain conversion is undefined there.
int ToTenths(double seconds) {
    double const tenths = (seconds >= -kTolerance ? seconds + kHalfTenth : seconds - kHalfTenth) * kTenthsPerSecond;
    if (std::isnan(tenths)) {
        return 0;
    }
    if (tenths >= static_cast<double>(std::numeric_limits<int>::max())) {
        return std::numeric_limits<int>::max();
    }
    if (tenths <= static_cast<double>(std::numeric_limits<int>::min())) {
        return std::numeric_limits<int>::min();
    }
    return static_cast<int>(tenths);
}

} // namespace

KTDuration::KTDuration() = default;
KTDuration::KTDuration(KTReal amount, KTDurationUnitOfMeasure unit) : m_Amount(amount), m_Unit(unit) {}
KTDuration::KTDuration(KTDuration const &other) = default;
KTDuration &KTDuration::operator=(KTDuration const &other) = default;
KTDuration::~KTDuration() = default;

KTReal KTDuration::GetTime() const {
    if (m_Unit != kKTDurationSeconds) {
        return m_Amount;
    }
    // Callers keep tenths as float: dividing in single precision gives exactly their values.
    float const tenths = static_cast<float>(ToTenths(m_Amount.AsDouble()));
    return {static_cast<double>(tenths / 10.0F)};
}

int KTDuration::GetTimeInDeciSeconds() const {
    if (m_Unit != kKTDurationSeconds) {
        KTAssertFailed("", "source/private/utils/KTDuration", 112);
        return 0;
    }
    return ToTenths(m_Amount.AsDouble());
}

KTReal KTDuration::GetTimeWithFullPrecision() const { return m_Amount; }

KTErrorCodeEnum KTDuration::SetTime(KTReal amount) {
    m_Amount = amount;
    return kKTErrorNone;
}

KTErrorCodeEnum KTDuration::SetDurationUnitOfMeasure(KTDurationUnitOfMeasure unit) {
    m_Unit = unit;
    return kKTErrorNone;
}

KTDurationUnitOfMeasure KTDuration::GetDurationUnitOfMeasure() const { return m_Unit; }

KTDuration &KTDuration::operator+=(KTDuration const &other) {
    m_Amount += other.m_Amount;
    return *this;
}

KTDuration &KTDuration::operator-=(KTDuration const &other) {
    m_Amount -= other.m_Amount;
    return *this;
}

KTBool16 KTDuration::operator==(KTDuration const &other) const {
    bool const near = std::fabs((m_Amount - other.m_Amount).AsDouble()) < kTolerance;
    return near && m_Unit == other.m_Unit ? 1 : 0;
}

KTBool16 KTDuration::operator!=(KTDuration const &other) const { return *this == other ? 0 : 1; }
