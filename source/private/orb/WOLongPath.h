// WOLongPath.h: a path in the form that the system is called with. Windows half only.

#pragma once

#include "OPath.h"

#include <windows.h>

#include <string>

/// The extended form of a path: \\?\C:\a or \\?\UNC\server\share\a, without a limit of 260 characters and taken by the
/// system as it stands. Every call that takes a path gets it from here. Ordinary paths need no memory from the heap.
class WOLongPath {
  public:
    explicit WOLongPath(OPath const &path);
    WOLongPath(WOLongPath const &) = delete;
    WOLongPath &operator=(WOLongPath const &) = delete;
    ~WOLongPath() = default;

    /// Whether the path can be handed to the system at all.
    bool IsValid() const noexcept { return m_Text != nullptr; }

    /// The extended form, zero-terminated. REQUIRES: IsValid().
    wchar_t const *c_str() const noexcept { return m_Text; }

  private:
    void Set(wchar_t const *prefix, std::size_t prefixLength, unsigned short const *units, std::size_t count);

    static constexpr std::size_t kInline = 280;

    wchar_t const *m_Text = nullptr;
    std::wstring m_Long;
    wchar_t m_Short[kInline]; // only what is used is ever written
};

/// The full path in the ordinary form that users read and older system interfaces take: C:\a, \\server\share\a. Empty if
/// the path is not valid. Any thread.
std::wstring WOGetFullText(OPath const &path);

/// A path from the system's characters.
OPath WOMakePath(wchar_t const *text, std::size_t length);
