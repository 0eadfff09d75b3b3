// SoftRenderer.cpp: textures in memory and triangles on canvases.

#include "SoftRenderer.h"

#include "KTGraphicsUtils.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <utility>

namespace soft {

namespace {

constexpr int kSubPixels = 256;

// A corner on the canvas in units of 1/256 pixel, y downwards, with its place between the quad's edges.
struct Corner {
    std::int64_t x;
    std::int64_t y;
    double s; // 0 left, 1 right
    double t; // 0 top, 1 bottom
};

// Twice the area of the triangle: positive when c lies to the right of a line from a to b on the canvas.
std::int64_t Area(Corner const &a, Corner const &b, std::int64_t x, std::int64_t y) {
    return (b.x - a.x) * (y - a.y) - (b.y - a.y) * (x - a.x);
}

// Whether a pixel exactly on the edge belongs to the triangle to its right: it is its upper or its left edge.
bool IsTopOrLeft(Corner const &a, Corner const &b) { return b.y < a.y || (b.y == a.y && b.x > a.x); }

// One edge of a triangle, evaluated at the centres of a row's pixels.
class Edge {
  public:
    Edge(Corner const &a, Corner const &b, std::int64_t x, std::int64_t y)
        : m_Value(Area(a, b, x, y)), m_Step(-(b.y - a.y) * kSubPixels), m_Least(IsTopOrLeft(a, b) ? 0 : 1) {}
    bool IsInside() const { return m_Value >= m_Least; }
    std::int64_t Value() const { return m_Value; }
    void Next() { m_Value += m_Step; }

  private:
    std::int64_t m_Value;
    std::int64_t m_Step;
    std::int64_t m_Least;
};

// The pixel at a position, or one before it, where a triangle may begin or end; from -1 to the canvas's size, as a quad
// may reach far beyond.
int PixelAt(std::int64_t position, int size) {
    return static_cast<int>(std::clamp<std::int64_t>((position - kSubPixels / 2) / kSubPixels, -1, size));
}

// Calls paint(x, y, s, t) for every pixel of the canvas whose centre belongs to the triangle.
template <typename Paint>
void Fill(Corner const &a, Corner const &b, Corner const &c, Canvas const &canvas, Paint const &paint) {
    std::int64_t const area = Area(a, b, c.x, c.y);
    if (area == 0) {
        return;
    }
    if (area < 0) {
        Fill(a, c, b, canvas, paint);
        return;
    }
    auto const [left, right] = std::minmax({a.x, b.x, c.x});
    auto const [top, bottom] = std::minmax({a.y, b.y, c.y});
    int const firstX = std::max(PixelAt(left, canvas.Width()), 0);
    int const lastX = std::min(PixelAt(right, canvas.Width()), canvas.Width() - 1);
    int const firstY = std::max(PixelAt(top, canvas.Height()), 0);
    int const lastY = std::min(PixelAt(bottom, canvas.Height()), canvas.Height() - 1);
    double const whole = static_cast<double>(area);
    for (int y = firstY; y <= lastY; ++y) {
        std::int64_t const centerX = std::int64_t{firstX} * kSubPixels + kSubPixels / 2;
        std::int64_t const centerY = std::int64_t{y} * kSubPixels + kSubPixels / 2;
        Edge ofA(b, c, centerX, centerY);
        Edge ofB(c, a, centerX, centerY);
        Edge ofC(a, b, centerX, centerY);
        for (int x = firstX; x <= lastX; ++x, ofA.Next(), ofB.Next(), ofC.Next()) {
            if (ofA.IsInside() && ofB.IsInside() && ofC.IsInside()) {
                auto const mixed = [&](double atA, double atB, double atC) {
                    return (static_cast<double>(ofA.Value()) * atA + static_cast<double>(ofB.Value()) * atB +
                            static_cast<double>(ofC.Value()) * atC) /
                           whole;
                };
                paint(x, y, mixed(a.s, b.s, c.s), mixed(a.t, b.t, c.t));
            }
        }
    }
}

Corner CornerOf(KTVector3f const &point, Canvas const &canvas, double s, double t) {
    auto const snapped = [](double position) { return std::llround(position * kSubPixels); };
    return {snapped(double{point.x} + canvas.Width() / 2.0), snapped(canvas.Height() / 2.0 - double{point.y}), s, t};
}

unsigned char Byte(double value) { return static_cast<unsigned char>(std::clamp(value + 0.5, 0.0, 255.0)); }

// The color over what is there; both not premultiplied.
Pixel Over(Pixel const &color, Pixel const &below) {
    double const alpha = color[3] / 255.0;
    double const rest = below[3] / 255.0 * (1 - alpha);
    if (alpha + rest == 0) {
        return {};
    }
    Pixel result{};
    for (std::size_t i = 0; i < 3; ++i) {
        result[i] = Byte((color[i] * alpha + below[i] * rest) / (alpha + rest));
    }
    result[3] = Byte((alpha + rest) * 255);
    return result;
}

struct Layer {
    Texture const *texture;
    KTTextureCoord2D coords;

