// KTIntRect.cpp: rectangles of pixels. Sums are made in 64 bits and stop at the limits of 32.

#include "KTIntRect.h"

#include "KTRect.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace {

constexpr KTInt64 kLowest = std::numeric_limits<KTInt32>::min();
constexpr KTInt64 kHighest = std::numeric_limits<KTInt32>::max();

KTInt32 Limited(KTInt64 value) { return static_cast<KTInt32>(std::clamp(value, kLowest, kHighest)); }

// REQUIRES: a whole number, an infinity or NaN.
KTInt32 Limited(double whole) {
    if (std::isnan(whole)) {
        return 0;
    }
    return static_cast<KTInt32>(std::clamp(whole, static_cast<double>(kLowest), static_cast<double>(kHighest)));
}

// Halves go up. Adding a half first would round what lies just below one up, too.
KTInt32 Rounded(double value) {
    double const below = std::floor(value);
    return Limited(value - below >= 0.5 ? below + 1 : below);
}

// Moves two opposite edges towards each other, at most until they meet, whichever is the lesser.
void InsetEdges(KTInt32 &first, KTInt32 &second, KTInt64 amount) {
    KTInt32 &lesser = first <= second ? first : second;
    KTInt32 &greater = first <= second ? second : first;
    KTInt64 const size = KTInt64{greater} - lesser;
    if (2 * amount > size) {
        lesser = greater = Limited(lesser + size / 2);
    } else {
        lesser = Limited(lesser + amount);
        greater = Limited(greater - amount);
    }
}

} // namespace

KTIntRect KTIntRect::Round(KTRect const &other) {
    return {Rounded(other.left), Rounded(other.top), Rounded(other.right), Rounded(other.bottom)};
}

KTIntRect KTIntRect::RoundOut(KTRect const &other) {
    KTRect normal = other;
    normal.Normalize();
    return {Limited(std::floor(normal.left)), Limited(std::floor(normal.top)), Limited(std::ceil(normal.right)),
            Limited(std::ceil(normal.bottom))};
}

KTInt64 KTIntRect::Width() const { return KTInt64{right} - left; }

KTInt64 KTIntRect::Height() const { return KTInt64{bottom} - top; }

bool KTIntRect::IsEmpty() const { return left >= right || top >= bottom; }

void KTIntRect::Normalize() {
    if (left > right) {
        std::swap(left, right);
    }
    if (top > bottom) {
        std::swap(top, bottom);
    }
}

void KTIntRect::Offset(KTInt32 dx, KTInt32 dy) {
    left = Limited(KTInt64{left} + dx);
    right = Limited(KTInt64{right} + dx);
    top = Limited(KTInt64{top} + dy);
    bottom = Limited(KTInt64{bottom} + dy);
}

void KTIntRect::Inset(KTInt32 dx, KTInt32 dy) {
    InsetEdges(left, right, dx);
    InsetEdges(top, bottom, dy);
}

void KTIntRect::Expand(KTInt32 dx, KTInt32 dy) {
    InsetEdges(left, right, -KTInt64{dx});
    InsetEdges(top, bottom, -KTInt64{dy});
}

bool KTIntRect::Contains(KTInt32 x, KTInt32 y) const { return left <= x && x < right && top <= y && y < bottom; }

bool KTIntRect::Contains(KTIntRect const &other) const {
    return other.IsEmpty() ||
           (left <= other.left && other.right <= right && top <= other.top && other.bottom <= bottom);
}

bool KTIntRect::Intersects(KTIntRect const &other) const {
    return !IsEmpty() && !other.IsEmpty() && left < other.right && other.left < right && top < other.bottom &&
           other.top < bottom;
}

KTIntRect KTIntRect::Intersection(KTIntRect const &other) const {
    if (!Intersects(other)) {
        return {};
    }
    return {std::max(left, other.left), std::max(top, other.top), std::min(right, other.right),
            std::min(bottom, other.bottom)};
}

KTIntRect KTIntRect::Union(KTIntRect const &other) const {
    if (other.IsEmpty()) {
        return IsEmpty() ? KTIntRect() : *this;
    }
    if (IsEmpty()) {
        return other;
    }
    return {std::min(left, other.left), std::min(top, other.top), std::max(right, other.right),
            std::max(bottom, other.bottom)};
}
