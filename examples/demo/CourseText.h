// CourseText.h: what a course keeps in its text files: entries of string dictionaries, caption lines and share URLs.
//
//     "KEY=TEXT"                  dictionary entry, quotes included; the key begins with $$$/
//     smb://server/share/path     share URL, anywhere in a line
//     START <tab> END <tab> TEXT  caption line, times in seconds; a bar may stand for the tab

#pragma once

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

/// Collects entries and caption lines from the lines of one file. Keeps at most 10,000 of each: no course has more,
/// and a file that only looks like one must not fill the memory.
class CourseTextCollector {
  public:
    void AddLine(KTString const &line);

    std::vector<DictionaryEntry> TakeEntries() { return std::move(m_Entries); }
    std::vector<KTString> TakeShares() { return std::move(m_Shares); }
    std::vector<Cue> TakeCues() { return std::move(m_Cues); }

  private:
    bool AddEntry(KTString const &line);
    void AddCue(KTString const &line);
    void AddShares(KTString const &line);

    std::vector<DictionaryEntry> m_Entries;
    std::vector<Cue> m_Cues;
    std::vector<KTString> m_Shares;
};
