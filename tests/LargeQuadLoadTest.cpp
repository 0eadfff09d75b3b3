// LargeQuadLoadTest.cpp: the loading of pictures into tiles, step by step, with a renderer that writes down what is asked of
// it.

#include "InterpolationMode.h"
#include "LogLines.h"
#include "RecordingRenderer.h"
#include "TexturedQuads.h"

#include "KTGraphicsUtils.h"
#include "KTTexturedQuad.h"

#include <gtest/gtest.h>

#include <climits>
#include <limits>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;
using Lines = std::vector<std::string>;

constexpr double kNan = std::numeric_limits<double>::quiet_NaN();

KTLoadTextureParams ParamsOf(KTPixelFormatEnum format) { return {true, false, true, false, 7, 0, format}; }

// A picture of one byte a pixel and where it is loaded from it.
struct Picture {
    int width;
    int height;
    Bytes bytes;

    Picture(int w, int h) : width(w), height(h), bytes(static_cast<std::size_t>(w) * static_cast<std::size_t>(h), 9) {}

    void LoadInto(KTLargeTexturedQuad3D &large, RecordingRenderer const &renderer, KTTextureCoord2D const &region,
                  KTLoadTextureParams &params, int quadWidth = 0, int quadHeight = 0) const {
        large.Load(bytes.data(), width, height, quadWidth == 0 ? width : quadWidth,
                   quadHeight == 0 ? height : quadHeight, renderer, region, params);
    }

    void LoadInto(KTLargeTexturedQuad3D &large, RecordingRenderer const &renderer,
                  KTTextureCoord2D const &region = {}) const {
        KTLoadTextureParams params = ParamsOf(kKTPixelFormatAlpha8);
        LoadInto(large, renderer, region, params);
    }
};

// Expects line and log of a load that must change nothing and upload nothing.
void ExpectRefused(int line, std::string const &text, RecordingRenderer const &renderer, Picture const &picture,
                   KTTextureCoord2D const &region, KTPixelFormatEnum format = kKTPixelFormatAlpha8) {
    KTLargeTexturedQuad3D large;
    large.quads = {TileWith(Rectangle(0, 0, 1, 1), {5}), TileWith(Rectangle(1, 0, 2, 1), {6})};
    KTLoadTextureParams params = ParamsOf(format);
    LogLines log;
    ExpectInternalError(line, [&] { picture.LoadInto(large, renderer, region, params); });
    EXPECT_EQ(log.Take(), Lines{text});
    EXPECT_EQ(large.quads.size(), 2U);
    EXPECT_EQ(large.quads[1].GetTexture(0).id, 6U);
    EXPECT_TRUE(renderer.manager.uploads.empty());
    EXPECT_TRUE(renderer.manager.released.empty());
    gKTLogger->LogEnableAtRuntime(false);
    ExpectInternalError(line, [&] { picture.LoadInto(large, renderer, region, params); });
    gKTLogger->LogEnableAtRuntime(true);
    EXPECT_EQ(log.Take(), Lines{});
}

std::vector<int> Widths(RecordingRenderer const &renderer) {
    std::vector<int> widths;
    for (Upload const &upload : renderer.manager.uploads) {
        if (widths.empty() || widths.back() != upload.width - 2) {
            widths.push_back(upload.width - 2);
        }
    }
    return widths;
}

std::vector<float> Bottoms(KTLargeTexturedQuad3D const &large) {
    std::vector<float> bottoms;
    bottoms.reserve(large.quads.size());
    for (KTTexturedQuad3D const &tile : large.quads) {
        bottoms.push_back(tile.quad.bottomLeft.y);
    }
    return bottoms;
}

} // namespace

// ---- step 1: no image ----

TEST(LargeQuadLoad, NoImageReleasesEveryTextureAndLooksAtNothingElse) {
    RecordingRenderer const renderer;
    KTLargeTexturedQuad3D large;
    large.quads = {TileWith(KTQuad3D(), {1, 2}), TileWith(KTQuad3D()), TileWith(KTQuad3D(), {3})};
    KTLoadTextureParams params = ParamsOf(kKTPixelFormatNone);
    LogLines log;
    large.Load(nullptr, -1, -1, -1, -1, renderer, {5, 5, -5, kNan}, params);
    EXPECT_EQ(renderer.manager.released, (std::vector<KTUInt32>{1, 2, 3}));
    EXPECT_EQ(renderer.manager.flags, (std::vector<bool>{true, true, true}));
    EXPECT_TRUE(large.quads.empty());
    EXPECT_EQ(params, ParamsOf(kKTPixelFormatNone));
    EXPECT_EQ(log.Take(), Lines{});
}

