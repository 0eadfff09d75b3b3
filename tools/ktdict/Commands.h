// Commands.h: the subcommands. Each is a file of its own, prints through the report and returns what the program ends
// with. They throw std::bad_alloc.

#pragma once

#include "CommandLine.h"
#include "Report.h"

/// Prints all entries of a file.
Status RunDump(Options const &options, Report &report);

/// Prints what the application would get for a key, from each file by itself.
Status RunGet(Options const &options, Report &report);

/// Reports what is wrong in each file, and the keys in which the others differ from the first.
Status RunCheck(Options const &options, Report &report);

/// Writes a file in another form, reads it back, and reports the entries that come back otherwise.
Status RunConvert(Options const &options, Report &report);

/// Prints the entries in which two files differ.
Status RunDiff(Options const &options, Report &report);
