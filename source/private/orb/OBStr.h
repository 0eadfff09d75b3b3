// OBStr.h: the system's automation strings, behind CComBSTR.

#pragma once

#include "KTTypes.h"

/// A new automation string of `length` wide characters, copied from `text`. Throws std::bad_alloc.
wchar_t *OAllocateBStr(wchar_t const *text, KTUInt32 length);

/// Frees an automation string; null is allowed.
void OFreeBStr(wchar_t *bstr) noexcept;

/// Length in wide characters; 0 for null.
KTUInt32 OBStrLength(wchar_t const *bstr) noexcept;
