// TexturedQuads.h: quads for tests of those that are made by hand.

#pragma once

#include "KTTexturedQuad.h"

#include <vector>

inline KTQuad3D Rectangle(float left, float bottom, float right, float top, float z = 0) {
    return {{left, bottom, z}, {right, bottom, z}, {right, top, z}, {left, top, z}};
}

inline KTTexturedQuad3D TileWith(KTQuad3D const &quad, std::vector<KTUInt32> const &ids = {}) {
    KTTexturedQuad3D tile;
    tile.quad = quad;
    for (KTUInt32 const id : ids) {
        tile.textures.emplace_back(id, 1, 1, 1.0, 1.0);
        tile.textureCoords.emplace_back();
    }
    return tile;
}
