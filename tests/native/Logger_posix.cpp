// Logger_posix.cpp: the process-wide logger of the native developer build: the file alone, as there is no debugger
// output to copy to.

#include "KTLogger.h"
#include "KTLogText.h"

#include <cstdarg>

namespace {

class NativeLogger : public KTLogger {
  public:
    void Log(std::wstring const &message) override {
        if (IsLogEnabled()) {
            KTLogger::Log(KTNarrowToLowBytes(message));
        }
    }

    void Log(wchar_t const *const format, ...) override {
        if (!IsLogEnabled()) {
            return;
        }
        std::va_list values;
        va_start(values, format);
        std::wstring const message = KTFormatLogText(format, values);
        va_end(values);
        Log(message);
    }

    using KTLogger::Log;
};

} // namespace

KTLogger *gKTLogger = new NativeLogger;
