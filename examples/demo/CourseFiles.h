// CourseFiles.h: which files a course folder holds, and what kind each is.

#pragma once

#include "KTPath.h"
#include "KTTypes.h"

#include <string>
#include <vector>

/// What the demo does with a file.
enum class FileKind {
    Text,    ///< read and counted
    Picture, ///< a PNG file: its size in pixels is read
    Other    ///< listed
};

/// One file below the folder.
struct CourseFile {
    KTPath path;   ///< full
    KTString name; ///< below the folder, with forward slashes
    KTUInt64 size = 0;
    FileKind kind = FileKind::Other;
};

/// The files of a folder.
struct CourseFolder {
    std::vector<CourseFile> files;  ///< ordered by name
    std::vector<std::string> notes; ///< what was left out and why, one line each, ready to print
};

/// Walks the folder and all below it. Links to folders are noted and not followed, and no folder is entered twice, so
/// the walk ends whatever the tree looks like; it also ends after 100,000 files.
CourseFolder FindCourseFiles(KTPath const &folder);

/// The size of a picture in pixels.
struct PictureSize {
    KTUInt32 width = 0;
    KTUInt32 height = 0;
    std::string problem; ///< why the size is not known; else empty
};

/// The size that a PNG file tells.
PictureSize ReadPictureSize(KTPath const &file);

/// "WIDTH x HEIGHT" of a PNG file, or what is wrong with it.
std::string DescribePicture(KTPath const &file);
