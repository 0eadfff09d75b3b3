// WOError.h: the system's error codes as the file layer's. Windows half only.

#pragma once

#include "OFileSystem.h"

#include <windows.h>

/// The reason that the code stands for. Any thread.
OError WOErrorOf(DWORD code) noexcept;

/// The same for the calling thread's last error.
OError WOLastError() noexcept;
