// OBStr_posix.cpp: automation strings for the native developer build: the same layout on the global heap.

#include "OBStr.h"

#include <cstddef>
#include <cstring>
#include <new>

namespace {

constexpr std::size_t kPrefix = 16; // the length, padded so that the text stays aligned

} // namespace

wchar_t *OAllocateBStr(wchar_t const *text, KTUInt32 length) {
    std::size_t const bytes = length * sizeof(wchar_t);
    auto *const block = static_cast<char *>(::operator new(kPrefix + bytes + sizeof(wchar_t)));
    std::memcpy(block + kPrefix - sizeof length, &length, sizeof length);
    auto *const bstr = reinterpret_cast<wchar_t *>(block + kPrefix);
    if (text != nullptr) {
        std::memcpy(bstr, text, bytes);
    }
    bstr[length] = 0;
    return bstr;
}

void OFreeBStr(wchar_t *bstr) noexcept {
    if (bstr != nullptr) {
        ::operator delete(reinterpret_cast<char *>(bstr) - kPrefix);
    }
}

KTUInt32 OBStrLength(wchar_t const *bstr) noexcept {
    KTUInt32 length = 0;
    if (bstr != nullptr) {
        std::memcpy(&length, reinterpret_cast<char const *>(bstr) - sizeof length, sizeof length);
    }
    return length;
}
