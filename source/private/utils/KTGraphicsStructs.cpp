// KTGraphicsStructs.cpp: the interpolator, vectors, colours, planes, quads and transforms, and the reports of all graphics
// structures. Matrices are in KTMatrix4x4f.cpp, textured quads in KTTexturedQuad.cpp.

#include "KTGraphicsStructs.h"

#include "KTException.h"
#include "KTGraphicsReport.h"
#include "KTInterpolator.h"
#include "KTLogger.h"
#include "KTVector3d.h"

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <string>

namespace {

constexpr char kReportPath[] = "source/private/utils/KTGraphicsStructs";

KTInterpolationModeEnum g_Mode = kKTInterpolationEaseInEaseOut;

bool IsModeLinear() {
    switch (g_Mode) {
    case kKTInterpolationLinear:
        return true;
    case kKTInterpolationEaseInEaseOut:
        return false;
    }
    KTFailGraphics(nullptr, 47);
}

// The parts of the way at which the pieces of the eased curve meet, and the area under its speed when that rises by 1 in
// the unit of time: (1 + 0.4) / 2 * 0.3. Hosts compare results bit by bit: neither the constants nor the order of the
// operations below may change.
template <typename Number> struct Easing;
template <> struct Easing<float> {
    static constexpr float kHalf = 0.5F;
    static constexpr float kRampEnd = 0.3F;
    static constexpr float kSlowdown = 0.7F;
    static constexpr float kArea = kRampEnd * kSlowdown;   // one unit above the float nearest to 0.21
    static constexpr float kCruise = kSlowdown - kRampEnd; // one unit below the float nearest to 0.4
};
template <> struct Easing<double> {
    static constexpr double kHalf = 0.5;
    static constexpr double kRampEnd = 0.3;
    static constexpr double kSlowdown = 0.7;
    static constexpr double kArea = 0.21;
    static constexpr double kCruise = 0.4;
};

static_assert(std::bit_cast<std::uint32_t>(Easing<float>::kArea) == 0x3E570A3EU);
static_assert(std::bit_cast<std::uint32_t>(Easing<float>::kCruise) == 0x3ECCCCCCU);

template <typename Number> Number Linear(Number from, Number to, Number t) {
    if (!(t >= 0 && t <= 1)) {
        KTFailGraphics(nullptr, 87);
    }
    return (to - from) * t + from;
}

template <typename Number> Number Eased(Number from, Number to, Number t) {
    using Constants = Easing<Number>;
    if (t < 0) {
        return from;
    }
    if (t >= 1) {
        return to;
    }
    Number const acceleration = (to - from) / Constants::kArea;
    Number const half = acceleration * Constants::kHalf;
    if (t <= Constants::kRampEnd) {
        return half * t * t + from;
    }
    Number const speed = acceleration * Constants::kRampEnd;
    Number const rampTop = half * Constants::kRampEnd * Constants::kRampEnd + from;
    if (t < Constants::kSlowdown) {
        return (t - Constants::kRampEnd) * speed + rampTop;
    }
    Number const u = t - Constants::kSlowdown;
    return rampTop + speed * Constants::kCruise + u * speed - u * half * u;
}

// The plane across the normal, which goes through the point as exactly as floats allow.
KTPlanef PlaneThrough(KTVector3d const &point, KTVector3d const &normal) {
    double const length = normal.Length();
    if (length == 0.0) {
        return {};
    }
    KTVector3f const rounded = (normal / length).Rounded();
    return {rounded, static_cast<float>(-point.Dot(rounded))};
}

template <float KTVector3f::*kCoordinate> float Least(KTQuad3D const &quad) {
    return std::fmin(std::fmin(quad.bottomLeft.*kCoordinate, quad.bottomRight.*kCoordinate),
                     std::fmin(quad.topRight.*kCoordinate, quad.topLeft.*kCoordinate));
}

template <float KTVector3f::*kCoordinate> float Greatest(KTQuad3D const &quad) {
    return std::fmax(std::fmax(quad.bottomLeft.*kCoordinate, quad.bottomRight.*kCoordinate),
                     std::fmax(quad.topRight.*kCoordinate, quad.topLeft.*kCoordinate));
}

} // namespace

// ---- reports ----

void KTLogGraphics(char const *text) {
    if (text != nullptr && gKTLogger->IsLogEnabled()) {
        gKTLogger->Log(std::string(text));
    }
}

void KTFailGraphics(char const *text, int line) {
    KTLogGraphics(text);
    throw KTLCException(kKTErrorInternal, kReportPath, line, false);
}

// ---- KTInterpolator ----

float KTInterpolator::Interpolate(float const &from, float const &to, float const &t) {
    return IsModeLinear() ? LinearInterpolate(from, to, t) : EaseInEaseOutInterpolate(from, to, t);
}

double KTInterpolator::Interpolate(double const &from, double const &to, double const &t) {
    return IsModeLinear() ? LinearInterpolate(from, to, t) : EaseInEaseOutInterpolate(from, to, t);
}

KTInterpolationModeEnum const &KTInterpolator::GetInterpolationMode() { return g_Mode; }

