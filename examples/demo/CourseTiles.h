// CourseTiles.h: the library's tiling at work on a course: its widest picture goes to renderers of several limits.

#pragma once

#include "CourseFiles.h"

#include <string>

/// A table of renderers: how many textures the picture became and whether what was drawn is the picture, pixel by pixel.
/// UTF-8, with a title and an empty line at the end; empty if the course has no readable picture. If `pageFolder` is not
/// empty, a page is written there with the pictures drawn: the tiles under each limit, the whole, its faded form, and
/// frames of its animation.
std::string ReportTiles(CourseFolder const &folder, KTPath const &pageFolder);
