// ODebugText_posix.cpp: the native developer build has no debugger output; the standard error stream stands for it.

#include "ODebugText.h"

#include <cstdio>

void ODebugText(char const *text) noexcept { std::fputs(text, stderr); }
