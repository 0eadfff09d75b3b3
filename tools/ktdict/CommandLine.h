// CommandLine.h: what the user asks for.

#pragma once

#include <bit>
#include <optional>
#include <string>
#include <vector>

/// What the program ends with.
enum class Status : int {
    Fine = 0,    ///< done, and nothing to report
    Found = 1,   ///< problems or differences were found, or a key is missing
    Usage = 2,   ///< the command line is wrong; nothing was done
    Trouble = 3, ///< a file cannot be read or written; no output file was made
};

/// The worse of two.
constexpr Status Worse(Status a, Status b) { return a < b ? b : a; }

enum class Command { Dump, Get, Check, Convert, Diff };

/// What `convert` makes.
struct ConvertOptions {
    std::string input;
    std::string output;
    bool isBinary = false;
    int encoding = 0; ///< as DictionaryForm has it
    std::endian order = std::endian::little;
    std::optional<std::string> locale;
    bool escapes = false;
    bool salvages = false;
    bool overwrites = false;
};

/// The command line, checked. Texts are UTF-8.
struct Options {
    Command command{};
    bool isJson = false;
    bool hasHeader = true; // dump
    bool isRaw = false;    // get
    std::string key;       // get
    std::vector<std::string> files;
    ConvertOptions convert;
};

/// What came of the command line: options, or what to print and the status to end with.
struct ParsedCommandLine {
    std::optional<Options> options;
    std::string text;
    Status status = Status::Fine;
};

/// Reads the arguments behind the program's name.
ParsedCommandLine ParseCommandLine(std::vector<std::string> arguments);
