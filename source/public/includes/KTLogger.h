// KTLogger.h: the process-wide diagnostic log.
//
// One object is created when the library is loaded and reached through gKTLogger; it lives until the process ends. Each
// line goes to "ktap_log.txt" in the system's temporary folder, which every load of the library empties:
//
//     milliseconds since the process started ": " message LF
//
// and, by the Windows logger, to the debugger output as well. There is no date, thread number or level.
//
//     gKTLogger->Log("saved %d objects", count);
//
// A format without a per cent sign is written as it stands, values or not; so untrusted text belongs in the
// std::string overloads or behind "%s".
//
// Threads: any thread may log. Lines never interleave inside a line of the file; their order is the order in which the
// threads take the logger's mutex. The debugger output is not ordered between threads.

#pragma once

#include "KTLocks.h"
#include "KTPath.h"

#include <iosfwd>
#include <memory>
#include <string>

#include "KTBeginExports.h"

/// The logger's interface and its file. A file that cannot be opened or written loses lines silently.
class KT_PUBLIC_API KTLogger {
  public:
    KTLogger(KTLogger const &) = delete;
    KTLogger &operator=(KTLogger const &) = delete;

    /// Writes one line: the low byte of each wide character.
    virtual void Log(std::wstring const &message) = 0;

    /// Formats like wprintf and writes one line; a null format writes "(null)". REQUIRES: the format fits its values.
    virtual void Log(wchar_t const *const format, ...) = 0;

    /// Writes one line: the bytes as they are.
    virtual void Log(std::string const &message);

    /// Formats like printf and writes one line; a null format writes "(null)". REQUIRES: the format fits its values.
    virtual void Log(char const *const format, ...);

    /// Whether anything is written; true from the start.
    bool IsLogEnabled() const;

    /// Switches all writing on or off; the file stays open. Not locked: lines on their way may still be written.
    void LogEnableAtRuntime(bool enable);

    /// Full path of the log file, fixed at construction.
    KTPath const &GetLogFilePath() const;

  protected:
    /// Opens the log file and empties it.
    KTLogger();

    /// Closes the log file.
    virtual ~KTLogger();

  private:
    bool m_Enabled;
    std::unique_ptr<std::ofstream> m_Stream;
    KTMutex m_Mutex;
    KTPath m_LogFilePath;
};

/// The one logger, from library load to the end of the process.
extern KT_PUBLIC_API KTLogger *gKTLogger;

#include "KTEndExports.h"
