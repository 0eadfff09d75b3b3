// WKTRegistryUtils.cpp: reading the registry.

#include "KTRegistryUtils.h"

#include "WORegistry.h"

#include <windows.h>

#include <utility>

namespace {

constexpr unsigned short kSeparator = '\\';

wchar_t const *Wide(KTString const &text) { return reinterpret_cast<wchar_t const *>(text.c_str()); }

// The system ends a name at its first zero, and would find another one.
bool HasZero(KTString const &name) { return name.find(static_cast<unsigned short>(0)) != KTString::npos; }

} // namespace

KTErrorCodeEnum KTRegistryUtils::OpenKeyReadOnly(HKEY__ *parent, KTString const &name, HKEY__ *&key) {
    key = nullptr;
    if (parent == nullptr || HasZero(name)) {
        return kKTErrorFailed;
    }
    key = WORegistryKey(parent, Wide(name), KEY_READ).Release();
    return key != nullptr ? kKTErrorNone : kKTErrorFailed;
}

KTErrorCodeEnum KTRegistryUtils::CloseKey(HKEY__ *&key) {
    HKEY const closing = std::exchange(key, nullptr);
    return closing == nullptr || RegCloseKey(closing) == ERROR_SUCCESS ? kKTErrorNone : kKTErrorFailed;
}

KTString KTRegistryUtils::ConstructKey(KTString const &parent, KTString const &child) {
    if (parent.empty() || child.empty()) {
        return parent.empty() ? child : parent;
    }
    // Neither has more than one there, or it is not a path.
    std::size_t const end = parent.size() - (parent[parent.size() - 1] == kSeparator ? 1 : 0);
    std::size_t const start = child[0] == kSeparator ? 1 : 0;
    KTString path;
    path.reserve(end + 1 + child.size() - start);
    path.append(parent, 0, end);
    path.push_back(kSeparator);
    path.append(child, start, KTString::npos);
    return path;
}

bool KTRegistryUtils::ConstructKeyAndName(KTString const &item, KTString &key, KTString &name) {
    std::size_t const separator = item.rfind(kSeparator);
    if (separator == KTString::npos || separator == 0) {
        return false;
    }
    // Both are made before either is assigned to, as one of them may be the item.
    KTString itsKey = item.substr(0, separator);
    KTString itsName = item.substr(separator + 1);
    key = std::move(itsKey);
    name = std::move(itsName);
    return true;
}

KTErrorCodeEnum KTRegistryUtils::GetSystemItem(KTString const &item, KTString &value) {
    KTString name;
    KTString itsKey;
    if (!ConstructKeyAndName(item, itsKey, name) || HasZero(itsKey)) {
        return kKTErrorFailed;
    }
    WORegistryKey const key(HKEY_LOCAL_MACHINE, Wide(itsKey), KEY_QUERY_VALUE);
    return ReadString(key.Get(), name, value);
}

KTErrorCodeEnum KTRegistryUtils::ReadString(HKEY__ *key, KTString const &name, KTString &value) {
    KTUnits text;
    if (key == nullptr || HasZero(name) || !WOReadText(key, Wide(name), text)) {
        return kKTErrorFailed;
    }
    value = KTString(OString(std::move(text)));
    return kKTErrorNone;
}
