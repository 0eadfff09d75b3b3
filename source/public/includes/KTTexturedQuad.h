// KTTexturedQuad.h: quads with textures, and a large picture as a list of them.
//
// A picture that is larger than the renderer's textures, or whose sides are no powers of two where they have to be, is
// cut into tiles. Each is a texture of its own on a quad of its own; together they cover a rectangle that is centred at
// the origin, at z = 0:
//
//     pixels of the region                 quads, in the order of the list
//
//     x start                                         |
//     | 512   | 256 |128|                +-------+-----+---+
//     +-------+-----+---+ y start        |   1   |  3  | 5 |
//     |       |     |   | 64             |       |     |   |
//     +-------+-----+---+             ---+-------+-----+---+---
//     |       |     |   | 32             |   0   |  2  | 4 |
//     +-------+-----+---+                +-------+-----+---+
//                                                    |
//
// Tiles are cut column by column, each column from its first row of pixels on. Each is uploaded with a border of one
// pixel: its neighbours in the picture, so that filtering sees no seam, or the frame of KTGraphicsUtils::GetBorderedImage
// at the picture's edges. The first tile cut of a column first stands lowest; in the usual orientation (top of the region
// not greater than its bottom) each column is then stacked the other way round, so that the buffer's first row is shown at
// the top. With bottom less than top the tiles keep their places and show their pixels upside down: the first row is at
// the bottom.

#pragma once

#include "IKTRenderer.h"
#include "KTGraphicsStructs.h"
#include "KTTexture.h"

#include <cstddef>
#include <vector>

#include "KTBeginExports.h"

/// A quad and what is drawn on it: any number of textures, each with the rectangle of it that covers the quad.
struct KT_PUBLIC_API KTTexturedQuad3D {
    KTQuad3D quad;
    std::vector<KTTexture2D> textures;
    std::vector<KTTextureCoord2D> textureCoords; ///< one for each texture

    /// A copy of the texture at that index. An index behind the last one is reported as an assertion,
    /// "KTTexturedQuad3D::GetTexture, index out of range", and gives a default record.
    KTTexture2D GetTexture(std::size_t index) const;

    /// A copy of the coordinates at that index. An index behind the last one is reported as an assertion,
    /// "KTTexturedQuad3D::GetTextureCoord, index out of range", and gives (0, 0, 1, 1).
    KTTextureCoord2D GetTextureCoord(std::size_t index) const;
};

/// The limits of a set of points; six floats, 24 bytes.
struct KTBoundingBox {
    float minX = 3.4028235e38F;
    float maxX = 1.1754944e-38F;
    float minY = 3.4028235e38F;
    float maxY = 1.1754944e-38F;
    float minZ = 3.4028235e38F;
    float maxZ = 1.1754944e-38F;

    /// What KTLargeTexturedQuad3D::GetBoundingBox starts from: the greatest float as each minimum and the smallest
    /// positive one as each maximum.
    constexpr KTBoundingBox() = default;

    constexpr KTBoundingBox(float minXValue, float maxXValue, float minYValue, float maxYValue, float minZValue,
                            float maxZValue)
        : minX(minXValue), maxX(maxXValue), minY(minYValue), maxY(maxYValue), minZ(minZValue), maxZ(maxZValue) {}

    friend constexpr bool operator==(KTBoundingBox const &a, KTBoundingBox const &b) = default;
};

/// A large picture as quads, one for each tile. Copies share the textures, which are the renderer's: release them once.
struct KT_PUBLIC_API KTLargeTexturedQuad3D {
    /// The tiles in the order in which they were cut.
    std::vector<KTTexturedQuad3D> quads;

