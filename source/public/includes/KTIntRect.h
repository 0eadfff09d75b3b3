// KTIntRect.h: a rectangle of whole pixels.
//
// The pixels in columns left to right - 1 and in rows top to bottom - 1; x grows to the right, y downwards. No operation
// overflows: sizes are 64-bit, and edges stop at the limits of 32 bits. Nothing throws or is reported. Any thread may
// use its own rectangles; one rectangle is not locked.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

struct KTRect;

/// Four 32-bit integers, in the order left, top, right, bottom; a plain value of 16 bytes.
struct KT_PUBLIC_API KTIntRect {
    KTInt32 left = 0;
    KTInt32 top = 0;
    KTInt32 right = 0;  ///< one past the last column
    KTInt32 bottom = 0; ///< one past the last row

    /// (0, 0, 0, 0), which is empty.
    constexpr KTIntRect() = default;

    /// The given edges, unchanged.
    constexpr KTIntRect(KTInt32 leftEdge, KTInt32 topEdge, KTInt32 rightEdge, KTInt32 bottomEdge)
        : left(leftEdge), top(topEdge), right(rightEdge), bottom(bottomEdge) {}

    /// The edges rounded to the nearest integer, halves upwards (2.5 gives 3, -2.5 gives -2), so that rectangles that
    /// share an edge still do. Edges beyond the limits of 32 bits give the nearer limit, NaN gives 0.
    static KTIntRect Round(KTRect const &other);

    /// The smallest rectangle of pixels around the other one: left and top rounded down, right and bottom up, after
    /// Normalize. Limits and NaN as for Round.
    static KTIntRect RoundOut(KTRect const &other);

    /// right - left and bottom - top in pixels: negative when inverted.
    KTInt64 Width() const;
    KTInt64 Height() const;

    /// Whether there is no pixel inside: unless left < right and top < bottom.
    bool IsEmpty() const;

    /// Swaps left and right if left > right, and top and bottom if top > bottom.
    void Normalize();

    /// Moves all edges by that many pixels.
    void Offset(KTInt32 dx, KTInt32 dy);

    /// Moves the left and right edges by `dx` and the top and bottom edges by `dy` pixels towards the centre, each pair
    /// at most until it meets there (in an odd size, at the lesser of the two middle edges). Negative amounts move them
    /// apart. An inverted rectangle shrinks towards its centre too, and stays inverted.
    void Inset(KTInt32 dx, KTInt32 dy);

    /// Moves the edges apart by that much; negative amounts move them together, as Inset does.
    void Expand(KTInt32 dx, KTInt32 dy);

    /// Whether the pixel (x, y) is one of the rectangle's.
    bool Contains(KTInt32 x, KTInt32 y) const;

    /// Whether every pixel of the other rectangle is one of this one's. True for an empty other.
    bool Contains(KTIntRect const &other) const;

    /// Whether both have a pixel in common.
    bool Intersects(KTIntRect const &other) const;

    /// The common pixels; (0, 0, 0, 0) if there are none.
    KTIntRect Intersection(KTIntRect const &other) const;

    /// The smallest rectangle around the pixels of both; (0, 0, 0, 0) if both are empty.
    KTIntRect Union(KTIntRect const &other) const;

    friend constexpr bool operator==(KTIntRect const &a, KTIntRect const &b) = default;
};

#include "KTEndExports.h"
