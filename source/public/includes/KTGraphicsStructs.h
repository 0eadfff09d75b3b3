// KTGraphicsStructs.h: the value types of the texture-based renderer: vectors, colours, planes, quads, matrices and
// transforms, all of single-precision floats.
//
// Conventions
//   Space        right-handed: x to the right, y upwards, z towards the viewer. (Pages have y downwards: KTRect.h.)
//   Angles       in radians. A positive rotation is counter-clockwise for who looks against the axis, from its tip to
//                the origin, so that a turn about z by pi / 2 takes x to y.
//   Vectors      are columns, on the right of a matrix: p' = M * p, and (A * B) * p = A * (B * p) applies B first.
//   Matrices     are stored column by column; the translation stands in elements 12, 13 and 14. That is the order that
//                OpenGL takes.
//   Planes       n . p + d = 0.
//   Quads        have their corners counter-clockwise for who sees the front.
//   Colours      red, green, blue, alpha; 0 to 1, not premultiplied; values outside are kept.
//
// All are plain values that can be copied byte by byte. Arithmetic follows IEEE 754: NaN and infinities are carried
// along, never reported. Equality is exact, without a tolerance, and NaN equals nothing. Each static Interpolate goes
// from `a` (t = 0) to `b` (t = 1) by KTInterpolator::Interpolate on every component, under the process-wide mode, and
// throws what that throws (KTInterpolator.h); nothing else here throws. Any thread may use its own values; one value is
// not locked.

#pragma once

#include <array>
#include <cstddef>

#include "KTBeginExports.h"

/// A vector or point of space; three floats, 12 bytes.
struct KT_PUBLIC_API KTVector3f {
    float x = 0.0F;
    float y = 0.0F;
    float z = 0.0F;

    /// The zero vector.
    constexpr KTVector3f() = default;

    constexpr KTVector3f(float xValue, float yValue, float zValue) : x(xValue), y(yValue), z(zValue) {}

    /// The Euclidean length, without overflow or underflow on the way.
    float Length() const;

    /// The Euclidean distance to the other point.
    float DistanceTo(KTVector3f const &other) const;

    /// The vector of length 1 in this direction; the zero vector stays zero.
    KTVector3f Normalized() const;

    /// The dot product.
    float Dot(KTVector3f const &other) const;

    /// The cross product this x other: x cross y is z.
    KTVector3f Cross(KTVector3f const &other) const;

    /// Whether no component is infinite or NaN.
    bool IsFinite() const;

    static KTVector3f Interpolate(KTVector3f const &a, KTVector3f const &b, float const &t);

    constexpr KTVector3f &operator+=(KTVector3f const &other) { return *this = *this + other; }
    constexpr KTVector3f &operator-=(KTVector3f const &other) { return *this = *this - other; }
    constexpr KTVector3f &operator*=(float factor) { return *this = *this * factor; }
    constexpr KTVector3f &operator/=(float divisor) { return *this = *this / divisor; }
    constexpr KTVector3f operator-() const { return {-x, -y, -z}; }

    friend constexpr KTVector3f operator+(KTVector3f const &a, KTVector3f const &b) {
        return {a.x + b.x, a.y + b.y, a.z + b.z};
    }
    friend constexpr KTVector3f operator-(KTVector3f const &a, KTVector3f const &b) {
        return {a.x - b.x, a.y - b.y, a.z - b.z};
    }
    friend constexpr KTVector3f operator*(KTVector3f const &a, float factor) {
        return {a.x * factor, a.y * factor, a.z * factor};
    }
    friend constexpr KTVector3f operator*(float factor, KTVector3f const &a) { return a * factor; }
    friend constexpr KTVector3f operator/(KTVector3f const &a, float divisor) {
        return {a.x / divisor, a.y / divisor, a.z / divisor};
    }
    friend constexpr bool operator==(KTVector3f const &a, KTVector3f const &b) = default;
};

/// A colour; four floats, 16 bytes.
struct KT_PUBLIC_API KTColor4f {
    float red = 0.0F;
    float green = 0.0F;
    float blue = 0.0F;
    float alpha = 1.0F;

    /// Opaque black, (0, 0, 0, 1).
    constexpr KTColor4f() = default;

    constexpr KTColor4f(float redValue, float greenValue, float blueValue, float alphaValue = 1.0F)
        : red(redValue), green(greenValue), blue(blueValue), alpha(alphaValue) {}

    static KTColor4f Interpolate(KTColor4f const &a, KTColor4f const &b, float const &t);

    friend constexpr bool operator==(KTColor4f const &a, KTColor4f const &b) = default;
};

/// The plane of the points p with normal . p + d = 0; four floats, 16 bytes. A zero normal is no plane.
struct KT_PUBLIC_API KTPlanef {
    KTVector3f normal; ///< points to the front; of length 1 in planes that the library makes
    float d = 0.0F;    ///< with a normal of length 1, the origin's signed distance from the plane

    /// No plane: all zero.
    constexpr KTPlanef() = default;

    /// The given coefficients, unchanged.
    constexpr KTPlanef(KTVector3f const &normalValue, float dValue) : normal(normalValue), d(dValue) {}

    /// The plane through the point, across the normal, which need not have length 1. No plane if the normal is zero.
    static KTPlanef FromPointAndNormal(KTVector3f const &point, KTVector3f const &normal);

    /// The plane through three points, which its front sees counter-clockwise. No plane if they lie exactly on one line.
    static KTPlanef FromPoints(KTVector3f const &a, KTVector3f const &b, KTVector3f const &c);

    /// Whether there is a plane: all coefficients are finite and the normal is not zero.
    bool IsValid() const;

