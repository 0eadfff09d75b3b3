// KTLogText.h: what the loggers of every platform do with a message before it is written.

#pragma once

#include "KTTypes.h"
#include "OFormat.h"

#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <cwchar>
#include <memory>
#include <string>

/// The number before a line: the processor clock divided and multiplied by 1000 as a double and cut to an integer, so
/// that a reading such as 1001 may show as one less.
KTInt64 KTLogMilliseconds(std::clock_t clock);

inline char const *KTFindPerCent(char const *format) { return std::strchr(format, '%'); }
inline wchar_t const *KTFindPerCent(wchar_t const *format) { return std::wcschr(format, L'%'); }

/// The text of a variadic log call: formatted into a block of just the size that the run-time counts, or the format
/// itself when it holds no per cent sign. A null format becomes what the run-time makes of a null text.
template <typename Char> std::basic_string<Char> KTFormatLogText(Char const *format, std::va_list values) {
    if (format == nullptr) {
        return {'(', 'n', 'u', 'l', 'l', ')'};
    }
    if (KTFindPerCent(format) == nullptr) {
        return format;
    }
    std::va_list counted;
    va_copy(counted, values);
    int const length = OFormatLength(format, counted);
    va_end(counted);
    if (length < 0) {
        return {}; // the run-time cannot format this at all
    }
    std::size_t const size = static_cast<std::size_t>(length) + 1;
    std::unique_ptr<Char, decltype(&std::free)> const block(static_cast<Char *>(std::malloc(size * sizeof(Char))),
                                                            &std::free);
    OFormatFitting(block.get(), size, format, values);
    return block.get();
}

/// The low byte of each wide character.
std::string KTNarrowToLowBytes(std::wstring const &message);

/// One unit for each byte, sign-extended.
std::wstring KTWidenSigned(std::string const &message);
