// CourseProperties.h: the library's variants and shortcuts at work on a course: its settings as typed properties.
//
// A course's settings are the first file whose name ends in ".ini". The library's settings reader answers for a name; as
// this host is shown files of any kind, it finds the names in the text. Sections become objects, variables properties:
//
//     (nothing)              undefined             0x1A                        int
//     #1F6FA8                colour                1024                        int
//     2.5                    double                anything else               string
//
// In the section "Shortcuts" the values are packed shortcuts, written like ints.

#pragma once

#include "CourseFiles.h"
#include "KTSimpleIniFileReader.h"
#include "KTVariant.h"
#include "Report.h"

#include <string>

/// The names that the settings text gives variables, each asked for in the reader: the sections as one object of
/// objects. Keeps at most 10,000 properties.
KTVariant PropertiesOf(KTString const &text, KTSimpleIniFileReader &settings);

/// The properties with their kinds, and the shortcuts with their texts and their virtual keys. UTF-8, with titles and
/// empty lines at the ends; empty if the course has no settings.
std::string ReportProperties(CourseFolder const &folder, ReportLimits const &limits);
