// WORegistry.cpp: reading texts of any length, with or without the zero that should end them.

#include "WORegistry.h"

#include <algorithm>
#include <utility>
#include <vector>

namespace {

constexpr std::size_t kFirstSize = 512; // wide characters; most texts fit, and then one call is enough

// With the terminating zero; the system may cut what is longer, and call that a success.
constexpr DWORD kMostExpanded = 32'767;

void AssignUpToZero(KTUnits &text, wchar_t const *value, std::size_t length) {
    wchar_t const *const end = std::find(value, value + length, L'\0');
    text.assign(reinterpret_cast<unsigned short const *>(value), static_cast<std::size_t>(end - value));
}

wchar_t const *Wide(KTUnits const &text) { return reinterpret_cast<wchar_t const *>(text.c_str()); }

// The environment may change between two calls.
void Expand(KTUnits &text) {
    std::vector<wchar_t> expanded(kFirstSize);
    for (;;) {
        auto const size = static_cast<DWORD>(expanded.size());
        DWORD const needed = ExpandEnvironmentStringsW(Wide(text), expanded.data(), size);
        if (needed == 0 || needed > kMostExpanded) {
            return; // as it is
        }
        if (needed <= size) {
            AssignUpToZero(text, expanded.data(), needed);
            return;
        }
        expanded.resize(needed);
    }
}

bool IsText(DWORD type) { return type == REG_SZ || type == REG_EXPAND_SZ; }

bool Take(DWORD type, wchar_t const *value, DWORD bytes, KTUnits &text) {
    if (!IsText(type)) {
        return false;
    }
    KTUnits read;
    AssignUpToZero(read, value, bytes / sizeof(wchar_t));
    if (type == REG_EXPAND_SZ) {
        Expand(read);
    }
    text = std::move(read);
    return true;
}

} // namespace

bool WOReadText(HKEY key, wchar_t const *name, KTUnits &text) {
    wchar_t first[kFirstSize];
    DWORD type = REG_NONE;
    DWORD bytes = sizeof first;
    LSTATUS status = RegQueryValueExW(key, name, nullptr, &type, reinterpret_cast<BYTE *>(first), &bytes);
    if (status == ERROR_SUCCESS) {
        return Take(type, first, bytes, text);
    }
    std::vector<wchar_t> longer;
    while (status == ERROR_MORE_DATA && IsText(type)) { // again if it grew meanwhile
        longer.resize(std::max<std::size_t>(bytes / sizeof(wchar_t) + 1, longer.size() * 2));
        bytes = static_cast<DWORD>(longer.size() * sizeof(wchar_t));
        status = RegQueryValueExW(key, name, nullptr, &type, reinterpret_cast<BYTE *>(longer.data()), &bytes);
    }
    return status == ERROR_SUCCESS && Take(type, longer.data(), bytes, text);
}