// ---- steps 2 to 8: refusals ----

TEST(LargeQuadLoad, RefusesRegionsOutside0To1) {
    RecordingRenderer const renderer;
    Picture const picture(8, 8);
    std::string const text = "KTLargeTexturedQuad3D::Load, Invalid texture co-ordinates passed.";
    for (KTTextureCoord2D const &region : {KTTextureCoord2D{-0.001, 0, 1, 1},
                                           {0, -0.001, 1, 1},
                                           {0, 0, 1.001, 1},
                                           {0, 0, 1, 1.001},
                                           {1.5, 0, 2, 1},
                                           {0, 1.001, 1, 1},
                                           {0, 0, 1, -0.5},
                                           {0.5, 0, 0.25, 1},
                                           {kNan, 0, 1, 1},
                                           {0, kNan, 1, 1},
                                           {0, 0, kNan, 1},
                                           {0, 0, 1, kNan}}) {
        ExpectRefused(451, text, renderer, picture, region);
    }
}

TEST(LargeQuadLoad, ChecksInOrder) {
    RecordingRenderer const renderer;
    Picture const picture(8, 8);
    // Everything is wrong; then, one after the other, it is put right.
    ExpectRefused(451, "KTLargeTexturedQuad3D::Load, Invalid texture co-ordinates passed.", renderer, picture,
                  {1, 0, 0, 1}, kKTPixelFormatNone);
    ExpectRefused(463, "KTLargeTexturedQuad3D::Load, numBytesPerPixel == 0", renderer, picture, {0.5, 0, 0.5, 1},
                  kKTPixelFormatNone);
    ExpectRefused(463, "KTLargeTexturedQuad3D::Load, numBytesPerPixel == 0", renderer, picture, {},
                  static_cast<KTPixelFormatEnum>(-1));
    Picture nothing(8, 8);
    nothing.width = 0;
    ExpectRefused(470, "KTLargeTexturedQuad3D::Load, textureWidthFactor <= 0", renderer, nothing, {0.5, 0, 0.5, 1});
    ExpectRefused(475, "KTLargeTexturedQuad3D::Load, Invalid image size passed.", renderer, nothing, {});
}

TEST(LargeQuadLoad, RefusesImagesWithoutPixelsOrBeyondMemory) {
    RecordingRenderer const renderer;
    std::string const text = "KTLargeTexturedQuad3D::Load, Invalid image size passed.";
    for (auto const &[width, height] : {std::pair{-1, 8}, {8, -1}, {8, 0}, {INT_MIN, INT_MIN}}) {
        Picture picture(8, 8);
        picture.width = width;
        picture.height = height;
        ExpectRefused(475, text, renderer, picture, {});
    }
    Picture huge(8, 8);
    huge.width = huge.height = INT_MAX;
    ExpectRefused(475, text, renderer, huge, {}, kKTPixelFormatBGRA);
    huge.width = INT_MAX - 1; // its framed rows would be longer than an int
    huge.height = 1;
    ExpectRefused(475, text, renderer, huge, {});
}

TEST(LargeQuadLoad, NeedsBordersToTile) {
    std::string const text =
        "KTLargeTexturedQuad3D::Load, Texture must be tiled and hence bordered, but texture border "
        "support doesn't exist.";
    ExpectRefused(484, text, RecordingRenderer(7, {kKTFeatureNPOT}), Picture(8, 4), {});
    ExpectRefused(484, text, RecordingRenderer(7, {kKTFeatureNPOT}), Picture(4, 8), {});
    ExpectRefused(484, text, RecordingRenderer(8, kNoFeatures), Picture(8, 7), {});
    ExpectRefused(484, text, RecordingRenderer(8, kNoFeatures), Picture(7, 8), {});
}