    /// Uploads a picture, or a region of it, and lays it on a rectangle of quadWidth x quadHeight centred at the origin.
    ///
    /// `image`: imageWidth x imageHeight pixels of params.pixelFormat, rows without padding. Null releases every texture
    /// of every tile (flag true) and empties the list; nothing else is looked at then.
    ///
    /// `region`: the part to show, each side 0 to 1, left less than right. Its rows are counted from the first row of
    /// the buffer with 1 there and 0 behind the last one: it begins at row (1 - bottom) * imageHeight. A bottom less
    /// than the top is allowed: the two are swapped for the sizes, and the picture is shown upside down. Sizes and starts
    /// are rounded to pixels, half up; where both are rounded up beyond the image's end, the start is one pixel less.
    ///
    /// `params` is changed and stays so; give each load settings of its own. Without tiles, `mipmaps` stays set only if
    /// noMipmaps is clear and the renderer has mipmaps; a row length other than 0 is the host's and goes to the
    /// renderer as it is. With tiles, `bordered` becomes true, `mipmaps` false and rowLength the pixels of a source row.
    ///
    /// Tiles are needed where the region is wider or higher than the manager's maximum, or where a side is no power of
    /// two and the renderer needs one. Powers of two are tested and cut in 16 bits. A tile is as long as the maximum and
    /// the rest allow, floored to a power of two where needed; a region that touches an edge of the image is cut from a
    /// framed copy of it (GetBorderedImage, freed at the end), any other one from the image itself. Without tiles the
    /// whole image is uploaded and `region` becomes the texture coordinates. Then rows count from the other end: v = 0
    /// is the buffer's first row (KTTexture.h); for a region that does not lie symmetrically between top and bottom,
    /// tiles and a whole texture therefore show different rows.
    ///
    /// Tiles are placed on whole units of the rectangle, the last column and row taking what is left. A rectangle of
    /// fewer units than tiles makes some of them overlap or empty.
    ///
    /// Existing textures: tile i is loaded into the first texture record of the i-th tile that was there. Textures that
    /// no tile takes over are dropped without being released: a host that loads a picture of fewer tiles, or of one,
    /// keeps the former records, or first loads null. Further textures of a tile are dropped likewise.
    ///
    /// Bad geometry is logged, unless logging is off, and thrown as KTLCException, "kKTErrorInternal",
    /// source/private/utils/KTGraphicsStructs; nothing has been changed or uploaded then, except that `params` may be:
    ///
    ///     451  a side of the region outside 0 to 1, or right less than left (NaN counts)
    ///     463  no pixel format
    ///     470  an empty width
    ///     475  an image without pixels, or larger than memory can be ("Invalid image size passed.")
    ///     484  tiles are needed, and the renderer has no borders
    ///     486  a tile would have no pixels: a maximum of 0, or a side beyond 32,768 where powers of two are needed
    ///     493  no memory for the framed copy
    ///
    /// Throws what the renderer throws, and std::bad_alloc. Tiles that were loaded before stand in the list then, in the
    /// places of those they replace, and columns are not yet turned round; without tiles the list is as it was.
    ///
    /// REQUIRES: `image` has as many bytes as its size and format say; `params` is no part of this object. One thread
    /// that the renderer allows.
    void Load(unsigned char const *image, int const &imageWidth, int const &imageHeight, int const &quadWidth,
              int const &quadHeight, IKTRenderer const &renderer, KTTextureCoord2D const &region,
              KTLoadTextureParams &params);

    /// Drops all tiles, without releasing their textures, and stores one quad of that size centred at the origin, with
    /// one default texture record and the coordinates (0, 0, 1, 1). The renderer is not used. Throws std::bad_alloc,
    /// which changes nothing.
    void Load(int const &width, int const &height, IKTRenderer const &renderer);

    /// The whole as one quad: without tiles all zero; of one tile its quad; of several the rectangle around them,
    /// GetBoundingBox's, at that box's greatest z.
    KTQuad3D GetQuad() const;

    /// The limits of all corners of all tiles. Minima start at the greatest float and maxima at the smallest positive
    /// one, 1.1754944e-38: no maximum is ever below that, quads at negative coordinates notwithstanding, and a list
    /// without tiles gives the start values. NaN coordinates do not count.
    KTBoundingBox GetBoundingBox() const;
};

#include "KTEndExports.h"
