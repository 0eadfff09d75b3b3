// ImageUtilsTest.cpp: frames, cuts, soft edges and single colours, against plain loops.

#include "InterpolationMode.h"
#include "LogLines.h"
#include "RecordingRenderer.h"

#include "KTGraphicsUtils.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstring>
#include <limits>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace {

using Bytes = std::vector<unsigned char>;
using Lines = std::vector<std::string>;
using Buffer = std::unique_ptr<unsigned char[]>;

constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr double kInfinity = std::numeric_limits<double>::infinity();

Bytes RandomBytes(std::size_t count, unsigned int seed = 1) {
    Bytes bytes(count);
    std::minstd_rand random(seed);
    std::generate(bytes.begin(), bytes.end(), [&] { return static_cast<unsigned char>(random() >> 8); });
    return bytes;
}

// ---- soft edges, pixel by pixel ----

double PlainFactor(double position, double length, double first, double last) {
    double const place = position - length / 2;
    double const firstEdge = first * length - length / 2;
    double const lastEdge = last * length - length / 2;
    double factor = 1;
    if (place <= firstEdge && first * length != 0) {
        factor = KTInterpolator::Interpolate(1.0, 0.0, std::min((firstEdge - place) / (first * length), 1.0));
    }
    if (place >= lastEdge && (1 - last) * length != 0) {
        factor = KTInterpolator::Interpolate(1.0, 0.0, std::min((place - lastEdge) / ((1 - last) * length), 1.0));
    }
    return factor;
}

void PlainMask(unsigned int width, unsigned int height, std::size_t pixelBytes, KTTextureCoord2D const &region,
               Bytes &image) {
    for (unsigned int x = 0; x < width; ++x) {
        for (unsigned int y = 0; y < height; ++y) {
            double const horizontal = PlainFactor(x, width, region.left, region.right);
            double const vertical = PlainFactor(y, height, region.top, region.bottom);
            unsigned char &alpha = image[(std::size_t{width} * y + x) * pixelBytes + pixelBytes - 1];
            alpha = static_cast<unsigned char>(alpha * horizontal * vertical);
        }
    }
}

void ExpectMasked(unsigned int width, unsigned int height, KTTextureCoord2D const &region) {
    for (auto const mode : {kKTInterpolationLinear, kKTInterpolationEaseInEaseOut}) {
        ScopedInterpolationMode const scope(mode);
        for (auto const &[format, pixelBytes] :
             {std::pair{kKTPixelFormatBGRA, std::size_t{4}}, {kKTPixelFormatAlpha8, std::size_t{1}}}) {
            Bytes image = RandomBytes(std::size_t{width} * height * pixelBytes);
            Bytes expected = image;
            PlainMask(width, height, pixelBytes, region, expected);
            KTGraphicsUtils::ApplyEdgeMaskToImage(width, height, format, region, image.data());
            ASSERT_EQ(image, expected) << width << " x " << height << ", format " << format << ", mode " << mode
                                       << ", region " << region.left << " " << region.top << " " << region.right << " "
                                       << region.bottom;
        }
    }
}

} // namespace

// ---- numbers ----

