// CourseDigests.h: the library's streams and digests at work on a course: the SHA-256 digest of each file.

#pragma once

#include "CourseFiles.h"
#include "Report.h"

#include <string>

/// A table of the files and their digests, read as streams. Stops after 256 MiB: the folder may be anything. UTF-8, with
/// a title and an empty line at the end; empty if there are no files.
std::string ReportDigests(CourseFolder const &folder, ReportLimits const &limits);
