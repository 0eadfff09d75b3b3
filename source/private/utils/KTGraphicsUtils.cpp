// KTGraphicsUtils.cpp: where lines meet planes.

#include "KTGraphicsUtils.h"

#include "KTVector3d.h"

#include <cmath>
#include <limits>

namespace {

// What rounding the components of a normal and of a direction to floats can make of the cosine between them.
constexpr double kTolerance = 2.0 * static_cast<double>(std::numeric_limits<float>::epsilon());

constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
constexpr KTVector3f kNoPoint(kNan, kNan, kNan);

// Whether the plane's equation holds for the point as far as the rounding of its terms can tell.
bool LiesIn(KTPlanef const &plane, KTVector3d const &point, double value) {
    double const terms = std::fabs(static_cast<double>(plane.normal.x) * point.x) +
                         std::fabs(static_cast<double>(plane.normal.y) * point.y) +
                         std::fabs(static_cast<double>(plane.normal.z) * point.z) +
                         std::fabs(static_cast<double>(plane.d));
    return std::fabs(value) <= kTolerance * terms;
}

} // namespace

KTVector3f KTGraphicsUtils::GetIntersectionOfLineWithPlane(KTVector3f const &a, KTVector3f const &b,
                                                           KTPlanef const &plane) {
    if (!plane.IsValid() || !a.IsFinite() || !b.IsFinite()) {
        return kNoPoint;
    }
    KTVector3d const start(a);
    KTVector3d const direction = KTVector3d(b) - start;
    KTVector3d const normal(plane.normal);
    double const value = normal.Dot(start) + static_cast<double>(plane.d);
    double const approach = normal.Dot(direction);
    if (std::fabs(approach) <= kTolerance * normal.Length() * direction.Length()) {
        return LiesIn(plane, start, value) ? a : kNoPoint;
    }
    return (start - direction * (value / approach)).Rounded();
}
