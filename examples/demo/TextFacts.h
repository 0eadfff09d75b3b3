// TextFacts.h: what there is to say about one text: counts, and whether its conversions agree.

#pragma once

#include "KTString.h"
#include "KTTypes.h"

#include <functional>

/// Facts about a text, or, added up, about several.
struct TextFacts {
    KTUInt64 units = 0;
    KTUInt64 lines = 0;          ///< LF, CR LF and CR end a line; a last line need not be ended
    KTUInt64 words = 0;          ///< runs between white space
    KTUInt64 nonAscii = 0;       ///< units above 0x7F
    KTUInt64 replacements = 0;   ///< U+FFFD
    KTUInt64 pieces = 0;         ///< parts, cut at line ends, whose conversions were tried
    KTUInt64 losslessPieces = 0; ///< those that are the same after UTF-8 and back; an unpaired surrogate is not
    KTUInt64 agreeingPieces = 0; ///< those that wide text, file-layer text and automation strings hand back unchanged

    TextFacts &operator+=(TextFacts const &other);
};

/// Counts and converts the text piece by piece, so that a huge text needs little more memory than its own. Each line,
/// without its end, is handed to `eachLine`.
TextFacts ExamineText(KTString const &text, std::function<void(KTString const &)> const &eachLine);

/// Whether numbers of every kind, written behind a text with the library's members, can be read from it again.
bool NumbersSurvive(KTUInt64 number);
