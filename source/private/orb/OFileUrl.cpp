// OFileUrl.cpp: taking a file URL apart.

#include "OFileUrl.h"

#include "OUtf.h"

#include <string>

namespace {

constexpr std::string_view kScheme = "file:";

unsigned short Lower(unsigned short unit) noexcept {
    return unit >= 'A' && unit <= 'Z' ? static_cast<unsigned short>(unit - 'A' + 'a') : unit;
}

bool BeginsWith(OUnitsView text, std::string_view lower) noexcept {
    if (text.size() < lower.size()) {
        return false;
    }
    for (std::size_t i = 0; i < lower.size(); ++i) {
        if (Lower(text[i]) != static_cast<unsigned char>(lower[i])) {
            return false;
        }
    }
    return true;
}

int HexValue(unsigned short unit) noexcept {
    if (unit >= '0' && unit <= '9') {
        return unit - '0';
    }
    unsigned short const lower = Lower(unit);
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : -1;
}

// The byte that "%XX" at the beginning of the text stands for, or -1.
int EscapedByte(OUnitsView text) noexcept {
    if (text.size() < 3 || text[0] != '%' || HexValue(text[1]) < 0 || HexValue(text[2]) < 0) {
        return -1;
    }
    return HexValue(text[1]) * 16 + HexValue(text[2]);
}

// Escapes that follow one another are bytes of the same characters, so they are collected and decoded together.
std::optional<KTUnits> DecodeEscapes(OUnitsView text) {
    KTUnits decoded;
    while (!text.empty()) {
        std::string bytes;
        for (int byte = EscapedByte(text); byte >= 0; byte = EscapedByte(text)) {
            if (byte == 0 || byte == '/' || byte == '\\') {
                return std::nullopt;
            }
            bytes.push_back(static_cast<char>(byte));
            text.remove_prefix(3);
        }
        if (bytes.empty()) {
            decoded.push_back(text.front());
            text.remove_prefix(1);
            continue;
        }
        KTUnits const units = OUtf8ToUnits(bytes);
        if (OUnitsToUtf8(units.data(), units.size()) != bytes) {
            return std::nullopt;
        }
        decoded.append(units);
    }
    return decoded;
}

} // namespace

bool OIsFileUrl(OUnitsView text) noexcept { return BeginsWith(text, kScheme); }

std::optional<KTUnits> OReadFileUrl(OUnitsView text) {
    text.remove_prefix(kScheme.size());
    bool isShare = BeginsWith(text, "//");
    if (isShare) {
        OUnitsView const authority = text.substr(2, text.substr(2).find('/'));
        if (authority.empty() || (authority.size() == 9 && BeginsWith(authority, "localhost"))) {
            text.remove_prefix(2 + authority.size());
            isShare = false;
        }
    }
    if (text.empty() || text[0] != '/') {
        return std::nullopt;
    }
    std::optional<KTUnits> path = DecodeEscapes(text);
    if (!path) {
        return std::nullopt;
    }
    // "/C:/a" is "C:/a"; "/C|/a" is the old way to write it.
    if (!isShare && path->size() >= 3 && ((*path)[2] == ':' || (*path)[2] == '|')) {
        (*path)[2] = ':';
        path->erase(0, 1);
    }
    for (unsigned short &unit : *path) {
        unit = unit == '/' ? static_cast<unsigned short>('\\') : unit;
    }
    return path;
}
