// KTPublicUtils.cpp: small helpers.

#include "KTPublicUtils.h"

#include <sstream>

// By value, as its callers link it.
std::string KTPublicUtils::ConstructLogStr(std::string text,
                                           float value) { // NOLINT(performance-unnecessary-value-param)
    std::ostringstream stream;
    stream << text << ": " << value;
    return stream.str();
}
