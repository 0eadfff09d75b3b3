// TilePictureTest.cpp: pictures of many sizes, loaded under many limits into a renderer in software. What it draws must be
// the picture, pixel by pixel, with nothing beside it; and every tile must have been cut as a plain loop cuts it.

#include "SoftRenderer.h"

#include "KTGraphicsUtils.h"
#include "KTTexturedQuad.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <string>
#include <vector>

namespace {

using soft::Blend;
using soft::Canvas;
using soft::Limits;
using soft::Pixel;

constexpr KTPixelFormatEnum kFormats[] = {kKTPixelFormatRGB, kKTPixelFormatBGR, kKTPixelFormatBGRA,
                                          kKTPixelFormatAlpha8};
constexpr Pixel kOutside = {1, 2, 3, 4};
constexpr int kMargin = 3; // pixels of the canvas around the quad

struct Image {
    int width;
    int height;
    KTPixelFormatEnum format;
    std::size_t pixelBytes;
    std::vector<unsigned char> bytes;

    Image(int w, int h, KTPixelFormatEnum f, unsigned int seed)
        : width(w), height(h), format(f),
          pixelBytes(static_cast<std::size_t>(KTGraphicsUtils::GetBytesForPixelFormat(f))) {
        bytes.resize(static_cast<std::size_t>(w) * static_cast<std::size_t>(h) * pixelBytes);
        std::minstd_rand random(seed);
        std::generate(bytes.begin(), bytes.end(), [&] { return static_cast<unsigned char>(random() >> 8); });
    }

    unsigned char const *At(int x, int y) const {
        return bytes.data() +
               (static_cast<std::size_t>(y) * static_cast<std::size_t>(width) + static_cast<std::size_t>(x)) *
                   pixelBytes;
    }

    Pixel ColorAt(int x, int y) const {
        unsigned char const *const byte = At(x, y);
        switch (format) {
        case kKTPixelFormatRGB:
            return {byte[0], byte[1], byte[2], 255};
        case kKTPixelFormatBGR:
            return {byte[2], byte[1], byte[0], 255};
        case kKTPixelFormatBGRA:
            return {byte[2], byte[1], byte[0], byte[3]};
        default:
            return {255, 255, 255, byte[0]};
        }
    }
};

// A part of an image in whole pixels. It is shown upside down if that is set.
struct Part {
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
    bool upsideDown = false;

    static Part All(Image const &image) { return {0, 0, image.width, image.height, false}; }

