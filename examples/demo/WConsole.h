// WConsole.h: UTF-8 on the console, in files and in pipes alike.

#pragma once

#include <string>

/// Switches the console and the standard streams to plain UTF-8 bytes, and the console back at the end.
class Console {
  public:
    Console();
    Console(Console const &) = delete;
    Console &operator=(Console const &) = delete;
    ~Console();

    /// Writes to the standard output.
    void Print(std::string const &text) const;

    /// Writes "ktdemo: MESSAGE" as one line to the standard error stream.
    void PrintError(std::string const &message) const;

  private:
    unsigned int m_CodePage; // the console is the user's: it gets its own code page back
};