TEST(LargeQuadLoad, RefusesTilesWithoutPixels) {
    std::string const text = "KTLargeTexturedQuad3D::Load, a tile would have no pixels.";
    ExpectRefused(486, text, RecordingRenderer(0), Picture(8, 8), {});
    ExpectRefused(486, text, RecordingRenderer(0, kOnlyBorders), Picture(8, 8), {});
    // Floored in 16 bits: 32,769 to 65,535 and 65,536 become 0.
    ExpectRefused(486, text, RecordingRenderer(40'000, kOnlyBorders), Picture(40'000, 1), {});
    ExpectRefused(486, text, RecordingRenderer(32'769, kOnlyBorders), Picture(1, 40'000), {});
    ExpectRefused(486, text, RecordingRenderer(65'536, kOnlyBorders), Picture(70'000, 1), {});
}

TEST(LargeQuadLoad, TestsPowersOfTwoIn16Bits) {
    RecordingRenderer const renderer(100'000, kOnlyBorders);
    KTLargeTexturedQuad3D large;
    Picture(65'536 + 4, 1).LoadInto(large, renderer);
    EXPECT_EQ(large.quads.size(), 1U) << "taken for 4";
    EXPECT_FALSE(renderer.manager.uploads[0].params.bordered);
    // Cut to 4 and 1 pixels, and the 65,536 that are left are taken for 0.
    ExpectRefused(486, "KTLargeTexturedQuad3D::Load, a tile would have no pixels.",
                  RecordingRenderer(100'000, kOnlyBorders), Picture(65'536 + 5, 1), {});
}

TEST(LargeQuadLoad, KeepsPicturesWhoseRowsAreTooLongForTilesWhole) {
    Picture huge(8, 8);
    huge.width = INT_MAX;
    huge.height = 1;
    RecordingRenderer const renderer(0xFFFFFFFFU);
    KTLargeTexturedQuad3D large;
    huge.LoadInto(large, renderer);
    EXPECT_EQ(renderer.manager.uploads.at(0).width, INT_MAX);
}

#ifdef _WIN32
// (Address sanitizers end the program instead.)
TEST(LargeQuadLoad, ReportsThatThereIsNoMemoryForTheFramedCopy) {
    Picture huge(8, 8);
    huge.width = huge.height = INT_MAX - 2;
    ExpectRefused(493, "KTLargeTexturedQuad3D::Load, !workingImageBuffer", RecordingRenderer(0x40000000U), huge, {});
}
#endif

// ---- step 10: one texture ----

TEST(LargeQuadLoad, UploadsTheWholeImageWhenItFits) {
    RecordingRenderer const renderer(2048);
    Picture const picture(1000, 600);
    KTLargeTexturedQuad3D large;
    KTTextureCoord2D const region(0.25, 0.125, 0.5, 1);
    KTLoadTextureParams params(true, false, false, false, 42, 1000, kKTPixelFormatAlpha8);
    picture.LoadInto(large, renderer, region, params, 301, 99);
    ASSERT_EQ(renderer.manager.uploads.size(), 1U);
    Upload const &upload = renderer.manager.uploads[0];
    EXPECT_EQ(upload.pixels, picture.bytes.data()) << "no copy";
    EXPECT_EQ(upload.width, 1000);
    EXPECT_EQ(upload.height, 600);
    EXPECT_EQ(upload.params, params) << "as given";
    EXPECT_EQ(params, KTLoadTextureParams(true, false, false, false, 42, 1000, kKTPixelFormatAlpha8));
    ASSERT_EQ(large.quads.size(), 1U);
    EXPECT_EQ(large.quads[0].quad, Rectangle(-150.5F, -49.5F, 150.5F, 49.5F));
    EXPECT_EQ(large.quads[0].textures.size(), 1U);
    EXPECT_EQ(large.quads[0].GetTexture(0).id, upload.id);
    EXPECT_EQ(large.quads[0].GetTextureCoord(0), region);
    EXPECT_EQ(large.quads[0].textureCoords.size(), 1U);
}

TEST(LargeQuadLoad, GivesTheRegionAsTextureCoordinatesUpsideDownToo) {
    RecordingRenderer const renderer;
    KTLargeTexturedQuad3D large;
    Picture(6, 6).LoadInto(large, renderer, {0, 0.75, 1, 0.5});
    EXPECT_EQ(large.quads.at(0).GetTextureCoord(0), KTTextureCoord2D(0, 0.75, 1, 0.5));
}

TEST(LargeQuadLoad, AsksForMipmapsOnlyWhereAllAgree) {
    for (int bits = 0; bits < 8; ++bits) {
        bool const wanted = (bits & 1) != 0;
        bool const forbidden = (bits & 2) != 0;
        bool const supported = (bits & 4) != 0;
        RecordingRenderer renderer;
        renderer.features = supported ? std::set<int>{1, 2} : std::set<int>{1};
        KTLoadTextureParams params(wanted, false, true, forbidden, 0, 0, kKTPixelFormatAlpha8);
        KTLargeTexturedQuad3D large;
        Picture(6, 6).LoadInto(large, renderer, {}, params);
        bool const expected = wanted && !forbidden && supported;
        EXPECT_EQ(renderer.manager.uploads.at(0).params.mipmaps, expected) << bits;
        EXPECT_EQ(params.mipmaps, expected) << "the caller's are changed";
        EXPECT_EQ(params.noMipmaps, forbidden);
    }
}

TEST(LargeQuadLoad, KeepsTheFirstTextureForOneQuadAndDropsTheOthers) {
    RecordingRenderer const renderer;
    KTLargeTexturedQuad3D large;
    large.quads = {TileWith(KTQuad3D(), {8, 9}), TileWith(KTQuad3D(), {10})};
    Picture(6, 6).LoadInto(large, renderer);
    EXPECT_EQ(renderer.manager.uploads.at(0).idBefore, 8U);
    ASSERT_EQ(large.quads.size(), 1U);
    EXPECT_EQ(large.quads[0].textures.size(), 1U);
    EXPECT_EQ(large.quads[0].GetTexture(0).id, 8U);
    EXPECT_TRUE(renderer.manager.released.empty()) << "the others are left to the host";
    large.quads = {TileWith(KTQuad3D()), TileWith(KTQuad3D(), {10})};
    Picture(6, 6).LoadInto(large, renderer);
    EXPECT_EQ(renderer.manager.uploads.at(1).idBefore, 0U) << "the first tile has none";
}

TEST(LargeQuadLoad, DecidesByTheRegionsSize) {
    RecordingRenderer const renderer(8, kOnlyBorders);
    KTLargeTexturedQuad3D large;
    Picture(16, 16).LoadInto(large, renderer, {0.25, 0.25, 0.75, 0.75});
    ASSERT_EQ(renderer.manager.uploads.size(), 1U);
    EXPECT_EQ(renderer.manager.uploads[0].width, 16) << "the whole image, which the host made larger than its maximum";
    Picture(16, 16).LoadInto(large, renderer, {0.25, 0.25, 0.75, 0.8125});
    EXPECT_EQ(renderer.manager.uploads.size(), 1U + 2U) << "9 rows";
}

TEST(LargeQuadLoad, TakesARegionWithoutRowsAsOneTextureOrAsNoTiles) {
    RecordingRenderer const renderer(8);
    KTLargeTexturedQuad3D large;
    Picture(8, 8).LoadInto(large, renderer, {0, 0.5, 1, 0.5});
    EXPECT_EQ(large.quads.size(), 1U);
    Picture(16, 8).LoadInto(large, renderer, {0, 0.5, 1, 0.5});
    EXPECT_EQ(large.quads.size(), 0U);
    EXPECT_EQ(renderer.manager.uploads.size(), 1U);
}

// ---- steps 11 to 14: tiles ----

TEST(LargeQuadLoad, CutsByPowersOfTwo) {
    RecordingRenderer const renderer(512, kOnlyBorders);
    Picture const picture(1000, 600);
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params(true, false, false, false, 42, 0, kKTPixelFormatAlpha8);
    picture.LoadInto(large, renderer, {}, params);
    std::vector<int> const widths = {512, 256, 128, 64, 32, 8};
    std::vector<int> const heights = {512, 64, 16, 8};
    ASSERT_EQ(renderer.manager.uploads.size(), 24U);
    ASSERT_EQ(large.quads.size(), 24U);
    EXPECT_EQ(Widths(renderer), widths);
    unsigned char const *const frame = renderer.manager.uploads[0].pixels; // the first tile's border is its corner
    float left = -500;
    std::size_t x = 0;
    for (std::size_t i = 0; i < widths.size(); ++i) {
        float top = 300;
        std::size_t y = 0;
        for (std::size_t j = 0; j < heights.size(); ++j) {
            std::size_t const index = i * heights.size() + j;
            Upload const &upload = renderer.manager.uploads[index];
            EXPECT_EQ(upload.width, widths[i] + 2);
            EXPECT_EQ(upload.height, heights[j] + 2);
            EXPECT_EQ(upload.params, KTLoadTextureParams(false, true, false, false, 42, 1002, kKTPixelFormatAlpha8));
            EXPECT_EQ(upload.pixels, frame + y * 1002 + x);
            // The first rows are at the top.
            KTTexturedQuad3D const &tile = large.quads[index];
            EXPECT_EQ(tile.quad,
                      Rectangle(left, top - static_cast<float>(heights[j]), left + static_cast<float>(widths[i]), top));
            EXPECT_EQ(tile.textures.size(), 1U);
            EXPECT_EQ(tile.GetTexture(0).id, upload.id);
            EXPECT_EQ(tile.textureCoords, std::vector<KTTextureCoord2D>{KTTextureCoord2D()});
            top -= static_cast<float>(heights[j]);
            y += static_cast<std::size_t>(heights[j]);
        }
        left += static_cast<float>(widths[i]);
        x += static_cast<std::size_t>(widths[i]);
    }
    EXPECT_EQ(params, KTLoadTextureParams(false, true, false, false, 42, 1002, kKTPixelFormatAlpha8));
}

TEST(LargeQuadLoad, TakesTheLargestTilesWhereAnySizeIsAllowed) {
    RecordingRenderer const renderer(512);
    KTLargeTexturedQuad3D large;
    Picture(1100, 600).LoadInto(large, renderer);
    EXPECT_EQ(Widths(renderer), (std::vector<int>{512, 76}));
    EXPECT_EQ(renderer.manager.uploads.at(1).height, 88 + 2);
    RecordingRenderer const one(2048);
    Picture(1000, 600).LoadInto(large, one);
    EXPECT_EQ(large.quads.size(), 1U);
    EXPECT_EQ(one.manager.uploads.at(0).width, 1000);
}

TEST(LargeQuadLoad, ShowsARegionUpsideDown) {
    RecordingRenderer const renderer(4);
    KTLargeTexturedQuad3D large;
    Picture(4, 10).LoadInto(large, renderer, {0, 1, 1, 0});
    ASSERT_EQ(large.quads.size(), 3U);
    EXPECT_EQ(Bottoms(large), (std::vector<float>{-5, -1, 3})) << "the first rows stay at the bottom";
    for (KTTexturedQuad3D const &tile : large.quads) {
        EXPECT_EQ(tile.GetTextureCoord(0), KTTextureCoord2D(0, 1, 1, 0));
    }
    Picture(4, 10).LoadInto(large, renderer, {0, 0, 1, 1});
    EXPECT_EQ(Bottoms(large), (std::vector<float>{1, -3, -5}));
    EXPECT_EQ(large.quads[2].quad, Rectangle(-2, -5, 2, -3));
}

TEST(LargeQuadLoad, CutsFromTheImageItselfAwayFromItsEdges) {
    RecordingRenderer const renderer(4);
    Picture const picture(16, 16);
    KTLargeTexturedQuad3D large;
    // Columns 2 to 7 and, rows being counted from bottom = 1 on, rows 4 to 13.
    KTLoadTextureParams params = ParamsOf(kKTPixelFormatAlpha8);
    picture.LoadInto(large, renderer, {0.125, 0.125, 0.5, 0.75}, params);
    ASSERT_EQ(renderer.manager.uploads.size(), 6U);
    EXPECT_EQ(renderer.manager.uploads[0].pixels, &picture.bytes[std::size_t{3} * 16 + 1]);
    EXPECT_EQ(renderer.manager.uploads[2].pixels, &picture.bytes[std::size_t{11} * 16 + 1]);
    EXPECT_EQ(renderer.manager.uploads[3].pixels, &picture.bytes[std::size_t{3} * 16 + 5]);
    EXPECT_EQ(renderer.manager.uploads[3].width, 2 + 2);
    EXPECT_EQ(params.rowLength, 16);
}

TEST(LargeQuadLoad, CopiesTheImageIntoAFrameWhenAnEdgeIsTouched) {
    Picture const picture(16, 16);
    for (KTTextureCoord2D const &region :
         {KTTextureCoord2D{0, 0.25, 0.75, 0.75}, {0.25, 0, 0.75, 0.75}, {0.25, 0.25, 1, 0.75}, {0.25, 0.25, 0.75, 1}}) {
        RecordingRenderer const renderer(4);
        KTLargeTexturedQuad3D large;
        KTLoadTextureParams params = ParamsOf(kKTPixelFormatAlpha8);
        picture.LoadInto(large, renderer, region, params);
        EXPECT_EQ(params.rowLength, 18);
        for (Upload const &upload : renderer.manager.uploads) {
            EXPECT_TRUE(upload.pixels < picture.bytes.data() || upload.pixels >= picture.bytes.data() + 256);
        }
    }
}

TEST(LargeQuadLoad, RoundsTheRegionToPixels) {
    // 2.5, 5.5 and 6.5 pixels become 3, 6 and 7; 2.4, 5.4 and 1.4 become 2, 5 and 1.
    Picture const picture(10, 10);
    for (auto const &[region, x, y, width, height] :
         {std::tuple{KTTextureCoord2D(0.25, 0.16, 0.8, 0.81), std::size_t{3}, std::size_t{2}, 6, 7},
          {KTTextureCoord2D(0.24, 0.16, 0.78, 0.86), 2, 1, 5, 7}}) {
        RecordingRenderer const renderer(4);
        KTLargeTexturedQuad3D large;
        picture.LoadInto(large, renderer, region);
        EXPECT_EQ(renderer.manager.uploads.at(0).pixels, &picture.bytes[(y - 1) * 10 + (x - 1)]);
        EXPECT_EQ(renderer.manager.uploads.back().width, width - 4 + 2);
        EXPECT_EQ(renderer.manager.uploads.back().height, height - 4 + 2);
    }
}

TEST(LargeQuadLoad, MovesARegionThatRoundingCarriesBeyondTheImage) {
    // Start 1.5 and length 1.5 both become 2, and the image has 3 columns and rows.
    RecordingRenderer const renderer(1);
    renderer.manager.bytesPerPixel = 1;
    Picture picture(3, 3);
    for (std::size_t i = 0; i < 9; ++i) {
        picture.bytes[i] = static_cast<unsigned char>(i);
    }
    KTLargeTexturedQuad3D large;
    picture.LoadInto(large, renderer, {0.5, 0, 1, 0.5});
    ASSERT_EQ(renderer.manager.uploads.size(), 4U);
    std::vector<int> centers;
    centers.reserve(renderer.manager.uploads.size());
    for (Upload const &upload : renderer.manager.uploads) {
        centers.push_back(upload.bytes.at(4));
    }
    EXPECT_EQ(centers, (std::vector<int>{4, 7, 5, 8}));
}

TEST(LargeQuadLoad, PlacesTilesOnWholeUnitsOfTheQuad) {
    // 4 of 10 pixels on 21 units are 8.4 units, of which 8 are taken; the last tile gets what is left.
    RecordingRenderer const renderer(4);
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params = ParamsOf(kKTPixelFormatAlpha8);
    Picture(10, 4).LoadInto(large, renderer, {}, params, 21, 4);
    ASSERT_EQ(large.quads.size(), 3U);
    EXPECT_EQ(large.quads[0].quad, Rectangle(-10.5F, -2, -2.5F, 2));
    EXPECT_EQ(large.quads[1].quad, Rectangle(-2.5F, -2, 5.5F, 2));
    EXPECT_EQ(large.quads[2].quad, Rectangle(5.5F, -2, 10.5F, 2));
    // A region: 4 of its 8 pixels are half of the quad, whatever the image's size.
    Picture(16, 8).LoadInto(large, renderer, {0.25, 0.25, 0.75, 0.75}, params, 20, 40);
    ASSERT_EQ(large.quads.size(), 2U);
    EXPECT_EQ(large.quads[0].quad, Rectangle(-10, -20, 0, 20));
    // The same on rows: 8.4 and 8.4 units from the bottom, then turned round.
    Picture(4, 10).LoadInto(large, renderer, {}, params, 4, 21);
    EXPECT_EQ(Bottoms(large), (std::vector<float>{2.5F, -5.5F, -10.5F}));
}

TEST(LargeQuadLoad, LetsTilesOverlapOnAQuadOfFewerUnits) {
    // Each half unit is rounded up; the last tile takes what is left, which is less than nothing.
    RecordingRenderer const renderer(1);
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params = ParamsOf(kKTPixelFormatAlpha8);
    Picture(6, 1).LoadInto(large, renderer, {}, params, 3, 1);
    ASSERT_EQ(large.quads.size(), 6U);
    EXPECT_EQ(large.quads[4].quad, Rectangle(2.5F, -0.5F, 3.5F, 0.5F));
    EXPECT_EQ(large.quads[5].quad, Rectangle(3.5F, -0.5F, 1.5F, 0.5F));
}

TEST(LargeQuadLoad, StacksTilesOfOneLeftEdgeTogether) {
    // On a quad without width all columns have one left edge: they are one run, and so one stack.
    RecordingRenderer const renderer(4);
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params = ParamsOf(kKTPixelFormatAlpha8);
    Picture picture(8, 8);
    large.Load(picture.bytes.data(), 8, 8, 0, 8, renderer, {}, params);
    EXPECT_EQ(Bottoms(large), (std::vector<float>{8, 4, 0, -4}));
}

TEST(LargeQuadLoad, ReusesTexturesTileByTile) {
    RecordingRenderer const renderer(4);
    KTLargeTexturedQuad3D large;
    Picture(4, 12).LoadInto(large, renderer);
    ASSERT_EQ(large.quads.size(), 3U);
    Picture(4, 16).LoadInto(large, renderer);
    std::vector<KTUInt32> before;
    std::vector<KTUInt32> after;
    for (std::size_t i = 3; i < 7; ++i) {
        before.push_back(renderer.manager.uploads.at(i).idBefore);
        after.push_back(large.quads.at(i - 3).GetTexture(0).id);
    }
    EXPECT_EQ(before, (std::vector<KTUInt32>{1, 2, 3, 0}));
    EXPECT_EQ(after, (std::vector<KTUInt32>{1, 2, 3, 4}));
    // Fewer tiles: the list is cut, and nothing is released.
    Picture(4, 8).LoadInto(large, renderer);
    ASSERT_EQ(large.quads.size(), 2U);
    EXPECT_EQ(large.quads[1].GetTexture(0).id, 2U);
    EXPECT_EQ(Bottoms(large), (std::vector<float>{0, -4}));
    EXPECT_TRUE(renderer.manager.released.empty());
    // A tile without a texture gets a new one.
    large.quads[0].textures.clear();
    Picture(4, 8).LoadInto(large, renderer);
    EXPECT_EQ(large.quads[0].GetTexture(0).id, 5U);
}

TEST(LargeQuadLoad, LosesNoTextureWhenTheRendererThrows) {
    RecordingRenderer renderer(4);
    KTLargeTexturedQuad3D large;
    Picture(4, 12).LoadInto(large, renderer);
    renderer.manager.failAt = 3 + 2;
    EXPECT_THROW(Picture(4, 16).LoadInto(large, renderer), std::runtime_error);
    ASSERT_EQ(large.quads.size(), 3U);
    for (std::size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(large.quads[i].GetTexture(0).id, i + 1);
    }
    renderer.manager.maximum = 64;
    EXPECT_THROW(Picture(4, 16).LoadInto(large, renderer), std::runtime_error);
    EXPECT_EQ(large.quads.size(), 3U) << "one texture: as it was";
}

TEST(LargeQuadLoad, MayBeGivenItsOwnCoordinates) {
    RecordingRenderer const renderer;
    KTLargeTexturedQuad3D large;
    Picture(6, 6).LoadInto(large, renderer, {0.5, 0, 1, 1});
    Picture(6, 6).LoadInto(large, renderer, large.quads[0].textureCoords[0]);
    EXPECT_EQ(large.quads[0].GetTextureCoord(0), KTTextureCoord2D(0.5, 0, 1, 1));
}
