// KTTexturedQuad.cpp: textured quads, and the loading of a large picture into them.

#include "KTTexturedQuad.h"

#include "KTAssert.h"
#include "KTGraphicsReport.h"
#include "KTGraphicsUtils.h"
#include "KTPixels.h"
#include "KTTileGrid.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace {

constexpr char kSourcePath[] = "source/private/utils/KTTexturedQuad";
constexpr int kFrame = 2; // pixels that a frame adds to a side

bool IsIn0To1(double value) { return value >= 0 && value <= 1; }

int RoundedPixels(double value) { return static_cast<int>(std::trunc(value + 0.5)); }

// The region's pixels along one axis: `length * before` pixels lie before it.
KTTileAxis AxisOf(int imageLength, double before, double factor, int quadLength) {
    KTTileAxis axis;
    axis.imageLength = imageLength;
    axis.length = RoundedPixels(imageLength * factor);
    // Start and length may both be rounded up, and the region would end one pixel behind the image.
    axis.start = std::min(RoundedPixels(imageLength * before), imageLength - axis.length);
    axis.factor = factor;
    axis.quadLength = quadLength;
    return axis;
}

// The rectangle between two corners of the plane z = 0.
KTQuad3D QuadBetween(double left, double bottom, double right, double top) {
    auto const corner = [](double x, double y) {
        return KTVector3f(static_cast<float>(x), static_cast<float>(y), 0.0F);
    };
    return {corner(left, bottom), corner(right, bottom), corner(right, top), corner(left, top)};
}

KTTexture2D FirstTexture(std::vector<KTTexturedQuad3D> const &quads, std::size_t index) {
    return index < quads.size() && !quads[index].textures.empty() ? quads[index].textures.front() : KTTexture2D();
}

// One load of a picture: what is given, and where it is cut.
class Loading {
  public:
    Loading(unsigned char const *image, int imageWidth, int imageHeight, int quadWidth, int quadHeight,
            IKTRenderer const &renderer, KTTextureCoord2D const &region, KTPixelFormatEnum format)
        : m_Image(image), m_Renderer(renderer), m_Manager(renderer.GetTextureManager()), m_Region(region) {
        if (!IsIn0To1(region.left) || !IsIn0To1(region.top) || !IsIn0To1(region.right) || !IsIn0To1(region.bottom) ||
            region.right < region.left) {
            KTFailGraphics("KTLargeTexturedQuad3D::Load, Invalid texture co-ordinates passed.", 451);
        }
        m_BytesPerPixel = static_cast<std::size_t>(KTBytesPerPixel(format));
        if (m_BytesPerPixel == 0) {
            KTFailGraphics("KTLargeTexturedQuad3D::Load, numBytesPerPixel == 0", 463);
        }
        double const widthFactor = region.right - region.left;
        if (widthFactor <= 0) {
            KTFailGraphics("KTLargeTexturedQuad3D::Load, textureWidthFactor <= 0", 470);
        }
        double const bottom = std::max(region.top, region.bottom);
        double const heightFactor = bottom - std::min(region.top, region.bottom);
        CheckImageSize(imageWidth, imageHeight);
        m_Columns = AxisOf(imageWidth, region.left, widthFactor, quadWidth);
        m_Rows = AxisOf(imageHeight, 1 - bottom, heightFactor, quadHeight);
    }

    void Into(std::vector<KTTexturedQuad3D> &quads, KTLoadTextureParams &params) const {
        unsigned int const maximum = m_Manager.GetMaxTextureSize();
        bool const onlyPowersOfTwo = !m_Renderer.IsFeatureSupported(kKTFeatureNPOT);
        if (m_Columns.FitsInto(maximum, onlyPowersOfTwo) && m_Rows.FitsInto(maximum, onlyPowersOfTwo)) {
            LoadWhole(quads, params);
            return;
        }
        if (!m_Renderer.IsFeatureSupported(kKTFeatureTextureBorder)) {
            KTFailGraphics("KTLargeTexturedQuad3D::Load, Texture must be tiled and hence bordered, but texture border "
                           "support doesn't exist.",
                           484);
        }
        if (m_Columns.imageLength > std::numeric_limits<int>::max() - kFrame) {
            FailImageSize(); // its framed rows would have no length
        }
        std::vector<KTTileSpan> const columns = m_Columns.Cut(maximum, onlyPowersOfTwo);
        std::vector<KTTileSpan> const rows = m_Rows.Cut(maximum, onlyPowersOfTwo);
        LoadTiles(columns, rows, quads, params);
        if (!IsUpsideDown()) {
            Restack(quads);
        }
    }

  private:
    [[noreturn]] static void FailImageSize() {
        KTFailGraphics("KTLargeTexturedQuad3D::Load, Invalid image size passed.", 475);
    }