    /// The distance of the point: positive in front, negative behind. NaN if there is no plane.
    float DistanceTo(KTVector3f const &point) const;

    friend constexpr bool operator==(KTPlanef const &a, KTPlanef const &b) = default;
};

/// Four corners in space; 48 bytes. They need not lie in one plane nor form a rectangle.
struct KT_PUBLIC_API KTQuad3D {
    KTVector3f bottomLeft;
    KTVector3f bottomRight;
    KTVector3f topRight;
    KTVector3f topLeft;

    /// All corners at the origin.
    constexpr KTQuad3D() = default;

    constexpr KTQuad3D(KTVector3f const &bottomLeftCorner, KTVector3f const &bottomRightCorner,
                       KTVector3f const &topRightCorner, KTVector3f const &topLeftCorner)
        : bottomLeft(bottomLeftCorner), bottomRight(bottomRightCorner), topRight(topRightCorner),
          topLeft(topLeftCorner) {}

    /// The plane of the quad, its front where the corners run counter-clockwise. Of corners that are not in one plane,
    /// the one through their centroid across Newell's normal (Sutherland, Sproull, Schumacker, "A characterization of
    /// ten hidden-surface algorithms", 1974). No plane if the quad has no area.
    KTPlanef GetPlane() const;

    /// The least and greatest coordinates of the corners; a NaN coordinate does not count unless all four are NaN.
    float MinX() const;
    float MaxX() const;
    float MinY() const;
    float MaxY() const;
    float MinZ() const;
    float MaxZ() const;

    /// The extents of the bounding box: MaxX - MinX, MaxY - MinY, MaxZ - MinZ.
    float Width() const;
    float Height() const;
    float Depth() const;

    /// Corner by corner: the same quad begun at another corner is not equal.
    friend constexpr bool operator==(KTQuad3D const &a, KTQuad3D const &b) = default;
};

/// A 4 x 4 matrix; 16 floats, 64 bytes, column by column.
struct KT_PUBLIC_API KTMatrix4x4f {
    /// Row r of column c stands at 4 * c + r.
    ///
    ///      0   4   8  12
    ///      1   5   9  13
    ///      2   6  10  14
    ///      3   7  11  15
    std::array<float, 16> elements = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};

    /// The identity.
    constexpr KTMatrix4x4f() = default;

    /// The given elements, column by column.
    explicit constexpr KTMatrix4x4f(std::array<float, 16> const &values) : elements(values) {}

    /// The element in that row and column. REQUIRES: both are 0 to 3.
    constexpr float &operator()(std::size_t row, std::size_t column) { return elements[4 * column + row]; }
    constexpr float operator()(std::size_t row, std::size_t column) const { return elements[4 * column + row]; }

    // ---- affine transforms ----

    static KTMatrix4x4f Translation(KTVector3f const &offset);

    /// Factors along the axes; 0 flattens, negative ones mirror.
    static KTMatrix4x4f Scaling(KTVector3f const &factors);

    /// The rotation about an axis through the origin by `radians` (Rodrigues' formula). The axis need not have length
    /// 1; the zero axis gives the identity.
    static KTMatrix4x4f Rotation(KTVector3f const &axis, float radians);

    // ---- operations ----

    KTMatrix4x4f Transposed() const;

    float Determinant() const;

    /// Stores the inverse and returns true; returns false and leaves `inverse` alone if there is none: the determinant
    /// is 0 or not finite, or an element of the inverse is too large for a float.
    bool GetInverse(KTMatrix4x4f &inverse) const;

    /// The point (x, y, z, 1) transformed and divided by its resulting w. A w of 0, a point at infinity, gives
    /// infinities or NaN.
    KTVector3f TransformPoint(KTVector3f const &point) const;

    /// The direction (x, y, z, 0) transformed: translations leave it alone.
    KTVector3f TransformVector(KTVector3f const &vector) const;

    /// All 16 elements independently: half-way between two rotations is in general no rotation.
    static KTMatrix4x4f Interpolate(KTMatrix4x4f const &a, KTMatrix4x4f const &b, float const &t);

    /// The matrix product: applies `other` first, then this. Sums are made in double precision and rounded once.
    KTMatrix4x4f operator*(KTMatrix4x4f const &other) const;
    KTMatrix4x4f &operator*=(KTMatrix4x4f const &other) { return *this = *this * other; }

    friend constexpr bool operator==(KTMatrix4x4f const &a, KTMatrix4x4f const &b) = default;
};

/// How an object is shown: where, and multiplied by which colour. A matrix and a colour, 80 bytes.
struct KT_PUBLIC_API KTTransform {
    KTMatrix4x4f matrix;
    KTColor4f color = {1.0F, 1.0F, 1.0F, 1.0F};

    /// Shows an object as it is: the identity and opaque white.
    constexpr KTTransform() = default;

    constexpr KTTransform(KTMatrix4x4f const &matrixValue, KTColor4f const &colorValue)
        : matrix(matrixValue), color(colorValue) {}

    /// The matrix Translation(translation) * Rotation(rotationAxis, radians) * Scaling(scale): the object is scaled,
    /// then turned about an axis through its origin, then moved.
    KTTransform(KTVector3f const &translation, KTVector3f const &scale, KTVector3f const &rotationAxis, float radians,
                KTColor4f const &colorValue);

    /// The matrix and the colour, each component by component.
    static KTTransform Interpolate(KTTransform const &a, KTTransform const &b, float const &t);

    friend constexpr bool operator==(KTTransform const &a, KTTransform const &b) = default;
};

#include "KTEndExports.h"
