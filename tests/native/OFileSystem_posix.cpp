// OFileSystem_posix.cpp: the file layer's questions, answered by the standard library for the native developer build.
//
// Back slashes separate names here, too, so that what the portable half joins can be opened. Full paths are made as on
// Windows, from a made-up current folder: the text work is what the native tests are about.

#include "OCopy.h"
#include "OFolder.h"
#include "OLongPath.h"
#include "OTempFiles.h"

#include <fcntl.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>

namespace fs = std::filesystem;

namespace {

fs::path NativePath(OPath path) {
    path.ReplaceBackSlashes();
    return path.GetString().GetUTF8();
}

OError ErrorOf(std::error_code const &code) {
    if (!code) {
        return OError::None;
    }
    if (code == std::errc::no_such_file_or_directory) {
        return OError::NotFound;
    }
    if (code == std::errc::file_exists) {
        return OError::AlreadyExists;
    }
    if (code == std::errc::permission_denied) {
        return OError::AccessDenied;
    }
    return code == std::errc::is_a_directory ? OError::IsAFolder : OError::Failed;
}

OError LastError() { return ErrorOf(std::error_code(errno, std::generic_category())); }

class MadeUpFolders final : public OCurrentFolders {
  public:
    KTUnits Get(unsigned short drive) const override {
        KTUnits folder = {'C', ':', '\\', 'n', 'o', 'w'};
        folder[0] = drive == 0 ? folder[0] : drive;
        return folder;
    }
};

} // namespace

OPath OGetSystemTempFolder() {
    std::error_code error;
    return OPath(OString::FromUTF8(fs::temp_directory_path(error).string()));
}

bool OIsValidPath(OPath const &path) { return !OGetFullPath(path).IsEmpty(); }

OPath OGetFullPath(OPath const &path) {
    auto full = OMakeFullPath(path.GetString().GetUnits(), MadeUpFolders());
    return full ? OPath(OString(std::move(*full))) : OPath();
}

bool OExists(OPath const &path) {
    OFileFacts facts;
    return OGetFacts(path, facts) == OError::None;
}

OError OGetFacts(OPath const &path, OFileFacts &facts) {
    std::error_code error;
    fs::file_status const status = fs::status(NativePath(path), error);
    if (!fs::exists(status)) {
        return error ? ErrorOf(error) : OError::NotFound;
    }
    facts.isFolder = fs::is_directory(status);
    facts.size = facts.isFolder ? 0 : fs::file_size(NativePath(path), error);
    return OError::None;
}

OError OMakeFile(OPath const &path, bool replace) {
    int const file =
        open(NativePath(path).c_str(), O_WRONLY | O_CREAT | O_CLOEXEC | (replace ? O_TRUNC : O_EXCL), 0666);
    if (file < 0) {
        return LastError();
    }
    close(file);
    return OError::None;
}

OError OTouch(OPath const &path) {
    std::error_code error;
    fs::last_write_time(NativePath(path), fs::file_time_type::clock::now(), error);
    return ErrorOf(error);
}

OError ODelete(OPath const &path) {
    std::error_code error;
    return fs::remove(NativePath(path), error) ? OError::None : error ? ErrorOf(error) : OError::NotFound;
}

OError OResolveAlias(OPath &) { return OError::None; }

OError OTryOpen(OPath const &path, OFile::AccessMode access, OFile::ShareMode) {
    int const mode = ((access & OFile::kAccessRead) != 0 ? R_OK : 0) | ((access & OFile::kAccessWrite) != 0 ? W_OK : 0);
    return ::access(NativePath(path).c_str(), mode) == 0 ? OError::None : LastError();
}

OError OMakeFolder(OPath const &path, bool parents) {
    std::error_code error;
    fs::path const folder = NativePath(path);
    bool const made = parents ? fs::create_directories(folder, error) : fs::create_directory(folder, error);
    return error ? ErrorOf(error) : made || parents ? OError::None : OError::AlreadyExists;
}

OError ODeleteFolder(OPath const &folder) {
    std::error_code error;
    return fs::remove_all(NativePath(folder), error) == 0 ? OError::NotFound : ErrorOf(error);
}

OError OCopyFile(OPath const &from, OPath const &to, bool replace) {
    std::error_code error;
    auto const options = replace ? fs::copy_options::overwrite_existing : fs::copy_options::none;
    fs::copy_file(NativePath(from), NativePath(to), options, error);
    return ErrorOf(error);
}

OError OCopyFolder(OPath const &from, OPath const &to) {
    std::error_code error;
    fs::copy(NativePath(from), NativePath(to), fs::copy_options::recursive, error);
    return ErrorOf(error);
}

OError OMove(OPath const &from, OPath const &to, bool replace) {
    if (!replace && OExists(to)) {
        return OError::AlreadyExists;
    }
    std::error_code error;
    fs::rename(NativePath(from), NativePath(to), error);
    return ErrorOf(error);
}

std::uint64_t OGetFreeSpace(OPath const &path) {
    std::error_code error;
    fs::space_info const space = fs::space(NativePath(path), error);
    return error ? 0 : space.available;
}

bool OIsOnServer(OPath const &) { return false; }
