// KTGraphicsImages.cpp: the part of KTGraphicsUtils that prepares pictures: frames, cuts, soft edges, single colours.

#include "KTEdgeMask.h"
#include "KTGraphicsReport.h"
#include "KTGraphicsUtils.h"
#include "KTPixels.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <cstring>
#include <limits>
#include <new>

namespace {

constexpr std::size_t kBgraBytes = 4;

std::size_t Size(int value) { return static_cast<std::size_t>(value); }

bool IsWhole(KTTextureCoord2D const &region) { return region == KTTextureCoord2D(); }

// Room for a BGRA picture whose size the renderer's calls can take; null otherwise.
KTPixelBuffer AllocateBgra(unsigned int width, unsigned int height) {
    constexpr auto kMost = static_cast<unsigned int>(std::numeric_limits<int>::max());
    return width <= kMost && height <= kMost ? KTAllocatePixels(width, height, kBgraBytes) : nullptr;
}

unsigned char ByteOf(float component) {
    float const scaled = component * 255.0F + 0.5F;
    if (!(scaled > 0.0F)) {
        return 0; // NaN, too
    }
    return static_cast<unsigned char>(std::min(scaled, 255.0F));
}

} // namespace

KTPixelBuffer KTAllocatePixels(std::size_t width, std::size_t height, std::size_t bytesPerPixel) {
    std::size_t left = static_cast<std::size_t>(std::numeric_limits<std::ptrdiff_t>::max());
    for (std::size_t const side : {width, height, bytesPerPixel}) {
        left = side == 0 ? left : left / side;
    }
    if (left == 0) {
        return nullptr;
    }
    return KTPixelBuffer(new (std::nothrow) unsigned char[width * height * bytesPerPixel]);
}

// ---- numbers ----

unsigned int KTGraphicsUtils::CalculateFrameSize(int const &width, int const &height, int const &bytesPerPixel) {
    return static_cast<unsigned int>(width) * static_cast<unsigned int>(height) *
           static_cast<unsigned int>(bytesPerPixel);
}

unsigned short KTGraphicsUtils::GetNearestUpperPowerOfTwo(unsigned short const &value) {
    return value == 0 ? std::uint16_t{0} : static_cast<unsigned short>(std::bit_ceil(unsigned{value}) & 0xFFFFU);
}

unsigned short KTGraphicsUtils::GetNearestLowerPowerOfTwo(unsigned short const &value) {
    unsigned short const upper = GetNearestUpperPowerOfTwo(value);
    return upper == value ? upper : static_cast<unsigned short>(upper / 2);
}

int KTGraphicsUtils::GetBytesForPixelFormat(KTPixelFormatEnum const &format) { return KTBytesPerPixel(format); }

// ---- pictures ----

unsigned char *KTGraphicsUtils::GetBorderedImage(unsigned char const *image, int const &width, int const &height,
                                                 int const &bytesPerPixel) {
    if (image == nullptr || width < 1 || height < 1 || bytesPerPixel < 1) {
        KTFailGraphics(nullptr, 748);
    }
    std::size_t const pixelBytes = Size(bytesPerPixel);
    std::size_t const rowBytes = Size(width) * pixelBytes;
    std::size_t const framedBytes = rowBytes + 2 * pixelBytes;
    KTPixelBuffer framed = KTAllocatePixels(Size(width) + 2, Size(height) + 2, pixelBytes);
    if (framed == nullptr) {
        return nullptr;
    }
    unsigned char *to = framed.get();
    std::memcpy(to + pixelBytes, image, rowBytes);
    for (std::size_t y = 0; y < Size(height); ++y, image += rowBytes) {
        to += framedBytes;
        to[0] = image[0];
        std::memcpy(to + pixelBytes, image, rowBytes);
        to[pixelBytes + rowBytes] = image[rowBytes - pixelBytes];
    }
    std::memcpy(to + framedBytes + pixelBytes, image - rowBytes, rowBytes);
    return framed.release();
}

unsigned char *KTGraphicsUtils::GetSubImage(unsigned char const *image, int const &width, int const &height,
                                            int const &x, int const &y, int const &subWidth, int const &subHeight,
                                            KTPixelFormatEnum const &format) {
    std::size_t const pixelBytes = Size(KTBytesPerPixel(format));
    if (image == nullptr || x < 0 || y < 0 || width < 1 || height < 1 || subWidth < 1 || subHeight < 1 ||
        pixelBytes == 0) {
        KTFailGraphics(nullptr, 790);
    }
    std::size_t const rowPixels = Size(width);
    std::size_t const endPixel = (Size(y) + Size(subHeight) - 1) * rowPixels + Size(x) + Size(subWidth);
    if (endPixel > rowPixels * Size(height)) {
        KTFailGraphics(nullptr, 790);
    }
    KTPixelBuffer part = KTAllocatePixels(Size(subWidth), Size(subHeight), pixelBytes);
    if (part == nullptr) {
        return nullptr;
    }
    std::size_t const partBytes = Size(subWidth) * pixelBytes;
    unsigned char const *from = image + (Size(y) * rowPixels + Size(x)) * pixelBytes;
    unsigned char *to = part.get();
    for (int row = 0; row < subHeight; ++row, from += rowPixels * pixelBytes, to += partBytes) {
        std::memcpy(to, from, partBytes);
    }
    return part.release();
}

