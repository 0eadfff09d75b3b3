// SystemUtils.cpp: services of the system and of the machine.

#include "KTSystemUtils.h"

#include "KTAssert.h"
#include "OGuid.h"

#include <utility>

namespace {

constexpr char kSourcePath[] = "source/private/utils/SystemUtils";

} // namespace

KTString KTSystemUtils::CreateGUID() {
    KTUnits text;
    switch (OMakeGuid(text)) {
    case OGuidResult::kMade:
        break;
    case OGuidResult::kNotGenerated:
        KTAssertFailed("Failed to generate a GUID", kSourcePath, 88);
        break;
    case OGuidResult::kNotWritten:
        KTAssertFailed("Failed to convert GUID to string", kSourcePath, 83);
        break;
    }
    return KTString(OString(std::move(text)));
}
