// OLongPath.h: the one place that turns the text of a path into the full name that the system is called with.
//
// Everything a user or a program may write is understood:
//
//     C:\a\b    C:/a/b/    C:\a\.\c\..\b       a full path; "." and ".." are worked out as text
//     \a\b      a\b        C:b                 relative to the current drive or folder
//     \\server\share\b     //server/share/b    a share
//     \\?\C:\a  \\?\UNC\server\share  \\?\Volume{...}\a
//     file:///C:/a%20b     file://server/share/b
//
// The result has back slashes, no separator at its end (but "C:\"), and names that Windows can hold. A path with another
// name is refused as a whole, never altered: what was written would not be what is found.
//
// The system's own normalisation is left out of this on purpose: it cuts trailing dots and blanks, sends "nul.txt" to a
// device and ends at 260 characters.

#pragma once

#include "KTUnitTraits.h"

#include <optional>
#include <string_view>

/// Units of a path that somebody else owns.
using OUnitsView = std::basic_string_view<unsigned short, KTUnitTraits>;

/// Where relative paths begin.
class OCurrentFolders {
  public:
    OCurrentFolders() = default;
    OCurrentFolders(OCurrentFolders const &) = delete;
    OCurrentFolders &operator=(OCurrentFolders const &) = delete;
    virtual ~OCurrentFolders() = default;

    /// The full path of the current folder, or of the current folder on the drive with that letter when it is not 0.
    /// Empty if there is none.
    virtual KTUnits Get(unsigned short drive) const = 0;
};

/// Longest full path in units; the system's own limit less its prefix.
constexpr std::size_t kOLongestPath = 32'700;

/// Whether a file or folder may have this name: not empty, at most 255 units, no control character and none of
/// <>:"/\|?*, no dot or blank at the end, and no device (CON, NUL, COM1, ..., with or without an extension). Unpaired
/// surrogates may stand in it. Any thread.
bool OIsValidName(OUnitsView name) noexcept;

/// Whether the text is a full path on a drive already, spelled as OMakeFullPath would give it. Any thread.
bool OIsPlainFullPath(OUnitsView path) noexcept;

/// The full path, or nothing if the text is empty or too long or names something that Windows cannot hold. Any thread.
std::optional<KTUnits> OMakeFullPath(OUnitsView path, OCurrentFolders const &current);
