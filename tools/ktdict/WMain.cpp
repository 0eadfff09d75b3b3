// WMain.cpp: ktdict, a tool for the people who write and translate the texts of string dictionaries.
//
//     arguments --CommandLine--> Options --Dump, Get, Check, Convert, Diff--> Report --> Console
//                                              |  LoadedFile: a file, its entries, its problems
//                                              '  RoundTrip: what the text form would change
//
// The dictionary's engine is linked in; KTPublic.dll is not loaded, as its load empties the application's log.

#include "CommandLine.h"
#include "Commands.h"
#include "OUtf.h"
#include "Report.h"
#include "WConsole.h"

#include <exception>
#include <new>
#include <string>
#include <vector>

namespace {

Status Dispatch(Options const &options, Report &report) {
    switch (options.command) {
    case Command::Dump:
        return RunDump(options, report);
    case Command::Get:
        return RunGet(options, report);
    case Command::Check:
        return RunCheck(options, report);
    case Command::Convert:
        return RunConvert(options, report);
    case Command::Diff:
        return RunDiff(options, report);
    }
    return Status::Usage;
}

Status RunCommand(Options const &options, Console &console) {
    Report report(console, options.isJson, options.command == Command::Check);
    try {
        return Dispatch(options, report);
    } catch (std::bad_alloc const &) {
        return report.Fail("there is not enough memory");
    } catch (std::exception const &error) {
        return report.Fail(error.what());
    }
}

Status Run(std::vector<std::string> arguments, Console &console) {
    ParsedCommandLine const parsed = ParseCommandLine(std::move(arguments));
    if (parsed.options) {
        return RunCommand(*parsed.options, console);
    }
    if (parsed.status == Status::Fine) {
        console.Print(parsed.text);
    } else {
        console.PrintError(parsed.text);
    }
    return parsed.status;
}

} // namespace

int wmain(int count, wchar_t **arguments) {
    Console console;
    std::vector<std::string> texts;
    for (int i = 1; i < count; ++i) {
        KTUnits const units = OWideToUnits(arguments[i], OWideLength(arguments[i]));
        texts.push_back(OUnitsToUtf8(units.data(), units.size()));
    }
    Status status = Run(std::move(texts), console);
    if (!console.Flush()) {
        console.PrintError("ktdict: the output cannot be written\n");
        status = Status::Trouble;
    }
    return static_cast<int>(status);
}
