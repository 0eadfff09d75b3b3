// OFileSystem_posix.cpp: the file layer's questions, answered by the standard library for the native developer build.

#include "OFileSystem.h"

#include <filesystem>

OPath OGetSystemTempFolder() {
    std::error_code error;
    return OPath(OString::FromUTF8(std::filesystem::temp_directory_path(error).string()));
}