void KTInterpolator::SetInterpolationMode(KTInterpolationModeEnum const &mode) { g_Mode = mode; }

float KTInterpolator::LinearInterpolate(float const &from, float const &to, float const &t) {
    return Linear(from, to, t);
}

double KTInterpolator::LinearInterpolate(double const &from, double const &to, double const &t) {
    return Linear(from, to, t);
}

float KTInterpolator::EaseInEaseOutInterpolate(float const &from, float const &to, float const &t) {
    return Eased(from, to, t);
}

double KTInterpolator::EaseInEaseOutInterpolate(double const &from, double const &to, double const &t) {
    return Eased(from, to, t);
}

// ---- KTVector3f ----

float KTVector3f::Length() const { return static_cast<float>(KTVector3d(*this).Length()); }

float KTVector3f::DistanceTo(KTVector3f const &other) const {
    return static_cast<float>((KTVector3d(other) - *this).Length());
}

KTVector3f KTVector3f::Normalized() const {
    double const length = KTVector3d(*this).Length();
    return length == 0.0 ? KTVector3f() : (KTVector3d(*this) / length).Rounded();
}

float KTVector3f::Dot(KTVector3f const &other) const { return static_cast<float>(KTVector3d(*this).Dot(other)); }

KTVector3f KTVector3f::Cross(KTVector3f const &other) const { return KTVector3d(*this).Cross(other).Rounded(); }

bool KTVector3f::IsFinite() const { return std::isfinite(x) && std::isfinite(y) && std::isfinite(z); }

KTVector3f KTVector3f::Interpolate(KTVector3f const &a, KTVector3f const &b, float const &t) {
    return {KTInterpolator::Interpolate(a.x, b.x, t), KTInterpolator::Interpolate(a.y, b.y, t),
            KTInterpolator::Interpolate(a.z, b.z, t)};
}

// ---- KTColor4f ----

KTColor4f KTColor4f::Interpolate(KTColor4f const &a, KTColor4f const &b, float const &t) {
    return {KTInterpolator::Interpolate(a.red, b.red, t), KTInterpolator::Interpolate(a.green, b.green, t),
            KTInterpolator::Interpolate(a.blue, b.blue, t), KTInterpolator::Interpolate(a.alpha, b.alpha, t)};
}

// ---- KTPlanef ----

KTPlanef KTPlanef::FromPointAndNormal(KTVector3f const &point, KTVector3f const &normal) {
    return PlaneThrough(point, normal);
}

KTPlanef KTPlanef::FromPoints(KTVector3f const &a, KTVector3f const &b, KTVector3f const &c) {
    KTVector3d const origin(a);
    return PlaneThrough(origin, (KTVector3d(b) - origin).Cross(KTVector3d(c) - origin));
}

bool KTPlanef::IsValid() const { return normal.IsFinite() && normal != KTVector3f() && std::isfinite(d); }

float KTPlanef::DistanceTo(KTVector3f const &point) const {
    if (!IsValid()) {
        return std::numeric_limits<float>::quiet_NaN();
    }
    KTVector3d const across(normal);
    return static_cast<float>((across.Dot(point) + double{d}) / across.Length());
}

// ---- KTQuad3D ----

KTPlanef KTQuad3D::GetPlane() const {
    KTVector3d const centroid =
        (KTVector3d(bottomLeft) + KTVector3d(bottomRight) + KTVector3d(topRight) + KTVector3d(topLeft)) / 4.0;
    // Of four corners, the sum of Newell's method is the cross product of the diagonals.
    KTVector3d const normal = (KTVector3d(topRight) - bottomLeft).Cross(KTVector3d(topLeft) - bottomRight);
    return PlaneThrough(centroid, normal);
}

float KTQuad3D::MinX() const { return Least<&KTVector3f::x>(*this); }
float KTQuad3D::MaxX() const { return Greatest<&KTVector3f::x>(*this); }
float KTQuad3D::MinY() const { return Least<&KTVector3f::y>(*this); }
float KTQuad3D::MaxY() const { return Greatest<&KTVector3f::y>(*this); }
float KTQuad3D::MinZ() const { return Least<&KTVector3f::z>(*this); }
float KTQuad3D::MaxZ() const { return Greatest<&KTVector3f::z>(*this); }
float KTQuad3D::Width() const { return MaxX() - MinX(); }
float KTQuad3D::Height() const { return MaxY() - MinY(); }
float KTQuad3D::Depth() const { return MaxZ() - MinZ(); }

// ---- KTTransform ----

KTTransform::KTTransform(KTVector3f const &translation, KTVector3f const &scale, KTVector3f const &rotationAxis,
                         float radians, KTColor4f const &colorValue)
    : matrix(KTMatrix4x4f::Translation(translation) * KTMatrix4x4f::Rotation(rotationAxis, radians) *
             KTMatrix4x4f::Scaling(scale)),
      color(colorValue) {}

KTTransform KTTransform::Interpolate(KTTransform const &a, KTTransform const &b, float const &t) {
    return {KTMatrix4x4f::Interpolate(a.matrix, b.matrix, t), KTColor4f::Interpolate(a.color, b.color, t)};
}
