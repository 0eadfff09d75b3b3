// DocumentReport.h: the library's streams at work on a course: saved as one document, read back, compared and cloned.

#pragma once

#include "CourseDocument.h"

#include <string>

/// Saves the document in the session folder, reads it back and saves that again, compares the two files, and clones the
/// first; then checks the files that were read back against the digests stored with them. Returns a table of sizes and
/// times and what the comparisons and the check showed: UTF-8, with a title and an empty line at the end.
std::string ReportDocument(CourseDocument &document);
