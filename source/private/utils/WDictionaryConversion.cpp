// WDictionaryConversion.cpp: the ANSI code page of the system.

#include "DictionaryConversion.h"

#include <windows.h>

namespace orvik_private {

std::int64_t AnsiToUnits(std::string_view bytes, unsigned short *units, std::size_t capacity) {
    if (bytes.empty()) {
        return 0;
    }
    char const *const text = bytes.data();
    int const size = static_cast<int>(bytes.size());
    int const count = MultiByteToWideChar(CP_ACP, 0, text, size, nullptr, 0);
    if (count == 0) {
        return -1;
    }
    if (static_cast<std::size_t>(count) > capacity) {
        return count;
    }
    return MultiByteToWideChar(CP_ACP, 0, text, size, reinterpret_cast<wchar_t *>(units), count) == count ? count : -1;
}

bool UnitsToAnsi(UnitsView units, std::string &bytes, bool *lossy) {
    if (units.empty()) {
        return true;
    }
    auto const *const text = reinterpret_cast<wchar_t const *>(units.data());
    int const size = static_cast<int>(units.size());
    // Best fits (a plain quotation mark for a typographic one) are losses, too. A code page that is UTF-8 knows neither
    // the flag nor the question.
    bool const isUtf8 = GetACP() == CP_UTF8;
    DWORD const flags = isUtf8 ? 0 : WC_NO_BEST_FIT_CHARS;
    BOOL usedDefault = FALSE;
    BOOL *const question = isUtf8 ? nullptr : &usedDefault;
    int const count = WideCharToMultiByte(CP_ACP, flags, text, size, nullptr, 0, nullptr, nullptr);
    if (count <= 0) {
        return false;
    }
    std::size_t const before = bytes.size();
    bytes.resize(before + static_cast<std::size_t>(count));
    if (WideCharToMultiByte(CP_ACP, flags, text, size, bytes.data() + before, count, nullptr, question) != count) {
        return false;
    }
    if (usedDefault != FALSE && lossy != nullptr) {
        *lossy = true;
    }
    return true;
}

} // namespace orvik_private
