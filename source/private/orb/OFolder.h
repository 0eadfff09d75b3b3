// OFolder.h: making, listing and deleting folders, and what the system tells about the disks under them. Any thread;
// nothing is thrown but std::bad_alloc.

#pragma once

#include "KTString.h"
#include "OFileSystem.h"

#include <vector>

/// What a listing takes.
struct OListing {
    bool recursive = false; ///< also what is in the folders below; links to folders are not entered
    bool all = true;        ///< every file; else those with the extension only
    KTUnits extension;      ///< with its dot, in lower case
};

/// Creates a folder, with `parents` also those on the way that are missing. AlreadyExists if anything is there; a
/// folder that is there is no error with `parents`.
OError OMakeFolder(OPath const &path, bool parents);

/// Appends the files of a folder to `names`, in the system's order: names, or with `recursive` paths from the folder
/// on. What can be read is appended even if a folder below cannot; the first such failure is returned.
OError OListFolder(OPath const &folder, OListing const &wanted, std::vector<KTString> &names);

/// Deletes a folder and all in it, read-only files included. Of a link, the link alone is deleted, and no folder can
/// be exchanged for a link while it is emptied. Goes on after a failure and returns the first.
OError ODeleteFolder(OPath const &folder);

/// Bytes that the user may still write to the disk that holds the path, or would hold it. 0 if it cannot be told.
std::uint64_t OGetFreeSpace(OPath const &path);

/// Whether the path lies on a share, also when the share has a drive letter.
bool OIsOnServer(OPath const &path);
