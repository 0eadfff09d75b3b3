// RunLog.h: the demo's lines in the library's log, and how many there are.

#pragma once

#include "KTLogger.h"
#include "KTTypes.h"

#include <atomic>
#include <string>

/// Writes to the process-wide logger; any thread may use it.
class RunLog {
  public:
    /// A step of the run. The text may come from files: it goes to the logger as it is, never as a format.
    void Step(std::string const &text);

    /// A step in the work of one of several threads.
    void WorkerStep(int worker, std::string const &file, std::string const &text);

    /// A worker begins or ends, by the formatting members.
    void WorkerStarted(int worker);
    void WorkerEnded(int worker, int files);

    /// Lines written so far.
    KTUInt64 Lines() const { return m_Lines; }

    /// Lines now in the log file; 0 if it cannot be read. The library itself may have written some of them.
    static KTUInt64 LinesInFile();

    /// Where the log is.
    static KTPath FilePath();

  private:
    bool Count();

    std::atomic<KTUInt64> m_Lines = 0;
};
