// KTColor.h: a colour of a document, with its colour space, alpha and transparency factor.
//
// The alpha belongs to the colour; the transparency factor is what the place where it is used (a fading object, say)
// adds. Components and both amounts are reals, 0 to 1; values outside are kept.
//
//     KTColor color(0x80FF0000);          // half transparent red
//     color.SetTransparencyFactor(0.5);
//     KTARGB shown;
//     color.GetResultantARGB(shown);      // alpha as stored, red 0.5
//
// Threads: any thread may use its own colours; one colour is not locked.

#pragma once

#include "KTErrorCodes.h"
#include "KTReal.h"
#include "KTTypes.h"

#include <vector>

#include "KTBeginExports.h"

/// Alpha, red, green and blue, in this order; a plain value of 32 bytes.
struct KTARGB {
    KTReal alpha;
    KTReal red;
    KTReal green;
    KTReal blue;

    friend bool operator==(KTARGB const &a, KTARGB const &b) = default;
};

/// A colour of any number of components.
class KT_PUBLIC_API KTColor {
  public:
    /// What the components mean. Values other than 0 belong to the callers, who give them names and meanings of their
    /// own: static_cast<KTColor::ColorSpaceEnum>(1). Four bytes. No operation converts between spaces.
    enum ColorSpaceEnum : int {
        kColorSpaceRGB = 0 ///< red, green, blue
    };

    /// Opaque black: red, green and blue 0, alpha 1, transparency factor 1.
    KTColor();

    /// The RGB colour 0xAARRGGBB, each byte divided by 255; transparency factor 1.
    explicit KTColor(KTUInt32 argb);

    KTColor(KTColor const &other);
    KTColor &operator=(KTColor const &other);

    // The virtual functions keep this order: hosts rely on it.

    virtual ~KTColor();

    /// Stores the alpha unchanged and the first three components each multiplied by the transparency factor; missing
    /// components count as 0. On purpose the factor scales the channels here and not the alpha; GetResultantAlpha gives
    /// the alpha scaled.
    virtual void GetResultantARGB(KTARGB &argb) const;

    /// Stores the alpha and the first three components as they are; missing components count as 0.
    virtual void GetARGB(KTARGB &argb) const;

    /// The alpha as stored.
    virtual KTReal GetAlpha() const;

    /// Stores the alpha. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetAlpha(KTReal const &alpha);

    /// The alpha multiplied by the transparency factor.
    virtual KTReal GetResultantAlpha() const;

    /// The transparency factor.
    virtual KTReal GetTransparencyFactor();

    /// Stores the transparency factor. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetTransparencyFactor(KTReal const &factor);

    /// The colour space.
    virtual ColorSpaceEnum GetColorSpace() const;

    /// The components; the reference is valid until they are set again.
    virtual std::vector<KTReal> const &GetColorData() const;

    /// How many components there are.
    virtual int GetNumComponents() const;

    /// Component n, counted from 0. REQUIRES: 0 <= n < GetNumComponents(); it is not checked.
    virtual KTReal GetNthComponent(int n) const;

    /// Stores the colour space; the components stay and are not converted. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetColorSpace(ColorSpaceEnum space);

    /// Stores the colour space and the components, of any number. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetColorData(ColorSpaceEnum space, std::vector<KTReal> const &components);

    /// Stores the components, of any number; the colour space stays. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetColorData(std::vector<KTReal> const &components);

    /// 1 when the colour spaces (the other's as its GetColorSpace tells) and the numbers of components are the same and
    /// each pair of components differs by less than 1e-5, else 0. Alpha and transparency factor do not count. NaN
    /// equals nothing; a null pointer gives 0.
    virtual KTBool16 IsEqual(KTColor const *other) const;

    /// 0xAARRGGBB of the alpha (as GetAlpha tells) and the components as stored, each times 255 and truncated; 0xAA000000
    /// without components, and missing ones count as 0. The conversion is that of KTReal: amounts beyond 32 bits are
    /// reported, NaN gives 0. Red, green and blue are cut to their low 8 bits, the alpha by being shifted out: amounts
    /// above 1 wrap.
    KTUInt32 GetColorAsUInt() const;

    /// 1 when IsEqual and, unlike there, the alphas and the transparency factors differ by less than 1e-5 too, else 0.
    KTBool16 operator==(KTColor const &other) const;

    /// The opposite of ==.
    KTBool16 operator!=(KTColor const &other) const;

  private:
    ColorSpaceEnum m_ColorSpace = kColorSpaceRGB;
    std::vector<KTReal> m_Components;
    KTReal m_Alpha = 1.0;
    KTReal m_TransparencyFactor = 1.0;
};

/// One stop of a gradient: a colour, and where on the way from start to end it is reached.
struct KT_PUBLIC_API KTColorStop {
    KTColor color;
    KTReal position; ///< 0 at the start, 1 at the end; values outside are kept

    /// Opaque black at the start.
    KTColorStop();

    KTColorStop(KTColor const &colorValue, KTReal const &positionValue);

    /// 1 when the colours are == and the positions differ by less than 1e-5, else 0.
    KTBool16 operator==(KTColorStop const &other) const;

    /// The opposite of ==.
    KTBool16 operator!=(KTColorStop const &other) const;

    /// Whether this stop stands before the other one: for sorting. Stops at a NaN position come last, so that the order
    /// is a strict weak one.
    bool operator<(KTColorStop const &other) const;
};

#include "KTEndExports.h"
