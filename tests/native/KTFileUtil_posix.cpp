// KTFileUtil_posix.cpp: the test program's own path, for the native developer build.

#include "KTFileUtil.h"

#include <filesystem>

KTPath KTFileUtil::GetCurrentExecutablePath() {
    std::error_code error;
    return KTPath(OPath(OString::FromUTF8(std::filesystem::read_symlink("/proc/self/exe", error).string())));
}
