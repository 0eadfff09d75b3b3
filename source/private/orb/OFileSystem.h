// OFileSystem.h: where the file layer asks the operating system.

#pragma once

#include "OPath.h"

/// The system's temporary folder without a trailing separator; empty if the system has none to offer. Any thread.
OPath OGetSystemTempFolder();
