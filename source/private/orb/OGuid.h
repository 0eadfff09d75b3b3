// OGuid.h: new globally unique identifiers from the system.

#pragma once

#include <array>

/// What became of a new identifier.
enum class OGuidResult {
    kMade,         ///< it was made and written
    kNotGenerated, ///< the system could not make one
    kNotWritten,   ///< the system made one but could not write it as text
};

/// An identifier's text and the zero behind it.
using OGuidText = std::array<unsigned short, 36 + 1>;

/// Makes an identifier and writes it to `text` as the system does: hexadecimal groups of 8, 4, 4, 4 and 12 digits joined
/// by hyphens. `text` is left alone unless the result is kMade. Throws nothing. Any thread.
OGuidResult OMakeGuid(OGuidText &text);