    // Rows of a region are counted from its bottom edge on.
    KTTextureCoord2D RegionOf(Image const &image) const {
        double const left = static_cast<double>(x) / image.width;
        double const right = static_cast<double>(x + width) / image.width;
        double const bottom = 1 - static_cast<double>(y) / image.height;
        double const top = 1 - static_cast<double>(y + height) / image.height;
        return upsideDown ? KTTextureCoord2D(left, bottom, right, top) : KTTextureCoord2D(left, top, right, bottom);
    }
};

int Side(float least, float greatest) { return static_cast<int>(std::lround(greatest - least)); }

// What stands wrong on the canvas: a pixel of the part at a wrong place, or anything beside it. Empty if all is right.
std::string WrongPixel(Canvas const &canvas, Image const &image, Part const &part) {
    for (int y = 0; y < canvas.Height(); ++y) {
        for (int x = 0; x < canvas.Width(); ++x) {
            int const column = x - kMargin;
            int const row = y - kMargin;
            bool const isInside = column >= 0 && column < part.width && row >= 0 && row < part.height;
            int const shown = part.upsideDown ? part.height - 1 - row : row;
            Pixel const expected = isInside ? image.ColorAt(part.x + column, part.y + shown) : kOutside;
            if (canvas.At(x, y) != expected) {
                return "pixel " + std::to_string(column) + ", " + std::to_string(row);
            }
        }
    }
    return "";
}

// Whether the pixel of a tile's border that lies on or beside the image at x, y is what it should be.
bool IsRightPixel(Image const &image, unsigned char const *texel, int x, int y) {
    bool const isBeside = x < 0 || x >= image.width;
    bool const isAboveOrBelow = y < 0 || y >= image.height;
    if (isBeside && isAboveOrBelow) {
        return true; // corners of the frame are not set
    }
    unsigned char const *const nearest =
        image.At(std::clamp(x, 0, image.width - 1), std::clamp(y, 0, image.height - 1));
    return std::equal(nearest, nearest + (isBeside ? 1 : image.pixelBytes), texel);
}

// The first tile that is not what a plain loop cuts at its place. The tiles of a column lie between its rows: `rows` and
// `columns` count pixels of the image from the part's first one.
std::string WrongTile(soft::Texture const &texture, Image const &image, int left, int top) {
    for (int y = 0; y < texture.height; ++y) {
        for (int x = 0; x < texture.width; ++x) {
            std::size_t const index =
                static_cast<std::size_t>(y) * static_cast<std::size_t>(texture.width) + static_cast<std::size_t>(x);
            if (!IsRightPixel(image, texture.bytes.data() + index * image.pixelBytes, left + x - 1, top + y - 1)) {
                return "tile at " + std::to_string(left) + ", " + std::to_string(top) + ": texel " + std::to_string(x) +
                       ", " + std::to_string(y);
            }
        }
    }
    return "";
}

// Whether the limits allow one texture for the part.
bool FitsIntoOne(Part const &part, Limits const &limits) {
    auto const fits = [&](int side) {
        return static_cast<unsigned int>(side) <= limits.maxTextureSize && (limits.npot || (side & (side - 1)) == 0);
    };
    return fits(part.width) && fits(part.height);
}

// The lengths that a side is cut into.
std::vector<int> PlainCuts(int length, Limits const &limits) {
    std::vector<int> cuts;
    while (length > 0) {
        int cut = std::min(length, static_cast<int>(limits.maxTextureSize));
        while (!limits.npot && (cut & (cut - 1)) != 0) {
            cut &= cut - 1; // the lowest bit goes, until one is left
        }
        cuts.push_back(cut);
        length -= cut;
    }
    return cuts;
}

void ExpectTilesAreCut(KTLargeTexturedQuad3D const &large, soft::Renderer const &renderer, Image const &image,
                       Part const &part, Limits const &limits) {
    std::vector<int> const widths = PlainCuts(part.width, limits);
    std::vector<int> const heights = PlainCuts(part.height, limits);
    ASSERT_EQ(large.quads.size(), widths.size() * heights.size());
    std::size_t index = 0;
    int x = part.x;
    for (int const width : widths) {
        int y = part.y;
        for (int const height : heights) {
            soft::Texture const &texture = renderer.Textures().Get(large.quads[index++].GetTexture(0).id);
            ASSERT_EQ(texture.width, width + 2);
            ASSERT_EQ(texture.height, height + 2);
            ASSERT_TRUE(texture.params.bordered);
            ASSERT_FALSE(texture.params.mipmaps);
            ASSERT_EQ(WrongTile(texture, image, x, y), "");
            y += height;
        }
        x += width;
    }
}

// Loads the part into one unit a pixel, draws it, and compares.
void ExpectShown(Image const &image, Part const &part, Limits const &limits) {
    SCOPED_TRACE(std::to_string(image.width) + " x " + std::to_string(image.height) + " of format " +
                 std::to_string(image.format) + ", part " + std::to_string(part.x) + " " + std::to_string(part.y) +
                 " " + std::to_string(part.width) + " " + std::to_string(part.height) + ", maximum " +
                 std::to_string(limits.maxTextureSize) + (limits.npot ? "" : ", powers of two"));
    soft::Renderer const renderer(limits);
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params(true, false, true, false, 0, 0, image.format);
    large.Load(image.bytes.data(), image.width, image.height, part.width, part.height, renderer, part.RegionOf(image),
               params);
    if (!FitsIntoOne(part, limits)) {
        ExpectTilesAreCut(large, renderer, image, part, limits);
    } else {
        ASSERT_EQ(large.quads.size(), 1U);
    }
    KTQuad3D const quad = large.GetQuad();
    ASSERT_EQ(Side(quad.MinX(), quad.MaxX()), part.width);
    ASSERT_EQ(Side(quad.MinY(), quad.MaxY()), part.height);
    Canvas canvas(part.width + 2 * kMargin, part.height + 2 * kMargin, kOutside);
    renderer.Draw(large, canvas, Blend::Replace);
    ASSERT_EQ(WrongPixel(canvas, image, part), "");
}

void ExpectShown(Image const &image, Limits const &limits) { ExpectShown(image, Part::All(image), limits); }

} // namespace

TEST(TilePicture, EveryFormatIsShownWholeUnderEveryLimit) {
    for (KTPixelFormatEnum const format : kFormats) {
        Image const image(137, 91, format, 1);
        for (unsigned int const maximum : {1U, 2U, 7U, 32U, 90U, 91U, 136U, 137U, 256U, 4096U}) {
            if (maximum > 2 || format == kKTPixelFormatBGRA) {
                ExpectShown(image, {maximum, true, true, true});
            }
            ExpectShown(image, {maximum + 5, false, true, true});
        }
    }
}

