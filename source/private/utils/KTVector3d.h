// KTVector3d.h: a vector of doubles for what the library computes from vectors of floats. In double precision, lengths,
// products and sums of floats neither overflow nor underflow; the result is rounded to floats once.

#pragma once

#include "KTGraphicsStructs.h"

#include <cmath>

struct KTVector3d {
    double x = 0.0;
    double y = 0.0;
    double z = 0.0;

    KTVector3d() = default;
    KTVector3d(double xValue, double yValue, double zValue) : x(xValue), y(yValue), z(zValue) {}
    KTVector3d(KTVector3f const &other) : x(other.x), y(other.y), z(other.z) {}

    KTVector3f Rounded() const { return {static_cast<float>(x), static_cast<float>(y), static_cast<float>(z)}; }
    double Dot(KTVector3d const &other) const { return x * other.x + y * other.y + z * other.z; }
    double Length() const { return std::sqrt(Dot(*this)); }
    KTVector3d Cross(KTVector3d const &other) const {
        return {y * other.z - z * other.y, z * other.x - x * other.z, x * other.y - y * other.x};
    }

    friend KTVector3d operator+(KTVector3d const &a, KTVector3d const &b) { return {a.x + b.x, a.y + b.y, a.z + b.z}; }
    friend KTVector3d operator-(KTVector3d const &a, KTVector3d const &b) { return {a.x - b.x, a.y - b.y, a.z - b.z}; }
    friend KTVector3d operator*(KTVector3d const &a, double factor) {
        return {a.x * factor, a.y * factor, a.z * factor};
    }
    friend KTVector3d operator/(KTVector3d const &a, double divisor) {
        return {a.x / divisor, a.y / divisor, a.z / divisor};
    }
};
