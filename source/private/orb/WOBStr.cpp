// WOBStr.cpp: automation strings by the system's allocator.

#include "OBStr.h"

#include <windows.h>

#include <oleauto.h>

#include <new>

wchar_t *OAllocateBStr(wchar_t const *text, KTUInt32 length) {
    BSTR const bstr = SysAllocStringLen(text, length);
    if (bstr == nullptr) {
        throw std::bad_alloc();
    }
    return bstr;
}

void OFreeBStr(wchar_t *bstr) noexcept { SysFreeString(bstr); }

KTUInt32 OBStrLength(wchar_t const *bstr) noexcept { return SysStringLen(const_cast<wchar_t *>(bstr)); }
