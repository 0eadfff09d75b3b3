// CourseText.cpp: captions, dictionary entries and share URLs.

#include "CourseText.h"

#include "KTClosedCaptionFileReader.h"
#include "KTSMBUtils.h"

#include <algorithm>

namespace {

constexpr std::size_t kMost = 10'000;
constexpr std::size_t kLongestLine = 4'096; // no entry and no caption is longer
constexpr double kLongestCourse = 360'000;  // seconds; later times are no times
constexpr unsigned int kColumns = 4;        // the split mode that cuts at tabs

bool StartsWithDigit(KTString const &text) { return !text.empty() && text[0] >= '0' && text[0] <= '9'; }

// A caption's text may hold separators of its own.
KTString JoinFrom(std::vector<KTString> const &fields, std::size_t first, char const *separator) {
    KTString text = fields[first];
    for (std::size_t i = first + 1; i < fields.size(); ++i) {
        text += separator + fields[i];
    }
    return text;
}

void AddCue(std::vector<KTString> const &row, std::vector<Cue> &cues) {
    bool const hasBars = row.size() == 1; // as older recorders write
    std::vector<KTString> const fields = hasBars ? row[0].Split(KTString("|")) : row;
    if (fields.size() < 3 || !StartsWithDigit(fields[0]) || !StartsWithDigit(fields[1])) {
        return;
    }
    Cue cue{fields[0].GetDoubleValue(), fields[1].GetDoubleValue(), JoinFrom(fields, 2, hasBars ? "|" : "\t")};
    if (cue.start <= cue.end && cue.end <= kLongestCourse && cue.text.size() <= kLongestLine) {
        cues.push_back(std::move(cue));
    }
}

} // namespace

std::vector<Cue> ReadCues(KTPath const &file) {
    std::vector<Cue> cues;
    for (std::vector<KTString> const &row :
         KTClosedCaptionFileReader().GetLinesFromFile(file.GetPathAsKTString(), kColumns)) {
        if (cues.size() < kMost) {
            AddCue(row, cues);
        }
    }
    return cues;
}

void CourseTextCollector::AddLine(KTString const &line) {
    if (line.size() > kLongestLine) {
        return;
    }
    AddShares(line);
    AddEntry(line);
}

void CourseTextCollector::AddEntry(KTString const &line) {
    KTString const prefix("\"$$$/");
    if (line.compare(0, prefix.size(), prefix) != 0) {
        return;
    }
    KTString::size_type const equals = line.find(static_cast<unsigned short>('='));
    if (equals == KTString::npos || line[line.size() - 1] != '"' || m_Entries.size() >= kMost) {
        return;
    }
    m_Entries.push_back(
        {line.substr(prefix.size(), equals - prefix.size()), line.substr(equals + 1, line.size() - equals - 2)});
}

void CourseTextCollector::AddShares(KTString const &line) {
    if (!line.Contains(KTString("://"))) {
        return;
    }
    KTString::size_type start = 0;
    while (start < line.size() && m_Shares.size() < kMost) {
        KTString::size_type const end = std::min(line.find_first_of(KTString(" \t\"'<>=;,"), start), line.size());
        KTString const word = line.substr(start, end - start);
        if (!KTSmbUrl(word).getScheme().empty()) {
            m_Shares.push_back(word);
        }
        start = end + 1;
    }
}
