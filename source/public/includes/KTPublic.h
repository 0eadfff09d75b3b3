// KTPublic.h: everything the library exports. It may stand before or after <windows.h>, includes it nowhere, and leaves
// no macro behind.

#pragma once

#include "KTAllocate.h"
#include "KTAssert.h"
#include "KTComBSTR.h"
#include "KTDataValidator.h"
#include "KTDuration.h"
#include "KTErrorCodes.h"
#include "KTFile.h"
#include "KTFileUtil.h"
#include "KTInterProcessFileLock.h"
#include "KTLocks.h"
#include "KTLogger.h"
#include "KTPath.h"
#include "KTPublicUtils.h"
#include "KTReal.h"
#include "KTString.h"
#include "KTTempFileHolder.h"
#include "KTTime.h"
#include "KTTypes.h"
#include "KTUnitTraits.h"
#include "KTUserEventUtil.h"
#include "OFile.h"
#include "OPath.h"
#include "OString.h"
#include "WKTLogger.h"
