// CourseAnimation.h: the library's keyframes at work on a course: its widest picture scrolls over the player's stage.

#pragma once

#include "CourseFiles.h"

#include "KTAnimation.h"

#include <string>

/// The player's stage in pixels.
inline constexpr int kStageWidth = 1024;
inline constexpr int kStageHeight = 640;

inline constexpr int kLastFrame = 100;

/// A picture of a course.
struct CoursePicture {
    std::string name; ///< ready to print
    KTPath path;
    PictureSize size;
};

/// The widest picture of the course; without a name if no picture can be read.
CoursePicture WidestPicture(CourseFolder const &folder);

/// Fades a picture in that is as high as the stage, scrolls it from its left end to its right one, and fades it out. Its
/// quad is centred at the origin, and so is the stage.
KTAnimation ScrollOf(KTQuad3D const &quad);

/// A table of frames: where the picture stands, how opaque it is, and which of its columns show, eased and at constant
/// speed. UTF-8, with a title and an empty line at the end; empty if the course has no readable picture.
std::string ReportAnimation(CourseFolder const &folder);
