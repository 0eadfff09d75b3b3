// OCopy.h: copying and moving, whole or not at all.
//
// Nobody ever sees half a file under the target's name: content is first copied to a unique name in the target's folder,
// "~kt-" and a number, and takes the target's place by renaming. A process that is ended on the way leaves that file.
// Any thread; nothing is thrown but std::bad_alloc.

#pragma once

#include "OFileSystem.h"

/// Copies a file with its times and attributes. A target that is there is replaced only if `replace` says so; a folder
/// or a read-only file never is.
OError OCopyFile(OPath const &from, OPath const &to, bool replace);

/// Copies a folder and all below it to a path where nothing is. Links to folders are left out, links to files become
/// the files they lead to. Failed if the target lies in the folder, whatever names lead there. On failure nothing is left
/// at the target.
OError OCopyFolder(OPath const &from, OPath const &to);

/// Renames a file or a folder, also to another drive, where it is copied and then deleted. The target is treated as
/// OCopyFile does. On another drive the content is on the disk before the original is deleted; a folder with links to
/// folders in it is not moved there, as they would be lost: Failed. The copy stays if the original cannot be deleted,
/// which is an error.
OError OMove(OPath const &from, OPath const &to, bool replace);
