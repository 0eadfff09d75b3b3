// BenchServices.cpp: identifiers, share URLs and the registry, beside the plain calls.

#include "Bench.h"

#include "KTRegistryUtils.h"
#include "KTSMBUtils.h"
#include "KTSystemUtils.h"

#include <windows.h>

#include <rpc.h>
#include <wininet.h>

#include <cwchar>
#include <string>
#include <string_view>

namespace bench {

namespace {

constexpr char kGroup[] = "services";
constexpr char kSystem[] = "system";
constexpr char kStandard[] = "std-wstring";
constexpr wchar_t kUrl[] = L"smb://fileserver.harbour.example/courses/harbour safety/captions/intro.utf8.txt";
constexpr wchar_t kKey[] = L"SOFTWARE\\Microsoft\\Cryptography";
constexpr wchar_t kName[] = L"MachineGuid";

KTString GuidBySystem() {
    UUID id;
    RPC_WSTR text = nullptr;
    if (UuidCreate(&id) != RPC_S_OK || UuidToStringW(&id, &text) != RPC_S_OK) {
        return {};
    }
    KTString guid(reinterpret_cast<wchar_t const *>(text));
    RpcStringFreeW(&text);
    return guid;
}

// The four parts, as KTSmbUrl holds them.
struct Parts {
    std::wstring scheme;
    std::wstring authority;
    std::wstring share;
    std::wstring path;
};

Parts SplitBySystem(std::wstring const &url) {
    Parts parts;
    URL_COMPONENTSW found{};
    found.dwStructSize = sizeof found;
    found.dwSchemeLength = found.dwHostNameLength = found.dwUrlPathLength = 1;
    if (InternetCrackUrlW(url.c_str(), static_cast<DWORD>(url.size()), 0, &found) != FALSE) {
        parts.scheme.assign(found.lpszScheme, found.dwSchemeLength);
        parts.authority.assign(found.lpszHostName, found.dwHostNameLength);
        std::wstring_view const path(found.lpszUrlPath + 1, found.dwUrlPathLength - 1);
        std::size_t const slash = path.find(L'/');
        parts.share = path.substr(0, slash);
        parts.path = path.substr(slash + 1);
    }
    return parts;
}

Parts SplitByStandard(std::wstring const &url) {
    Parts parts;
    for (wchar_t const *const prefix : {L"file://///", L"file://localhost///", L"smb://"}) {
        std::size_t const start = std::wcslen(prefix);
        if (url.compare(0, start, prefix) != 0) {
            continue;
        }
        parts.scheme = L"smb";
        std::size_t const first = url.find(L'/', start);
        std::size_t const second = url.find(L'/', first + 1);
        parts.authority = url.substr(start, first - start);
        parts.share = url.substr(first + 1, second - first - 1);
        parts.path = url.substr(second + 1);
        break;
    }
    return parts;
}

// Text of the value; the buffer is large enough for it.
KTString ReadBySystem(HKEY key) {
    wchar_t buffer[512];
    DWORD bytes = sizeof buffer;
    DWORD type = 0;
    if (RegQueryValueExW(key, kName, nullptr, &type, reinterpret_cast<BYTE *>(buffer), &bytes) != ERROR_SUCCESS) {
        return {};
    }
    return KTString(buffer);
}

KTString GetBySystem() {
    wchar_t buffer[512];
    DWORD bytes = sizeof buffer;
    if (RegGetValueW(HKEY_LOCAL_MACHINE, kKey, kName, RRF_RT_REG_SZ, nullptr, buffer, &bytes) != ERROR_SUCCESS) {
        return {};
    }
    return KTString(buffer);
}

template <typename Operation> void AddOne(char const *kase, char const *contender, Operation const &operation) {
    Add({kGroup, kase, "one"}, contender, [operation](benchmark::State &state) {
        for (auto _ : state) {
            benchmark::DoNotOptimize(operation());
        }
    });
}

void AddRegistry() {
    // Open until the program ends.
    static HKEY key = nullptr;
    RegOpenKeyExW(HKEY_LOCAL_MACHINE, kKey, 0, KEY_READ, &key);
    AddOne("registry-read", kOurs, [name = KTString(kName)] {
        KTString text;
        KTRegistryUtils::ReadString(key, name, text);
        return text;
    });
    AddOne("registry-read", kSystem, [] { return ReadBySystem(key); });
    AddOne("registry-item", kOurs, [item = KTRegistryUtils::ConstructKey(kKey, kName)] {
        KTString text;
        KTRegistryUtils::GetSystemItem(item, text);
        return text;
    });
    AddOne("registry-item", kSystem, GetBySystem);
}

} // namespace

void AddServiceBenchmarks() {
    DescribeGroup(kGroup, "identifiers, share URLs, texts of the registry");
    ExpectSpeed(kGroup, kSystem, 1 / 1.2);
    ExpectSpeed(kGroup, kStandard, 1 / 1.2);
    AddOne("create-guid", kOurs, KTSystemUtils::CreateGUID);
    AddOne("create-guid", kSystem, GuidBySystem);
    AddOne("share-url", kOurs, [url = KTString(kUrl)] { return KTSmbUrl(url); });
    AddOne("share-url", kSystem, [url = std::wstring(kUrl)] { return SplitBySystem(url); });
    AddOne("share-url", kStandard, [url = std::wstring(kUrl)] { return SplitByStandard(url); });
    AddRegistry();
}

} // namespace bench
