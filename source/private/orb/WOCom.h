// WOCom.h: ownership in the system's component model. Windows half only.

#pragma once

#include <objbase.h>
#include <windows.h>

/// The calling thread's use of components while this object lives. A thread that was set up otherwise stays as it is.
class WOComScope {
  public:
    WOComScope() noexcept : m_Result(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED | COINIT_DISABLE_OLE1DDE)) {}
    WOComScope(WOComScope const &) = delete;
    WOComScope &operator=(WOComScope const &) = delete;
    ~WOComScope() {
        if (SUCCEEDED(m_Result)) {
            CoUninitialize();
        }
    }

  private:
    HRESULT m_Result;
};

/// Owns one reference to an interface.
template <typename Interface> class WOComPointer {
  public:
    WOComPointer() = default;
    WOComPointer(WOComPointer const &) = delete;
    WOComPointer &operator=(WOComPointer const &) = delete;
    ~WOComPointer() {
        if (m_Object != nullptr) {
            m_Object->Release();
        }
    }

    Interface *operator->() const noexcept { return m_Object; }

    /// Where a call stores the reference. REQUIRES: none is owned yet.
    void **Receive() noexcept { return reinterpret_cast<void **>(&m_Object); }

  private:
    Interface *m_Object = nullptr;
};

/// Owns memory that the system allocated for its caller.
template <typename Unit> class WOComMemory {
  public:
    WOComMemory() = default;
    WOComMemory(WOComMemory const &) = delete;
    WOComMemory &operator=(WOComMemory const &) = delete;
    ~WOComMemory() { CoTaskMemFree(m_Memory); }

    Unit *Get() const noexcept { return m_Memory; }

    /// Where a call stores the memory. REQUIRES: none is owned yet.
    Unit **Receive() noexcept { return &m_Memory; }

  private:
    Unit *m_Memory = nullptr;
};
