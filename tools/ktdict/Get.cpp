// Get.cpp: one key.

#include "Commands.h"
#include "LoadedFile.h"
#include "OUtf.h"
#include "Show.h"

#include <memory>
#include <vector>

using namespace orvik_private;

namespace {

char const *NameOf(DictionaryFound found) {
    return found == DictionaryFound::Entry ? "entry" : found == DictionaryFound::Default ? "default" : "nothing";
}

void PrintText(Options const &options, LoadedFile const &file, UnitsView text, Console &out) {
    std::string line = options.files.size() > 1 ? file.Path() + ": " : std::string();
    line += options.isRaw ? OUnitsToUtf8(text.data(), text.size()) : ShowText(text);
    out.Print(line + "\n");
}

// False if the file has not the key.
bool Print(Options const &options, LoadedFile const &file, Report &report) {
    KTUnits scratch;
    UnitsView text;
    DictionaryFound const found = file.Dictionary().Lookup(options.key, scratch, text);
    text = text.substr(0, text.find(static_cast<unsigned short>(0))); // where the application's text ends
    bool const isOld = found != DictionaryFound::Entry && file.HasOldEntry(SplitKeyText(options.key).name);
    if (report.IsJson()) {
        JsonWriter &json = report.Json();
        json.BeginObject();
        json.String("file", file.Path());
        json.String("found", NameOf(found));
        if (found != DictionaryFound::Nothing) {
            json.Text("text", text);
        }
        json.Boolean("isInVersion1Table", isOld);
        json.End();
        return found == DictionaryFound::Entry;
    }
    if (found != DictionaryFound::Nothing) {
        PrintText(options, file, text, report.Out());
    }
    if (found != DictionaryFound::Entry) {
        report.Out().PrintError("ktdict: " + file.Path() +
                                (isOld ? " has the key in a table of version 1, where the application does not look\n"
                                       : " does not have the key\n"));
    }
    return found == DictionaryFound::Entry;
}

} // namespace

Status RunGet(Options const &options, Report &report) {
    std::vector<std::unique_ptr<LoadedFile>> files;
    for (std::string const &path : options.files) {
        std::string why;
        files.push_back(LoadedFile::Load(path, Reported::Damage, report, why));
        if (!files.back()) {
            return report.Fail(why);
        }
    }
    report.EndFindings();
    if (report.IsJson()) {
        report.Json().Key("key", SplitKeyText(options.key).name);
        report.Json().BeginArray("results");
    }
    Status status = report.Result();
    for (auto const &file : files) {
        if (!Print(options, *file, report)) {
            status = Worse(status, Status::Found);
        }
    }
    if (report.IsJson()) {
        report.Json().End();
    }
    return status;
}
