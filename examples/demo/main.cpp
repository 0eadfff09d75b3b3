// main.cpp: ktdemo, a small host of the KTPublic library. It reads the text files of a course and shows what the library
// makes of them; the capabilities follow one another in Run.

#include "CourseAnimation.h"
#include "CourseCopy.h"
#include "CourseDictionary.h"
#include "CourseDigests.h"
#include "CourseFiles.h"
#include "CourseMail.h"
#include "CourseProperties.h"
#include "CourseTiles.h"
#include "DocumentReport.h"
#include "Options.h"
#include "ReadCourse.h"
#include "Report.h"
#include "RunGuard.h"
#include "RunLog.h"
#include "Services.h"
#include "Table.h"
#include "WConsole.h"
#include "WCrash.h"
#include "WDisk.h"

#include <algorithm>
#include <exception>
#include <limits>

namespace {

constexpr int kDone = 0;
constexpr int kNothing = 1;
constexpr int kUsage = 2;

int Fail(Console const &console, RunLog &log, std::string const &message) {
    log.Step(message);
    console.PrintError(message);
    return kNothing;
}

struct Course {
    KTPath const &path;
    CourseFolder const &folder;
    CourseReading const &reading;
    std::vector<TextResult *> const &languages;
};

// One capability after the other.
void PrintReports(Console const &console, Options const &options, Course const &course, RunLog &log) {
    std::vector<TextResult> const &results = course.reading.results;
    ReportLimits limits;
    if (options.all) {
        limits.rows = limits.texts = std::numeric_limits<std::size_t>::max();
    }
    console.Print("Course folder: " + Printable(course.path.GetPathAsKTString()) + "\n\n");
    console.Print(ReportTexts(results, limits));
    console.Print(ReportCaptions(results));
    console.Print(ReportDictionaries(results, limits));
    console.Print(ReportProperties(course.folder, limits));
    console.Print(ReportShares(results, limits));
    console.Print(ReportOtherFiles(course.folder, limits));
    console.Print(ReportAnimation(course.folder));
    console.Print(ReportDigests(course.folder, limits));
    console.Print(ReportTiles(course.folder, options.report.empty() ? KTPath() : DiskFullPath(options.report)));
    {
        CourseCopy const copy(course.path); // gone again before the run ends
        log.Step("copied to the session folder");
        console.Print(copy.Report(limits));
        CourseDocument document(course.folder, results);
        console.Print(ReportDocument(document));
        log.Step("saved as one document, read back, compared and cloned");
        console.Print(ReportBinaryDictionary(course.languages));
    }
    console.Print(ReportMail());
    console.Print(ReportSystem(course.path));
    console.Print(ReportChecks(results));
    console.Print(ReportWork(course.reading));
}

int Run(Console const &console, Options const &options) {
    RunLog log;
    RunGuard const guard;
    if (!guard.IsHeld()) {
        // The run that holds the lock owns the log.
        console.PrintError("another ktdemo is running (it holds " + Printable(guard.FilePath().GetPathAsKTString()) +
                           ")");
        return kNothing;
    }
    KTPath const path = DiskFullPath(options.folder);
    std::string const shownPath = Printable(path.GetPathAsKTString());
    if (!DiskIsFolder(path)) {
        return Fail(console, log, "no such folder: " + Printable(options.folder));
    }
    log.Step("folder: " + shownPath);

    CourseFolder const folder = FindCourseFiles(path);
    log.Step("files found: " + std::to_string(folder.files.size()));
    if (folder.files.empty() && folder.notes.empty()) {
        return Fail(console, log, "nothing to read in " + shownPath);
    }
    if (options.crash) {
        log.Step("about to crash");
        CrashWhileSaving(console, folder);
        return Fail(console, log, "did not crash");
    }
    CourseReading reading = ReadCourse(folder.files, log);
    std::vector<TextResult> &results = reading.results;
    std::vector<TextResult *> const languages = ChooseLanguages(results);
    LookTextsUp(languages);
    log.Step("languages loaded: " + std::to_string(languages.size()));

    PrintReports(console, options, {path, folder, reading, languages}, log);

    bool const anyRead = std::any_of(results.begin(), results.end(), [](auto const &result) { return result.isRead; });
    bool const onlyOthers = results.empty() && !folder.files.empty();
    if (!anyRead && !onlyOthers) {
        return Fail(console, log, "nothing readable in " + shownPath);
    }
    log.Step("done");
    console.Print(ReportLog(log));
    return kDone;
}

} // namespace

int wmain(int count, wchar_t **arguments) {
    Console const console;
    try {
        Options const options = ParseOptions({arguments + std::min(count, 1), arguments + count});
        if (!options.error.empty()) {
            console.PrintError(options.error + " (ktdemo --help tells more)");
            return kUsage;
        }
        if (options.help) {
            console.Print(UsageText());
            return kDone;
        }
        return Run(console, options);
    } catch (std::exception const &problem) {
        console.PrintError(std::string("stopped: ") + problem.what());
        return kNothing;
    }
}
