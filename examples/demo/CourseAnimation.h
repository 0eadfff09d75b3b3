// CourseAnimation.h: the library's keyframes at work on a course: its widest picture scrolls over the player's stage.

#pragma once

#include "CourseFiles.h"

#include <string>

/// A table of frames: where the picture stands, how opaque it is, and which of its columns show, eased and at constant
/// speed. UTF-8, with a title and an empty line at the end; empty if the course has no readable picture.
std::string ReportAnimation(CourseFolder const &folder);
