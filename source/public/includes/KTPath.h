// KTPath.h: a path value of the library.

#pragma once

#include "KTString.h"
#include "OPath.h"

#include "KTBeginExports.h"

/// A path, held as the file layer's OPath: text with elements separated by "\" or "/". Nothing here touches the disk.
/// Distinct values may be used from any thread; one value is not locked.
class KT_PUBLIC_API KTPath {
  public:
    /// The empty path.
    KTPath();

    /// The path as it is written; no normalisation.
    KTPath(KTString const &path);
    KTPath(OPath path);

    KTPath(KTPath const &other);
    KTPath &operator=(KTPath const &other);
    virtual ~KTPath();

    /// Replaces the path by the given text.
    void SetPath(KTString const &path);

    /// Adds an element, joined by exactly one separator; an empty element changes nothing.
    void Append(KTString const &element);

    /// Append, returning this path.
    KTPath &operator+=(KTString const &element);

    /// The containing folder; empty for a root, a single element and the empty path.
    KTPath GetParentKTPath() const;

    /// The path as text.
    KTString GetPathAsKTString() const;

    /// Turns every "\" into "/".
    void ReplaceAllBackSlashWithFrontSlash();

    /// The file layer's path.
    OPath const &GetOPath() const { return m_Path; }

    /// Unit by unit, case-sensitive: two spellings of one place are different paths.
    bool operator==(KTPath const &other) const;
    bool operator!=(KTPath const &other) const;

  private:
    OPath m_Path;
};

#include "KTEndExports.h"
