// WConsole.cpp: UTF-8 on the console.

#include "WConsole.h"

#include <windows.h>

#include <cstdio>
#include <fcntl.h>
#include <io.h>

Console::Console() : m_CodePage(GetConsoleOutputCP()) {
    SetConsoleOutputCP(CP_UTF8);
    // Without translation of line ends: a file made from the output is the same on every system.
    _setmode(_fileno(stdout), _O_BINARY);
    _setmode(_fileno(stderr), _O_BINARY);
}

Console::~Console() {
    std::fflush(stdout);
    if (m_CodePage != 0) {
        SetConsoleOutputCP(m_CodePage);
    }
}

void Console::Print(std::string const &text) const { std::fwrite(text.data(), 1, text.size(), stdout); }

void Console::PrintError(std::string const &message) const {
    std::string const line = "ktdemo: " + message + "\n";
    std::fflush(stdout);
    std::fwrite(line.data(), 1, line.size(), stderr);
}
