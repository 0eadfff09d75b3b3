// Show.cpp: escapes for people's eyes.

#include "Show.h"

#include "OUtf.h"

using orvik_private::UnitsView;

namespace {

constexpr char kDigits[] = "0123456789ABCDEF";

bool IsHigh(unsigned short unit) noexcept { return unit >= 0xD800 && unit < 0xDC00; }
bool IsLow(unsigned short unit) noexcept { return unit >= 0xDC00 && unit < 0xE000; }

// Units of the character at a place: 2 for a surrogate pair, 0 for half of one.
std::size_t CharacterAt(UnitsView text, std::size_t at) noexcept {
    if (IsHigh(text[at])) {
        return at + 1 < text.size() && IsLow(text[at + 1]) ? 2 : 0;
    }
    return IsLow(text[at]) ? 0 : 1;
}

void AppendNumber(std::string &line, char letter, unsigned value, int digits) {
    line += '\\';
    line += letter;
    for (int shift = 4 * (digits - 1); shift >= 0; shift -= 4) {
        line += kDigits[value >> shift & 0xFU];
    }
}

bool IsHidden(unsigned short unit) noexcept {
    return unit < 0x20 || (unit >= 0x7F && unit < 0xA0) || unit == 0x2028 || unit == 0x2029 || unit == 0xFEFF;
}

void AppendHidden(std::string &line, unsigned short unit) {
    switch (unit) {
    case '\n':
        line += "\\n";
        break;
    case '\r':
        line += "\\r";
        break;
    case '\t':
        line += "\\t";
        break;
    default:
        AppendNumber(line, 'u', unit, 4);
    }
}

} // namespace

void AppendText(std::string &line, UnitsView text) {
    std::size_t plain = 0; // where the run of units begins that need no escape
    auto const flush = [&](std::size_t end) {
        if (end != plain) {
            line += OUnitsToUtf8(text.data() + plain, end - plain);
        }
    };
    for (std::size_t at = 0; at < text.size();) {
        std::size_t const length = CharacterAt(text, at);
        if (length != 0 && !IsHidden(text[at]) && text[at] != '\\') {
            at += length;
            continue;
        }
        flush(at);
        if (text[at] == '\\') {
            line += "\\\\";
        } else {
            AppendHidden(line, text[at]);
        }
        plain = ++at;
    }
    flush(text.size());
}

void AppendKey(std::string &line, std::string_view key) {
    std::string shown;
    if (IsUtf8(key)) {
        AppendText(shown, OUtf8ToUnits(key));
    } else {
        for (char const byte : key) {
            unsigned char const value = static_cast<unsigned char>(byte);
            unsigned short const unit = value;
            if (value < 0x80) {
                AppendText(shown, UnitsView(&unit, 1));
            } else {
                AppendNumber(shown, 'x', value, 2);
            }
        }
    }
    for (char const byte : shown) {
        if (byte == '=') {
            line += "\\u003D";
        } else {
            line += byte;
        }
    }
}

std::string ShowText(UnitsView text) {
    std::string line;
    AppendText(line, text);
    return line;
}

std::string ShowKey(std::string_view key) {
    std::string line;
    AppendKey(line, key);
    return line;
}

std::string ShowBeginning(UnitsView text) {
    constexpr std::size_t kMost = 60;
    if (text.size() <= kMost) {
        return ShowText(text);
    }
    return ShowText(text.substr(0, IsHigh(text[kMost - 1]) ? kMost - 1 : kMost)) + "...";
}

bool IsUtf8(std::string_view bytes) {
    bool isAscii = true;
    for (char const byte : bytes) {
        isAscii = isAscii && static_cast<unsigned char>(byte) < 0x80;
    }
    if (isAscii) {
        return true;
    }
    KTUnits const units = OUtf8ToUnits(bytes);
    return OUnitsToUtf8(units.data(), units.size()) == bytes;
}

bool IsUtf16(UnitsView text) noexcept {
    for (std::size_t at = 0; at < text.size();) {
        std::size_t const length = CharacterAt(text, at);
        if (length == 0) {
            return false;
        }
        at += length;
    }
    return true;
}
