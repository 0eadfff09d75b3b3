// WODebugOutput.h: the debugger output. Windows half only.

#pragma once

#include <string>

/// Whether anybody would see debugger output: a debugger of this process, or a system-wide monitor, which is looked for
/// at most every 100 milliseconds. Any thread.
bool WOIsDebugOutputWatched() noexcept;

/// Sends the text, then a line feed as a second text. Any thread; the two may be separated by another thread's output.
void WODebugOutput(std::wstring const &text) noexcept;
