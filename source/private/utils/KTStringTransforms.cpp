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
    // Copies, as the caller may hand in this string itself.
    KTString const needle = find;      // NOLINT(performance-unnecessary-copy-initialization)
    KTString const replacement = with; // NOLINT(performance-unnecessary-copy-initialization)
    // Each search begins anew, so that what a replacement creates is replaced too. Nothing was found before the last
    // occurrence, and the next one can at most begin a needle's length before it: starting there finds the same.
    size_type at = m_Units.find(needle.m_Units);
    while (at != npos) {
        replace(at, needle.size(), replacement);
        size_type const overlap = needle.empty() ? 0 : needle.size() - 1;
        at = m_Units.find(needle.m_Units, at > overlap && !needle.empty() ? at - overlap : 0);
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
