// WDisk.h: what the demo asks the disk: the content of a folder and the bytes of a file.
//
// Paths are KTPath values. They are handed to the system in their extended form (\\?\C:\...), so that trees deeper than
// 260 characters can be walked. Nothing here throws anything but std::bad_alloc; failures are return values.

#pragma once

#include "KTPath.h"
#include "KTTypes.h"

#include <compare>
#include <optional>
#include <string>
#include <vector>

/// One name in a folder.
struct DiskEntry {
    KTString name;
    KTUInt64 size = 0;
    bool isFolder = false;
    bool isLink = false; ///< a symbolic link or a junction, whatever it leads to
};

/// Tells one folder from another, however it was reached.
struct DiskIdentity {
    KTUInt64 volume = 0;
    KTUInt64 file = 0;
    auto operator<=>(DiskIdentity const &) const = default;
};

/// The beginning of a file.
struct DiskBytes {
    std::string bytes;
    KTUInt64 size = 0;   ///< of the whole file
    std::string problem; ///< not empty: why the file could not be read
};

/// The full path of what the user wrote: forward slashes allowed, relative to the current folder. Under Wine a path of
/// the system around it (/home/...) is found on drive Z: when no other drive has it.
KTPath DiskFullPath(KTString const &written);

/// Whether the path names a folder.
bool DiskIsFolder(KTPath const &path);

/// Nothing if the folder cannot be opened.
std::optional<DiskIdentity> DiskIdentify(KTPath const &folder);

/// The names in a folder without "." and "..", in the system's order; nothing if it cannot be listed.
std::optional<std::vector<DiskEntry>> DiskList(KTPath const &folder);

/// Reads up to `limit` bytes. What is not a plain file (a device, a pipe) is a problem, as reading it might never end.
DiskBytes DiskRead(KTPath const &file, KTUInt64 limit);

/// Creates the file if it is not there. Returns whether it is there now.
bool DiskTouch(KTPath const &file);

/// Creates the file anew with these bytes. Returns whether all of them are in it.
bool DiskWrite(KTPath const &file, std::string const &bytes);
