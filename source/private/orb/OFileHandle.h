// OFileHandle.h: the system's calls on open files, one function for one call.
//
// The seam below the file transport: what is read ahead, gathered or asked for in pieces is decided above it. Each call
// works on the handle's own position. Nothing throws; one handle belongs to one thread at a time.

#pragma once

#include "OPath.h"

#include <cstdint>

/// The system's handle; null and the system's invalid handle name no file, and every call fails on them.
using OFileHandle = void *;

/// What a file is opened for; values may be combined, and none is one of them.
enum OOpenAccess : unsigned int { kOAccessNone = 0, kOAccessRead = 1, kOAccessWrite = 2 };

/// What becomes of a file that is there or is not.
enum class ODisposition {
    CreateAlways,    ///< created, or emptied if it is there
    OpenExisting,    ///< must be there
    OpenAlways,      ///< opened, or created if it is missing
    TruncateExisting ///< must be there, and is emptied
};

/// Where a distance counts from.
enum class OMoveFrom { Beginning, Current, End };

/// How a call that moves bytes ended: whether the system reports success, and how many bytes it moved.
struct OTransfer {
    bool succeeded;
    std::uint32_t bytes;
};

/// Opens a file that others may read meanwhile. `flags` are the system's flags and attributes (CreateFileW). Returns the
/// system's invalid handle, and false from OIsOpen, if the path is not valid, memory is short, or the system refuses.
OFileHandle OOpenFile(OPath const &path, unsigned int access, ODisposition disposition, unsigned int flags);
bool OIsOpen(OFileHandle handle) noexcept;

/// Closes the file; false if the system refuses.
bool OCloseFile(OFileHandle handle) noexcept;

/// Reads or writes at the handle's position and moves it on. At the end of the file reading succeeds with 0 bytes.
OTransfer OReadFile(OFileHandle handle, void *buffer, std::uint32_t count) noexcept;
OTransfer OWriteFile(OFileHandle handle, void const *buffer, std::uint32_t count) noexcept;

/// Moves the handle's position; `distance` 0 from the current one asks for it. Places behind the end are allowed. False,
/// and no move, for a place before the beginning or one of 4 GiB and more.
bool OMoveFilePointer(OFileHandle handle, std::int64_t distance, OMoveFrom from, std::uint32_t &position) noexcept;

/// Bytes in the file; false if the system does not tell.
bool OGetOpenFileSize(OFileHandle handle, std::uint64_t &size) noexcept;

/// Ends the file at the handle's position; false if the system refuses.
bool OSetEndOfFile(OFileHandle handle) noexcept;
