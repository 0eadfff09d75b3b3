// RunGuard.h: one demo at a time. A second one would empty the first one's log, as each start of the library does.

#pragma once

#include "KTInterProcessFileLock.h"
#include "KTPath.h"

#include <memory>

/// Holds the lock on "ktdemo.lock" in the system's temporary folder. The file stays there: if each run deleted it, a
/// run could lock a file that the next one no longer finds.
class RunGuard {
  public:
    /// Takes the lock, or finds it taken. Throws std::exception when the file cannot be made or locked.
    RunGuard();
    RunGuard(RunGuard const &) = delete;
    RunGuard &operator=(RunGuard const &) = delete;
    ~RunGuard();

    /// Whether this process holds the lock.
    bool IsHeld() const { return m_IsHeld; }

    /// The lock file.
    KTPath const &FilePath() const { return m_Path; }

  private:
    KTPath m_Path;
    std::unique_ptr<KTInterProcessFileLock> m_Lock;
    bool m_IsHeld = false;
};