    void CheckImageSize(int width, int height) const {
        if (width < 1 || height < 1) {
            FailImageSize();
        }
        constexpr auto kMostBytes = static_cast<std::size_t>(std::numeric_limits<std::ptrdiff_t>::max());
        if (static_cast<std::size_t>(width) * static_cast<std::size_t>(height) > kMostBytes / m_BytesPerPixel) {
            FailImageSize();
        }
    }

    bool IsUpsideDown() const { return m_Region.bottom < m_Region.top; }

    KTQuad3D QuadAt(double left, double bottom, double right, double top) const {
        double const halfWidth = m_Columns.quadLength / 2.0;
        double const halfHeight = m_Rows.quadLength / 2.0;
        return QuadBetween(left - halfWidth, bottom - halfHeight, right - halfWidth, top - halfHeight);
    }

    void LoadWhole(std::vector<KTTexturedQuad3D> &quads, KTLoadTextureParams &params) const {
        params.mipmaps = params.mipmaps && !params.noMipmaps && m_Renderer.IsFeatureSupported(kKTFeatureMipmaps);
        KTLoadTextureParams const upload = params;
        KTTexturedQuad3D whole{
            QuadAt(0, 0, m_Columns.quadLength, m_Rows.quadLength), {FirstTexture(quads, 0)}, {m_Region}};
        std::vector<KTTexturedQuad3D> result;
        result.reserve(1);
        quads.swap(result);
        try {
            m_Manager.LoadTexture(m_Image, m_Columns.imageLength, m_Rows.imageLength, whole.textures.front(), upload);
        } catch (...) {
            quads.swap(result); // the host may still release what was there
            throw;
        }
        result.clear();
        result.push_back(std::move(whole));
        quads.swap(result);
    }

    void LoadTiles(std::vector<KTTileSpan> const &columns, std::vector<KTTileSpan> const &rows,
                   std::vector<KTTexturedQuad3D> &quads, KTLoadTextureParams &params) const {
        bool const isFramed = m_Columns.TouchesAnEnd() || m_Rows.TouchesAnEnd();
        KTPixelBuffer const framed(isFramed ? KTGraphicsUtils::GetBorderedImage(m_Image, m_Columns.imageLength,
                                                                                m_Rows.imageLength,
                                                                                static_cast<int>(m_BytesPerPixel))
                                            : nullptr);
        if (isFramed && framed == nullptr) {
            KTFailGraphics("KTLargeTexturedQuad3D::Load, !workingImageBuffer", 493);
        }
        int const rowLength = m_Columns.imageLength + (isFramed ? kFrame : 0);
        params.bordered = true;
        params.mipmaps = false;
        params.rowLength = rowLength;
        KTLoadTextureParams const upload = params;

        quads.reserve(std::max(quads.size(), columns.size() * rows.size()));
        std::size_t index = 0;
        for (KTTileSpan const &column : columns) {
            for (KTTileSpan const &row : rows) {
                KTTexturedQuad3D tile = TileAt(column, row, FirstTexture(quads, index));
                m_Manager.LoadTexture(PixelsOf(framed.get(), rowLength, column, row), column.length + kFrame,
                                      row.length + kFrame, tile.textures.front(), upload);
                if (index < quads.size()) {
                    quads[index] = std::move(tile);
                } else {
                    quads.push_back(std::move(tile));
                }
                ++index;
            }
        }
        quads.erase(quads.begin() + static_cast<std::ptrdiff_t>(index), quads.end());
    }

    KTTexturedQuad3D TileAt(KTTileSpan const &column, KTTileSpan const &row, KTTexture2D const &texture) const {
        KTTextureCoord2D const upright;
        KTTextureCoord2D const upsideDown(0, 1, 1, 0);
        return {QuadAt(column.quadStart, row.quadStart, column.quadEnd, row.quadEnd),
                {texture},
                {IsUpsideDown() ? upsideDown : upright}};
    }

    // The first pixel of a tile's border: in the framed copy, where every pixel stands one further on in both directions,
    // at the tile's own place, in the image itself one pixel before it.
    unsigned char const *PixelsOf(unsigned char const *framed, int rowLength, KTTileSpan const &column,
                                  KTTileSpan const &row) const {
        std::size_t const before = framed == nullptr ? 1 : 0;
        std::size_t const x = static_cast<std::size_t>(column.start) - before;
        std::size_t const y = static_cast<std::size_t>(row.start) - before;
        return (framed == nullptr ? m_Image : framed) + (y * static_cast<std::size_t>(rowLength) + x) * m_BytesPerPixel;
    }

