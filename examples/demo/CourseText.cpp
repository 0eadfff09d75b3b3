// CourseText.cpp: dictionary entries, caption lines and share URLs.

#include "CourseText.h"

#include "KTSMBUtils.h"

#include <algorithm>

namespace {

constexpr std::size_t kMost = 10'000;
constexpr std::size_t kLongestLine = 4'096; // no entry and no caption is longer
constexpr double kLongestCourse = 360'000;  // seconds; later times are no times

bool StartsWithDigit(KTString const &text) { return !text.empty() && text[0] >= '0' && text[0] <= '9'; }

} // namespace

void CourseTextCollector::AddLine(KTString const &line) {
    if (line.size() > kLongestLine) {
        return;
    }
    AddShares(line);
    if (!AddEntry(line)) {
        AddCue(line);
    }
}

bool CourseTextCollector::AddEntry(KTString const &line) {
    KTString const prefix("\"$$$/");
    if (line.compare(0, prefix.size(), prefix) != 0) {
        return false;
    }
    KTString::size_type const equals = line.find(static_cast<unsigned short>('='));
    if (equals == KTString::npos || line[line.size() - 1] != '"' || m_Entries.size() >= kMost) {
        return false;
    }
    m_Entries.push_back(
        {line.substr(prefix.size(), equals - prefix.size()), line.substr(equals + 1, line.size() - equals - 2)});
    return true;
}

void CourseTextCollector::AddCue(KTString const &line) {
    if (!StartsWithDigit(line) || m_Cues.size() >= kMost) {
        return;
    }
    std::vector<KTString> const pieces = line.Split(KTString("\t|"));
    if (pieces.size() < 3 || !StartsWithDigit(pieces[1])) {
        return;
    }
    // The text may hold separators of its own.
    Cue cue{pieces[0].GetDoubleValue(), pieces[1].GetDoubleValue(),
            line.substr(pieces[0].size() + pieces[1].size() + 2)};
    if (cue.start <= cue.end && cue.end <= kLongestCourse) {
        m_Cues.push_back(std::move(cue));
    }
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
