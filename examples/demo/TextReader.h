// TextReader.h: from the bytes of a file to a KTString, by the encoding the bytes seem to be in.
//
//     FF FE           UTF-16, low byte first
//     FE FF           UTF-16, high byte first
//     EF BB BF        UTF-8
//     no mark         UTF-16 if nearly every other byte is zero, else UTF-8, else single bytes
//
// Nothing fails: what cannot be decoded becomes U+FFFD, and notes say what was odd.

#pragma once

#include "KTString.h"

#include <string>
#include <vector>

/// A file's text.
struct DecodedText {
    KTString text; ///< without the byte order mark
    std::string encoding;
    std::vector<std::string> notes;
};

/// Decodes a file's bytes. When they are only the beginning of the file (`isCut`), a character that the cut broke is
/// left out.
DecodedText DecodeText(std::string bytes, bool isCut);
