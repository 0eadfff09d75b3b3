// WKTMailClient.cpp: the default mail program, from the registry.

#include "WKTMailClient.h"

#include <windows.h>

#include <cwchar>

namespace {

constexpr wchar_t kClients[] = L"Software\\Clients\\Mail";

std::wstring Expanded(std::wstring const &text) {
    std::wstring expanded;
    DWORD needed = static_cast<DWORD>(text.size()) + 1;
    while (needed > expanded.size()) { // the environment may change between two calls
        expanded.resize(needed);
        needed = ExpandEnvironmentStringsW(text.c_str(), expanded.data(), static_cast<DWORD>(expanded.size()));
        if (needed == 0) {
            return text; // out of memory
        }
    }
    expanded.resize(needed - 1); // the zero at its end
    return expanded;
}

class RegistryKey {
  public:
    explicit RegistryKey(std::wstring const &path) noexcept {
        if (RegOpenKeyExW(HKEY_LOCAL_MACHINE, path.c_str(), 0, KEY_QUERY_VALUE, &m_Key) != ERROR_SUCCESS) {
            m_Key = nullptr;
        }
    }
    RegistryKey(RegistryKey const &) = delete;
    RegistryKey &operator=(RegistryKey const &) = delete;
    ~RegistryKey() {
        if (m_Key != nullptr) {
            RegCloseKey(m_Key);
        }
    }

    bool IsOpen() const noexcept { return m_Key != nullptr; }

    /// The text of a value, expanded if it is of the expandable type; null is the unnamed value. None if it is missing or
    /// of another type.
    std::optional<std::wstring> ReadText(wchar_t const *name) const {
        // Expanding is left out here: not every system's RegGetValue keeps to the room it is given when it expands.
        constexpr DWORD kTexts = RRF_RT_REG_SZ | RRF_RT_REG_EXPAND_SZ | RRF_NOEXPAND;
        std::wstring text;
        DWORD type = REG_NONE;
        DWORD size = 256 * sizeof(wchar_t);
        LSTATUS status = ERROR_MORE_DATA;
        while (status == ERROR_MORE_DATA) { // it may grow between two calls
            text.resize(size / sizeof(wchar_t) + 1);
            size = static_cast<DWORD>(text.size() * sizeof(wchar_t));
            status = RegGetValueW(m_Key, nullptr, name, kTexts, &type, text.data(), &size);
        }
        if (status != ERROR_SUCCESS) {
            return std::nullopt;
        }
        text.resize(std::wcslen(text.c_str()));
        return type == REG_EXPAND_SZ ? Expanded(text) : text;
    }

  private:
    HKEY m_Key = nullptr;
};

} // namespace

std::optional<WKTMailClient> WKTFindMailClient() {
    RegistryKey const clients(kClients);
    if (!clients.IsOpen()) {
        return std::nullopt;
    }
    auto const name = clients.ReadText(nullptr);
    if (!name || name->empty()) {
        return std::nullopt;
    }
    RegistryKey const client(std::wstring(kClients) + L"\\" + *name);
    if (!client.IsOpen()) {
        return std::nullopt;
    }
    auto const dllPath = client.ReadText(L"DLLPath");
    if (!dllPath) {
        return std::nullopt;
    }
    return WKTMailClient{*name, *dllPath, client.ReadText(L"PreFirstRun").value_or(std::wstring())};
}
