// Check.cpp: what is wrong in dictionaries, and where.

#include "Commands.h"
#include "LoadedFile.h"
#include "Show.h"

#include <memory>
#include <vector>

using namespace orvik_private;

namespace {

// What the reading does not mind, but the author should.
void CheckEntries(LoadedFile const &file, Report &report) {
    file.ForEach([&](Entry const &entry) {
        if (!entry.hasKey || entry.key.empty()) {
            std::string const detail =
                "entry " + std::to_string(entry.position + 1) + " has no key, so nobody finds it";
            report.Add({.file = file.Path(), .kind = "no-key", .detail = detail});
            return;
        }
        if (!IsUtf8(entry.key) || entry.key.find('=') != std::string_view::npos) {
            report.Add({.file = file.Path(),
                        .kind = "unfindable-key",
                        .key = entry.key,
                        .detail = "keys are looked up as UTF-8 and up to their first =, so nobody finds this one"});
        }
        if (entry.text.find(static_cast<unsigned short>(0)) != UnitsView::npos) {
            report.Add({.file = file.Path(),
                        .kind = "zero-in-text",
                        .key = entry.key,
                        .detail = "the application gets the text up to its first zero"});
        }
        if (!IsUtf16(entry.text)) {
            report.Add({.file = file.Path(),
                        .kind = "unpaired-surrogate",
                        .key = entry.key,
                        .detail = "the text has half of a character"});
        }
    });
    if (!file.OldEntries().empty()) {
        report.Add({.file = file.Path(),
                    .kind = "old-version",
                    .detail = "the application does not find the entries of a file of version 1; convert it"});
    }
}

void ReportMissing(LoadedFile const &in, LoadedFile const &from, char const *kind, LoadedFile const &named,
                   std::string const &detail, Report &report) {
    KTUnits scratch;
    UnitsView text;
    in.ForEach([&](Entry const &entry) {
        if (entry.hasKey && !from.Find(entry.key, scratch, text)) {
            report.Add({.file = named.Path(), .kind = kind, .key = entry.key, .detail = detail});
        }
    });
}

std::unique_ptr<LoadedFile> Check(std::string const &path, LoadedFile const *first, Report &report, std::string &why) {
    auto file = LoadedFile::Load(path, Reported::All, report, why);
    if (!file) {
        return nullptr;
    }
    CheckEntries(*file, report);
    if (first != nullptr) {
        ReportMissing(*first, *file, "missing-key", *file, "only " + first->Path() + " has the key", report);
        ReportMissing(*file, *first, "extra-key", *file, first->Path() + " does not have the key", report);
    }
    return file;
}

} // namespace

Status RunCheck(Options const &options, Report &report) {
    std::unique_ptr<LoadedFile> first;
    for (std::string const &path : options.files) {
        std::string why;
        auto file = Check(path, first.get(), report, why);
        if (!file) {
            return report.Fail(why);
        }
        if (!first) {
            first = std::move(file);
        }
    }
    report.EndFindings();
    if (!report.IsJson()) {
        std::string const count = std::to_string(report.Count());
        report.Out().Print(report.Count() == 0   ? std::string("no problems\n")
                           : report.Count() == 1 ? count + " problem\n"
                                                 : count + " problems\n");
    }
    return report.Result();
}
