// OGuid_posix.cpp: identifiers from the kernel for the native developer build.

#include "OGuid.h"

#include <fstream>
#include <string>

OGuidResult OMakeGuid(KTUnits &text) {
    std::ifstream file("/proc/sys/kernel/random/uuid");
    std::string line;
    if (!std::getline(file, line)) {
        return OGuidResult::kNotGenerated;
    }
    text.assign(line.begin(), line.end());
    return OGuidResult::kMade;
}
