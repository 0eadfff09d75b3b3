// WOLongPath.cpp: the prefix, and the current folders.

#include "WOLongPath.h"

#include "OFileSystem.h"
#include "OLongPath.h"
#include "OUtf.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace {

class SystemFolders final : public OCurrentFolders {
  public:
    KTUnits Get(unsigned short drive) const override {
        wchar_t const ofDrive[] = {static_cast<wchar_t>(drive), L':', 0};
        wchar_t const *const name = drive == 0 ? L"." : ofDrive;
        std::wstring folder(MAX_PATH, L'\0');
        DWORD length = GetFullPathNameW(name, static_cast<DWORD>(folder.size()), folder.data(), nullptr);
        if (length >= folder.size()) { // the size needed; another thread may change the folder meanwhile
            folder.resize(length + MAX_PATH);
            length = GetFullPathNameW(name, static_cast<DWORD>(folder.size()), folder.data(), nullptr);
        }
        return length < folder.size() ? OWideToUnits(folder.data(), length) : KTUnits();
    }
};

std::optional<KTUnits> FullPath(OPath const &path) {
    return OMakeFullPath(path.GetString().GetUnits(), SystemFolders());
}

bool IsShare(KTUnits const &full) { return full[0] == '\\' && full[2] != '?'; }

} // namespace

WOLongPath::WOLongPath(OPath const &path) { // NOLINT(cppcoreguidelines-pro-type-member-init): see m_Short
    KTUnits const &written = path.GetString().GetUnits();
    constexpr std::wstring_view kPrefix = L"\\\\?\\";
    constexpr std::wstring_view kShare = L"\\\\?\\UNC\\";
    if (OIsPlainFullPath(written)) {
        Set(kPrefix.data(), kPrefix.size(), written.data(), written.size());
        return;
    }
    std::optional<KTUnits> const full = FullPath(path);
    if (!full) {
        return;
    }
    if ((*full)[0] != '\\') {
        Set(kPrefix.data(), kPrefix.size(), full->data(), full->size());
    } else if (IsShare(*full)) {
        Set(kShare.data(), kShare.size(), full->data() + 2, full->size() - 2);
    } else {
        Set(nullptr, 0, full->data(), full->size());
    }
}

void WOLongPath::Set(wchar_t const *prefix, std::size_t prefixLength, unsigned short const *units, std::size_t count) {
    wchar_t *target = m_Short;
    if (prefixLength + count >= kInline) {
        m_Long.resize(prefixLength + count);
        target = m_Long.data();
    }
    m_Text = target;
    target = std::copy_n(prefix, prefixLength, target);
    target = std::copy_n(units, count, target);
    *target = 0;
}

std::wstring WOGetFullText(OPath const &path) {
    std::optional<KTUnits> const full = FullPath(path);
    return full ? OUnitsToWide(full->data(), full->size()) : std::wstring();
}

OPath WOMakePath(wchar_t const *text, std::size_t length) { return OPath(OString(OWideToUnits(text, length))); }

bool OIsValidPath(OPath const &path) {
    return OIsPlainFullPath(path.GetString().GetUnits()) || FullPath(path).has_value();
}

OPath OGetFullPath(OPath const &path) {
    std::optional<KTUnits> full = FullPath(path);
    return full ? OPath(OString(std::move(*full))) : OPath();
}
