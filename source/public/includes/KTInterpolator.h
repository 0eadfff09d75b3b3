// KTInterpolator.h: the way from one number to another, straight or eased.
//
// The process has one interpolation mode, ease in and ease out when the library is loaded. Every interpolation follows
// it: the numbers here, and the vectors, colours, matrices and transforms of KTGraphicsStructs.h component by component.
//
//     value   linear    eased: constant acceleration up to t = 0.3, constant speed up to 0.7, constant
//       to |    /  |      __ |    deceleration to 1
//          |   /   |    /    |
//     from | /     | __/     |
//          +-------+---------+
//            t: 0 to 1
//
// Threads: the mode is one plain value without a lock. It is set on one thread while no other interpolates.

#pragma once

#include "KTBeginExports.h"

/// How KTInterpolator goes from one value to another. Four bytes.
enum KTInterpolationModeEnum : int {
    kKTInterpolationLinear = 0,       ///< at constant speed
    kKTInterpolationEaseInEaseOut = 1 ///< speeding up at the start, slowing down at the end
};

/// Static members only: the mode, and the interpolation of numbers.
class KT_PUBLIC_API KTInterpolator {
  public:
    KTInterpolator() = delete;

    /// The value at `t` on the way from `from` (t = 0) to `to` (t = 1), under the current mode.
    ///
    /// Linear: (to - from) * t + from. A `t` outside [0, 1], or NaN, throws KTLCException, "kKTErrorInternal".
    /// Eased: a `t` below 0 gives `from`, 1 and above give `to`, NaN gives NaN; nothing is thrown. With
    /// a = (to - from) / 0.21 and v = 0.3 * a, the curve is a / 2 * t^2 up to 0.3, goes on at speed v up to 0.7, and
    /// ends with -a / 2 * (t - 0.7)^2 on top of that speed. Results are the same bit by bit on every machine; for floats
    /// 0.21 is 0.3F * 0.7F.
    /// Any other mode throws KTLCException, "kKTErrorInternal". NaN and infinite ends follow IEEE 754.
    static float Interpolate(float const &from, float const &to, float const &t);
    static double Interpolate(double const &from, double const &to, double const &t);

    /// The process-wide mode; the reference stays valid and follows later changes.
    static KTInterpolationModeEnum const &GetInterpolationMode();

    /// Sets the process-wide mode. Any value is stored; an unknown one makes interpolations throw.
    static void SetInterpolationMode(KTInterpolationModeEnum const &mode);

  private:
    static float LinearInterpolate(float const &from, float const &to, float const &t);
    static double LinearInterpolate(double const &from, double const &to, double const &t);
    static float EaseInEaseOutInterpolate(float const &from, float const &to, float const &t);
    static double EaseInEaseOutInterpolate(double const &from, double const &to, double const &t);
};

#include "KTEndExports.h"
