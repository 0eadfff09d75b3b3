// KTDataValidator.h: range checks of data fields, as result codes.
//
//     if (KTDataValidator::ValidateDouble(opacity, 0.0, 1.0, "opacity", "slide", 3) != kKTErrorNone)
//         return kKTErrorFailed;

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"
#include "KTTypes.h"

class KTColor;
class KTTime;

#include "KTBeginExports.h"

/// Static range checks; any thread. Each takes the value, the least and the greatest value allowed, and three arguments
/// that say where the value stands (two names and a number): the checks do not use them, callers hand them over in one
/// form for all types. A least value above the greatest allows nothing.
class KT_PUBLIC_API KTDataValidator {
  public:
    KTDataValidator() = delete;

    /// kKTErrorFailed if the value is less than the least or greater than the greatest, else kKTErrorNone.
    static KTErrorCodeEnum ValidateKTInt32(int const &value, int const &least, int const &greatest,
                                           KTString const &field, KTString const &owner, int const &index);

    /// The same for unsigned numbers.
    static KTErrorCodeEnum ValidateKTUInt32(unsigned int const &value, unsigned int const &least,
                                            unsigned int const &greatest, KTString const &field, KTString const &owner,
                                            int const &index);

    /// kKTErrorNone only if least <= value and value <= greatest; a NaN anywhere gives kKTErrorFailed.
    static KTErrorCodeEnum ValidateDouble(double const &value, double const &least, double const &greatest,
                                          KTString const &field, KTString const &owner, int const &index);

    /// Always kKTErrorFailed, on purpose: colours have no order, so no colour lies between two others.
    static KTErrorCodeEnum ValidateColor(KTColor const &value, KTColor const &least, KTColor const &greatest,
                                         KTString const &field, KTString const &owner, int const &index);

    /// Always kKTErrorFailed, on purpose: no time passes validation through this class.
    static KTErrorCodeEnum ValidateTimeData(KTTime const &value, KTTime const &least, KTTime const &greatest,
                                            KTString const &field, KTString const &owner, int const &index);
};

#include "KTEndExports.h"
