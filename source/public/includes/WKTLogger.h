// WKTLogger.h: the logger on Windows, which copies each line to the debugger output.
//
// The debugger gets the message, then a line feed, in two calls: bytes are widened one to one with their sign (0xE9
// becomes the unit 0xFFE9), wide text goes out unchanged. The calls are made when a debugger is attached to the process
// or a system-wide monitor of debugger output is running; the monitor is looked for at most ten times a second, as
// asking costs a hundred times as much as writing the line.

#pragma once

#include "KTLogger.h"

#include "KTBeginExports.h"

struct KTLoggerCreator;

/// The logger that gKTLogger points to on Windows.
class KT_PUBLIC_API WKTLogger : public KTLogger {
  public:
    /// Opens the log file and empties it.
    WKTLogger();

    void Log(std::wstring const &message) override;
    void Log(wchar_t const *const format, ...) override;
    void Log(std::string const &message) override;
    using KTLogger::Log;
    ~WKTLogger() override;

    /// Creates the process-wide logger when the library is loaded.
    static KTLoggerCreator creator;
};

/// Stores a new WKTLogger in gKTLogger; null if there is no memory for it.
struct KT_PUBLIC_API KTLoggerCreator {
    KTLoggerCreator();
};

#include "KTEndExports.h"
