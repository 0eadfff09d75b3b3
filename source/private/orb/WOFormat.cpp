// WOFormat.cpp: formatting by the system run-time.
//
// vswprintf_s is the run-time's own function: its "%s" is a wide text, as Windows programs expect.

#include "OFormat.h"

#include <cstdio>
#include <cwchar>

int OFormatTruncating(char *buffer, std::size_t size, char const *format, std::va_list values) {
    return _vsnprintf_s(buffer, size, _TRUNCATE, format, values);
}

int OFormatLength(char const *format, std::va_list values) { return _vscprintf(format, values); }

int OFormatFitting(char *buffer, std::size_t size, char const *format, std::va_list values) {
    return vsprintf_s(buffer, size, format, values);
}

int OFormatLength(wchar_t const *format, std::va_list values) { return _vscwprintf(format, values); }

int OFormatFitting(wchar_t *buffer, std::size_t size, wchar_t const *format, std::va_list values) {
    return vswprintf_s(buffer, size, format, values);
}
