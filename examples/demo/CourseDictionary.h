// CourseDictionary.h: the library's string dictionary at work on the dictionary files of a course.

#pragma once

#include "ReadCourse.h"

#include <string>
#include <vector>

/// The languages that are shown side by side: the first two files with entries.
std::vector<TextResult *> ChooseLanguages(std::vector<TextResult> &results);

/// Loads each language into the process-wide dictionary and looks its texts up by their keys; what the dictionary gives
/// becomes the entries' text.
void LookTextsUp(std::vector<TextResult *> const &languages);

/// Writes the dictionary to the session folder in its binary form and reads it back. UTF-8, with a title and an empty
/// line at the end; empty if the course has no dictionary. REQUIRES: LookTextsUp has been called.
std::string ReportBinaryDictionary(std::vector<TextResult *> const &languages);
