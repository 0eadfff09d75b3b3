// KTComBSTR.h: the automation string class, for hosts built without ATL.
//
// A BSTR is a pointer to UTF-16 text whose length in bytes stands in the four bytes before it; it may hold zeros.
// Null is the empty string. Build with _ATL_NO_AUTOMATIC_NAMESPACE where ATL's class of the same name is in use too.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Owns one BSTR; on Windows it comes from the system's automation allocator. One object belongs to one thread at a
/// time.
class KT_PUBLIC_API CComBSTR {
  public:
    /// Null, which is the empty string.
    CComBSTR() = default;

    /// Copies the text up to its terminating zero; a null pointer gives null. Throws std::bad_alloc.
    CComBSTR(wchar_t const *text);

    /// Copies `length` wide characters, zeros included. REQUIRES: text holds that many. Throws std::bad_alloc.
    CComBSTR(KTUInt32 length, wchar_t const *text);

    /// Copies the text, its length and any zeros in it. Throws std::bad_alloc.
    CComBSTR(CComBSTR const &other);

    /// Takes the text over and leaves null behind.
    CComBSTR(CComBSTR &&other) noexcept;

    CComBSTR &operator=(CComBSTR other) noexcept;
    ~CComBSTR();

    /// Length in wide characters, zeros inside counted; 0 for null.
    KTUInt32 Length() const;

    /// Takes ownership of an automation string made elsewhere, after freeing the one held; nothing happens if it is the
    /// one held.
    void Attach(wchar_t *bstr) noexcept;

    /// Gives the automation string to the caller, who frees it, and holds null afterwards.
    wchar_t *Detach() noexcept;

    /// The automation string, still owned; null when empty.
    operator wchar_t *() const noexcept { return m_str; }

    /// The owned automation string. Public, as its users expect of this class.
    wchar_t *m_str = nullptr;
};

#include "KTEndExports.h"
