// ODebugText.h: narrow text for the debugger output.

#pragma once

/// Hands the text to the debugger output as it is. Any thread.
void ODebugText(char const *text) noexcept;
