// WORegistry.h: keys of the registry and the texts in them. Windows half only.

#pragma once

#include "KTUnitTraits.h"

#include <windows.h>

/// Owns an open key.
class WORegistryKey {
  public:
    /// Opens an existing key below another, which may be a predefined one.
    WORegistryKey(HKEY parent, wchar_t const *name, REGSAM access) noexcept {
        if (RegOpenKeyExW(parent, name, 0, access, &m_Key) != ERROR_SUCCESS) {
            m_Key = nullptr;
        }
    }
    WORegistryKey(WORegistryKey const &) = delete;
    WORegistryKey &operator=(WORegistryKey const &) = delete;
    ~WORegistryKey() {
        if (m_Key != nullptr) {
            RegCloseKey(m_Key);
        }
    }

    bool IsOpen() const noexcept { return m_Key != nullptr; }
    HKEY Get() const noexcept { return m_Key; }

    /// Gives the key to the caller.
    HKEY Release() noexcept {
        HKEY const key = m_Key;
        m_Key = nullptr;
        return key;
    }

  private:
    HKEY m_Key = nullptr;
};

/// The text value `name` (null or "" for the unnamed one) up to its first zero, with environment variables filled in
/// where its type says so, as long as the result has fewer than 32,767 units. False, with `text` unchanged, if it is not
/// there, is no text, or may not be read. Throws std::bad_alloc. Any thread.
bool WOReadText(HKEY key, wchar_t const *name, KTUnits &text);
