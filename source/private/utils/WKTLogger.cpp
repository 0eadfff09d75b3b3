// WKTLogger.cpp: the logger on Windows: the file line, then the debugger output.

#include "WKTLogger.h"

#include "KTLogText.h"
#include "WODebugOutput.h"

#include <cstdarg>
#include <new>

KTLogger *gKTLogger = nullptr;

KTLoggerCreator WKTLogger::creator;

KTLoggerCreator::KTLoggerCreator() { gKTLogger = new (std::nothrow) WKTLogger; }

WKTLogger::WKTLogger() = default;

WKTLogger::~WKTLogger() = default;

void WKTLogger::Log(std::string const &message) {
    if (!IsLogEnabled()) {
        return;
    }
    KTLogger::Log(message);
    if (WOIsDebugOutputWatched()) {
        WODebugOutput(KTWidenSigned(message));
    }
}

void WKTLogger::Log(std::wstring const &message) {
    if (!IsLogEnabled()) {
        return;
    }
    KTLogger::Log(KTNarrowToLowBytes(message));
    if (WOIsDebugOutputWatched()) {
        WODebugOutput(message);
    }
}

void WKTLogger::Log(wchar_t const *const format, ...) {
    if (!IsLogEnabled()) {
        return;
    }
    std::va_list values;
    va_start(values, format);
    std::wstring const message = KTFormatLogText(format, values);
    va_end(values);
    Log(message);
}
