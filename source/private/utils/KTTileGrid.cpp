// KTTileGrid.cpp: the rule by which one axis of a picture is cut.

#include "KTTileGrid.h"

#include "KTGraphicsReport.h"
#include "KTGraphicsUtils.h"

#include <algorithm>
#include <cmath>

namespace {

unsigned short In16Bits(unsigned int value) { return static_cast<unsigned short>(value & 0xFFFFU); }

bool IsPowerOfTwoIn16Bits(unsigned int value) {
    return KTGraphicsUtils::GetNearestUpperPowerOfTwo(In16Bits(value)) == In16Bits(value);
}

} // namespace

bool KTTileAxis::FitsInto(unsigned int maximum, bool onlyPowersOfTwo) const {
    auto const pixels = static_cast<unsigned int>(length);
    return pixels <= maximum && (!onlyPowersOfTwo || IsPowerOfTwoIn16Bits(pixels));
}

std::vector<KTTileSpan> KTTileAxis::Cut(unsigned int maximum, bool onlyPowersOfTwo) const {
    double const scale = static_cast<double>(quadLength) / imageLength;
    std::vector<KTTileSpan> tiles;
    double placed = 0;
    for (int done = 0; done < length;) {
        auto const left = static_cast<unsigned int>(length - done);
        unsigned int pixels = std::min(maximum, left);
        if (onlyPowersOfTwo) {
            pixels = KTGraphicsUtils::GetNearestLowerPowerOfTwo(In16Bits(pixels));
        }
        if (pixels == 0) {
            KTFailGraphics("KTLargeTexturedQuad3D::Load, a tile would have no pixels.", 486);
        }
        // The last tile takes what rounding has left.
        double const end = pixels == left ? quadLength : placed + std::trunc(pixels * scale / factor + 0.5);
        tiles.push_back({start + done, static_cast<int>(pixels), placed, end});
        placed = end;
        done += static_cast<int>(pixels);
    }
    return tiles;
}
