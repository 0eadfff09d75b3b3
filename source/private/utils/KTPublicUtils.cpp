// KTPublicUtils.cpp: small helpers.

#include "KTPublicUtils.h"

#include <sstream>

std::string KTPublicUtils::ConstructLogStr(std::string text, float value) {
    std::ostringstream stream;
    stream << text << ": " << value;
    return stream.str();
}
