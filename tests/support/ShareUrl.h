// ShareUrl.h: a plain reader of share URLs, byte by byte, to compare the library's with.

#pragma once

#include "Units.h"

#include <cstddef>
#include <string>
#include <vector>

/// The parts of a URL; `found` tells how far it was read.
struct ShareUrlParts {
    bool found = false;
    std::string scheme;
    KTString authority;
    KTString share;
    KTString path;
};

/// Reads the URL by the rule that each part ends with its slash.
inline ShareUrlParts ReferenceShareUrl(KTString const &url) {
    ShareUrlParts parts;
    Units const units = UnitsOf(url);
    std::size_t position = 0;
    for (std::string const prefix : {"file://///", "file://localhost///", "smb://"}) {
        bool same = units.size() > prefix.size() && units[prefix.size()] != 0;
        for (std::size_t i = 0; same && i < prefix.size(); ++i) {
            same = units[i] == static_cast<unsigned char>(prefix[i]);
        }
        if (same) {
            position = prefix.size();
            break;
        }
    }
    if (position == 0) {
        return parts;
    }
    parts.scheme = "smb";
    for (KTString *const part : {&parts.authority, &parts.share}) {
        std::size_t end = position;
        while (end < units.size() && units[end] != '/') {
            ++end;
        }
        if (end == position || end == units.size()) {
            return parts;
        }
        *part = FromUnits(Units(units.begin() + static_cast<std::ptrdiff_t>(position),
                                units.begin() + static_cast<std::ptrdiff_t>(end)));
        position = end + 1;
    }
    parts.found = true;
    if (units.size() - position > 1) {
        parts.path = FromUnits(Units(units.begin() + static_cast<std::ptrdiff_t>(position), units.end()));
    }
    return parts;
}
