// Dump.cpp: all entries.

#include "Commands.h"
#include "LoadedFile.h"
#include "Show.h"

namespace {

void PrintText(LoadedFile const &file, bool hasHeader, Console &out) {
    if (hasHeader) {
        out.Print("# " + file.Path() + ": " + file.Describe() + "\n");
    }
    std::string line;
    file.ForEach([&](Entry const &entry) {
        line.clear();
        AppendKey(line, entry.key);
        line += '=';
        AppendText(line, entry.text);
        line += '\n';
        out.Print(line);
    });
}

void PrintJson(LoadedFile const &file, JsonWriter &json) {
    file.Describe(json);
    json.BeginArray("entries");
    file.ForEach([&](Entry const &entry) {
        json.BeginObject();
        if (entry.hasKey) {
            json.Key("key", entry.key);
        } else {
            json.Null("key");
        }
        json.Text("text", entry.text);
        json.End();
    });
    json.End();
}

} // namespace

Status RunDump(Options const &options, Report &report) {
    std::string why;
    auto const file = LoadedFile::Load(options.files.front(), Reported::Damage, report, why);
    if (!file) {
        return report.Fail(why);
    }
    report.EndFindings();
    if (report.IsJson()) {
        PrintJson(*file, report.Json());
    } else {
        PrintText(*file, options.hasHeader, report.Out());
    }
    return report.Result();
}
