// SoftRenderer.h: a renderer without hardware behind the library's IKTRenderer. Its limits can be set, so that a picture is
// cut in every way; it is strict, so that a wrong upload does not pass.
//
// Drawing is orthographic: world x and y are pixels, the origin is the centre of the canvas, y points up, z and w are
// ignored. A pixel belongs to a triangle if its centre does; corners are snapped to 1/256 pixel, and on a shared edge the
// top-left rule decides, so that quads that share corners leave no gap and draw no pixel twice. Textures are not
// filtered: a pixel shows the texel that its centre lies in. (For smooth pictures draw on a larger canvas, Reduced.)

#pragma once

#include "Canvas.h"

#include "IKTRenderer.h"
#include "KTRenderModel.h"

#include <cstddef>
#include <map>
#include <vector>

namespace soft {

/// What the renderer can do.
struct Limits {
    unsigned int maxTextureSize = 2048;
    bool npot = true;
    bool mipmaps = true;
    bool borders = true;
};

/// A texture as it was uploaded: the rows one behind the other, the border with them.
struct Texture {
    int width = 0; ///< with the border
    int height = 0;
    KTLoadTextureParams params;
    int bytesPerPixel = 0;
    std::vector<unsigned char> bytes;

    /// The color of the texel at that place of the texture without its border. Formats without alpha are opaque; alpha
    /// alone is white.
    Pixel At(double u, double v) const;
};

/// Keeps textures in memory.
class TextureManager : public KTTextureManager {
  public:
    explicit TextureManager(Limits const &limits) : m_Limits(limits) {}

    unsigned int GetMaxTextureSize() const override { return m_Limits.maxTextureSize; }

    /// Throws std::invalid_argument if the limits forbid the texture, or if the record's id is not one of its own.
    void LoadTexture(unsigned char const *pixels, int width, int height, KTTexture2D &texture,
                     KTLoadTextureParams const &params) override;

    /// Throws std::invalid_argument if there is no such texture; records with id 0 are passed over.
    void ReleaseTexture(KTTexture2D const &texture, bool flag) override;

    /// The texture of that id. Throws std::out_of_range if there is none.
    Texture const &Get(KTUInt32 id) const { return m_Textures.at(id); }

    /// How many textures there are, and how many bytes were ever uploaded.
    std::size_t Count() const { return m_Textures.size(); }
    std::size_t UploadedBytes() const { return m_UploadedBytes; }

  private:
    void Check(int width, int height, KTLoadTextureParams const &params) const;

    Limits m_Limits;
    std::map<KTUInt32, Texture> m_Textures;
    KTUInt32 m_LastId = 0;
    std::size_t m_UploadedBytes = 0;
};

/// How a drawn pixel meets what is there.
enum class Blend {
    Replace, ///< takes its place, alpha and all
    Over     ///< covers it as far as it is opaque
};

/// Draws textured quads on canvases.
class Renderer : public IKTRenderer {
  public:
    explicit Renderer(Limits const &limits) : m_Limits(limits), m_Manager(limits) {}

    bool IsFeatureSupported(KTRendererFeatureEnum feature) const override;
    KTTextureManager &GetTextureManager() const override { return m_Manager; }
    TextureManager const &Textures() const { return m_Manager; }

    /// Draws the objects in their order. Every texture of a quad multiplies its color, as does the transform's. Quads
    /// whose textures were never uploaded are left out.
    void Draw(KTPrimitiveRenderModel const &model, Canvas &canvas, Blend blend) const;

    /// Draws the tiles as they are.
    void Draw(KTLargeTexturedQuad3D const &quad, Canvas &canvas, Blend blend) const;

  private:
    void DrawObject(KTTexturedQuad3D const &quad, KTTransform const &transform, Canvas &canvas, Blend blend) const;

    Limits m_Limits;
    mutable TextureManager m_Manager; // the interface gives it to holders of a constant renderer
};

/// Draws the outline of every tile, one pixel wide, inside it.
void DrawTileGrid(KTLargeTexturedQuad3D const &quad, Canvas &canvas, Pixel const &color);

} // namespace soft
