// KTPublicUtils.cpp: small helpers.

#include "KTPublicUtils.h"

#include <sstream>

// By value, as its callers link it.
// NOLINTNEXTLINE(performance-unnecessary-value-param)
std::string KTPublicUtils::ConstructLogStr(std::string text, float value) {
    std::ostringstream stream;
    stream << text << ": " << value;
    return stream.str();
}
