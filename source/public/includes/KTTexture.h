// KTTexture.h: textures as the library hands them to the host's renderer: pixel formats, texture coordinates, the
// settings of an upload and the record of an uploaded texture. Plain values; any thread may use its own.
//
// Texture coordinates run from 0 to 1 over the uploaded pixels without their border: u from the first pixel of a row to
// its last one, v from the first row to the last one.

#pragma once

#include "KTTypes.h"

/// The bytes of a pixel, in the order of their addresses; one byte a channel, rows without padding. Four bytes. Any other
/// number is no format.
enum KTPixelFormatEnum : int {
    kKTPixelFormatRGB = 0,    ///< 3 bytes: red, green, blue
    kKTPixelFormatBGR = 1,    ///< 3 bytes: blue, green, red
    kKTPixelFormatBGRA = 2,   ///< 4 bytes: blue, green, red, alpha
    kKTPixelFormatAlpha8 = 3, ///< 1 byte: alpha
    kKTPixelFormatNone = 4    ///< no format: what a record has that nothing was loaded into
};

/// A rectangle of a texture; four doubles, 32 bytes. Top lies on the top edge of the quad that shows it, so a top greater
/// than the bottom shows the picture upside down.
struct KTTextureCoord2D {
    double left = 0.0;
    double top = 0.0;
    double right = 1.0;
    double bottom = 1.0;

    /// All of it: (0, 0, 1, 1).
    constexpr KTTextureCoord2D() = default;

    constexpr KTTextureCoord2D(double leftValue, double topValue, double rightValue, double bottomValue)
        : left(leftValue), top(topValue), right(rightValue), bottom(bottomValue) {}

    /// Exact, without a tolerance.
    friend constexpr bool operator==(KTTextureCoord2D const &a, KTTextureCoord2D const &b) = default;
};

/// How pixels are to be uploaded; 16 bytes. The library sets the members that say so and hands on the others, whose
/// meaning is the renderer's.
struct KTLoadTextureParams {
    bool mipmaps = true;       ///< make mipmaps
    bool bordered = false;     ///< the outermost pixels on all four sides are a border
    bool rendererFlag = true;  ///< handed on
    bool noMipmaps = false;    ///< handed on; forbids mipmaps
    KTInt32 rendererValue = 0; ///< handed on
    KTInt32 rowLength = 0;     ///< pixels from the start of a source row to that of the next; 0: the upload's width
    KTPixelFormatEnum pixelFormat = kKTPixelFormatNone;

    constexpr KTLoadTextureParams() = default;

    constexpr KTLoadTextureParams(bool mipmapsValue, bool borderedValue, bool rendererFlagValue, bool noMipmapsValue,
                                  KTInt32 rendererValueValue, KTInt32 rowLengthValue, KTPixelFormatEnum format)
        : mipmaps(mipmapsValue), bordered(borderedValue), rendererFlag(rendererFlagValue), noMipmaps(noMipmapsValue),
          rendererValue(rendererValueValue), rowLength(rowLengthValue), pixelFormat(format) {}

    friend constexpr bool operator==(KTLoadTextureParams const &a, KTLoadTextureParams const &b) = default;
};

/// What the renderer knows a texture by; 48 bytes. The renderer fills it in LoadTexture and gets it back as it was.
struct KTTexture2D {
    KTUInt32 id = 0; ///< the renderer's number; 0 in a record without a texture
    KTInt32 width = 0;
    KTInt32 height = 0;
    double widthFactor = 1.0;  ///< the renderer's
    double heightFactor = 1.0; ///< the renderer's
    KTLoadTextureParams params;

    /// No texture.
    constexpr KTTexture2D() = default;

    constexpr KTTexture2D(KTUInt32 idValue, KTInt32 widthValue, KTInt32 heightValue, double widthFactorValue,
                          double heightFactorValue)
        : id(idValue), width(widthValue), height(heightValue), widthFactor(widthFactorValue),
          heightFactor(heightFactorValue) {}

    /// By the id alone, so that sets and maps hold each texture once.
    friend constexpr bool operator<(KTTexture2D const &a, KTTexture2D const &b) { return a.id < b.id; }
};
