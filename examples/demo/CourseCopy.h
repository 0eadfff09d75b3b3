// CourseCopy.h: the library's files and folders at work on a course: sizes and dates of its files, and a copy of it in
// the session folder.

#pragma once

#include "Report.h"

#include <string>

/// A copy of the course in the session folder, from construction to the end of the object.
class CourseCopy {
  public:
    explicit CourseCopy(KTPath const &course);
    CourseCopy(CourseCopy const &) = delete;
    CourseCopy &operator=(CourseCopy const &) = delete;

    /// Deletes the session folder with everything in it.
    ~CourseCopy();

    /// A table of the course's files, and what became of the copy. UTF-8, with a title and an empty line at the end;
    /// empty if the course has no files.
    std::string Report(ReportLimits const &limits) const;

  private:
    KTPath m_Course;
    KTPath m_Copy; ///< empty if the course could not be copied
};
