// KTClosedCaptionFileReader.h: caption files as rows of fields, such as
//
//     00:01.0 <tab> 00:04.5 <tab> Welcome to the harbour.
//
// The file is UTF-16, low byte first, if it begins with FF FE; otherwise each line is UTF-8 if it is well-formed UTF-8,
// else text in the system's ANSI code page, so that files of older recorders read as well. EF BB BF at the beginning is
// no text, and a byte left over at the end of a UTF-16 file is dropped.
//
// A line ends at LF; the last one need not be ended. Each CR, and spaces and tabs at the start of a line, are dropped.
// Lines of fewer than three UTF-16 units are nothing, whatever bytes they were made of. A zero is a character of the text.

#pragma once

#include "KTString.h"

#include <vector>

#include "KTBeginExports.h"

/// Reads caption files. It holds nothing: any thread, any number at a time.
class KT_PUBLIC_API KTClosedCaptionFileReader {
  public:
    /// A row of fields for each line, which is first trimmed of spaces and tabs at both ends:
    ///
    ///     splitMode 3    words: split at spaces and tabs, however many there are; no field is empty
    ///     splitMode 4    columns: split at each tab, so fields may hold spaces, and two tabs have an empty field between
    ///     any other      not split: the whole line is the row's one field
    ///
    /// Empty if the file cannot be opened; also if reading it fails, which is reported as an assertion: captions that
    /// stop in the middle would pass for all of them. Needs memory in proportion to the file. Throws std::bad_alloc.
    std::vector<std::vector<KTString>> GetLinesFromFile(KTString const &path, unsigned int const &splitMode);
};

#include "KTEndExports.h"
