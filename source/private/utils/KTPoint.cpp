// KTPoint.cpp: vector operations of points.

#include "KTPoint.h"

#include "KTRect.h"

#include <algorithm>
#include <cmath>

namespace {

// The vector multiplied by the power of two that brings its greater coordinate near 1, which is exact, so that products
// of coordinates neither overflow nor underflow. Zero and infinite vectors stay.
KTPoint Scaled(KTPoint const &vector) {
    double const greatest = std::max(std::fabs(vector.x), std::fabs(vector.y));
    if (greatest == 0.0 || !std::isfinite(greatest)) {
        return vector;
    }
    int const exponent = std::ilogb(greatest);
    return {std::scalbn(vector.x, -exponent), std::scalbn(vector.y, -exponent)};
}

// atan2 with the zeros made positive: of negative ones it would give -pi, or pi for a zero vector.
double AngleOf(double x, double y) { return std::atan2(y + 0.0, x + 0.0); }

} // namespace

double KTPoint::Length() const { return std::hypot(x, y); }

double KTPoint::DistanceTo(KTPoint const &other) const { return (other - *this).Length(); }

double KTPoint::Dot(KTPoint const &other) const { return x * other.x + y * other.y; }

double KTPoint::Cross(KTPoint const &other) const { return x * other.y - y * other.x; }

double KTPoint::VectorAngle() const { return AngleOf(x, y); }

double KTPoint::VectorAngle(KTPoint const &other) const {
    KTPoint const from = Scaled(*this);
    KTPoint const to = Scaled(other);
    return AngleOf(from.Dot(to), from.Cross(to));
}

KTPoint KTPoint::RotateAbout(KTPoint const &center, double radians) const {
    KTPoint const arm = *this - center;
    double const cosine = std::cos(radians);
    double const sine = std::sin(radians);
    return center + KTPoint(arm.x * cosine - arm.y * sine, arm.x * sine + arm.y * cosine);
}

KTPoint KTPoint::ProjectOnLine(KTPoint const &a, KTPoint const &b) const {
    KTPoint const direction = Scaled(b - a);
    if (direction == KTPoint()) {
        return a;
    }
    return a + direction * ((*this - a).Dot(direction) / direction.Dot(direction));
}

KTPoint KTPoint::ConstrainTo(KTRect const &bounds) const {
    KTRect normal = bounds;
    normal.Normalize();
    return {std::clamp(x, normal.left, normal.right), std::clamp(y, normal.top, normal.bottom)};
}
