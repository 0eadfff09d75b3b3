// KTInterProcessFileLock.h: an exclusive lock between processes, held on an existing file.
//
// The lock excludes every other handle, in this process too. The system drops it when the handle is closed or its
// process ends, however that happens, so a crash never leaves it behind.
//
//     KTInterProcessFileLock lock(path);     // the file must exist; it is never created
//     if (lock.TryLock()) { ... lock.Unlock(); }
//
// Every failure but "somebody else holds it" throws boost::interprocess::interprocess_exception (a std::exception),
// which carries the system's error code, the library code from Boost.Interprocess's table, and the system's message.

#pragma once

#include "KTString.h"

#include "KTBeginExports.h"

struct KTInterProcessFileLockImpl;

/// A lock on a whole file. One object belongs to one thread at a time. WRONG: copying it; the copy operations exist
/// and copy the pointer only, so two handles then delete one object.
class KT_PUBLIC_API KTInterProcessFileLock {
  public:
    /// Opens the existing file at the full path `path`, of any length, for reading and writing, shared with everybody.
    /// Throws boost::interprocess::interprocess_exception if it cannot be opened; no object results then.
    explicit KTInterProcessFileLock(KTString const &path);
    KTInterProcessFileLock(KTInterProcessFileLock const &other);
    KTInterProcessFileLock &operator=(KTInterProcessFileLock const &other);

    /// Closes the file; the system drops the lock with it.
    virtual ~KTInterProcessFileLock();

    /// Takes the lock without waiting. Returns true when it is taken, false when another handle holds it; anything else
    /// throws.
    bool TryLock();

    /// Releases the lock and returns true; a failure, also of a lock that is not held, throws.
    bool Unlock();

    /// The owned record with the file handle.
    KTInterProcessFileLockImpl *get();

  private:
    KTInterProcessFileLockImpl *m_Impl;
};

#include "KTEndExports.h"
