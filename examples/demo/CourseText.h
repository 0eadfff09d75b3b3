// CourseText.h: what a course keeps in its text files: entries of string dictionaries, caption lines and share URLs.
//
//     "KEY=TEXT"                  dictionary entry, quotes included; the key begins with $$$/
//     smb://server/share/path     share URL, anywhere in a line
//     START <tab> END <tab> TEXT  caption line, times in seconds; bars may stand for the tabs

#pragma once

#include "KTPath.h"
#include "KTString.h"

#include <vector>

struct DictionaryEntry {
    KTString key; ///< without the leading $$$/
    KTString text;
};

struct Cue {
    double start = 0; ///< seconds
    double end = 0;
    KTString text;
};

/// The captions of a file, read by the library's caption reader. At most 10,000, as no course has more.
std::vector<Cue> ReadCues(KTPath const &file);

/// Collects entries and share URLs from the lines of one file. Keeps at most 10,000 of each: a file that only looks like
/// a course's must not fill the memory.
class CourseTextCollector {
  public:
    void AddLine(KTString const &line);

    std::vector<DictionaryEntry> TakeEntries() { return std::move(m_Entries); }
    std::vector<KTString> TakeShares() { return std::move(m_Shares); }

  private:
    void AddEntry(KTString const &line);
    void AddShares(KTString const &line);

    std::vector<DictionaryEntry> m_Entries;
    std::vector<KTString> m_Shares;
};
