// OFormat_posix.cpp: formatting by the C library for the native developer build.

#include "OFormat.h"

#include <cstdio>
#include <cwchar>
#include <vector>

int OFormatTruncating(char *buffer, std::size_t size, char const *format, std::va_list values) {
    int const length = std::vsnprintf(buffer, size, format, values);
    return length >= static_cast<int>(size) ? -1 : length;
}

int OFormatLength(char const *format, std::va_list values) { return std::vsnprintf(nullptr, 0, format, values); }

int OFormatFitting(char *buffer, std::size_t size, char const *format, std::va_list values) {
    return std::vsnprintf(buffer, size, format, values);
}

int OFormatLength(wchar_t const *format, std::va_list values) {
    // The C library does not count wide text: try growing buffers.
    for (std::size_t size = 256;; size *= 2) {
        std::vector<wchar_t> buffer(size);
        std::va_list attempt;
        va_copy(attempt, values);
        int const length = std::vswprintf(buffer.data(), size, format, attempt);
        va_end(attempt);
        if (length >= 0 || size > (1U << 24)) {
            return length;
        }
    }
}

int OFormatFitting(wchar_t *buffer, std::size_t size, wchar_t const *format, std::va_list values) {
    return std::vswprintf(buffer, size, format, values);
}
