// Report.cpp: what the demo prints.

#include "Report.h"

#include "Table.h"

#include <algorithm>
#include <cstdio>
#include <functional>
#include <map>

namespace {

constexpr std::size_t kNameWidth = 60;
constexpr std::size_t kTextWidth = 52;

// "1 file", "2 files".
std::string Count(KTUInt64 number, char const *what) { return Number(number) + " " + what + (number == 1 ? "" : "s"); }

std::string Joined(std::vector<std::string> const &notes) {
    std::string text;
    for (std::string const &note : notes) {
        text += (text.empty() ? "" : "; ") + note;
    }
    return text;
}

std::string More(std::size_t all, std::size_t shown, char const *what) {
    return all <= shown ? "" : "  ... and " + Count(all - shown, what) + " more; --all shows everything\n";
}

// The name of a file without folder and ending: for a dictionary, its language.
KTString Stem(KTString const &name) {
    KTString::size_type const slash = name.rfind(static_cast<unsigned short>('/'));
    KTString const last = slash == KTString::npos ? name : name.substr(slash + 1);
    return last.substr(0, last.rfind(static_cast<unsigned short>('.')));
}

using Results = std::vector<TextResult const *>;

Results Select(std::vector<TextResult> const &results, std::function<bool(TextResult const &)> const &wanted) {
    Results selected;
    for (TextResult const &result : results) {
        if (wanted(result)) {
            selected.push_back(&result);
        }
    }
    return selected;
}

} // namespace

std::string ReportTexts(std::vector<TextResult> const &results, ReportLimits const &limits) {
    if (results.empty()) {
        return "";
    }
    using enum Table::Align;
    Table table({{"File", Left},
                 {"Encoding", Left},
                 {"Bytes", Right},
                 {"Units", Right},
                 {"Lines", Right},
                 {"Words", Right},
                 {"Non-ASCII", Right},
                 {"U+FFFD", Right},
                 {"Notes", Left}});
    TextFacts sum;
    KTUInt64 bytes = 0;
    std::size_t rows = 0;
    for (TextResult const &result : results) {
        TextFacts const &facts = result.facts;
        sum += facts;
        bytes += result.file.size;
        if (rows++ < limits.rows) {
            std::string const name = PrintableTail(result.file.name, kNameWidth);
            auto const count = [&](KTUInt64 number) { return result.isRead ? Number(number) : "-"; };
            table.AddRow({name, result.isRead ? result.encoding : "-", Number(result.file.size), count(facts.units),
                          count(facts.lines), count(facts.words), count(facts.nonAscii), count(facts.replacements),
                          Joined(result.notes)});
        }
    }
    table.AddTotal({Count(results.size(), "file"), "", Number(bytes), Number(sum.units), Number(sum.lines),
                    Number(sum.words), Number(sum.nonAscii), Number(sum.replacements), ""});
    return "Texts\n" + table.Print() + More(results.size(), limits.rows, "file") + "\n";
}

std::string ReportCaptions(std::vector<TextResult> const &results) {
    Results const captions = Select(results, [](TextResult const &result) { return !result.cues.empty(); });
    if (captions.empty()) {
        return "";
    }
    constexpr std::size_t kMostFiles = 20;
    using enum Table::Align;
    Table table({{"File", Left}, {"Captions", Right}, {"Seconds", Right}, {"First caption", Left}});
    for (std::size_t i = 0; i < std::min(captions.size(), kMostFiles); ++i) {
        std::vector<Cue> const &cues = captions[i]->cues;
        double seconds = 0;
        for (Cue const &cue : cues) {
            seconds += cue.end - cue.start;
        }
        table.AddRow({PrintableTail(captions[i]->file.name, kNameWidth), Number(cues.size()), Number(seconds, 2),
                      PrintableCut(cues.front().text, kTextWidth)});
    }
    return "Captions\n" + table.Print() + More(captions.size(), kMostFiles, "file") + "\n";
}

