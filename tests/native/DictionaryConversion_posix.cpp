// DictionaryConversion_posix.cpp: an ANSI code page for the native developer build: Latin-1, one unit for each byte.

#include "DictionaryConversion.h"

namespace orvik_private {

std::int64_t AnsiToUnits(std::string_view bytes, unsigned short *units, std::size_t capacity) {
    if (bytes.size() <= capacity) {
        for (char const byte : bytes) {
            *units++ = static_cast<unsigned char>(byte);
        }
    }
    return static_cast<std::int64_t>(bytes.size());
}

bool UnitsToAnsi(UnitsView units, std::string &bytes, bool *lossy) {
    for (unsigned short const unit : units) {
        bytes.push_back(unit < 0x100 ? static_cast<char>(unit) : '?');
        if (unit >= 0x100 && lossy != nullptr) {
            *lossy = true;
        }
    }
    return true;
}

} // namespace orvik_private
