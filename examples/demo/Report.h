// Report.h: what the demo prints: one function for each capability it shows. Each returns UTF-8 text that begins with
// a title and ends with an empty line; it is empty if the course has nothing of the kind.

#pragma once

#include "ReadCourse.h"

#include <string>
#include <vector>

/// How much to print.
struct ReportLimits {
    std::size_t rows = 100; ///< of a table of files
    std::size_t texts = 12; ///< of captions and dictionary entries
};

/// The text files: encoding and counts of each, and their sums.
std::string ReportTexts(std::vector<TextResult> const &results, ReportLimits const &limits);

/// The files with captions and how long they are.
std::string ReportCaptions(std::vector<TextResult> const &results);

/// Texts of the first two dictionaries side by side, as looked up by their keys (CourseDictionary.h).
std::string ReportDictionaries(std::vector<TextResult> const &results, ReportLimits const &limits);

/// Pictures with their sizes in pixels, and all other files.
std::string ReportOtherFiles(CourseFolder const &folder, ReportLimits const &limits);

/// What converting back and forth showed.
std::string ReportChecks(std::vector<TextResult> const &results);

/// How the message threads and timers went about it.
std::string ReportWork(CourseReading const &reading);

/// Where the log is and how much is in it.
std::string ReportLog(RunLog const &log);