    // Turns the order of the tiles within each column round, from its bottom upwards.
    static void Restack(std::vector<KTTexturedQuad3D> &quads) {
        for (auto first = quads.begin(); first != quads.end();) {
            float const left = first->quad.bottomLeft.x;
            auto const end =
                std::find_if(first, quads.end(), [left](auto const &tile) { return tile.quad.bottomLeft.x != left; });
            float bottom = first->quad.bottomLeft.y;
            for (auto tile = end; tile != first;) {
                KTQuad3D &quad = (--tile)->quad;
                float const top = bottom + (quad.topLeft.y - quad.bottomLeft.y);
                quad.bottomLeft.y = quad.bottomRight.y = bottom;
                quad.topLeft.y = quad.topRight.y = top;
                bottom = top;
            }
            first = end;
        }
    }

    unsigned char const *m_Image;
    IKTRenderer const &m_Renderer;
    KTTextureManager &m_Manager;
    KTTextureCoord2D m_Region; // a copy: the caller's may be one of the tiles'
    std::size_t m_BytesPerPixel = 0;
    KTTileAxis m_Columns;
    KTTileAxis m_Rows;
};

void ReleaseAll(std::vector<KTTexturedQuad3D> &quads, KTTextureManager &manager) {
    for (KTTexturedQuad3D &tile : quads) {
        for (KTTexture2D const &texture : tile.textures) {
            manager.ReleaseTexture(texture, true);
        }
        tile.textures.clear();
    }
    quads.clear();
}

void Widen(float &least, float &greatest, float value) {
    if (value < least) {
        least = value;
    }
    if (value > greatest) {
        greatest = value;
    }
}

} // namespace

// ---- the host's part ----

KTTextureManager::KTTextureManager() = default;
KTTextureManager::KTTextureManager(KTTextureManager const &) = default;
KTTextureManager &KTTextureManager::operator=(KTTextureManager const &) = default;
KTTextureManager::~KTTextureManager() = default;

IKTRenderer::IKTRenderer() = default;
IKTRenderer::IKTRenderer(IKTRenderer const &) = default;
IKTRenderer &IKTRenderer::operator=(IKTRenderer const &) = default;
IKTRenderer::~IKTRenderer() = default;

// ---- KTTexturedQuad3D ----

KTTexture2D KTTexturedQuad3D::GetTexture(std::size_t index) const {
    if (index >= textures.size()) {
        KTAssertFailed("KTTexturedQuad3D::GetTexture, index out of range", kSourcePath, 263);
        return {};
    }
    return textures[index];
}

KTTextureCoord2D KTTexturedQuad3D::GetTextureCoord(std::size_t index) const {
    if (index >= textureCoords.size()) {
        KTAssertFailed("KTTexturedQuad3D::GetTextureCoord, index out of range", kSourcePath, 271);
        return {};
    }
    return textureCoords[index];
}

// ---- KTLargeTexturedQuad3D ----

void KTLargeTexturedQuad3D::Load(unsigned char const *image, int const &imageWidth, int const &imageHeight,
                                 int const &quadWidth, int const &quadHeight, IKTRenderer const &renderer,
                                 KTTextureCoord2D const &region, KTLoadTextureParams &params) {
    if (image == nullptr) {
        ReleaseAll(quads, renderer.GetTextureManager());
        return;
    }
    Loading const loading(image, imageWidth, imageHeight, quadWidth, quadHeight, renderer, region, params.pixelFormat);
    loading.Into(quads, params);
}

void KTLargeTexturedQuad3D::Load(int const &width, int const &height, IKTRenderer const &) {
    double const x = width / 2.0;
    double const y = height / 2.0;
    std::vector<KTTexturedQuad3D> one{{QuadBetween(-x, -y, x, y), {KTTexture2D()}, {KTTextureCoord2D()}}};
    quads.swap(one);
}

KTQuad3D KTLargeTexturedQuad3D::GetQuad() const {
    if (quads.empty()) {
        return {};
    }
    if (quads.size() == 1) {
        return quads.front().quad;
    }
    KTBoundingBox const box = GetBoundingBox();
    return {{box.minX, box.minY, box.maxZ},
            {box.maxX, box.minY, box.maxZ},
            {box.maxX, box.maxY, box.maxZ},
            {box.minX, box.maxY, box.maxZ}};
}

KTBoundingBox KTLargeTexturedQuad3D::GetBoundingBox() const {
    KTBoundingBox box;
    for (KTTexturedQuad3D const &tile : quads) {
        KTQuad3D const &quad = tile.quad;
        for (KTVector3f const &corner : {quad.bottomLeft, quad.bottomRight, quad.topRight, quad.topLeft}) {
            Widen(box.minX, box.maxX, corner.x);
            Widen(box.minY, box.maxY, corner.y);
            Widen(box.minZ, box.maxZ, corner.z);
        }
    }
    return box;
}
