// KTPoint.h: a point or vector of the drawing plane.
//
// The plane of points and rectangles (KTRect.h) is that of pages and screens: x grows to the right, y grows downwards,
// in whatever unit the host draws in. Angles are in radians and grow from the positive x axis towards the positive y
// axis, which on the screen is clockwise.
//
//     KTPoint const handle = KTPoint(10, 0).RotateAbout(KTPoint(0, 0), std::numbers::pi / 2);   // (0, 10): below
//
// Arithmetic follows IEEE 754: NaN and infinite coordinates are carried along, never reported. Nothing here throws. Any
// thread may use its own points; one point is not locked.

#pragma once

#include "KTBeginExports.h"

struct KTRect;

/// Two doubles, x and y; a plain value of 16 bytes.
struct KT_PUBLIC_API KTPoint {
    double x = 0.0; ///< to the right
    double y = 0.0; ///< downwards

    /// The origin (0, 0).
    constexpr KTPoint() = default;

    /// The given coordinates, NaN and infinities included.
    constexpr KTPoint(double xValue, double yValue) : x(xValue), y(yValue) {}

    // ---- lengths and products, this point taken as the vector from the origin ----

    /// The Euclidean length, without overflow or underflow on the way.
    double Length() const;

    /// The Euclidean distance to the other point.
    double DistanceTo(KTPoint const &other) const;

    /// The dot product x * other.x + y * other.y.
    double Dot(KTPoint const &other) const;

    /// The z component of the cross product, x * other.y - y * other.x: positive when the other vector lies at a
    /// positive angle from this one (clockwise on the screen).
    double Cross(KTPoint const &other) const;

    // ---- angles, in radians ----

    /// The angle of this vector from the positive x axis, from -pi to pi; pi for the negative x axis, 0 for the zero
    /// vector. NaN coordinates give NaN.
    double VectorAngle() const;

    /// The angle that turns this vector to the direction of the other one, from -pi to pi; 0 when either is the zero
    /// vector. Infinite and NaN coordinates give NaN, or what IEEE 754 makes of them.
    double VectorAngle(KTPoint const &other) const;

    /// This point turned about `center` by `radians`. A point that is its own centre stays exactly.
    KTPoint RotateAbout(KTPoint const &center, double radians) const;

    // ---- positions ----

    /// The foot of the perpendicular from this point to the infinite line through `a` and `b`, which may lie outside
    /// the segment between them. When both are the same point there is no line: that point is returned.
    KTPoint ProjectOnLine(KTPoint const &a, KTPoint const &b) const;

    /// The point of the rectangle, edges included, that lies nearest to this one; a point inside stays. Inverted
    /// rectangles are taken normalised, empty ones are a line or a point. A NaN coordinate stays NaN, and a NaN
    /// edge constrains nothing.
    KTPoint ConstrainTo(KTRect const &bounds) const;

    // ---- arithmetic and comparison, by coordinate ----

    constexpr KTPoint &operator+=(KTPoint const &other) { return *this = *this + other; }
    constexpr KTPoint &operator-=(KTPoint const &other) { return *this = *this - other; }
    constexpr KTPoint &operator*=(double factor) { return *this = *this * factor; }
    constexpr KTPoint &operator/=(double divisor) { return *this = *this / divisor; }
    constexpr KTPoint operator-() const { return {-x, -y}; }

    friend constexpr KTPoint operator+(KTPoint const &a, KTPoint const &b) { return {a.x + b.x, a.y + b.y}; }
    friend constexpr KTPoint operator-(KTPoint const &a, KTPoint const &b) { return {a.x - b.x, a.y - b.y}; }
    friend constexpr KTPoint operator*(KTPoint const &a, double factor) { return {a.x * factor, a.y * factor}; }
    friend constexpr KTPoint operator*(double factor, KTPoint const &a) { return a * factor; }
    friend constexpr KTPoint operator/(KTPoint const &a, double divisor) { return {a.x / divisor, a.y / divisor}; }

    /// Exact comparison, without a tolerance; NaN equals nothing.
    friend constexpr bool operator==(KTPoint const &a, KTPoint const &b) = default;
};

#include "KTEndExports.h"
