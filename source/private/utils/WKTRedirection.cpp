// WKTRedirection.cpp: the file-system redirection's switch.

#include "WKTRedirection.h"

#include <bit>

namespace {

template <typename Function> Function Find(char const *name) {
    HMODULE const module = GetModuleHandleW(L"kernel32");
    return module == nullptr ? nullptr : std::bit_cast<Function>(GetProcAddress(module, name));
}

} // namespace

WKTRedirectionOff::WKTRedirectionOff() {
    using Disable = BOOL(WINAPI *)(void **);
    auto const disable = Find<Disable>("Wow64DisableWow64FsRedirection");
    auto const revert = Find<Revert>("Wow64RevertWow64FsRedirection");
    // A system without redirection refuses, and then there is nothing to go back to.
    if (disable != nullptr && revert != nullptr && disable(&m_Before) != FALSE) {
        m_Revert = revert;
    }
}

WKTRedirectionOff::~WKTRedirectionOff() {
    if (m_Revert != nullptr) {
        m_Revert(m_Before);
    }
}
