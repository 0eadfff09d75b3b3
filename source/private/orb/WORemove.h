// WORemove.h: deleting one name. Windows half only.

#pragma once

#include "OFileSystem.h"

/// Deletes a file, an empty folder or a link; `attributes` are those that its name had just now. Names are in the
/// extended form. A read-only file or folder is made writable first, and read-only again if that did not help. A link is
/// deleted only if the system hands out the link itself, never what it leads to: AccessDenied otherwise. Any thread.
OError WORemove(wchar_t const *name, unsigned long attributes);