TEST(TilePicture, EverySmallSizeIsShownWhole) {
    for (int width = 1; width <= 9; ++width) {
        for (int height = 1; height <= 9; ++height) {
            Image const image(width, height, kFormats[(width + height) % 4], 2);
            for (unsigned int const maximum : {1U, 2U, 3U, 4U, 8U, 9U}) {
                ExpectShown(image, {maximum, true, true, true});
                ExpectShown(image, {maximum, false, false, true});
            }
        }
    }
}

TEST(TilePicture, LongSidesAreShownWhole) {
    for (auto const &[width, height] :
         {std::pair{8191, 1}, {1, 8191}, {8191, 33}, {33, 8191}, {4097, 130}, {1000, 600}}) {
        for (KTPixelFormatEnum const format : {kKTPixelFormatBGRA, kKTPixelFormatRGB}) {
            Image const image(width, height, format, 3);
            ExpectShown(image, {512, false, true, true});
            ExpectShown(image, {8191, true, true, true});
            ExpectShown(image, {8190, true, true, true});
        }
    }
}

TEST(TilePicture, PartsAreShownEitherWayUp) {
    Image const image(64, 48, kKTPixelFormatBGRA, 4);
    std::minstd_rand random(5);
    auto const upTo = [&](int most) { return static_cast<int>(random() % static_cast<unsigned int>(most)) + 1; };
    for (int i = 0; i < 200; ++i) {
        Part part;
        part.width = upTo(image.width);
        part.height = upTo(image.height);
        part.x = upTo(image.width - part.width + 1) - 1;
        part.y = upTo(image.height - part.height + 1) - 1;
        part.upsideDown = i % 2 == 0;
        Limits const limits{static_cast<unsigned int>(upTo(20)), i % 3 == 0, true, true};
        if (!FitsIntoOne(part, limits)) { // one texture shows other rows of a part
            ExpectShown(image, part, limits);
        }
    }
}

TEST(TilePicture, OneTextureIsShownEitherWayUp) {
    Image const image(20, 15, kKTPixelFormatBGR, 6);
    Part part = Part::All(image);
    part.upsideDown = true;
    ExpectShown(image, part, {64, true, false, false});
    ExpectShown(image, part, {8, true, false, true});
    ExpectShown(image, part, {8, false, false, true});
}

TEST(TilePicture, IsShownWholeOnQuadsOfOtherSizes) {
    // Three canvas pixels for each of the image's, so that every tile has whole units.
    Image const image(50, 40, kKTPixelFormatBGRA, 7);
    for (Limits const &limits : {Limits{16, false, true, true}, Limits{7, true, true, true}}) {
        soft::Renderer const renderer(limits);
        KTLargeTexturedQuad3D large;
        KTLoadTextureParams params(true, false, true, false, 0, 0, image.format);
        large.Load(image.bytes.data(), 50, 40, 150, 120, renderer, {}, params);
        Canvas canvas(150, 120, kOutside);
        renderer.Draw(large, canvas, Blend::Replace);
        for (int y = 0; y < 120; ++y) {
            for (int x = 0; x < 150; ++x) {
                ASSERT_EQ(canvas.At(x, y), image.ColorAt(x / 3, y / 3)) << x << ", " << y;
            }
        }
    }
}

TEST(TilePicture, HasNoGapWhenScaledAndTurned) {
    // Opaque white over black: between the tiles nothing black may show, nor may a pixel be drawn twice.
    std::vector<unsigned char> const white(std::size_t{200} * 100, 128);
    soft::Renderer const renderer({32, false, true, true});
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params(true, false, true, false, 0, 0, kKTPixelFormatAlpha8);
    large.Load(white.data(), 200, 100, 200, 100, renderer, {}, params);
    for (float const radians : {0.0F, 0.3F, 1.0F, 2.5F}) {
        Canvas canvas(400, 400, {0, 0, 0, 255});
        KTTransform const turned({7.3F, -4.1F, 0}, {1.37F, 1.61F, 1}, {0, 0, 1}, radians, {1, 1, 1, 1});
        renderer.Draw(KTLargeRenderObject3D(large, turned).GetPrimitiveRenderModel(), canvas, Blend::Over);
        KTMatrix4x4f back;
        ASSERT_TRUE(turned.matrix.GetInverse(back));
        for (int y = 0; y < 400; ++y) {
            for (int x = 0; x < 400; ++x) {
                KTVector3f const place =
                    back.TransformPoint({static_cast<float>(x) - 199.5F, 199.5F - static_cast<float>(y), 0});
                float const beyond = std::max(std::fabs(place.x) - 100, std::fabs(place.y) - 50);
                if (std::fabs(beyond) > 0.1F) {
                    int const expected = beyond < 0 ? 128 : 0;
                    ASSERT_EQ(canvas.At(x, y)[0], expected) << x << ", " << y << " turned by " << radians;
                }
            }
        }
    }
}

