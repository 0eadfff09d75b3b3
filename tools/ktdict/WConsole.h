// WConsole.h: the two output streams, as UTF-8. One thread.

#pragma once

#include <string>
#include <string_view>

/// Collects what goes to the standard output and writes it in large pieces: as UTF-8 into files and pipes, as UTF-16 to
/// a console, whatever its code page. Line ends stay as they are.
class Console {
  public:
    Console() = default;
    Console(Console const &) = delete;
    Console &operator=(Console const &) = delete;
    ~Console() { Flush(); }

    void Print(std::string_view text);

    /// Writes to the standard error stream at once, behind what was printed before.
    void PrintError(std::string_view text);

    /// Writes out what is pending. False if any of the output so far could not be written.
    bool Flush();

  private:
    std::string m_Pending;
    bool m_Failed = false;
};
