// Autosave.h: what a run has done so far, kept in a file that survives the program.

#pragma once

#include "KTPath.h"

#include <cstddef>
#include <mutex>
#include <string>
#include <vector>

/// One line for each finished text. Any thread.
class Autosave {
  public:
    /// Adds a line, which the next Save writes.
    void Add(std::string const &line);

    /// Writes all lines to a new file and puts it in the place of the old one, so that one of both is always whole.
    /// Nothing if that file holds them already. One thread at a time.
    void Save();

    std::size_t Lines() const;  ///< added
    std::size_t Saved() const;  ///< in the file
    std::size_t Tried() const;  ///< that Save has tried to write: more than Saved() if the disk refused
    std::size_t Writes() const; ///< how often the file was written

    /// The file, in the session folder.
    static KTPath FilePath();

  private:
    mutable std::mutex m_Mutex; // guards what follows; not held while the disk writes
    std::vector<std::string> m_Lines;
    std::size_t m_Saved = 0;
    std::size_t m_Tried = 0;
    std::size_t m_Writes = 0;
};
