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

// Where the last element begins and ends; nothing of it may lie in the root.
struct Span {
    std::size_t begin = 0;
    std::size_t end = 0;
};

Span LastElement(KTUnits const &text) {
    std::size_t const root = RootLength(text);
    std::size_t const last = text.find_last_not_of(kSeparators);
    if (last == KTUnits::npos || last < root) {
        return {};
    }
    std::size_t const separator = text.find_last_of(kSeparators, last);
    bool const isFirst = separator == KTUnits::npos || separator < root;
    return {isFirst ? root : separator + 1, last + 1};
}

// Where the extension begins; the element's end if it has none.
std::size_t ExtensionStart(KTUnits const &text, Span name) {
    if (name.begin == name.end) {
        return name.end;
    }
    std::size_t const dot = text.rfind('.', name.end - 1);
    return dot == KTUnits::npos || dot <= name.begin ? name.end : dot;
}

OString Part(KTUnits const &text, std::size_t begin, std::size_t end) { return {text.data() + begin, end - begin}; }

} // namespace

OPath::OPath(OString text) : m_Text(std::move(text)) {}

void OPath::Append(OString const &element) {
    if (m_Text.empty()) {
        m_Text = element;
        return;
    }
    KTUnits const &name = element.GetUnits();
    std::size_t const start = name.find_first_not_of(kSeparators);
    if (start == KTUnits::npos) {
        return;
    }
    if (&element == &m_Text) {
        Append(OString(element));
        return;
    }
    if (!IsSeparator(m_Text.GetUnits().back())) {
        m_Text.Append(kSeparators, 1);
    }
    m_Text.Append(name.data() + start, name.size() - start);
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

OString OPath::GetFileName() const {
    Span const name = LastElement(m_Text.GetUnits());
    return Part(m_Text.GetUnits(), name.begin, name.end);
}

OString OPath::GetBaseName() const {
    KTUnits const &text = m_Text.GetUnits();
    Span const name = LastElement(text);
    return Part(text, name.begin, ExtensionStart(text, name));
}

OString OPath::GetExtension() const {
    KTUnits const &text = m_Text.GetUnits();
    Span const name = LastElement(text);
    return Part(text, ExtensionStart(text, name), name.end);
}

std::vector<OString> OPath::GetComponents() const {
    KTUnits const &text = m_Text.GetUnits();
    std::vector<OString> components;
    std::size_t const root = RootLength(text);
    if (root != 0) {
        std::size_t const last = text.find_last_not_of(kSeparators, root - 1);
        components.push_back(Part(text, 0, last == KTUnits::npos ? 1 : last + 1));
    }
    std::size_t begin = text.find_first_not_of(kSeparators, root);
    while (begin != KTUnits::npos) {
        std::size_t end = text.find_first_of(kSeparators, begin);
        end = end == KTUnits::npos ? text.size() : end;
        components.push_back(Part(text, begin, end));
        begin = text.find_first_not_of(kSeparators, end);
    }
    return components;
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
