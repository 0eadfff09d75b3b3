// Options.cpp: the command line of ktdemo.

#include "Options.h"

char const *UsageText() {
    return "usage: ktdemo [--all | --crash] [--report=FOLDER] [FOLDER]\n"
           "\n"
           "Reads every text file below FOLDER (here: the current folder) with the KTPublic library and prints what "
           "it\n"
           "found: encodings, counts, captions and the texts of string dictionaries side by side. Nothing in FOLDER "
           "is\n"
           "changed. Text files are *.txt, *.ini, *.csv, *.srt, *.vtt, *.xml, *.md and *.json; others are listed with\n"
           "their sizes.\n"
           "\n"
           "  --all     print every row; else long tables are cut after 100\n"
           "  --crash   instead, save the texts as a project in the temporary folder, fault while saving, and show "
           "what "
           "the\n"
           "            library keeps: the work as a .ktbak file, and a crash dump\n"
           "  --report=FOLDER\n"
           "            write a page of pictures to FOLDER, index.html\n"
           "  --help    print this text\n"
           "\n"
           "Exit status: 0 done, 1 no such folder, nothing readable in it, or --crash, 2 wrong usage.\n";
}

namespace {

constexpr char kReport[] = "--report=";

} // namespace

Options ParseOptions(std::vector<KTString> const &arguments) {
    Options options;
    bool onlyFolders = false;
    bool hasFolder = false;
    for (KTString const &argument : arguments) {
        bool const isOption = !onlyFolders && argument.size() > 1 && argument[0] == '-';
        if (isOption && argument == "--") {
            onlyFolders = true;
        } else if (isOption && (argument == "--help" || argument == "-h")) {
            options.help = true;
        } else if (isOption && argument == "--all") {
            options.all = true;
        } else if (isOption && argument == "--crash") {
            options.crash = true;
        } else if (isOption && argument.GetUTF8String().starts_with(kReport)) {
            options.report = argument.substr(sizeof kReport - 1);
        } else if (isOption) {
            options.error = "unknown option: " + argument.GetUTF8String();
        } else if (hasFolder) {
            options.error = "more than one folder given";
        } else {
            options.folder = argument;
            hasFolder = true;
        }
    }
    return options;
}
