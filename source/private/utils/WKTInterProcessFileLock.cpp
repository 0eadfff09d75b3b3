// WKTInterProcessFileLock.cpp: the lock between processes, by the system's byte-range locks.
//
// The range starts at offset 0 and is 2^64 - 1 bytes long, so it covers every file whole, empty ones included.

#include "KTInterProcessFileLock.h"

#include "WOHandle.h"
#include "WOLongPath.h"

#include <boost/interprocess/errors.hpp>
#include <boost/interprocess/exceptions.hpp>

struct KTInterProcessFileLockImpl {
    WOHandle file;
};

namespace {

constexpr DWORD kWholeFile = 0xFFFFFFFF; // low and high half of the length

// Throws what `code` means to Boost.Interprocess, with the system's message; code 0 has no message.
[[noreturn]] void ThrowSystemError(DWORD code) {
    throw boost::interprocess::interprocess_exception(
        boost::interprocess::error_info(static_cast<boost::interprocess::native_error_t>(code)), "");
}

// The file is named by the path's extended form, as everywhere in the library, so that it may lie in a deep folder. What
// has no such form goes to the system as it was written, for its own answer; a zero inside would name another file.
WOHandle OpenLockFile(KTString const &path) {
    if (path.find(static_cast<unsigned short>(0)) != KTString::npos) {
        ThrowSystemError(ERROR_INVALID_NAME);
    }
    std::wstring const written = path.GetWstring();
    WOLongPath const extended(OPath(path.GetOString()));
    WOHandle file(CreateFileW(extended.IsValid() ? extended.c_str() : written.c_str(), GENERIC_READ | GENERIC_WRITE,
                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr, OPEN_EXISTING, 0,
                              nullptr));
    if (!file.IsValid()) {
        ThrowSystemError(GetLastError());
    }
    return file;
}

} // namespace

KTInterProcessFileLock::KTInterProcessFileLock(KTString const &path)
    : m_Impl(new KTInterProcessFileLockImpl{OpenLockFile(path)}) {}

KTInterProcessFileLock::KTInterProcessFileLock(KTInterProcessFileLock const &other) = default;

KTInterProcessFileLock &KTInterProcessFileLock::operator=(KTInterProcessFileLock const &other) = default;

KTInterProcessFileLock::~KTInterProcessFileLock() { delete m_Impl; }

KTInterProcessFileLockImpl *KTInterProcessFileLock::get() { return m_Impl; }

bool KTInterProcessFileLock::TryLock() {
    OVERLAPPED start{};
    if (LockFileEx(m_Impl->file.Get(), LOCKFILE_EXCLUSIVE_LOCK | LOCKFILE_FAIL_IMMEDIATELY, 0, kWholeFile, kWholeFile,
                   &start) != FALSE) {
        return true;
    }
    DWORD const code = GetLastError();
    if (code == ERROR_LOCK_VIOLATION) {
        return false;
    }
    ThrowSystemError(code);
}

bool KTInterProcessFileLock::Unlock() {
    OVERLAPPED start{};
    if (UnlockFileEx(m_Impl->file.Get(), 0, kWholeFile, kWholeFile, &start) == FALSE) {
        ThrowSystemError(GetLastError());
    }
    return true;
}
