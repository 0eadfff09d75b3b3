// KTGraphicsReport.h: how the graphics structures, wherever their code stands, report bad geometry and missing buffers.

#pragma once

/// Writes the text to the log, unless it is null or logging is off.
void KTLogGraphics(char const *text);

/// Writes the text as KTLogGraphics does and throws KTLCException, "kKTErrorInternal", with the path of
/// KTGraphicsStructs.cpp, where the function stands, and the line, which is the report's own fixed number.
[[noreturn]] void KTFailGraphics(char const *text, int line);
