// WMail.cpp: the default mail program, in the registry.

#include "WMail.h"

#include <windows.h>

#include <string>

namespace {

constexpr wchar_t kClients[] = L"Software\\Clients\\Mail";

std::wstring ReadText(std::wstring const &key, wchar_t const *name) {
    wchar_t text[1024] = {};
    DWORD size = sizeof text - sizeof *text;
    constexpr DWORD kTexts = RRF_RT_REG_SZ | RRF_RT_REG_EXPAND_SZ | RRF_NOEXPAND;
    LSTATUS const status = RegGetValueW(HKEY_LOCAL_MACHINE, key.c_str(), name, kTexts, nullptr, text, &size);
    return status == ERROR_SUCCESS ? text : L"";
}

} // namespace

KTString MailProgram() {
    std::wstring const name = ReadText(kClients, nullptr);
    if (name.empty() || ReadText(std::wstring(kClients) + L"\\" + name, L"DLLPath").empty()) {
        return {};
    }
    return {name.c_str()};
}
