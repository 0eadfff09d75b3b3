// DictionaryProblem.cpp: the names of problems.

#include "DictionaryProblem.h"

namespace orvik_private {

char const *DictionaryProblemName(DictionaryProblemKind kind) noexcept {
    switch (kind) {
    case DictionaryProblemKind::LoneDollar:
        return "lone-dollar";
    case DictionaryProblemKind::EmptyKey:
        return "empty-key";
    case DictionaryProblemKind::NoEquals:
        return "no-equals";
    case DictionaryProblemKind::UnclosedQuote:
        return "unclosed-quote";
    case DictionaryProblemKind::TextBefore:
        return "text-before";
    case DictionaryProblemKind::TextAfter:
        return "text-after";
    case DictionaryProblemKind::WideKey:
        return "wide-key";
    case DictionaryProblemKind::OddByte:
        return "odd-byte";
    case DictionaryProblemKind::EarlyEnd:
        return "early-end";
    case DictionaryProblemKind::UnknownEscape:
        return "unknown-escape";
    case DictionaryProblemKind::UnknownCaret:
        return "unknown-caret";
    case DictionaryProblemKind::TrailingEscape:
        return "trailing-escape";
    case DictionaryProblemKind::UnknownEntity:
        return "unknown-entity";
    case DictionaryProblemKind::DuplicateKey:
        return "duplicate-key";
    case DictionaryProblemKind::Damaged:
        return "damaged";
    case DictionaryProblemKind::BadBucket:
        return "bad-bucket";
    case DictionaryProblemKind::ReadFailed:
        return "read-failed";
    case DictionaryProblemKind::UnmappableText:
        return "unmappable-text";
    case DictionaryProblemKind::TooLong:
        return "too-long";
    }
    return "";
}

} // namespace orvik_private
