// KTRect.cpp: reference points, size and sets of rectangles.

#include "KTRect.h"

#include "KTAssert.h"
#include "KTIntRect.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numeric>
#include <utility>

namespace {

constexpr double kTolerance = 1e-5; // points nearer than this are the same
constexpr char kReportPath[] = "source/private/utils/KTRect";
constexpr char kHeaderReportPath[] = "source/public/includes/KTRect";

// What mirroring makes of the points of the outline, by value.
constexpr std::array<KTRect::RefPoint, 8> kMirroredLeftRight = {
    KTRect::kTopCenter, KTRect::kRightCenter, KTRect::kBottomCenter, KTRect::kLeftCenter,
    KTRect::kTopRight,  KTRect::kTopLeft,     KTRect::kBottomLeft,   KTRect::kBottomRight};
constexpr std::array<KTRect::RefPoint, 8> kMirroredTopBottom = {
    KTRect::kBottomCenter, KTRect::kLeftCenter,  KTRect::kTopCenter, KTRect::kRightCenter,
    KTRect::kBottomLeft,   KTRect::kBottomRight, KTRect::kTopRight,  KTRect::kTopLeft};

bool IsOnOutline(KTRect::RefPoint point) { return point >= KTRect::kFirstPoint && point <= KTRect::kLastPoint; }

// Points that are not on the outline are their own mirror images.
KTRect::RefPoint Mirrored(std::array<KTRect::RefPoint, 8> const &images, KTRect::RefPoint point) {
    return IsOnOutline(point) ? images[static_cast<std::size_t>(point)] : point;
}

// Moves two opposite edges towards each other, at most until they meet in the middle, whichever is the lesser.
void InsetEdges(double &first, double &second, double amount) {
    double &lesser = first <= second ? first : second;
    double &greater = first <= second ? second : first;
    if (amount > (greater - lesser) / 2) {
        lesser = greater = std::midpoint(lesser, greater);
    } else {
        lesser += amount;
        greater -= amount;
    }
}

} // namespace

KTRect::KTRect(KTPoint const &corner, KTPoint const &oppositeCorner)
    : KTRect(corner.x, corner.y, oppositeCorner.x, oppositeCorner.y) {
    Normalize();
}

KTRect::KTRect(KTIntRect const &other) : KTRect(other.left, other.top, other.right, other.bottom) {}

// ---- reference points ----

KTPoint KTRect::GetPoint(RefPoint point) const {
    double const middleX = std::midpoint(left, right);
    double const middleY = std::midpoint(top, bottom);
    switch (point) {
    case kTopCenter:
        return {middleX, top};
    case kLeftCenter:
        return {left, middleY};
    case kBottomCenter:
        return {middleX, bottom};
    case kRightCenter:
        return {right, middleY};
    case kTopLeft:
        return {left, top};
    case kTopRight:
        return {right, top};
    case kBottomRight:
        return {right, bottom};
    case kBottomLeft:
        return {left, bottom};
    case kCenter:
        return {middleX, middleY};
    default:
        KTAssertFailed("RefPoint out of range", kReportPath, 158);
        return {};
    }
}

KTRect::RefPoint KTRect::GetRefPoint(KTPoint const &position) const {
    for (int value = kFirstPoint; value <= kCenter; ++value) {
        auto const point = static_cast<RefPoint>(value);
        KTPoint const away = GetPoint(point) - position;
        if (std::fabs(away.x) <= kTolerance && std::fabs(away.y) <= kTolerance) {
            return point;
        }
    }
    return kNoPoint;
}

KTRect::RefPoint KTRect::MovePointTo(RefPoint point, KTPoint const &position) {
    if (!IsOnOutline(point)) {
        KTAssertFailed("Invalid RefPoint", kReportPath, 248);
    }
    if (point == kTopCenter || point == kTopLeft || point == kTopRight) {
        top = position.y;
    }
    if (point == kLeftCenter || point == kTopLeft || point == kBottomLeft) {
        left = position.x;
    }
    if (point == kBottomCenter || point == kBottomLeft || point == kBottomRight) {
        bottom = position.y;
    }
    if (point == kRightCenter || point == kTopRight || point == kBottomRight) {
        right = position.x;
    }
    // Mirroring has a tolerance and normalising has none, see the header.
    if (left > right + kTolerance) {
        point = Mirrored(kMirroredLeftRight, point);
    }
    if (top > bottom + kTolerance) {
        point = Mirrored(kMirroredTopBottom, point);
    }
    Normalize();
    return point;
}