// ---- masks and colours ----

void KTGraphicsUtils::ApplyEdgeMaskToImage(unsigned int const &width, unsigned int const &height,
                                           KTPixelFormatEnum const &format, KTTextureCoord2D const &region,
                                           unsigned char *image) {
    if (image == nullptr) {
        KTFailGraphics("KTGraphicsUtils::ApplyEdgeMaskToImage, !ioEdgeMaskedImage", 853);
    }
    if (IsWhole(region) || width == 0 || height == 0) {
        return;
    }
    switch (format) {
    case kKTPixelFormatRGB:
    case kKTPixelFormatBGR:
        KTLogGraphics("KTGraphicsUtils::ApplyEdgeMaskToImage, Image passed is of RGB/BGR pixel format. No edge mask "
                      "will be applied.");
        return;
    case kKTPixelFormatBGRA:
    case kKTPixelFormatAlpha8:
        break;
    case kKTPixelFormatNone:
    default:
        KTFailGraphics("KTGraphicsUtils::ApplyEdgeMaskToImage, Image passed is of unknown pixel format.", 873);
    }
    KTEdgeRamps const horizontal(width, region.left, region.right);
    KTEdgeRamps const vertical(height, region.top, region.bottom);
    if (!horizontal.IsFinite() || !vertical.IsFinite()) {
        KTFailGraphics("KTGraphicsUtils::ApplyEdgeMaskToImage, Invalid texture co-ordinates passed.", 881);
    }
    KTApplyEdgeRamps(image, width, height, Size(KTBytesPerPixel(format)), horizontal, vertical);
}

void KTGraphicsUtils::GetEdgeMaskTexture(IKTRenderer const &renderer, unsigned int const &width,
                                         unsigned int const &height, KTTextureCoord2D const &region,
                                         KTTexture2D &texture) {
    KTTextureManager &manager = renderer.GetTextureManager();
    unsigned int const maximum = manager.GetMaxTextureSize();
    if (maximum < width || maximum < height) {
        KTLogGraphics("KTGraphicsUtils::GetEdgeMaskTexture, The max supported texture size is too small to accomodate "
                      "the mask texture.");
        return;
    }
    if (!renderer.IsFeatureSupported(kKTFeatureNPOT) && !(std::has_single_bit(width) && std::has_single_bit(height))) {
        KTLogGraphics("KTGraphicsUtils::GetEdgeMaskTexture, NPOT support not available. Will not tile the mask "
                      "texture.");
        return;
    }
    KTPixelBuffer const mask = AllocateBgra(width, height);
    if (mask == nullptr) {
        KTFailGraphics("KTGraphicsUtils::GetEdgeMaskTexture, !maskBuffer", 944);
    }
    std::memset(mask.get(), 255, std::size_t{width} * height * kBgraBytes);
    ApplyEdgeMaskToImage(width, height, kKTPixelFormatBGRA, region, mask.get());
    manager.LoadTexture(mask.get(), static_cast<int>(width), static_cast<int>(height), texture,
                        KTLoadTextureParams(true, false, true, false, 1, 0, kKTPixelFormatBGRA));
}

void KTGraphicsUtils::GetConstColoredQuad(IKTRenderer const &renderer, unsigned int const &width,
                                          unsigned int const &height, KTColor4f const &color,
                                          KTTextureCoord2D const &region, KTLargeTexturedQuad3D &quad) {
    KTPixelBuffer const pixels = AllocateBgra(width, height);
    if (pixels == nullptr) {
        KTFailGraphics("KTGraphicsUtils::GetConstColoredQuad, !textureBuffer", 969);
    }
    std::array<unsigned char, kBgraBytes> const pixel = {ByteOf(color.blue), ByteOf(color.green), ByteOf(color.red),
                                                         ByteOf(color.alpha)};
    for (std::size_t i = 0; i < std::size_t{width} * height; ++i) {
        std::memcpy(pixels.get() + i * kBgraBytes, pixel.data(), kBgraBytes);
    }
    ApplyEdgeMaskToImage(width, height, kKTPixelFormatBGRA, region, pixels.get());
    int const columns = static_cast<int>(width);
    int const rows = static_cast<int>(height);
    KTLoadTextureParams params(true, false, true, false, 0, 0, kKTPixelFormatBGRA);
    quad.Load(pixels.get(), columns, rows, columns, rows, renderer, KTTextureCoord2D(), params);
}