TEST(GraphicsUtils, FrameSizeIsAnUnsignedProduct) {
    EXPECT_EQ(KTGraphicsUtils::CalculateFrameSize(640, 480, 4), 1'228'800U);
    EXPECT_EQ(KTGraphicsUtils::CalculateFrameSize(32'768, 32'768, 3), 3'221'225'472U) << "beyond signed integers";
    EXPECT_EQ(KTGraphicsUtils::CalculateFrameSize(65'536, 65'536, 4), 0U) << "modulo 2^32";
    EXPECT_EQ(KTGraphicsUtils::CalculateFrameSize(-1, 1, 1), 0xFFFFFFFFU);
    EXPECT_EQ(KTGraphicsUtils::CalculateFrameSize(INT_MAX, INT_MAX, 4), 4U);
    EXPECT_EQ(KTGraphicsUtils::CalculateFrameSize(0, 5, 4), 0U);
}

TEST(GraphicsUtils, PowersOfTwoAreFoundIn16Bits) {
    for (unsigned int value = 0; value <= 0xFFFF; ++value) {
        unsigned int upper = 1;
        while (upper < value) {
            upper *= 2;
        }
        unsigned int const expected = value == 0 ? 0 : upper & 0xFFFF;
        auto const given = static_cast<unsigned short>(value);
        ASSERT_EQ(KTGraphicsUtils::GetNearestUpperPowerOfTwo(given), expected) << value;
        ASSERT_EQ(KTGraphicsUtils::GetNearestLowerPowerOfTwo(given), expected == value ? value : expected / 2) << value;
    }
    EXPECT_EQ(KTGraphicsUtils::GetNearestUpperPowerOfTwo(0), 0);
    EXPECT_EQ(KTGraphicsUtils::GetNearestUpperPowerOfTwo(600), 1024);
    EXPECT_EQ(KTGraphicsUtils::GetNearestUpperPowerOfTwo(32'768), 32'768);
    EXPECT_EQ(KTGraphicsUtils::GetNearestUpperPowerOfTwo(32'769), 0);
    EXPECT_EQ(KTGraphicsUtils::GetNearestLowerPowerOfTwo(600), 512);
    EXPECT_EQ(KTGraphicsUtils::GetNearestLowerPowerOfTwo(512), 512);
    EXPECT_EQ(KTGraphicsUtils::GetNearestLowerPowerOfTwo(0), 0);
    EXPECT_EQ(KTGraphicsUtils::GetNearestLowerPowerOfTwo(40'000), 0);
}

TEST(GraphicsUtils, FormatsHaveTheirBytes) {
    for (auto const &[format, bytes] :
         {std::pair{0, 3}, {1, 3}, {2, 4}, {3, 1}, {4, 0}, {5, 0}, {-1, 0}, {INT_MIN, 0}, {INT_MAX, 0}}) {
        EXPECT_EQ(KTGraphicsUtils::GetBytesForPixelFormat(static_cast<KTPixelFormatEnum>(format)), bytes) << format;
    }
    EXPECT_EQ(kKTPixelFormatRGB, 0);
    EXPECT_EQ(kKTPixelFormatBGR, 1);
    EXPECT_EQ(kKTPixelFormatBGRA, 2);
    EXPECT_EQ(kKTPixelFormatAlpha8, 3);
}

// ---- frames ----

TEST(GraphicsUtils, BorderedImageHasItsFrame) {
    for (int pixelBytes : {1, 3, 4, 7}) {
        for (auto const &[width, height] : {std::pair{1, 1}, {1, 5}, {5, 1}, {2, 2}, {33, 17}}) {
            auto const bytes = static_cast<std::size_t>(pixelBytes);
            auto const columns = static_cast<std::size_t>(width);
            auto const rows = static_cast<std::size_t>(height);
            Bytes const image = RandomBytes(columns * rows * bytes);
            Buffer const framed(KTGraphicsUtils::GetBorderedImage(image.data(), width, height, pixelBytes));
            std::size_t const stride = (columns + 2) * bytes;
            auto const isRow = [&](std::size_t framedRow, std::size_t row) {
                return std::memcmp(framed.get() + framedRow * stride + bytes, image.data() + row * columns * bytes,
                                   columns * bytes) == 0;
            };
            EXPECT_TRUE(isRow(0, 0));
            EXPECT_TRUE(isRow(rows + 1, rows - 1));
            for (std::size_t y = 0; y < rows; ++y) {
                EXPECT_TRUE(isRow(y + 1, y));
                EXPECT_EQ(framed[(y + 1) * stride], image[y * columns * bytes]);
                EXPECT_EQ(framed[(y + 1) * stride + (columns + 1) * bytes],
                          image[y * columns * bytes + (columns - 1) * bytes]);
            }
        }
    }
}

TEST(GraphicsUtils, BorderedImageRefusesWhatIsNoPicture) {
    Bytes const image(4, 1);
    LogLines log;
    ExpectInternalError(748, [] { KTGraphicsUtils::GetBorderedImage(nullptr, 1, 1, 1); });
    for (auto const &[width, height, pixelBytes] :
         {std::tuple{0, 1, 1}, {1, 0, 1}, {-1, 1, 1}, {1, -1, 1}, {INT_MIN, INT_MIN, 1}, {1, 1, 0}, {1, 1, -4}}) {
        ExpectInternalError(748, [&] { KTGraphicsUtils::GetBorderedImage(image.data(), width, height, pixelBytes); });
    }
    EXPECT_EQ(log.Take(), Lines{}) << "thrown without a text";
}

TEST(GraphicsUtils, BorderedImageIsNullWithoutMemory) {
    unsigned char const byte = 0;
    EXPECT_EQ(KTGraphicsUtils::GetBorderedImage(&byte, INT_MAX, INT_MAX, 4), nullptr);
    EXPECT_EQ(KTGraphicsUtils::GetBorderedImage(&byte, INT_MAX, INT_MAX, INT_MAX), nullptr);
#ifdef _WIN32
    EXPECT_EQ(KTGraphicsUtils::GetBorderedImage(&byte, INT_MAX, INT_MAX, 1), nullptr);
#endif
}

// ---- cuts ----

TEST(GraphicsUtils, SubImageIsCutOut) {
    for (auto const &[format, bytes] : {std::pair{kKTPixelFormatRGB, std::size_t{3}},
                                        {kKTPixelFormatBGR, 3U},
                                        {kKTPixelFormatBGRA, 4U},
                                        {kKTPixelFormatAlpha8, 1U}}) {
        constexpr std::size_t kWidth = 13;
        Bytes const image = RandomBytes(kWidth * 9 * bytes);
        for (auto const &[x, y, width, height] :
             {std::tuple{0, 0, 13, 9}, {12, 8, 1, 1}, {3, 2, 5, 4}, {0, 8, 13, 1}, {12, 0, 1, 9}}) {
            Buffer const part(KTGraphicsUtils::GetSubImage(image.data(), 13, 9, x, y, width, height, format));
            auto const row = static_cast<std::size_t>(width) * bytes;
            for (std::size_t i = 0; i < static_cast<std::size_t>(height); ++i) {
                std::size_t const start =
                    ((static_cast<std::size_t>(y) + i) * kWidth + static_cast<std::size_t>(x)) * bytes;
                EXPECT_EQ(std::memcmp(part.get() + i * row, image.data() + start, row), 0) << x << " " << y << " " << i;
            }
        }
    }
}

TEST(GraphicsUtils, SubImageGoesOnInTheNextRowBeyondTheRightEdge) {
    Bytes const image = {0, 1, 2, 3, 4, 5, 6, 7, 8};
    Buffer const part(KTGraphicsUtils::GetSubImage(image.data(), 3, 3, 2, 0, 3, 2, kKTPixelFormatAlpha8));
    EXPECT_EQ(Bytes(part.get(), part.get() + 6), (Bytes{2, 3, 4, 5, 6, 7}));
}

TEST(GraphicsUtils, SubImageRefusesWhatIsNoPartOfAPicture) {
    Bytes const image(std::size_t{9} * 4, 1);
    auto const refused = [&](unsigned char const *from, int width, int height, int x, int y, int subWidth,
                             int subHeight, KTPixelFormatEnum format = kKTPixelFormatBGRA) {
        ExpectInternalError(
            790, [&] { KTGraphicsUtils::GetSubImage(from, width, height, x, y, subWidth, subHeight, format); });
    };
    LogLines log;
    refused(nullptr, 3, 3, 0, 0, 1, 1);
    refused(image.data(), 0, 3, 0, 0, 1, 1);
    refused(image.data(), 3, 0, 0, 0, 1, 1);
    refused(image.data(), 3, 3, -1, 0, 1, 1);
    refused(image.data(), 3, 3, 0, -1, 1, 1);
    refused(image.data(), 3, 3, 0, 0, 0, 1);
    refused(image.data(), 3, 3, 0, 0, 1, 0);
    refused(image.data(), 3, 3, 0, 0, 1, 1, kKTPixelFormatNone);
    refused(image.data(), 3, 3, 0, 0, 1, 1, static_cast<KTPixelFormatEnum>(-1));
    // Beyond the last pixel.
    refused(image.data(), 3, 3, 1, 2, 3, 1);
    refused(image.data(), 3, 3, 0, 1, 3, 3);
    refused(image.data(), 3, 3, 0, 3, 1, 1);
    refused(image.data(), 3, 3, INT_MAX, INT_MAX, INT_MAX, INT_MAX);
    refused(image.data(), INT_MAX, 1, INT_MAX, INT_MAX, INT_MAX, INT_MAX);
    EXPECT_EQ(log.Take(), Lines{}) << "thrown without a text";
}

// ---- soft edges ----

TEST(EdgeMask, FadesAsTheFormulaPixelByPixel) {
    for (KTTextureCoord2D const &region : {KTTextureCoord2D{0.25, 0.25, 0.75, 0.75},
                                           {0.1, 0.2, 0.7, 0.9},
                                           {0, 0, 1, 0.5},
                                           {0.5, 0, 1, 1},
                                           {0.5, 0.5, 0.5, 0.5},
                                           {1, 1, 0, 0},
                                           {0, 0, 0, 0},
                                           {1, 1, 1, 1},
                                           {-0.5, -1, 1.5, 2},
                                           {0.75, 0.6, 0.25, 0.4},
                                           {1e-9, 0, 1, 1},
                                           {-1e-300, 0, 1, 1},
                                           {1e300, 0, 1, 1},
                                           {1.0 / 3, 1.0 / 7, 2.0 / 3, 6.0 / 7}}) {
        for (auto const &[width, height] : {std::pair{1U, 1U}, {2U, 3U}, {7U, 5U}, {64U, 33U}, {101U, 20U}}) {
            ExpectMasked(width, height, region);
        }
    }
}

TEST(EdgeMask, FadesAcrossTheBlocksItWorksIn) {
    ExpectMasked(4099, 3, {0.3, 0.1, 0.8, 0.9});
    ExpectMasked(3, 4099, {0.1, 0.3, 0.9, 0.8});
    ExpectMasked(4099, 2, {0.5, 0, 0.5, 1});
    ExpectMasked(2050, 2050, {0.25, 0.25, 0.75, 0.75});
}

TEST(EdgeMask, NeverLeavesTheRampByRounding) {
    // Straight interpolation throws beyond 1; the ramp's far end is exactly there, give or take a bit.
    for (unsigned int width = 1; width < 60; ++width) {
        for (int i = 1; i < 60; ++i) {
            ScopedInterpolationMode const scope(kKTInterpolationLinear);
            Bytes image(width, 200);
            KTGraphicsUtils::ApplyEdgeMaskToImage(width, 1, kKTPixelFormatAlpha8, {i / 60.0, 0, 1, 1}, image.data());
            ASSERT_EQ(image[0], 0);
        }
    }
}

TEST(EdgeMask, FadesByHandComputedValues) {
    ScopedInterpolationMode const scope(kKTInterpolationLinear);
    // Left ramp of two pixels, right edge at 3 with a ramp of one.
    Bytes row = {200, 200, 200, 200};
    KTGraphicsUtils::ApplyEdgeMaskToImage(4, 1, kKTPixelFormatAlpha8, {0.5, 0, 0.75, 1}, row.data());
    EXPECT_EQ(row, (Bytes{0, 100, 200, 200}));
    Bytes column = {200, 200, 200, 200};
    KTGraphicsUtils::ApplyEdgeMaskToImage(1, 4, kKTPixelFormatAlpha8, {0, 0, 1, 0.25}, column.data());
    EXPECT_EQ(column, (Bytes{200, 200, 133, 66})) << "truncated";
    Bytes pixel = {1, 2, 3, 255, 4, 5, 6, 255};
    KTGraphicsUtils::ApplyEdgeMaskToImage(2, 1, kKTPixelFormatBGRA, {1, 0, 1, 1}, pixel.data());
    EXPECT_EQ(pixel, (Bytes{1, 2, 3, 0, 4, 5, 6, 127})) << "colors stay";
}

TEST(EdgeMask, FollowsTheInterpolationMode) {
    Bytes eased(100, 255);
    Bytes straight(100, 255);
    KTTextureCoord2D const region(1, 0, 1, 1);
    KTGraphicsUtils::ApplyEdgeMaskToImage(100, 1, kKTPixelFormatAlpha8, region, eased.data());
    ScopedInterpolationMode const scope(kKTInterpolationLinear);
    KTGraphicsUtils::ApplyEdgeMaskToImage(100, 1, kKTPixelFormatAlpha8, region, straight.data());
    EXPECT_EQ(straight[30], 76);
    EXPECT_EQ(eased[30], 54);
    ScopedInterpolationMode const unknown(kUnknownMode);
    Bytes const before = straight;
    ExpectInternalError(
        47, [&] { KTGraphicsUtils::ApplyEdgeMaskToImage(100, 1, kKTPixelFormatAlpha8, region, straight.data()); });
    EXPECT_EQ(straight, before);
}

TEST(EdgeMask, LeavesWholeRegionsAndEmptyImagesAlone) {
    Bytes image = RandomBytes(64);
    Bytes const before = image;
    LogLines log;
    // Not even the format is looked at.
    KTGraphicsUtils::ApplyEdgeMaskToImage(4, 4, kKTPixelFormatBGRA, {0, 0, 1, 1}, image.data());
    KTGraphicsUtils::ApplyEdgeMaskToImage(4, 4, kKTPixelFormatNone, {0, 0, 1, 1}, image.data());
    KTGraphicsUtils::ApplyEdgeMaskToImage(0, 4, kKTPixelFormatRGB, {0.5, 0, 1, 1}, image.data());
    KTGraphicsUtils::ApplyEdgeMaskToImage(4, 0, kKTPixelFormatNone, {0.5, 0, 1, 1}, image.data());
    EXPECT_EQ(image, before);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(EdgeMask, ReportsImagesThatItCannotFade) {
    Bytes image = RandomBytes(64);
    Bytes const before = image;
    KTTextureCoord2D const region(0.5, 0, 1, 1);
    auto const fade = [&](KTPixelFormatEnum format, KTTextureCoord2D const &where, unsigned char *to) {
        return [=] { KTGraphicsUtils::ApplyEdgeMaskToImage(4, 4, format, where, to); };
    };
    LogLines log;
    ExpectInternalError(853, fade(kKTPixelFormatNone, {0, 0, 1, 1}, nullptr));
    EXPECT_EQ(log.Take(), Lines{"KTGraphicsUtils::ApplyEdgeMaskToImage, !ioEdgeMaskedImage"});
    std::string const noAlpha =
        "KTGraphicsUtils::ApplyEdgeMaskToImage, Image passed is of RGB/BGR pixel format. No edge "
        "mask will be applied.";
    fade(kKTPixelFormatRGB, region, image.data())();
    fade(kKTPixelFormatBGR, region, image.data())();
    EXPECT_EQ(log.Take(), (Lines{noAlpha, noAlpha}));
    for (int const format : {4, -1, 99}) {
        ExpectInternalError(873, fade(static_cast<KTPixelFormatEnum>(format), region, image.data()));
        EXPECT_EQ(log.Take(), Lines{"KTGraphicsUtils::ApplyEdgeMaskToImage, Image passed is of unknown pixel format."});
    }
    for (double const bad : {kNan, kInfinity, -kInfinity, 1e308}) {
        for (KTTextureCoord2D const &where :
             {KTTextureCoord2D{bad, 0, 1, 1}, {0, bad, 1, 1}, {0, 0, bad, 1}, {0, 0, 1, bad}}) {
            ExpectInternalError(881, fade(kKTPixelFormatBGRA, where, image.data()));
            EXPECT_EQ(log.Take(), Lines{"KTGraphicsUtils::ApplyEdgeMaskToImage, Invalid texture co-ordinates passed."});
        }
    }
    EXPECT_EQ(image, before);
    gKTLogger->LogEnableAtRuntime(false);
    fade(kKTPixelFormatRGB, region, image.data())();
    ExpectInternalError(853, fade(kKTPixelFormatBGRA, region, nullptr));
    gKTLogger->LogEnableAtRuntime(true);
    EXPECT_EQ(log.Take(), Lines{});
}

// ---- mask textures ----

TEST(EdgeMaskTexture, IsAFadedWhiteTexture) {
    RecordingRenderer const renderer(64);
    renderer.manager.bytesPerPixel = 4;
    KTTextureCoord2D const region(0.25, 0.25, 0.75, 0.75);
    KTTexture2D texture(9, 1, 1, 1, 1);
    KTGraphicsUtils::GetEdgeMaskTexture(renderer, 20, 64, region, texture);
    Bytes expected(std::size_t{20} * 64 * 4, 255);
    PlainMask(20, 64, 4, region, expected);
    ASSERT_EQ(renderer.manager.uploads.size(), 1U);
    Upload const &upload = renderer.manager.uploads[0];
    EXPECT_EQ(upload.bytes, expected);
    EXPECT_EQ(upload.width, 20);
    EXPECT_EQ(upload.height, 64);
    EXPECT_EQ(upload.idBefore, 9U);
    EXPECT_EQ(upload.params, KTLoadTextureParams(true, false, true, false, 1, 0, kKTPixelFormatBGRA));
    EXPECT_EQ(texture.id, 9U);
    EXPECT_EQ(texture.width, 20);
}

TEST(EdgeMaskTexture, IsLeftOutWhereTheRendererCannotHoldIt) {
    std::string const tooSmall = "KTGraphicsUtils::GetEdgeMaskTexture, The max supported texture size is too small to "
                                 "accomodate the mask texture.";
    std::string const noPower =
        "KTGraphicsUtils::GetEdgeMaskTexture, NPOT support not available. Will not tile the mask "
        "texture.";
    RecordingRenderer const renderer(64, kNoFeatures);
    KTTexture2D texture;
    LogLines log;
    for (auto const &[width, height] : {std::pair{65U, 1U}, {1U, 65U}, {128U, 128U}}) {
        KTGraphicsUtils::GetEdgeMaskTexture(renderer, width, height, {0.5, 0, 1, 1}, texture);
        EXPECT_EQ(log.Take(), Lines{tooSmall});
    }
    for (auto const &[width, height] : {std::pair{63U, 64U}, {64U, 63U}, {0U, 64U}, {3U, 3U}}) {
        KTGraphicsUtils::GetEdgeMaskTexture(renderer, width, height, {0.5, 0, 1, 1}, texture);
        EXPECT_EQ(log.Take(), Lines{noPower});
    }
    EXPECT_TRUE(renderer.manager.uploads.empty());
    EXPECT_EQ(texture.id, 0U);
    KTGraphicsUtils::GetEdgeMaskTexture(renderer, 64, 1, {0.5, 0, 1, 1}, texture);
    EXPECT_EQ(log.Take(), Lines{});
    EXPECT_EQ(renderer.manager.uploads.size(), 1U);
}

TEST(EdgeMaskTexture, ReportsThatThereIsNoMemory) {
    RecordingRenderer const renderer(0xFFFFFFFFU);
    KTTexture2D texture;
    LogLines log;
    for (auto const &[width, height] : {std::pair{0x7FFFFFFFU, 0x7FFFFFFFU}, {0xFFFFFFFFU, 1U}, {1U, 0x80000000U}}) {
        ExpectInternalError(
            944, [&] { KTGraphicsUtils::GetEdgeMaskTexture(renderer, width, height, {0.5, 0, 1, 1}, texture); });
        EXPECT_EQ(log.Take(), Lines{"KTGraphicsUtils::GetEdgeMaskTexture, !maskBuffer"});
    }
    EXPECT_TRUE(renderer.manager.uploads.empty());
}

// ---- quads of one colour ----

TEST(ConstColoredQuad, IsAPictureOfItsColorFaded) {
    RecordingRenderer const renderer(64);
    renderer.manager.bytesPerPixel = 4;
    KTTextureCoord2D const region(0.25, 0.25, 0.75, 0.75);
    KTLargeTexturedQuad3D large;
    KTGraphicsUtils::GetConstColoredQuad(renderer, 21, 10, {0.1F, 0.5F, 1, 0.75F}, region, large);
    Bytes expected;
    for (int i = 0; i < 210; ++i) {
        for (int const byte : {255, 128, 26, 191}) { // 255.5, 128.0, 26.0 and 191.75 truncated
            expected.push_back(static_cast<unsigned char>(byte));
        }
    }
    PlainMask(21, 10, 4, region, expected);
    ASSERT_EQ(renderer.manager.uploads.size(), 1U);
    Upload const &upload = renderer.manager.uploads[0];
    EXPECT_EQ(upload.bytes, expected);
    EXPECT_EQ(upload.params, KTLoadTextureParams(true, false, true, false, 0, 0, kKTPixelFormatBGRA));
    ASSERT_EQ(large.quads.size(), 1U);
    EXPECT_EQ(large.quads[0].quad, KTQuad3D({-10.5F, -5, 0}, {10.5F, -5, 0}, {10.5F, 5, 0}, {-10.5F, 5, 0}));
    EXPECT_EQ(large.quads[0].GetTextureCoord(0), KTTextureCoord2D());
}

TEST(ConstColoredQuad, ClampsItsColor) {
    RecordingRenderer const renderer;
    renderer.manager.bytesPerPixel = 4;
    KTLargeTexturedQuad3D large;
    float const nan = std::numeric_limits<float>::quiet_NaN();
    KTGraphicsUtils::GetConstColoredQuad(renderer, 1, 1, {-1, 2, 1e30F, nan}, {}, large);
    EXPECT_EQ(renderer.manager.uploads.at(0).bytes, (Bytes{255, 255, 0, 0}));
}

TEST(ConstColoredQuad, IsTiledWhereItHasToBe) {
    RecordingRenderer const renderer(16, kOnlyBorders);
    KTLargeTexturedQuad3D large;
    KTGraphicsUtils::GetConstColoredQuad(renderer, 24, 16, {1, 1, 1, 1}, {}, large);
    ASSERT_EQ(large.quads.size(), 2U);
    EXPECT_EQ(renderer.manager.uploads[0].params,
              KTLoadTextureParams(false, true, true, false, 0, 26, kKTPixelFormatBGRA));
}

TEST(ConstColoredQuad, ReportsThatThereIsNoMemory) {
    RecordingRenderer const renderer;
    KTLargeTexturedQuad3D large;
    LogLines log;
    for (auto const &[width, height] : {std::pair{0x7FFFFFFFU, 0x7FFFFFFFU}, {0xFFFFFFFFU, 1U}, {1U, 0x80000000U}}) {
        ExpectInternalError(
            969, [&] { KTGraphicsUtils::GetConstColoredQuad(renderer, width, height, {}, {0.5, 0, 1, 1}, large); });
        EXPECT_EQ(log.Take(), Lines{"KTGraphicsUtils::GetConstColoredQuad, !textureBuffer"});
    }
    ExpectInternalError(475, [&] { KTGraphicsUtils::GetConstColoredQuad(renderer, 0, 4, {}, {}, large); });
}
