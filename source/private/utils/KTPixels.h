// KTPixels.h: what the graphics structures share about pictures in memory.

#pragma once

#include "KTTexture.h"

#include <cstddef>
#include <memory>

/// Pixels of a picture or a copy of it; released as the library's callers release them.
using KTPixelBuffer = std::unique_ptr<unsigned char[]>;

/// Room for width x height pixels, not cleared; null when the bytes cannot be counted or memory is short.
KTPixelBuffer KTAllocatePixels(std::size_t width, std::size_t height, std::size_t bytesPerPixel);

/// KTGraphicsUtils::GetBytesForPixelFormat.
constexpr int KTBytesPerPixel(KTPixelFormatEnum format) {
    switch (format) {
    case kKTPixelFormatRGB:
    case kKTPixelFormatBGR:
        return 3;
    case kKTPixelFormatBGRA:
        return 4;
    case kKTPixelFormatAlpha8:
        return 1;
    case kKTPixelFormatNone:
        break;
    }
    return 0;
}
