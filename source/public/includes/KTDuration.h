// KTDuration.h: a length of time, an amount and the unit that it is counted in.
//
// The library itself knows one unit, seconds, and rounds amounts of seconds to tenths for display. Amounts in the units
// of callers are handed through as they are. No operation converts between units.

#pragma once

#include "KTErrorCodes.h"
#include "KTReal.h"
#include "KTTypes.h"

#include "KTBeginExports.h"

/// Unit of a duration. Values other than 0 belong to the callers, who give them names and meanings of their own:
/// static_cast<KTDurationUnitOfMeasure>(1).
enum KTDurationUnitOfMeasure : int {
    kKTDurationSeconds = 0 ///< seconds
};

/// A length of time. Any thread may use its own durations; one duration is not locked.
class KT_PUBLIC_API KTDuration {
  public:
    /// 0 seconds.
    KTDuration();

    /// `amount` in the given unit; negative, infinite and NaN amounts are kept as they are.
    KTDuration(KTReal amount, KTDurationUnitOfMeasure unit);

    KTDuration(KTDuration const &other);
    KTDuration &operator=(KTDuration const &other);
    virtual ~KTDuration();

    // The virtual functions keep this order: hosts rely on it.

    /// Seconds: the amount in whole tenths, rounded as GetTimeInDeciSeconds does and divided by 10 in single precision,
    /// so that 1.26 gives the double of 1.3F. Other units: the amount unchanged.
    virtual KTReal GetTime() const;

    /// Seconds: the amount in tenths of a second, rounded half away from zero (1.26 gives 13, -0.06 gives -1). Tenths
    /// beyond the range of int give the nearer limit, NaN gives 0. Other units: reports an assertion and returns 0.
    virtual int GetTimeInDeciSeconds() const;

    /// The amount unchanged.
    virtual KTReal GetTimeWithFullPrecision() const;

    /// Stores the amount; the unit stays. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetTime(KTReal amount);

    /// Stores the unit; the amount stays and is not converted. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetDurationUnitOfMeasure(KTDurationUnitOfMeasure unit);

    /// The unit.
    virtual KTDurationUnitOfMeasure GetDurationUnitOfMeasure() const;

    /// Adds or subtracts the other's amount; this unit stays. REQUIRES: both units are the same, or the sum means
    /// nothing.
    KTDuration &operator+=(KTDuration const &other);
    KTDuration &operator-=(KTDuration const &other);

    /// 1 when the amounts differ by less than 0.00001 and the units are the same, else 0. NaN and infinite amounts
    /// equal nothing.
    KTBool16 operator==(KTDuration const &other) const;

    /// The opposite of ==.
    KTBool16 operator!=(KTDuration const &other) const;

  private:
    KTReal m_Amount;
    KTDurationUnitOfMeasure m_Unit = kKTDurationSeconds;
};

#include "KTEndExports.h"
