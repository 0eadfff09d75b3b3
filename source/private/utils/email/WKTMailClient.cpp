// WKTMailClient.cpp: the default mail program, from the registry.

#include "WKTMailClient.h"

#include "WORegistry.h"

#include <windows.h>

namespace {

constexpr wchar_t kClients[] = L"Software\\Clients\\Mail";

// The text of a value, expanded if it is of the expandable type; null is the unnamed value. None if it is missing or of
// another type.
std::optional<std::wstring> ReadText(WORegistryKey const &key, wchar_t const *name) {
    KTUnits text;
    if (!WOReadText(key.Get(), name, text)) {
        return std::nullopt;
    }
    return std::wstring(text.begin(), text.end());
}

} // namespace

std::optional<WKTMailClient> WKTFindMailClient() {
    WORegistryKey const clients(HKEY_LOCAL_MACHINE, kClients, KEY_QUERY_VALUE);
    if (!clients.IsOpen()) {
        return std::nullopt;
    }
    auto const name = ReadText(clients, nullptr);
    if (!name || name->empty()) {
        return std::nullopt;
    }
    std::wstring const path = std::wstring(kClients) + L"\\" + *name;
    WORegistryKey const client(HKEY_LOCAL_MACHINE, path.c_str(), KEY_QUERY_VALUE);
    if (!client.IsOpen()) {
        return std::nullopt;
    }
    auto const dllPath = ReadText(client, L"DLLPath");
    if (!dllPath) {
        return std::nullopt;
    }
    return WKTMailClient{*name, *dllPath, ReadText(client, L"PreFirstRun").value_or(std::wstring())};
}
