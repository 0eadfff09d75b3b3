// Services.h: the library's system services at work: share URLs in a course's texts, and the machine that it is on.
// Each function returns UTF-8 text as those of Report.h do.

#pragma once

#include "Report.h"

#include <string>
#include <vector>

/// The share URLs that the texts name, taken apart. None is connected to: a text may come from anybody, and connecting
/// would tell a server who the user is.
std::string ReportShares(std::vector<TextResult> const &results, ReportLimits const &limits);

/// The system's version, this process and its like, a new identifier, and where the course's folder is.
std::string ReportSystem(KTPath const &course);
