// KTMailRecipients.cpp: lists of recipients.

#include "KTMailRecipients.h"

namespace {

constexpr KTString::size_type kNone = KTString::npos;

bool IsOneOf(unsigned short unit, char const *characters) {
    for (; *characters != '\0'; ++characters) {
        if (unit == static_cast<unsigned short>(*characters)) {
            return true;
        }
    }
    return false;
}

bool IsLetter(unsigned short unit) { return (unit >= 'a' && unit <= 'z') || (unit >= 'A' && unit <= 'Z'); }

KTString Trimmed(KTString const &text) {
    auto const isBlank = [](unsigned short unit) { return IsOneOf(unit, " \t\r\n"); };
    KTString::size_type first = 0;
    auto last = text.size();
    while (first < last && isBlank(text[first])) {
        ++first;
    }
    while (first < last && isBlank(text[last - 1])) {
        --last;
    }
    return text.substr(first, last - first);
}

// Finds what keeps separators from separating: quoted texts and addresses in brackets. Takes one pass over a text in
// which nothing is ever closed, as it remembers that nothing will be.
class Shelters {
  public:
    explicit Shelters(KTString const &text) : m_Text(text) {}

    /// The last position of the shelter that begins at `at`; `at` itself if none begins here or it is never closed.
    /// REQUIRES: positions are asked in rising order.
    KTString::size_type EndOf(KTString::size_type at) {
        if (m_Text[at] == '<' && m_MayClose) {
            auto const end = m_Text.find(static_cast<unsigned short>('>'), at);
            m_MayClose = end != kNone;
            return m_MayClose ? end : at;
        }
        if (m_Text[at] == '"' && m_MayUnquote) {
            auto const end = EndOfQuote(at);
            m_MayUnquote = end != kNone;
            return m_MayUnquote ? end : at;
        }
        return at;
    }

  private:
    KTString::size_type EndOfQuote(KTString::size_type start) const {
        for (auto at = start + 1; at < m_Text.size(); ++at) {
            if (m_Text[at] == '\\') {
                ++at;
            } else if (m_Text[at] == '"') {
                return at;
            }
        }
        return kNone;
    }

    KTString const &m_Text;
    bool m_MayClose = true;
    bool m_MayUnquote = true;
};

// Calls `visit` with the first and the last position of each shelter, and of each unit outside of them.
template <typename Visit> void ForEachPart(KTString const &text, Visit visit) {
    Shelters shelters(text);
    for (KTString::size_type at = 0; at < text.size(); ++at) {
        auto const first = at;
        at = shelters.EndOf(at);
        visit(first, at);
    }
}

std::vector<KTString> SplitList(KTString const &list) {
    bool hasSemicolon = false;
    ForEachPart(list, [&](auto at, auto) { hasSemicolon = hasSemicolon || list[at] == ';'; });
    char const *const separators = hasSemicolon ? ";\r\n" : ",\r\n";
    std::vector<KTString> pieces;
    KTString::size_type start = 0;
    ForEachPart(list, [&](auto at, auto) {
        if (IsOneOf(list[at], separators)) {
            pieces.push_back(Trimmed(list.substr(start, at - start)));
            start = at + 1;
        }
    });
    pieces.push_back(Trimmed(list.substr(start)));
    std::erase_if(pieces, [](KTString const &piece) { return piece.empty(); });
    return pieces;
}

// A name without the quotes around it.
KTString Unquoted(KTString const &name) {
    if (name.size() < 2 || name[0] != '"' || Shelters(name).EndOf(0) != name.size() - 1) {
        return name;
    }
    KTString text;
    for (KTString::size_type at = 1; at + 1 < name.size(); ++at) {
        if (name[at] == '\\') {
            ++at;
        }
        text.push_back(name[at]);
    }
    return text;
}

bool HasType(KTString const &address) {
    KTString::size_type at = 0;
    while (at < address.size() && IsLetter(address[at])) {
        ++at;
    }
    return at > 0 && at < address.size() && address[at] == ':';
}

KTString Typed(KTString const &address) { return HasType(address) ? address : KTString("SMTP:") + address; }

// Where the address in brackets at the end begins: its "<"; kNone if there is none.
KTString::size_type FindBracket(KTString const &piece) {
    auto found = kNone;
    ForEachPart(piece, [&](auto first, auto last) {
        if (piece[first] == '<' && last > first && last == piece.size() - 1) {
            found = first;
        }
    });
    return found;
}

KTMailRecipient ParseRecipient(KTString const &piece) {
    auto const bracket = FindBracket(piece);
    if (bracket != kNone) {
        KTString const address = Trimmed(piece.substr(bracket + 1, piece.size() - bracket - 2));
        KTString const name = Unquoted(Trimmed(piece.substr(0, bracket)));
        if (address.empty()) {
            return {name, KTString()};
        }
        return {name.empty() ? address : name, Typed(address)};
    }
    bool const isAddress = piece.find(static_cast<unsigned short>('@')) != kNone || HasType(piece);
    return isAddress ? KTMailRecipient{piece, Typed(piece)} : KTMailRecipient{Unquoted(piece), KTString()};
}

} // namespace

std::vector<KTMailRecipient> KTParseMailRecipients(KTString const &list) {
    std::vector<KTMailRecipient> recipients;
    for (KTString const &piece : SplitList(list)) {
        recipients.push_back(ParseRecipient(piece));
    }
    std::erase_if(recipients, [](KTMailRecipient const &one) { return one.name.empty(); });
    return recipients;
}
