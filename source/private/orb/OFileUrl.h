// OFileUrl.h: "file:" URLs as paths (RFC 8089, and the form with a share's server as the authority).

#pragma once

#include "OLongPath.h"

/// Whether the text begins with "file:" in any case. Any thread.
bool OIsFileUrl(OUnitsView text) noexcept;

/// The path that the URL names: "\\server\share\a" for file://server/share/a, "C:\a b" for file:///C:/a%20b. Escapes are
/// UTF-8; a per cent sign that begins none stays, as shares have such names. Nothing if an escape stands for a separator
/// or a zero, or if the escapes are no UTF-8. REQUIRES: OIsFileUrl(text). Any thread.
std::optional<KTUnits> OReadFileUrl(OUnitsView text);
