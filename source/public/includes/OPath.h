// OPath.h: a path as a value: text, separators and nothing of the disk.
//
// Both "\" and "/" separate elements; what is appended is joined with "\". Nothing is looked up and nothing fails.

#pragma once

#include "OString.h"

#include <vector>

#include "KTBeginExports.h"

/// A path of the file layer. Distinct values may be used from any thread; one value is not locked.
class KT_PUBLIC_API OPath {
  public:
    /// The empty path.
    OPath() = default;

    /// The path as it is written; no normalisation.
    explicit OPath(OString text);

    /// The path as text.
    OString const &GetString() const { return m_Text; }

    /// Whether the text is empty.
    bool IsEmpty() const { return m_Text.empty(); }

    /// Adds an element, joined by exactly one separator: none is added to an empty path, and separators that end the
    /// path or begin the element are not doubled. An empty element changes nothing.
    void Append(OString const &element);

    /// The containing folder without a trailing separator, except that the root of a drive keeps it ("C:\"). A root,
    /// a single element and the empty path have no parent: empty.
    OPath GetParent() const;

    /// The last element, without separators; empty for a root and the empty path.
    OString GetFileName() const;

    /// The last element up to its last dot. A dot that begins the name is part of it: ".profile" has no extension.
    OString GetBaseName() const;

    /// The last element from its last dot on, the dot included, so that base name and extension give the name again;
    /// empty if it has none.
    OString GetExtension() const;

    /// The elements in order: first the root without a separator at its end ("C:", "\\server\share", or "\" for a
    /// path that begins with one separator), if there is one, then the names.
    std::vector<OString> GetComponents() const;

    /// Turns every "\" into "/".
    void ReplaceBackSlashes();

    /// Unit by unit: two spellings of one place are different paths.
    friend bool operator==(OPath const &a, OPath const &b) { return a.m_Text == b.m_Text; }
    friend bool operator!=(OPath const &a, OPath const &b) { return a.m_Text != b.m_Text; }

  private:
    OString m_Text;
};

#include "KTEndExports.h"
