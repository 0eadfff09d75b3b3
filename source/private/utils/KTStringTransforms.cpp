// KTStringTransforms.cpp: predicates, replacing and splitting.

#include "KTString.h"

#include <boost/algorithm/string/classification.hpp>

#include <algorithm>

namespace {

constexpr char kSpecialCharacters[] = "~`!@#$%^&*()_+{}:\"<>?/.,';[]=-|\\";
constexpr char kForbiddenInFileNames[] = "/\\:*?\"<>|";

KTBool16 ContainsAnyOf(KTString const &text, char const *set) {
    return static_cast<KTBool16>(text.find_first_of(KTString(set)) != KTString::npos);
}

bool EndsWith(KTUnits const &text, KTUnits const &end) {
    return text.size() >= end.size() && text.compare(text.size() - end.size(), end.size(), end) == 0;
}

// Replaces the first occurrence of `find` until there is none left, as if each search began anew: what a replacement
// creates, on its own or with its neighbours, is replaced too.
//
// One pass does that. `done` never holds an occurrence; units move to its end one by one, and the first occurrence of
// the whole text is the one that the moved unit completes. Its replacement goes in front of what is still to come:
//
//     done | pending, last unit first | rest of the text
KTUnits ReplacedFromTheBeginning(KTUnits const &text, KTUnits const &find, KTUnits const &with) {
    KTUnits done;
    KTUnits pending;
    for (std::size_t next = 0; next < text.size() || !pending.empty();) {
        if (pending.empty()) {
            done.push_back(text[next++]);
        } else {
            done.push_back(pending.back());
            pending.pop_back();
        }
        if (done.back() == find.back() && EndsWith(done, find)) {
            done.resize(done.size() - find.size());
            pending.append(with.rbegin(), with.rend());
        }
    }
    return done;
}

} // namespace

KTBool16 KTString::Contains(KTString const &text) const { return static_cast<KTBool16>(find(text) != npos); }

KTBool16 KTString::ContainsAny(KTString const &set, unsigned long flags) const {
    return static_cast<KTBool16>(GetOString().ContainsAny(set.GetOString(), flags));
}

KTBool16 KTString::ContainsSpecialCharacters() const { return ContainsAnyOf(*this, kSpecialCharacters); }

KTBool16 KTString::IsPermissableFileName() const {
    return static_cast<KTBool16>(ContainsAnyOf(*this, kForbiddenInFileNames) == 0);
}

KTString &KTString::ReplaceAll(KTString const &find, KTString const &with) {
    if (find.empty()) {
        // An empty text is found at the beginning, again and again. A copy, as the caller may hand in this string itself.
        KTString const text = with; // NOLINT(performance-unnecessary-copy-initialization)
        for (;;) {
            insert(0, text);
        }
    }
    if (m_Units.find(find.m_Units) != npos) {
        m_Units = ReplacedFromTheBeginning(m_Units, find.m_Units, with.m_Units);
    }
    return *this;
}

KTString &KTString::ReplaceAll2(KTString const &find, KTString const &with) {
    if (find.empty()) {
        return *this;
    }
    KTUnits result;
    size_type copied = 0;
    for (size_type at = m_Units.find(find.m_Units); at != npos; at = m_Units.find(find.m_Units, copied)) {
        result.append(m_Units, copied, at - copied).append(with.m_Units);
        copied = at + find.size();
    }
    result.append(m_Units, copied);
    m_Units = std::move(result);
    return *this;
}

std::vector<KTString> KTString::Split(KTString const &delimiters) const {
    auto const isDelimiter = boost::algorithm::is_any_of(delimiters.m_Units);
    std::vector<KTString> pieces;
    for (auto from = m_Units.begin();;) {
        auto const to = std::find_if(from, m_Units.end(), isDelimiter);
        pieces.push_back(KTString(KTUnits(from, to)));
        if (to == m_Units.end()) {
            return pieces;
        }
        from = to + 1;
    }
}
