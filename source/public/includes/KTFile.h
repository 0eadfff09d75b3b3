// KTFile.h: a file or folder on disk, named by its path.

#pragma once

#include "KTPath.h"
#include "OFile.h"

#include <cstddef>

#include "KTBeginExports.h"

/// Names a file-system object. Copying and assignment copy the path. Objects are allocated with the library's
/// Allocate and Deallocate, so that they may be created on one side of the library boundary and deleted on the other.
/// Distinct values may be used from any thread; one value is not locked.
class KT_PUBLIC_API KTFile {
  public:
    /// Names nothing.
    KTFile();

    /// Names what is, or will be, at that path.
    KTFile(KTPath const &path);
    KTFile(KTString const &path);
    KTFile(OFile file);
    KTFile(OPath path);
    KTFile(OString path);

    KTFile(KTFile const &other);
    KTFile &operator=(KTFile const &other);
    virtual ~KTFile();

    /// The path as a path value.
    KTPath GetPath() const;

    /// The path as text.
    KTString GetPathString() const;

    /// Whether both name the same file.
    bool operator==(KTFile const &other) const;
    bool operator!=(KTFile const &other) const;

    static void *operator new(std::size_t size);
    static void operator delete(void *block);
    static void *operator new(std::size_t, void *place) noexcept { return place; }
    static void operator delete(void *, void *) noexcept {}

  private:
    /// Called when the path has changed; does nothing here.
    virtual void PathChanged(OString const &path);

    OFile m_File;
};

#include "KTEndExports.h"
