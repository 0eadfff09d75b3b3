// KTGraphicsUtils.h: the static toolbox of the renderer's value types and of the pictures that become textures.
// Conventions are those of KTGraphicsStructs.h and KTTexture.h.
//
// Pictures are rows of pixels without padding, one after the other. Buffers that a function returns were allocated by the
// library and are released by the caller with delete[]; null means that memory was short. Errors are thrown as
// KTLCException, "kKTErrorInternal", source/private/utils/KTGraphicsStructs, with the lines given; texts go to the log
// before, unless logging is off. Any thread may call; those that take a renderer, one that the renderer allows. Those that
// fade read the process-wide interpolation mode (KTInterpolator.h), which no other thread may change meanwhile.

#pragma once

#include "IKTRenderer.h"
#include "KTGraphicsStructs.h"
#include "KTTexture.h"
#include "KTTexturedQuad.h"

#include "KTBeginExports.h"

class KT_PUBLIC_API KTGraphicsUtils {
  public:
    KTGraphicsUtils() = delete;

    // ---- numbers ----

    /// The product of width, height and bytes for each pixel, modulo 2^32. Buffers of more than 4 GiB need a wider one.
    static unsigned int CalculateFrameSize(int const &width, int const &height, int const &bytesPerPixel);

    /// The smallest power of two that is not less than the value. 16 bits: 0 for 0 and for values above 32,768.
    static unsigned short GetNearestUpperPowerOfTwo(unsigned short const &value);

    /// GetNearestUpperPowerOfTwo, halved unless it equals the value: the greatest power of two that is not greater. 0 for
    /// 0 and for values above 32,768.
    static unsigned short GetNearestLowerPowerOfTwo(unsigned short const &value);

    /// 3, 3, 4 and 1 for the four formats; 0 for any other number.
    static int GetBytesForPixelFormat(KTPixelFormatEnum const &format);

    // ---- pictures ----

    /// A copy of the picture in a frame of one pixel, (width + 2) x (height + 2) pixels:
    ///
    ///      ? ? ?   0 1 2 3 4 5   ? ? ?      first row, without its corners
    ///      0 ? ?   0 1 2 3 4 5   3 ? ?      each row; of the frame's pixels beside it just the first byte is set, to the
    ///      6 ? ?   6 7 8 9 A B   9 ? ?      first byte of the pixel next to it
    ///      ? ? ?   6 7 8 9 A B   ? ? ?      last row
    ///
    /// (here two rows of two pixels of three bytes). Bytes marked ? are not set: they are what the heap holds.
    ///
    /// Throws (line 748): the image is null, or width, height or bytesPerPixel is less than 1.
    static unsigned char *GetBorderedImage(unsigned char const *image, int const &width, int const &height,
                                           int const &bytesPerPixel);

    /// A copy of subWidth x subHeight pixels from column x and row y on. The picture is taken as one run of pixels: what
    /// reaches beyond the right edge goes on in the next row.
    ///
    /// Throws (line 790): the image is null, x or y is negative, a size is less than 1, the format is none, or the last
    /// row would be read beyond the picture's last pixel.
    static unsigned char *GetSubImage(unsigned char const *image, int const &width, int const &height, int const &x,
                                      int const &y, int const &subWidth, int const &subHeight,
                                      KTPixelFormatEnum const &format);

    // ---- masks and colours ----

    /// Fades the alpha channel from the edges of the region to those of the image.
    ///
    /// With a ramp from the left edge of the image to that of the region, left * width pixels long, and the same on the
    /// other sides (top from the first row, bottom to the last one), pixels on a ramp get a factor for its direction:
    /// KTInterpolator::Interpolate(1, 0, t) in double precision, t being the distance from the region's edge divided by
    /// the ramp's length, 1 at most; where ramps of one direction overlap, right and bottom count. Then
    ///
    ///     alpha = truncated(alpha * horizontal factor * vertical factor)
    ///
    /// A region of (0, 0, 1, 1), and a width or height of 0, change nothing. RGB and BGR images have no alpha: that is
    /// logged and nothing changes. All other bytes stay as they are. Nothing is allocated.
    ///
    /// Throws, before anything is changed: no image (line 853); no pixel format (line 873); coordinates that are not
    /// finite or overflow ("Invalid texture co-ordinates passed.", line 881); what the interpolation throws.
    static void ApplyEdgeMaskToImage(unsigned int const &width, unsigned int const &height,
                                     KTPixelFormatEnum const &format, KTTextureCoord2D const &region,
                                     unsigned char *image);

    /// Uploads a white BGRA texture of that size, faded by ApplyEdgeMaskToImage, into `texture`, which keeps its id if
    /// it has one. A size beyond the renderer's maximum, or one that is no power of two where the renderer needs one, is
    /// logged and nothing is uploaded. Throws (line 944) when memory is short or the size has no 32-bit signed form; what
    /// ApplyEdgeMaskToImage and the renderer throw.
    static void GetEdgeMaskTexture(IKTRenderer const &renderer, unsigned int const &width, unsigned int const &height,
                                   KTTextureCoord2D const &region, KTTexture2D &texture);

    /// Loads a picture of one colour, faded by ApplyEdgeMaskToImage, into `quad`: BGRA, as large as the quad. Components
    /// are multiplied by 255, rounded half up and clamped to 0 to 255 (NaN is 0). Throws (line 969) when memory is short
    /// or the size has no 32-bit signed form; what ApplyEdgeMaskToImage and KTLargeTexturedQuad3D::Load throw.
    static void GetConstColoredQuad(IKTRenderer const &renderer, unsigned int const &width, unsigned int const &height,
                                    KTColor4f const &color, KTTextureCoord2D const &region,
                                    KTLargeTexturedQuad3D &quad);

    // ---- geometry ----

    /// The point where the infinite line through `a` and `b` meets the plane. Computed in double precision.
    ///
    /// A line in the plane gives `a`. A line parallel to the plane and beside it, and a plane with a zero normal, have
    /// no such point: all three coordinates are NaN then (KTVector3f::IsFinite tells). The same point twice is no line:
    /// it gives that point if it lies in the plane, else NaN. The same with an infinite or NaN point. Parallel means that
    /// the cosine between line and normal is at most 2 * FLT_EPSILON, what rounding to floats can make of 0. Any thread;
    /// throws nothing.
    static KTVector3f GetIntersectionOfLineWithPlane(KTVector3f const &a, KTVector3f const &b, KTPlanef const &plane);
};

#include "KTEndExports.h"
