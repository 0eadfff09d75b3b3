// KTRect.h: a rectangle and its nine reference points, the handles by which an author drags it.
//
//     4 --- 0 --- 5      x grows to the right, y downwards: in a normalised rectangle
//     |           |      left <= right and top <= bottom
//     1     8     3
//     |           |      0 to 3 stand in the middles of the edges, 4 to 7 at the corners, 8 in the centre;
//     7 --- 2 --- 6      kFirstPoint to kLastPoint are the eight on the outline
//
// A rectangle may be inverted (left > right or top > bottom), as it is while being dragged. Unless a member says
// otherwise, inverted rectangles are handled as they are; Normalize puts them right. An empty one has no area but keeps
// its place. Arithmetic follows IEEE 754: NaN and infinite edges are carried along, and no comparison with NaN holds.
//
// Nothing here throws. What "is reported" becomes one assertion line in the log (KTAssert.h). Any thread may use its own
// rectangles; one rectangle is not locked.

#pragma once

#include "KTPoint.h"
#include "KTTypes.h"

#include "KTBeginExports.h"

struct KTIntRect;

/// Four doubles, in the order left, top, right, bottom; a plain value of 32 bytes.
struct KT_PUBLIC_API KTRect {
    /// A reference point. Four bytes.
    enum RefPoint : int {
        kNoPoint = -1,     ///< none; no operation takes it
        kTopCenter = 0,    ///< ((left + right) / 2, top)
        kLeftCenter = 1,   ///< (left, (top + bottom) / 2)
        kBottomCenter = 2, ///< ((left + right) / 2, bottom)
        kRightCenter = 3,  ///< (right, (top + bottom) / 2)
        kTopLeft = 4,      ///< (left, top)
        kTopRight = 5,     ///< (right, top)
        kBottomRight = 6,  ///< (right, bottom)
        kBottomLeft = 7,   ///< (left, bottom)
        kCenter = 8,       ///< ((left + right) / 2, (top + bottom) / 2)

        kFirstPoint = kTopCenter, ///< the first point of the outline
        kLastPoint = kBottomLeft  ///< the last point of the outline
    };

    double left = 0.0;
    double top = 0.0;
    double right = 0.0;
    double bottom = 0.0;

    /// (0, 0, 0, 0), which is empty.
    constexpr KTRect() = default;

    /// The given edges, unchanged.
    constexpr KTRect(double leftEdge, double topEdge, double rightEdge, double bottomEdge)
        : left(leftEdge), top(topEdge), right(rightEdge), bottom(bottomEdge) {}

    /// The normalised rectangle with these two opposite corners.
    KTRect(KTPoint const &corner, KTPoint const &oppositeCorner);

    /// The same edges, exactly.
    explicit KTRect(KTIntRect const &other);

    // ---- reference points ----

    /// Where the point is, see RefPoint. Any other value is reported and gives (0, 0).
    KTPoint GetPoint(RefPoint point) const;

    /// The first reference point, in the order of their values, that lies within 1e-5 of the position both in x and
    /// in y; kNoPoint when none does.
    RefPoint GetRefPoint(KTPoint const &position) const;

    /// Drags a point of the outline to a new position: the edges on which it stands move there, the rectangle is
    /// normalised, and the value is returned that the point has afterwards.
    ///
    /// A point dragged across the opposite edge by more than 1e-5 becomes its mirror image: the top left of
    /// (0, 0, 10, 10) dragged to (20, 5) leaves (10, 5, 20, 10) and is now the top right. A crossing by less swaps the
    /// edges, yet keeps the point's value: handles do not flicker while an author holds them on the opposite edge.
    /// kCenter and values that are no point are reported and move no edge, but the rectangle is normalised.
    RefPoint MovePointTo(RefPoint point, KTPoint const &position);

    /// The point across the centre: top centre and bottom centre, left and right centre, top left and bottom right, top
    /// right and bottom left; kCenter is its own. Any other value is reported and gives kNoPoint.
    RefPoint GetOppositeRefPoint(RefPoint point) const;

    /// Where the opposite point is: GetPoint(GetOppositeRefPoint(point)).
    KTPoint GetOppositePoint(RefPoint point) const;

    /// 1 for the four corners, 0 for the middles of the edges. Everything else, kCenter included, is not on the
    /// outline: it is reported and gives 0.
    KTBool16 IsCorner(RefPoint point) const;

    /// The index under which hosts list the handles: 7 - point on the outline, 8 for kCenter. Any other value is
    /// reported and gives -1.
    static int RefPointToIndex(RefPoint point);

    /// The point at that index; any other index is reported and gives kNoPoint.
    static RefPoint IndexToRefPoint(int index);

    // ---- size and shape ----

    /// right - left and bottom - top: negative when inverted.
    double Width() const;
    double Height() const;

    /// |width * height|.
    double Area() const;

    /// |width / height|; 0 when the height is 0.
    double AspectRatio() const;

    /// Whether left <= right and top <= bottom.
    bool IsNormalized() const;

    /// Whether there is no inside: unless left < right and top < bottom. So inverted rectangles and those with a NaN
    /// edge are empty too.
    bool IsEmpty() const;

    /// Swaps left and right if left > right, and top and bottom if top > bottom.
    void Normalize();

    // ---- moving and sizing ----

    /// Moves all edges by that much.
    void Offset(double dx, double dy);

    /// Moves the left and right edges by `dx` and the top and bottom edges by `dy` towards the centre, each pair at
    /// most until it meets there. Negative amounts move them apart. An inverted rectangle shrinks towards its centre
    /// too, and stays inverted.
    void Inset(double dx, double dy);

    /// Inset(-dx, -dy).
    void Expand(double dx, double dy);

    // ---- sets of points ----

    /// Whether the point lies inside or on an edge. False for inverted rectangles.
    bool Contains(KTPoint const &point) const;

    /// Whether the other rectangle lies inside, common edges allowed. REQUIRES, to mean anything: both are normalised.
    bool Contains(KTRect const &other) const;

    /// Whether the insides have a point in common; touching edges are none. False when either is empty.
    bool Intersects(KTRect const &other) const;

    /// What both have in common; (0, 0, 0, 0) unless Intersects.
    KTRect Intersection(KTRect const &other) const;

    /// The smallest rectangle around both, where an empty one does not count: the other is returned as it is;
    /// (0, 0, 0, 0) if both are empty.
    KTRect Union(KTRect const &other) const;

    /// Exact comparison of the edges, without a tolerance; NaN equals nothing.
    friend constexpr bool operator==(KTRect const &a, KTRect const &b) = default;
};

#include "KTEndExports.h"
