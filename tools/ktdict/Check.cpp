// Check.cpp: what is wrong in dictionaries, and where.

#include "Commands.h"
#include "LoadedFile.h"
#include "Show.h"

#include <memory>
#include <vector>

using namespace orvik_private;

namespace {

void Add(LoadedFile const &file, char const *kind, std::optional<std::string_view> key, std::string_view detail,
         Report &report) {
    Finding finding;
    finding.file = file.Path();
    finding.kind = kind;
    finding.key = key;
    finding.detail = detail;
    report.Add(finding);
}

// What the reading does not mind, but the author should.
void CheckEntry(LoadedFile const &file, Entry const &entry, Report &report) {
    if (!entry.hasKey || entry.key.empty()) {
        std::string const number = std::to_string(entry.position + 1);
        Add(file, "no-key", std::nullopt, "entry " + number + " has no key, so nobody finds it", report);
        return;
    }
    if (!IsUtf8(entry.key) || entry.key.find('=') != std::string_view::npos) {
        Add(file, "unfindable-key", entry.key,
            "keys are looked up as UTF-8 and up to their first =, so nobody finds this one", report);
    }
    if (entry.text.find(static_cast<unsigned short>(0)) != UnitsView::npos) {
        Add(file, "zero-in-text", entry.key, "the application gets the text up to its first zero", report);
    }
    if (!IsUtf16(entry.text)) {
        Add(file, "unpaired-surrogate", entry.key, "the text has half of a character", report);
    }
}

void CheckEntries(LoadedFile const &file, Report &report) {
    file.ForEach([&](Entry const &entry) { CheckEntry(file, entry, report); });
    if (!file.OldEntries().empty()) {
        Add(file, "old-version", std::nullopt,
            "the application does not find the entries of a file of version 1; convert it", report);
    }
}

void ReportMissing(LoadedFile const &in, LoadedFile const &from, char const *kind, LoadedFile const &named,
                   std::string const &detail, Report &report) {
    KTUnits scratch;
    UnitsView text;
    in.ForEach([&](Entry const &entry) {
        if (entry.hasKey && !from.Find(entry.key, scratch, text)) {
            Add(named, kind, entry.key, detail, report);
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
