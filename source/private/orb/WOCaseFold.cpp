// WOCaseFold.cpp: lower case by the system's language-neutral tables.

#include "OCaseFold.h"

#include <windows.h>

#include <algorithm>

KTUnits OFoldCase(KTUnits const &text) {
    // The mapping keeps the length, and its count is an int: longer text goes in pieces.
    constexpr std::size_t kPiece = 1U << 20;
    KTUnits folded = text;
    for (std::size_t at = 0; at < folded.size(); at += kPiece) {
        auto const count = static_cast<int>(std::min(kPiece, folded.size() - at));
        LCMapStringEx(LOCALE_NAME_INVARIANT, LCMAP_LOWERCASE, reinterpret_cast<wchar_t const *>(text.data() + at),
                      count, reinterpret_cast<wchar_t *>(folded.data() + at), count, nullptr, nullptr, 0);
    }
    return folded;
}
