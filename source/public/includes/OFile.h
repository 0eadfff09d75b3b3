// OFile.h: the file-system object that KTFile holds: a name on disk.

#pragma once

#include "OPath.h"

#include "KTBeginExports.h"

/// A file or folder named by a path. The object itself is a value: copying copies the name.
class KT_PUBLIC_API OFile {
  public:
    /// Names nothing.
    OFile() = default;

    /// Names what is, or will be, at that path.
    explicit OFile(OPath path);

    /// The path given at construction.
    OPath const &GetPath() const { return m_Path; }

    /// Whether both name the same path text.
    friend bool operator==(OFile const &a, OFile const &b) { return a.m_Path == b.m_Path; }
    friend bool operator!=(OFile const &a, OFile const &b) { return a.m_Path != b.m_Path; }

  private:
    OPath m_Path;
};

#include "KTEndExports.h"
