// OGuid_posix.cpp: identifiers from the kernel for the native developer build.

#include "OGuid.h"

#include <algorithm>
#include <fstream>
#include <string>

OGuidResult OMakeGuid(OGuidText &text) {
    std::ifstream file("/proc/sys/kernel/random/uuid");
    std::string line;
    if (!std::getline(file, line) || line.size() + 1 != text.size()) {
        return OGuidResult::kNotGenerated;
    }
    std::copy(line.begin(), line.end(), text.begin());
    text.back() = 0;
    return OGuidResult::kMade;
}
