// OFormat.h: the run-time's printf family, the way the library needs it.
//
// The library's texts are formatted by the system run-time that its hosts use too, so that a format means the same on
// both sides of the boundary.

#pragma once

#include <cstdarg>
#include <cstddef>

/// Formats into `buffer` of `size` bytes, always zero-terminated. Returns the number of bytes written, or -1 when the
/// output was cut to size - 1 bytes. Any thread.
int OFormatTruncating(char *buffer, std::size_t size, char const *format, std::va_list values);

/// Number of bytes that the output needs, the terminating zero not counted. Any thread.
int OFormatLength(char const *format, std::va_list values);

/// Formats into `buffer` of `size` bytes, which the caller made large enough. Any thread.
int OFormatFitting(char *buffer, std::size_t size, char const *format, std::va_list values);

/// The same two for wide text, lengths and sizes in wide characters. Any thread.
int OFormatLength(wchar_t const *format, std::va_list values);
int OFormatFitting(wchar_t *buffer, std::size_t size, wchar_t const *format, std::va_list values);
