// KTGraphicsUtils.h: the static toolbox of the renderer's value types. Conventions are those of KTGraphicsStructs.h.

#pragma once

#include "KTGraphicsStructs.h"

#include "KTBeginExports.h"

class KT_PUBLIC_API KTGraphicsUtils {
  public:
    KTGraphicsUtils() = delete;

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
