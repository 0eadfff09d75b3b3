// ReadCourse.h: reads a course's text files with two message threads.

#pragma once

#include "CourseFiles.h"
#include "CourseText.h"
#include "RunLog.h"
#include "TextFacts.h"

#include <cstddef>
#include <string>
#include <vector>

/// What reading one text file gave.
struct TextResult {
    CourseFile file;
    std::string encoding;
    std::vector<std::string> notes;
    TextFacts facts;
    bool isRead = false;         ///< else the notes say why not
    bool hasFileName = false;    ///< whether its name may be given to a file on every system
    bool numbersSurvive = false; ///< see NumbersSurvive
    std::vector<DictionaryEntry> entries;
    std::vector<Cue> cues;
    std::vector<KTString> shares; ///< URLs that name a share's server at least
};

/// Reads up to this much of each file; more is not text that an author wrote.
constexpr KTUInt64 kMostBytes = 32ULL << 20;

/// What all of them gave, and how the work went.
struct CourseReading {
    std::vector<TextResult> results; ///< in the order of the files
    std::size_t texts = 0;           ///< finished, also with a problem
    std::size_t saved = 0;           ///< of these, in the last autosave
    std::size_t saves = 0;
    std::size_t shown = 0; ///< how often progress was shown
};

/// Reads the text files among `files`. Pumps the calling thread's messages meanwhile.
CourseReading ReadCourse(std::vector<CourseFile> const &files, RunLog &log);
