// OTempFiles.h: temporary and unique names. Any thread; nothing is thrown but std::bad_alloc.

#pragma once

#include "OFileSystem.h"

/// The system's temporary folder without a trailing separator; empty if the system has none to offer.
OPath OGetSystemTempFolder();

/// Sixteen hexadecimal digits: different in each call of the process, most likely different in every process. What is
/// made by such a name is created so that an existing one is never taken.
OString OMakeUniqueText();

/// Creates an empty file PREFIX + unique text + EXTENSION in the folder, which must exist. Empty on failure.
OPath OMakeUniqueFile(OPath const &folder, OString const &prefix, OString const &extension);

/// Creates a folder PREFIX + NAME + "-" + unique text in the folder, which must exist. Empty on failure.
OPath OMakeUniqueFolder(OPath const &folder, OString const &prefix, OString const &name);
