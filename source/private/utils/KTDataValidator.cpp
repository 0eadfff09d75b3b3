// KTDataValidator.cpp: the range checks.

#include "KTDataValidator.h"

namespace {

// Written so that a NaN anywhere fails.
template <typename T> KTErrorCodeEnum Validate(T value, T least, T greatest) {
    return least <= value && value <= greatest ? kKTErrorNone : kKTErrorFailed;
}

} // namespace

KTErrorCodeEnum KTDataValidator::ValidateKTInt32(int const &value, int const &least, int const &greatest,
                                                 KTString const & /*field*/, KTString const & /*owner*/,
                                                 int const & /*index*/) {
    return Validate(value, least, greatest);
}

KTErrorCodeEnum KTDataValidator::ValidateKTUInt32(unsigned int const &value, unsigned int const &least,
                                                  unsigned int const &greatest, KTString const & /*field*/,
                                                  KTString const & /*owner*/, int const & /*index*/) {
    return Validate(value, least, greatest);
}

KTErrorCodeEnum KTDataValidator::ValidateDouble(double const &value, double const &least, double const &greatest,
                                                KTString const & /*field*/, KTString const & /*owner*/,
                                                int const & /*index*/) {
    return Validate(value, least, greatest);
}

KTErrorCodeEnum KTDataValidator::ValidateColor(KTColor const & /*value*/, KTColor const & /*least*/,
                                               KTColor const & /*greatest*/, KTString const & /*field*/,
                                               KTString const & /*owner*/, int const & /*index*/) {
    return kKTErrorFailed;
}

KTErrorCodeEnum KTDataValidator::ValidateTimeData(KTTime const & /*value*/, KTTime const & /*least*/,
                                                  KTTime const & /*greatest*/, KTString const & /*field*/,
                                                  KTString const & /*owner*/, int const & /*index*/) {
    return kKTErrorFailed;
}
