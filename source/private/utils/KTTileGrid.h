// KTTileGrid.h: where a picture is cut into tiles. The columns and the rows of the grid are found by the same rule, one
// axis at a time; every column has the same rows.

#pragma once

#include <vector>

/// One side of a tile: its pixels on the axis, and its place on the quad, counted from the quad's first edge.
struct KTTileSpan {
    int start = 0;
    int length = 0;
    double quadStart = 0;
    double quadEnd = 0;
};

/// One axis of the region of a picture.
struct KTTileAxis {
    int imageLength = 0; ///< the whole picture's pixels; at least 1
    int start = 0;       ///< the region's first pixel
    int length = 0;      ///< the region's pixels
    double factor =
        1.0; ///< the part of the picture that the region is, before rounding to pixels; not 0 unless length is
    int quadLength = 0; ///< the quad's units

    /// Whether the region has the first or the last pixel of the picture.
    bool TouchesAnEnd() const { return start == 0 || start + length == imageLength; }

    /// Whether one texture can hold the region. Powers of two are tested in 16 bits.
    bool FitsInto(unsigned int maximum, bool onlyPowersOfTwo) const;

    /// The tiles, in the order of the pixels; none if the region has no pixels. Fails (line 486) if a tile would have no
    /// pixels.
    std::vector<KTTileSpan> Cut(unsigned int maximum, bool onlyPowersOfTwo) const;
};
