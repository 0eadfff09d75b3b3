// KTFileUtils.cpp: the static toolbox for files and folders.

#include "KTFileUtil.h"

#include "OFileSystem.h"

KTFile KTFileUtil::GetSystemTempFolder() { return KTFile(OGetSystemTempFolder()); }
