// Units.h: UTF-16 code units in tests: literals, printing, and a plain converter to compare with.

#pragma once

#include "KTString.h"

#include <cstdint>
#include <initializer_list>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

using Units = std::vector<unsigned short>;

/// The string's units.
inline Units UnitsOf(KTString const &text) { return {text.begin(), text.end()}; }

/// A string of exactly these units.
inline KTString FromUnits(Units const &units) {
    KTString text;
    text.append(units.data(), units.size());
    return text;
}

/// The plain ASCII form of a u"" literal as the library's unit pointer.
inline unsigned short const *U(char16_t const *text) { return reinterpret_cast<unsigned short const *>(text); }

/// Shows failures readably.
inline void PrintTo(KTString const &text, std::ostream *out) { *out << '"' << text.GetUTF8String() << '"'; }

/// UTF-8 decoded by the definition of maximal subparts (Unicode 15, section 3.9, table 3-7), one byte at a time.
inline Units ReferenceDecode(std::string_view bytes) {
    Units units;
    std::uint32_t value = 0;
    int needed = 0;
    unsigned lowest = 0x80;
    unsigned highest = 0xBF;
    for (std::size_t i = 0; i < bytes.size();) {
        unsigned const byte = static_cast<unsigned char>(bytes[i]);
        if (needed != 0) {
            if (byte < lowest || byte > highest) {
                units.push_back(0xFFFD); // the part so far; this byte is looked at again
                needed = 0;
                lowest = 0x80;
                highest = 0xBF;
                continue;
            }
            lowest = 0x80;
            highest = 0xBF;
            value = (value << 6) | (byte & 0x3F);
            if (--needed == 0) {
                if (value >= 0x10000) {
                    units.push_back(static_cast<unsigned short>(0xD800 + ((value - 0x10000) >> 10)));
                    units.push_back(static_cast<unsigned short>(0xDC00 + ((value - 0x10000) & 0x3FF)));
                } else {
                    units.push_back(static_cast<unsigned short>(value));
                }
            }
        } else if (byte < 0x80) {
            units.push_back(static_cast<unsigned short>(byte));
        } else if (byte >= 0xC2 && byte <= 0xDF) {
            needed = 1;
            value = byte & 0x1F;
        } else if (byte >= 0xE0 && byte <= 0xEF) {
            needed = 2;
            value = byte & 0x0F;
            lowest = byte == 0xE0 ? 0xA0 : 0x80;
            highest = byte == 0xED ? 0x9F : 0xBF;
        } else if (byte >= 0xF0 && byte <= 0xF4) {
            needed = 3;
            value = byte & 0x07;
            lowest = byte == 0xF0 ? 0x90 : 0x80;
            highest = byte == 0xF4 ? 0x8F : 0xBF;
        } else {
            units.push_back(0xFFFD);
        }
        ++i;
    }
    if (needed != 0) {
        units.push_back(0xFFFD);
    }
    return units;
}

/// UTF-16 encoded as UTF-8, one character at a time; an unpaired surrogate becomes U+FFFD.
inline std::string ReferenceEncode(Units const &units) {
    std::string bytes;
    auto const put = [&](unsigned value) { bytes.push_back(static_cast<char>(static_cast<unsigned char>(value))); };
    for (std::size_t i = 0; i < units.size(); ++i) {
        std::uint32_t point = units[i];
        bool const high = point >= 0xD800 && point <= 0xDBFF;
        if (high && i + 1 < units.size() && units[i + 1] >= 0xDC00 && units[i + 1] <= 0xDFFF) {
            point = 0x10000 + ((point - 0xD800) << 10) + (units[++i] - 0xDC00U);
        } else if (point >= 0xD800 && point <= 0xDFFF) {
            point = 0xFFFD;
        }
        if (point < 0x80) {
            put(point);
        } else if (point < 0x800) {
            put(0xC0 | (point >> 6));
            put(0x80 | (point & 0x3F));
        } else if (point < 0x10000) {
            put(0xE0 | (point >> 12));
            put(0x80 | ((point >> 6) & 0x3F));
            put(0x80 | (point & 0x3F));
        } else {
            put(0xF0 | (point >> 18));
            put(0x80 | ((point >> 12) & 0x3F));
            put(0x80 | ((point >> 6) & 0x3F));
            put(0x80 | (point & 0x3F));
        }
    }
    return bytes;
}
