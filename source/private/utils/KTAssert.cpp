// KTAssert.cpp: assertion reports and the two message formatters.

#include "KTAssert.h"

#include "KTLogger.h"
#include "OFormat.h"

#include <cstdarg>
#include <cstddef>

namespace {

constexpr std::size_t kShortSize = 2048;
constexpr KTUInt32 kGrowthStep = 4096;
constexpr KTUInt32 kLastSizeToGrow = 4'096'000;

char g_ShortBuffer[kShortSize];

// Never freed: formatted texts may be wanted until the last moment of the process. The size only grows.
char *g_GrowableBuffer = nullptr;
KTUInt32 g_GrowableSize = 0;

KTBibAddressProc g_BibAddressProc = nullptr;

// Replaces the growable buffer; its text is lost. Leaves none behind if memory is short.
void AllocateGrowableBuffer(KTUInt32 size) {
    delete[] g_GrowableBuffer;
    g_GrowableBuffer = nullptr;
    g_GrowableSize = size;
    g_GrowableBuffer = new char[size];
}

// Formats into the growable buffer, growing it step by step. A format that expands to nothing makes the run-time answer
// 0, which is tried again without end: callers rely on a text coming back, so this stays as it is.
void FormatGrowing(char const *format, std::va_list values) {
    if (g_GrowableBuffer == nullptr) {
        AllocateGrowableBuffer(kGrowthStep);
    }
    for (;;) {
        std::va_list attempt;
        va_copy(attempt, values);
        int const written = OFormatTruncating(g_GrowableBuffer, g_GrowableSize, format, attempt);
        va_end(attempt);
        if (written > 0) {
            return;
        }
        if (written == -1) {
            if (g_GrowableSize > kLastSizeToGrow) {
                KTAssertFailed("Buffer not sufficient", "source/private/utils/KTAssert", 141);
                return;
            }
            AllocateGrowableBuffer(g_GrowableSize + kGrowthStep);
        }
    }
}

} // namespace

void KTAssertFailed(char const *message, char const *path, KTInt32 line) {
    KTLogger *const logger = gKTLogger;
    if (!logger->IsLogEnabled()) {
        return;
    }
    if (message != nullptr) {
        logger->Log("Assert failed: %s at %s:%d", message, path, line);
    } else {
        logger->Log("Assert failed at %s:%d", path, line);
    }
}

void KTAssertFail(char const *, ...) {}

char *FORMAT_ARGS(char const *format, ...) {
    if (format == nullptr) {
        g_ShortBuffer[0] = 0;
        return g_ShortBuffer;
    }
    std::va_list values;
    va_start(values, format);
    OFormatTruncating(g_ShortBuffer, kShortSize, format, values);
    va_end(values);
    return g_ShortBuffer;
}

KTString FORMAT_ARGS2(char const *format, ...) {
    if (format == nullptr) {
        return {};
    }
    std::va_list values;
    va_start(values, format);
    try {
        FormatGrowing(format, values);
    } catch (...) {
        va_end(values);
        throw;
    }
    va_end(values);
    return KTString(OString::FromUTF8(g_GrowableBuffer));
}

bool const IsAssertsEnabled() { return false; }

void EnableAsserts(bool) {}

KTString const GetAssertionLogPath() { return {}; }

void SetAssertionLogPath(KTString const &) {}

void InitializeDefaultAssertionPath() {}

KTErrorCodeEnum SetKTBibAddressProc(KTBibAddressProc proc) {
    g_BibAddressProc = proc;
    return kKTErrorNone;
}

KTBibAddressProc GetKTBibAddressProc() { return g_BibAddressProc; }