std::string ReportDictionaries(std::vector<TextResult> const &results, ReportLimits const &limits) {
    Results const dictionaries = Select(results, [](TextResult const &result) { return !result.entries.empty(); });
    if (dictionaries.empty()) {
        return "";
    }
    std::vector<DictionaryEntry> const &first = dictionaries[0]->entries;
    std::map<KTString, KTString> second;
    std::vector<Table::Column> columns = {{"Key"}, {PrintableCut(Stem(dictionaries[0]->file.name), kTextWidth)}};
    bool const hasSecond = dictionaries.size() > 1;
    if (hasSecond) {
        columns.push_back({PrintableCut(Stem(dictionaries[1]->file.name), kTextWidth)});
        for (DictionaryEntry const &entry : dictionaries[1]->entries) {
            second.emplace(entry.key, entry.text);
        }
    }
    Table table(std::move(columns));
    std::size_t rows = 0;
    KTUInt64 missing = 0;
    for (DictionaryEntry const &entry : first) {
        auto const other = second.find(entry.key);
        missing += hasSecond && other == second.end() ? 1 : 0;
        if (rows++ < limits.texts) {
            std::vector<std::string> row = {PrintableCut(entry.key, kTextWidth), PrintableCut(entry.text, kTextWidth)};
            if (hasSecond) {
                row.push_back(other == second.end() ? "-" : PrintableCut(other->second, kTextWidth));
            }
            table.AddRow(std::move(row));
        }
    }
    std::string text = "Dictionary\n" + table.Print() + More(first.size(), limits.texts, "text");
    if (missing != 0) {
        text += "  " + Count(missing, "text") + " missing in the second language\n";
    }
    return text + More(dictionaries.size(), 2, "dictionary file") + "\n";
}

std::string ReportOtherFiles(CourseFolder const &folder, ReportLimits const &limits) {
    using enum Table::Align;
    Table table({{"File", Left}, {"Bytes", Right}, {"Pixels", Left}});
    std::size_t rows = 0;
    for (CourseFile const &file : folder.files) {
        if (file.kind != FileKind::Text && rows++ < limits.rows) {
            table.AddRow({PrintableTail(file.name, kNameWidth), Number(file.size),
                          file.kind == FileKind::Picture ? DescribePicture(file.path) : ""});
        }
    }
    std::string text;
    if (rows != 0) {
        text = "Pictures and other files\n" + table.Print() + More(rows, limits.rows, "file") + "\n";
    }
    if (!folder.notes.empty()) {
        text += "Left out\n";
        for (std::size_t i = 0; i < std::min(folder.notes.size(), limits.rows); ++i) {
            text += "  " + folder.notes[i] + "\n";
        }
        text += More(folder.notes.size(), limits.rows, "note") + "\n";
    }
    return text;
}

std::string ReportChecks(std::vector<TextResult> const &results) {
    Results const read = Select(results, [](TextResult const &result) { return result.isRead; });
    if (read.empty()) {
        return "";
    }
    TextFacts sum;
    KTUInt64 names = 0;
    KTUInt64 numbers = 0;
    KTUInt64 texts = 0;
    KTUInt64 permissable = 0;
    for (TextResult const *result : read) {
        sum += result->facts;
        names += result->hasFileName ? 1 : 0;
        numbers += result->numbersSurvive ? 1 : 0;
        texts += result->entries.size();
        permissable += static_cast<KTUInt64>(
            std::count_if(result->entries.begin(), result->entries.end(),
                          [](DictionaryEntry const &entry) { return entry.text.IsPermissableFileName() != 0; }));
    }
    std::string text = "Checks\n";
    auto const add = [&](char const *what, KTUInt64 good, KTUInt64 all) {
        char label[64];
        std::snprintf(label, sizeof label, "  %-48s ", what);
        text += label + Number(good) + " of " + Number(all) + "\n";
    };
    add("pieces unchanged by UTF-8 and back", sum.losslessPieces, sum.pieces);
    add("pieces unchanged by wide and automation text", sum.agreeingPieces, sum.pieces);
    add("files whose counts can be written and read back", numbers, read.size());
    add("file names that every system allows", names, read.size());
    if (texts != 0) {
        add("dictionary texts that could name a file", permissable, texts);
    }
    return text + "\n";
}

std::string ReportWork(CourseReading const &reading) {
    if (reading.texts == 0) {
        return "";
    }
    return "Work\n  texts finished by two message threads: " + Number(reading.texts) + " of " +
           Number(reading.results.size()) + "\n  texts in the autosave file: " + Number(reading.saved) + " of " +
           Number(reading.texts) + ", written " + Count(reading.saves, "time") + "\n  progress shown " +
           Count(reading.shown, "time") + "\n\n";
}

std::string ReportLog(RunLog const &log) {
    std::string const path = Printable(RunLog::FilePath().GetPathAsKTString());
    return "Log\n  " + path + "\n  " + Count(log.Lines(), "line") + " written, " + Number(RunLog::LinesInFile()) +
           " in the file\n";
}
