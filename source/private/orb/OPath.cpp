// OPath.cpp: joining and cutting path text.

#include "OPath.h"

#include <utility>

namespace {

constexpr unsigned short kSeparators[] = {'\\', '/', 0};

bool IsSeparator(unsigned short unit) { return unit == '\\' || unit == '/'; }

// Length of the part that a parent never cuts into: "C:\", "\\server\share", or the separators a path begins with.
std::size_t RootLength(KTUnits const &text) {
    if (text.size() >= 2 && text[1] == ':') {
        return text.size() >= 3 && IsSeparator(text[2]) ? 3 : 2;
    }
    std::size_t const name = text.find_first_not_of(kSeparators);
    if (name != 2 || !IsSeparator(text[0])) {
        return name == KTUnits::npos ? text.size() : name;
    }
    std::size_t const afterServer = text.find_first_of(kSeparators, name);
    std::size_t const share = text.find_first_not_of(kSeparators, afterServer);
    std::size_t const afterShare = share == KTUnits::npos ? share : text.find_first_of(kSeparators, share);
    return afterShare == KTUnits::npos ? text.size() : afterShare;
}

} // namespace

OPath::OPath(OString text) : m_Text(std::move(text)) {}

void OPath::Append(OString const &element) {
    KTUnits text = m_Text.GetUnits();
    std::size_t const name = element.GetUnits().find_first_not_of(kSeparators);
    if (text.empty()) {
        m_Text = element;
        return;
    }
    if (name == KTUnits::npos) {
        return;
    }
    if (!IsSeparator(text.back())) {
        text.push_back('\\');
    }
    text.append(element.GetUnits(), name);
    m_Text = OString(std::move(text));
}

OPath OPath::GetParent() const {
    KTUnits const &text = m_Text.GetUnits();
    std::size_t const root = RootLength(text);
    std::size_t const nameEnd = text.find_last_not_of(kSeparators);
    if (nameEnd == KTUnits::npos || nameEnd < root) {
        return {};
    }
    std::size_t const cut = text.find_last_of(kSeparators, nameEnd);
    if (cut == KTUnits::npos || cut < root) {
        return OPath(OString(text.substr(0, root)));
    }
    std::size_t const folderEnd = text.find_last_not_of(kSeparators, cut);
    std::size_t const kept = folderEnd == KTUnits::npos ? 0 : folderEnd + 1;
    return OPath(OString(text.substr(0, kept < root ? root : kept)));
}

void OPath::ReplaceBackSlashes() {
    KTUnits text = m_Text.GetUnits();
    for (unsigned short &unit : text) {
        if (unit == '\\') {
            unit = '/';
        }
    }
    m_Text = OString(std::move(text));
}
