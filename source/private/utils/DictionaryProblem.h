// DictionaryProblem.h: what a dictionary tells whoever wants to know what is wrong with a file.
//
// The library itself only keeps a flag. Tools for the people who write and translate texts pass an observer and get each
// problem with its place; without one nothing is looked for and nothing is formatted.

#pragma once

#include <cstdint>
#include <string>

namespace orvik_private {

/// What is wrong, or may be not what the author meant. The comment says what becomes of the entry.
enum class DictionaryProblemKind : int {
    // text form
    LoneDollar,    ///< the entry begins with "$" but not "$$$": skipped, and the dictionary is no longer valid
    EmptyKey,      ///< nothing before the "=": skipped
    NoEquals,      ///< the line has no "=": taken as a key with an empty text
    UnclosedQuote, ///< the quotation mark has no partner: the entry goes to the end of the line
    TextBefore,    ///< text before the first quotation mark: ignored
    TextAfter,     ///< text behind the second quotation mark: ignored
    WideKey,       ///< a unit of the key is above 255: only its low byte is kept
    OddByte,       ///< UTF-16 text with an odd number of bytes: the last one is ignored, no longer valid
    EarlyEnd,      ///< a zero begins a line: the rest of the file is not read
    // texts
    UnknownEscape,  ///< "\" before a character that is no escape: both stay
    UnknownCaret,   ///< "^" before a character that has no meaning: both stay
    TrailingEscape, ///< "\" or "^" as the last character: stays
    UnknownEntity,  ///< "#{" with neither a known name nor a number behind it: stays
    // both forms
    DuplicateKey, ///< the key was there before: the new text replaces the old one
    // binary form
    Damaged,    ///< the file cannot be read on from here; what was read before is kept; no longer valid (also a text
                ///< form's line that the system does not convert)
    BadBucket,  ///< the lists of the hash buckets do not fit the keys: not needed, no longer valid
    ReadFailed, ///< the device failed; no longer valid
    // writing
    UnmappableText, ///< the text or key has characters that the code page has not: others stand in for them
    TooLong         ///< the key or text is longer than the binary form can say: nothing is written
};

/// One problem. `detail` is English, for people.
struct DictionaryProblem {
    DictionaryProblemKind kind{};
    std::uint64_t line = 0;   ///< from 1; 0 when the file has no lines
    std::uint64_t offset = 0; ///< binary form: the byte of the file; text form: the unit of the line, where known
    std::string key;          ///< the entry's key, as stored, where known
    std::string detail;
};

/// Gets the problems of one file in the order in which they are met.
class DictionaryObserver {
  public:
    DictionaryObserver() = default;
    DictionaryObserver(DictionaryObserver const &) = delete;
    DictionaryObserver &operator=(DictionaryObserver const &) = delete;
    virtual ~DictionaryObserver() = default;

    virtual void OnProblem(DictionaryProblem const &problem) = 0;
};

/// The kind's name as tools print it, for example "duplicate-key".
char const *DictionaryProblemName(DictionaryProblemKind kind) noexcept;

} // namespace orvik_private