TEST(TilePicture, CoversTheCanvasFromFarOutside) {
    // A course's picture may be a line of many pixels, scaled up: its ends are billions of pixels away then.
    unsigned char const white = 255;
    soft::Renderer const renderer({1, true, true, true});
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params(true, false, true, false, 0, 0, kKTPixelFormatAlpha8);
    large.Load(&white, 1, 1, 1, 1, renderer, {}, params);
    KTTransform const wide({}, {6e9F, 100, 1}, {}, 0, {1, 1, 1, 1});
    Canvas canvas(8, 4, kOutside);
    renderer.Draw(KTLargeRenderObject3D(large, wide).GetPrimitiveRenderModel(), canvas, Blend::Replace);
    EXPECT_EQ(canvas, Canvas(8, 4, {255, 255, 255, 255}));
}

TEST(TilePicture, ReloadingUsesTheSameTextures) {
    soft::Renderer const renderer({16, false, true, true});
    KTLargeTexturedQuad3D large;
    for (unsigned int seed = 0; seed < 3; ++seed) {
        Image const image(40, 40, kKTPixelFormatBGRA, seed);
        KTLoadTextureParams params(true, false, true, false, 0, 0, image.format);
        large.Load(image.bytes.data(), 40, 40, 40, 40, renderer, {}, params);
        EXPECT_EQ(renderer.Textures().Count(), 9U);
        Canvas canvas(40 + 2 * kMargin, 40 + 2 * kMargin, kOutside);
        renderer.Draw(large, canvas, Blend::Replace);
        EXPECT_EQ(WrongPixel(canvas, image, Part::All(image)), "");
    }
    KTLoadTextureParams params;
    large.Load(nullptr, 0, 0, 0, 0, renderer, {}, params);
    EXPECT_EQ(renderer.Textures().Count(), 0U);
}

TEST(TilePicture, ConstColoredQuadsAreShownInTheirColor) {
    for (Limits const &limits : {Limits{64, true, true, true}, Limits{16, false, true, true}}) {
        soft::Renderer const renderer(limits);
        KTLargeTexturedQuad3D large;
        KTGraphicsUtils::GetConstColoredQuad(renderer, 37, 21, {0.2F, 0.4F, 0.6F, 0.8F}, {}, large);
        Canvas canvas(37 + 2 * kMargin, 21 + 2 * kMargin, kOutside);
        renderer.Draw(large, canvas, Blend::Replace);
        for (int y = 0; y < canvas.Height(); ++y) {
            for (int x = 0; x < canvas.Width(); ++x) {
                bool const isInside = x >= kMargin && x < kMargin + 37 && y >= kMargin && y < kMargin + 21;
                ASSERT_EQ(canvas.At(x, y), isInside ? (Pixel{51, 102, 153, 204}) : kOutside) << x << ", " << y;
            }
        }
    }
}

TEST(TilePicture, CanvasesBecomePngFilesAndBack) {
    Canvas canvas(70, 30);
    std::minstd_rand random(8);
    for (int y = 0; y < 30; ++y) {
        for (int x = 0; x < 70; ++x) {
            for (unsigned char &channel : canvas.At(x, y)) {
                channel = static_cast<unsigned char>(random() >> 8);
            }
        }
    }
    std::string const file = soft::EncodePng(canvas);
    EXPECT_TRUE(file.starts_with("\x89PNG"));
    EXPECT_EQ(soft::DecodePng(file), canvas);
    EXPECT_EQ(soft::DecodePng(file.substr(0, 40)), std::nullopt);
    EXPECT_EQ(soft::EncodePng(Canvas()), "");
    Canvas two(4, 2, {100, 0, 0, 255});
    two.At(0, 0) = {0, 0, 0, 0};
    EXPECT_EQ(soft::Reduced(two, 2).At(0, 0), (Pixel{100, 0, 0, 191}));
    EXPECT_EQ(soft::Reduced(two, 2).Width(), 2);
}
