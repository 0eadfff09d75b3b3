// WOHandle.h: ownership of a Windows handle. Windows half only.

#pragma once

#include <windows.h>

/// Owns a handle of the kind that CloseHandle closes; both invalid values, null and INVALID_HANDLE_VALUE, mean none.
class WOHandle {
  public:
    WOHandle() = default;
    explicit WOHandle(HANDLE handle) noexcept : m_Handle(handle) {}
    WOHandle(WOHandle &&other) noexcept : m_Handle(other.Release()) {}
    WOHandle(WOHandle const &) = delete;
    WOHandle &operator=(WOHandle const &) = delete;
    WOHandle &operator=(WOHandle &&other) noexcept {
        if (this != &other) {
            Close();
            m_Handle = other.Release();
        }
        return *this;
    }
    ~WOHandle() { Close(); }

    HANDLE Get() const noexcept { return m_Handle; }
    bool IsValid() const noexcept { return m_Handle != nullptr && m_Handle != INVALID_HANDLE_VALUE; }

    /// Gives the handle to the caller.
    HANDLE Release() noexcept {
        HANDLE const handle = m_Handle;
        m_Handle = INVALID_HANDLE_VALUE;
        return handle;
    }

    /// Closes the handle, if there is one, and marks it invalid.
    void Close() noexcept {
        if (IsValid()) {
            CloseHandle(m_Handle);
        }
        m_Handle = INVALID_HANDLE_VALUE;
    }

  private:
    HANDLE m_Handle = INVALID_HANDLE_VALUE;
};
