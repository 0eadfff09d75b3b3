// WOFind.h: the entries of a folder, one after the other. Windows half only.

#pragma once

#include "OFileSystem.h"

#include <windows.h>

#include <string>

/// Reads a folder from its beginning to its end; "." and ".." are passed over.
class WOFind {
  public:
    /// `folder` is in the extended form.
    explicit WOFind(std::wstring const &folder);
    WOFind(WOFind const &) = delete;
    WOFind &operator=(WOFind const &) = delete;
    ~WOFind();

    /// Moves to the next entry, the first one at first. False at the end and after a failure; Error() tells which.
    bool Next();

    /// None, unless the folder could not be opened or not read to its end.
    OError Error() const { return m_Error; }

    /// The entry's name. REQUIRES: Next() returned true; so do the others.
    wchar_t const *Name() const { return m_Data.cFileName; }
    bool IsFolder() const { return (m_Data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0; }
    DWORD Attributes() const { return m_Data.dwFileAttributes; }

    /// A symbolic link or a junction. Files that a cloud service keeps elsewhere are reparse points too, but no links.
    bool IsLink() const {
        return (m_Data.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0 &&
               (m_Data.dwReserved0 == 0 || IsReparseTagNameSurrogate(m_Data.dwReserved0));
    }

  private:
    bool IsDots() const;

    WIN32_FIND_DATAW m_Data;
    HANDLE m_Search;
    OError m_Error = OError::None;
    bool m_HasFirst = false;
};
