// CourseMail.h: the library's mail sender, as far as it goes without sending anything.

#pragma once

#include <string>

/// Which mail program would send the course; without one, what the library says about that, which is the dictionary's
/// text. UTF-8, with a title and an empty line at the end.
std::string ReportMail();
