// KTSimpleIniFileReader.h: settings by section and name, as the product's settings files hold them.
//
//     ; how the course is shown            a comment
//     Zoom=1.5                             a variable of the section without a name
//     [Player]                             a section
//     Width=1024                           a variable: the name up to the first "=", the value behind it
//
//     KTSimpleIniFileReader settings(path);
//     int width = 800;
//     settings.GetIntValForVariable("Player", "Width", width);
//
// The file is UTF-16, low byte first, if it begins with FF FE; otherwise each line is UTF-8 if it is well-formed UTF-8,
// else text in the system's ANSI code page. EF BB BF at the beginning is no text. The rules are the same for all:
//
// - A line ends at LF; the last one need not be ended. Each CR is dropped. Spaces and tabs at the start of a line are
//   dropped, all others are kept: those around "=" and at the end of the line belong to the name and the value.
// - Lines of fewer than two units, lines that begin with ";" (not "#") and lines without "=" are nothing.
// - A line that begins with "[" and has a "]" begins a section: its name is the line without the first of each, so
//   "[a]b" begins "ab". A section that is there already is emptied. Without "]" the line is nothing.
// - Any other line is a variable. The name has one unit at least: "==b" has the name "=", and "=x" none, which is reported
//   as an assertion, and nothing is stored. A name that its section already has is reported as an assertion, and the new
//   value replaces the old.
// - The file is taken in chunks of 1,024 bytes from its beginning, or of 1,024 units from behind FF FE. A zero, byte or
//   unit, drops the rest of its chunk; the line goes on in the next.
// - A byte left over at the end of a UTF-16 file is dropped.
//
// Names are compared unit by unit, with their case.

#pragma once

#include "KTString.h"

#include <memory>

class SettingsTable;

#include "KTBeginExports.h"

/// A loaded settings file. Any number of threads may query one; only one thread at a time may make readers, as the name
/// of the section that is being read is one for the whole process.
class KT_PUBLIC_API KTSimpleIniFileReader {
  public:
    /// Loads the file. If it cannot be opened, there are no variables. The same if reading it fails, which is reported as
    /// an assertion: half of the settings would pass for all of them. Needs memory in proportion to the file. Throws
    /// std::bad_alloc.
    explicit KTSimpleIniFileReader(KTString const &path);

    KTSimpleIniFileReader(KTSimpleIniFileReader const &) = delete;
    KTSimpleIniFileReader &operator=(KTSimpleIniFileReader const &) = delete;
    ~KTSimpleIniFileReader();

    // Each query returns whether the section has the variable; if not, `value` stays as it is.

    /// The value as it is written. Throws std::bad_alloc.
    bool GetStringValForVariable(KTString const &section, KTString const &variable, KTString &value);

    /// True for "true", as it stands here; false for every other value, an empty one included.
    bool GetBoolValForVariable(KTString const &section, KTString const &variable, bool &value);

    // Numbers are read as `std::istringstream(the value in UTF-8) >> value` does: decimal, behind white space, to the
    // first character that does not belong to the number. So "1e5" and "0x1A" are the integers 1 and 0, a number out of
    // range gives the nearest limit ("-1" is 4294967295 without a sign), a text that begins with no number gives 0, and
    // one with nothing but white space leaves `value` as it is. The result tells that the variable is there, not that it
    // is a number. Throw std::bad_alloc.

    bool GetIntValForVariable(KTString const &section, KTString const &variable, int &value);
    bool GetUIntValForVariable(KTString const &section, KTString const &variable, unsigned int &value);
    bool GetDoubleValForVariable(KTString const &section, KTString const &variable, double &value);

  private:
    // Whether the file could be opened, whatever is in it.
    bool LoadFile(KTString const &path);

    std::unique_ptr<SettingsTable> m_Table;
};

#include "KTEndExports.h"
