// OFileHandle_posix.cpp: open files for the native developer build. A handle is the descriptor plus one, as null names no
// file; -1 is the invalid handle, as on Windows.

#include "OFileHandle.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <limits>

namespace {

int DescriptorOf(OFileHandle handle) { return static_cast<int>(reinterpret_cast<std::intptr_t>(handle) - 1); }

OFileHandle HandleOf(int descriptor) {
    std::intptr_t const number = descriptor < 0 ? -1 : descriptor + 1;
    return reinterpret_cast<OFileHandle>(number); // NOLINT(performance-no-int-to-ptr)
}

int FlagsOf(unsigned int access, ODisposition disposition) {
    bool const writes = (access & kOAccessWrite) != 0;
    int const flags = !writes ? O_RDONLY : (access & kOAccessRead) != 0 ? O_RDWR : O_WRONLY;
    switch (disposition) {
    case ODisposition::CreateAlways:
        return flags | O_CREAT | O_TRUNC;
    case ODisposition::OpenAlways:
        return flags | O_CREAT;
    case ODisposition::TruncateExisting:
        return flags | O_TRUNC;
    case ODisposition::OpenExisting:
        break;
    }
    return flags;
}

int WhenceOf(OMoveFrom from) {
    return from == OMoveFrom::Beginning ? SEEK_SET : from == OMoveFrom::End ? SEEK_END : SEEK_CUR;
}

OTransfer TransferOf(ssize_t moved) { return {moved >= 0, moved < 0 ? 0 : static_cast<std::uint32_t>(moved)}; }

} // namespace

OFileHandle OOpenFile(OPath const &path, unsigned int access, ODisposition disposition, unsigned int) {
    OPath native = path;
    native.ReplaceBackSlashes();
    return HandleOf(
        open(native.GetString().GetUTF8().c_str(), FlagsOf(access, disposition) | O_CLOEXEC, 0666)); // NOLINT(*-vararg)
}

bool OIsOpen(OFileHandle handle) noexcept { return DescriptorOf(handle) >= 0; }

bool OCloseFile(OFileHandle handle) noexcept { return close(DescriptorOf(handle)) == 0; }

OTransfer OReadFile(OFileHandle handle, void *buffer, std::uint32_t count) noexcept {
    return TransferOf(read(DescriptorOf(handle), buffer, count));
}

OTransfer OWriteFile(OFileHandle handle, void const *buffer, std::uint32_t count) noexcept {
    return TransferOf(write(DescriptorOf(handle), buffer, count));
}

bool OMoveFilePointer(OFileHandle handle, std::int64_t distance, OMoveFrom from, std::uint32_t &position) noexcept {
    off_t const before = lseek(DescriptorOf(handle), 0, SEEK_CUR);
    off_t const after = lseek(DescriptorOf(handle), distance, WhenceOf(from));
    if (after < 0) {
        return false;
    }
    if (after > std::numeric_limits<std::uint32_t>::max()) {
        lseek(DescriptorOf(handle), before, SEEK_SET);
        return false;
    }
    position = static_cast<std::uint32_t>(after);
    return true;
}

bool OGetOpenFileSize(OFileHandle handle, std::uint64_t &size) noexcept {
    struct stat facts{};
    if (fstat(DescriptorOf(handle), &facts) != 0) {
        return false;
    }
    size = static_cast<std::uint64_t>(facts.st_size);
    return true;
}

bool OSetEndOfFile(OFileHandle handle) noexcept {
    off_t const position = lseek(DescriptorOf(handle), 0, SEEK_CUR);
    return position >= 0 && ftruncate(DescriptorOf(handle), position) == 0;
}
