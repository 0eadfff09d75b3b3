// KTComBSTR.cpp: ownership of one automation string.

#include "KTComBSTR.h"

#include "OBStr.h"

#include <cwchar>
#include <utility>

CComBSTR::CComBSTR(wchar_t const *text)
    : m_str(text == nullptr ? nullptr : OAllocateBStr(text, static_cast<KTUInt32>(std::wcslen(text)))) {}

CComBSTR::CComBSTR(KTUInt32 length, wchar_t const *text) : m_str(OAllocateBStr(text, length)) {}

CComBSTR::CComBSTR(CComBSTR const &other)
    : m_str(other.m_str == nullptr ? nullptr : OAllocateBStr(other.m_str, other.Length())) {}

CComBSTR::CComBSTR(CComBSTR &&other) noexcept : m_str(std::exchange(other.m_str, nullptr)) {}

CComBSTR &CComBSTR::operator=(CComBSTR other) noexcept {
    std::swap(m_str, other.m_str);
    return *this;
}

CComBSTR::~CComBSTR() { OFreeBStr(m_str); }

KTUInt32 CComBSTR::Length() const { return OBStrLength(m_str); }

void CComBSTR::Attach(wchar_t *bstr) noexcept {
    if (bstr != m_str) {
        OFreeBStr(std::exchange(m_str, bstr));
    }
}

wchar_t *CComBSTR::Detach() noexcept { return std::exchange(m_str, nullptr); }