    Pixel At(double s, double t) const {
        return texture->At(coords.left + (coords.right - coords.left) * s,
                           coords.top + (coords.bottom - coords.top) * t);
    }
};

Pixel Colored(std::vector<Layer> const &layers, double s, double t, std::array<double, 4> const &tint) {
    Pixel color = layers.front().At(s, t);
    if (layers.size() == 1 && tint == std::array<double, 4>{1, 1, 1, 1}) {
        return color;
    }
    for (std::size_t i = 0; i < color.size(); ++i) {
        double value = color[i] * tint[i];
        for (std::size_t layer = 1; layer < layers.size(); ++layer) {
            value *= layers[layer].At(s, t)[i] / 255.0;
        }
        color[i] = Byte(value);
    }
    return color;
}

std::size_t TexelAt(double place, int size, int border) {
    int const inside = size - 2 * border;
    int const texel = static_cast<int>(std::floor(place * inside));
    return static_cast<std::size_t>(std::clamp(texel, 0, inside - 1) + border);
}

} // namespace

// ---- Texture, TextureManager ----

Pixel Texture::At(double u, double v) const {
    int const border = params.bordered ? 1 : 0;
    std::size_t const index = TexelAt(v, height, border) * static_cast<std::size_t>(width) + TexelAt(u, width, border);
    unsigned char const *const texel = bytes.data() + index * static_cast<std::size_t>(bytesPerPixel);
    switch (params.pixelFormat) {
    case kKTPixelFormatRGB:
        return {texel[0], texel[1], texel[2], 255};
    case kKTPixelFormatBGR:
        return {texel[2], texel[1], texel[0], 255};
    case kKTPixelFormatBGRA:
        return {texel[2], texel[1], texel[0], texel[3]};
    case kKTPixelFormatAlpha8:
        return {255, 255, 255, texel[0]};
    case kKTPixelFormatNone:
        break;
    }
    return {};
}

void TextureManager::Check(int width, int height, KTLoadTextureParams const &params) const {
    int const border = params.bordered ? 2 : 0;
    for (int const side : {width - border, height - border}) {
        if (side < 1 || static_cast<unsigned int>(side) > m_Limits.maxTextureSize) {
            throw std::invalid_argument("a texture's side is 0 or beyond the maximum");
        }
        if (!m_Limits.npot && !std::has_single_bit(static_cast<unsigned int>(side))) {
            throw std::invalid_argument("a texture's side is no power of two");
        }
    }
    if (params.bordered && !m_Limits.borders) {
        throw std::invalid_argument("textures have no borders here");
    }
    if (params.mipmaps && (!m_Limits.mipmaps || params.noMipmaps || params.bordered)) {
        throw std::invalid_argument("this texture has no mipmaps");
    }
    if (params.rowLength != 0 && params.rowLength < width) {
        throw std::invalid_argument("a row is shorter than the texture");
    }
}

void TextureManager::LoadTexture(unsigned char const *pixels, int width, int height, KTTexture2D &texture,
                                 KTLoadTextureParams const &params) {
    Check(width, height, params);
    int const bytesPerPixel = KTGraphicsUtils::GetBytesForPixelFormat(params.pixelFormat);
    auto const pixelBytes = static_cast<std::size_t>(bytesPerPixel);
    auto const rowBytes = static_cast<std::size_t>(width) * pixelBytes;
    auto const sourceBytes = static_cast<std::size_t>(params.rowLength == 0 ? width : params.rowLength) * pixelBytes;
    Texture loaded{width, height, params, bytesPerPixel, {}};
    loaded.bytes.resize(rowBytes * static_cast<std::size_t>(height));
    for (std::size_t y = 0; y < static_cast<std::size_t>(height); ++y) {
        std::memcpy(loaded.bytes.data() + y * rowBytes, pixels + y * sourceBytes, rowBytes);
    }
    if (texture.id != 0 && !m_Textures.contains(texture.id)) {
        throw std::invalid_argument("this texture is not one of this renderer's");
    }
    if (texture.id == 0) {
        texture.id = ++m_LastId;
    }
    texture.width = width;
    texture.height = height;
    texture.params = params;
    m_UploadedBytes += loaded.bytes.size();
    m_Textures[texture.id] = std::move(loaded);
}

void TextureManager::ReleaseTexture(KTTexture2D const &texture, bool) {
    if (texture.id != 0 && m_Textures.erase(texture.id) == 0) {
        throw std::invalid_argument("there is no such texture");
    }
}

// ---- Renderer ----

bool Renderer::IsFeatureSupported(KTRendererFeatureEnum feature) const {
    switch (feature) {
    case kKTFeatureNPOT:
        return m_Limits.npot;
    case kKTFeatureMipmaps:
        return m_Limits.mipmaps;
    case kKTFeatureTextureBorder:
        return m_Limits.borders;
    }
    return false;
}

void Renderer::DrawObject(KTTexturedQuad3D const &quad, KTTransform const &transform, Canvas &canvas,
                          Blend blend) const {
    std::vector<Layer> layers;
    for (std::size_t i = 0; i < quad.textures.size(); ++i) {
        if (quad.textures[i].id != 0) {
            layers.push_back({&m_Manager.Get(quad.textures[i].id), quad.GetTextureCoord(i)});
        }
    }
    if (layers.empty()) {
        return;
    }
    auto const corner = [&](KTVector3f const &point, double s, double t) {
        return CornerOf(transform.matrix.TransformPoint(point), canvas, s, t);
    };
    Corner const bottomLeft = corner(quad.quad.bottomLeft, 0, 1);
    Corner const bottomRight = corner(quad.quad.bottomRight, 1, 1);
    Corner const topRight = corner(quad.quad.topRight, 1, 0);
    Corner const topLeft = corner(quad.quad.topLeft, 0, 0);
    std::array<double, 4> const tint = {transform.color.red, transform.color.green, transform.color.blue,
                                        transform.color.alpha};
    auto const paint = [&](int x, int y, double s, double t) {
        Pixel const color = Colored(layers, s, t, tint);
        Pixel &pixel = canvas.At(x, y);
        pixel = blend == Blend::Replace ? color : Over(color, pixel);
    };
    Fill(bottomLeft, bottomRight, topRight, canvas, paint);
    Fill(bottomLeft, topRight, topLeft, canvas, paint);
}

void Renderer::Draw(KTPrimitiveRenderModel const &model, Canvas &canvas, Blend blend) const {
    for (KTRenderObject3D const &object : model.objects) {
        DrawObject(object.quad, object.transform, canvas, blend);
    }
}

void Renderer::Draw(KTLargeTexturedQuad3D const &quad, Canvas &canvas, Blend blend) const {
    Draw(KTLargeRenderObject3D(quad, KTTransform()).GetPrimitiveRenderModel(), canvas, blend);
}

void DrawTileGrid(KTLargeTexturedQuad3D const &quad, Canvas &canvas, Pixel const &color) {
    auto const paint = [&](int x, int y) {
        if (x >= 0 && y >= 0 && x < canvas.Width() && y < canvas.Height()) {
            canvas.At(x, y) = color;
        }
    };
    for (KTTexturedQuad3D const &tile : quad.quads) {
        int const left = static_cast<int>(std::lround(double{tile.quad.MinX()} + canvas.Width() / 2.0));
        int const right = static_cast<int>(std::lround(double{tile.quad.MaxX()} + canvas.Width() / 2.0)) - 1;
        int const top = static_cast<int>(std::lround(canvas.Height() / 2.0 - double{tile.quad.MaxY()}));
        int const bottom = static_cast<int>(std::lround(canvas.Height() / 2.0 - double{tile.quad.MinY()})) - 1;
        for (int x = left; x <= right; ++x) {
            paint(x, top);
            paint(x, bottom);
        }
        for (int y = top; y <= bottom; ++y) {
            paint(left, y);
            paint(right, y);
        }
    }
}

} // namespace soft
