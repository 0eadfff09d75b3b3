// OFileSystem.h: where the file layer asks the operating system about one file or folder.
//
// Paths are what users write; OLongPath.h says which forms there are. All functions may be called on any thread; none
// throws anything but std::bad_alloc.

#pragma once

#include "OFile.h"

#include <cstdint>

/// What became of a request.
enum class OError : int {
    None = 0,
    Failed,        ///< none of the reasons below
    NotFound,      ///< nothing is there, or a folder on the way is missing
    InvalidName,   ///< the path is empty, too long, or has a name that Windows cannot hold
    NotAFolder,    ///< a file stands where a folder is needed
    IsAFolder,     ///< a folder stands where a file is needed
    AlreadyExists, ///< something is there that must not be replaced
    AccessDenied,  ///< no permission, or the file is read-only
    InUse,         ///< another handle keeps the file from being opened so
    DiskFull,      ///< no room, or the quota is used up
    NotReady,      ///< the drive or the share is gone
    NotEmpty,      ///< the folder has something in it
    NoApplication  ///< no program is registered for the file's type
};

/// What the system tells about a file in one question. Times count 100 ns since 1601, UTC; 0 is unknown.
struct OFileFacts {
    bool isFolder = false;
    bool isLink = false; ///< a symbolic link or a junction, whatever it leads to
    bool isReadOnly = false;
    std::uint64_t size = 0; ///< in bytes; 0 for a folder
    std::uint64_t created = 0;
    std::uint64_t modified = 0;
    std::uint64_t accessed = 0;
};

/// Whether the path can be handed to the system; nothing is looked up.
bool OIsValidPath(OPath const &path);

/// The full path as OMakeFullPath gives it; empty if the path is not valid.
OPath OGetFullPath(OPath const &path);

/// Whether a file or folder is there.
bool OExists(OPath const &path);

/// Fills `facts`; leaves them alone on failure.
OError OGetFacts(OPath const &path, OFileFacts &facts);

/// None if a folder is there, NotAFolder for a file, else what the question failed of.
OError OCheckFolder(OPath const &path);

/// Creates an empty file. One that is there is emptied if `replace` says so, else it stays: AlreadyExists.
OError OMakeFile(OPath const &path, bool replace);

/// Sets the times of the last change and the last access to now.
OError OTouch(OPath const &path);

/// Deletes a file, also a read-only one, a link (never what it leads to), or an empty folder.
OError ODelete(OPath const &path);

/// Replaces the path of a shell link by that of its target, through several links if they follow one another. A path
/// without the extension ".lnk" stays as it is.
OError OResolveAlias(OPath &path);

/// Whether the file could be opened so at this moment.
OError OTryOpen(OPath const &path, OFile::AccessMode access, OFile::ShareMode share);