KTRect::RefPoint KTRect::GetOppositeRefPoint(RefPoint point) const {
    if (point == kCenter) {
        return kCenter;
    }
    bool const isCorner = IsCorner(point) != 0;
    if (!IsOnOutline(point)) {
        return kNoPoint;
    }
    int const across = (point + 2) % 4;
    return static_cast<RefPoint>(isCorner ? kTopLeft + across : across);
}

KTPoint KTRect::GetOppositePoint(RefPoint point) const { return GetPoint(GetOppositeRefPoint(point)); }

KTBool16 KTRect::IsCorner(RefPoint point) const {
    if (!IsOnOutline(point)) {
        KTAssertFailed("KTRect::IsCorner - whichPoint >= kFirstPoint && whichPoint <= kLastPoint", kHeaderReportPath,
                       622);
        return 0;
    }
    return point >= kTopLeft ? 1 : 0;
}

int KTRect::RefPointToIndex(RefPoint point) {
    if (IsOnOutline(point)) {
        return kLastPoint - point;
    }
    if (point != kCenter) {
        KTAssertFailed("RefPoint out of range", kReportPath, 563);
        return -1;
    }
    return kCenter;
}

KTRect::RefPoint KTRect::IndexToRefPoint(int index) {
    if (index >= kFirstPoint && index <= kLastPoint) {
        return static_cast<RefPoint>(kLastPoint - index);
    }
    if (index != kCenter) {
        KTAssertFailed("RefPoint index out of range", kReportPath, 590);
        return kNoPoint;
    }
    return kCenter;
}

// ---- size and shape ----

double KTRect::Width() const { return right - left; }

double KTRect::Height() const { return bottom - top; }

double KTRect::Area() const { return std::fabs(Width() * Height()); }

double KTRect::AspectRatio() const {
    double const height = Height();
    return height == 0.0 ? 0.0 : std::fabs(Width() / height);
}

bool KTRect::IsNormalized() const { return left <= right && top <= bottom; }

bool KTRect::IsEmpty() const { return !(left < right && top < bottom); }

void KTRect::Normalize() {
    if (left > right) {
        std::swap(left, right);
    }
    if (top > bottom) {
        std::swap(top, bottom);
    }
}

// ---- moving and sizing ----

void KTRect::Offset(double dx, double dy) {
    left += dx;
    right += dx;
    top += dy;
    bottom += dy;
}

void KTRect::Inset(double dx, double dy) {
    InsetEdges(left, right, dx);
    InsetEdges(top, bottom, dy);
}

void KTRect::Expand(double dx, double dy) { Inset(-dx, -dy); }

// ---- sets of points ----

bool KTRect::Contains(KTPoint const &point) const {
    return left <= point.x && point.x <= right && top <= point.y && point.y <= bottom;
}

bool KTRect::Contains(KTRect const &other) const {
    return left <= other.left && other.right <= right && top <= other.top && other.bottom <= bottom;
}

bool KTRect::Intersects(KTRect const &other) const {
    return !IsEmpty() && !other.IsEmpty() && left < other.right && other.left < right && top < other.bottom &&
           other.top < bottom;
}

KTRect KTRect::Intersection(KTRect const &other) const {
    if (!Intersects(other)) {
        return {};
    }
    return {std::max(left, other.left), std::max(top, other.top), std::min(right, other.right),
            std::min(bottom, other.bottom)};
}

KTRect KTRect::Union(KTRect const &other) const {
    if (other.IsEmpty()) {
        return IsEmpty() ? KTRect() : *this;
    }
    if (IsEmpty()) {
        return other;
    }
    return {std::min(left, other.left), std::min(top, other.top), std::max(right, other.right),
            std::max(bottom, other.bottom)};
}
