// Options.h: the command line of ktdemo.

#pragma once

#include "KTString.h"

#include <string>
#include <vector>

/// What the command line asks for.
struct Options {
    KTString folder = ".";
    KTString report;    ///< where to write the page of pictures; empty: nowhere
    bool all = false;   ///< print every row, however many
    bool crash = false; ///< crash while saving, instead of reading
    bool help = false;  ///< print the usage and nothing else
    std::string error;  ///< not empty: what is wrong with the command line
};

/// Reads the arguments behind the program's name.
Options ParseOptions(std::vector<KTString> const &arguments);

/// The text that --help prints.
char const *UsageText();
