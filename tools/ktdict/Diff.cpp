// Diff.cpp: the entries in which two files differ. Forms, versions, locales and the order of entries do not matter.

#include "Commands.h"
#include "LoadedFile.h"
#include "Show.h"

#include <algorithm>
#include <memory>
#include <utility>
#include <vector>

using namespace orvik_private;

namespace {

// Takes the differences as they are found.
class Differences {
  public:
    Differences(LoadedFile const &first, LoadedFile const &second, Report &report)
        : m_First(first), m_Second(second), m_Report(report) {}

    void Only(char sign, Entry const &entry) {
        if (m_Report.IsJson()) {
            Begin(sign == '-' ? "first" : "second", entry);
            m_Report.Json().Text("text", entry.text);
            m_Report.Json().End();
        } else {
            Line(sign, entry, entry.text);
        }
        m_IsAny = true;
    }

    void Changed(Entry const &entry, UnitsView other) {
        if (m_Report.IsJson()) {
            Begin("both", entry);
            m_Report.Json().Text("first", entry.text);
            m_Report.Json().Text("second", other);
            m_Report.Json().End();
        } else {
            Line('-', entry, entry.text);
            Line('+', entry, other);
        }
        m_IsAny = true;
    }

    bool IsAny() const { return m_IsAny; }

  private:
    void Begin(char const *in, Entry const &entry) {
        JsonWriter &json = m_Report.Json();
        json.BeginObject();
        json.String("in", in);
        if (entry.hasKey) {
            json.Key("key", entry.key);
        } else {
            json.Null("key");
        }
    }

    void Line(char sign, Entry const &entry, UnitsView text) {
        std::string line;
        if (!std::exchange(m_HasHead, true)) {
            line = "--- " + m_First.Path() + "\n+++ " + m_Second.Path() + "\n";
        }
        line += sign;
        AppendKey(line, entry.key);
        line += '=';
        AppendText(line, text);
        m_Report.Out().Print(line + "\n");
    }

    LoadedFile const &m_First;
    LoadedFile const &m_Second;
    Report &m_Report;
    bool m_IsAny = false;
    bool m_HasHead = false;
};

// Entries without keys are told apart by their places among them. Only where they are is kept: many may share the same
// bytes of a file.
std::vector<std::uint32_t> WithoutKeys(LoadedFile const &file) {
    std::vector<std::uint32_t> indices;
    file.ForEach([&](Entry const &entry) {
        if (!entry.hasKey) {
            indices.push_back(entry.index);
        }
    });
    return indices;
}

void CompareWithoutKeys(LoadedFile const &first, LoadedFile const &second, Differences &differences) {
    std::vector<std::uint32_t> const ones = WithoutKeys(first);
    std::vector<std::uint32_t> const others = WithoutKeys(second);
    KTUnits oneScratch;
    KTUnits otherScratch;
    for (std::size_t i = 0; i < std::max(ones.size(), others.size()); ++i) {
        UnitsView const one = i < ones.size() ? first.Dictionary().Array().Value(ones[i], oneScratch) : UnitsView();
        UnitsView const other =
            i < others.size() ? second.Dictionary().Array().Value(others[i], otherScratch) : UnitsView();
        Entry entry;
        entry.text = i < ones.size() ? one : other;
        if (i >= ones.size() || i >= others.size()) {
            differences.Only(i < ones.size() ? '-' : '+', entry);
        } else if (one != other) {
            differences.Changed(entry, other);
        }
    }
}

void Compare(LoadedFile const &first, LoadedFile const &second, Differences &differences) {
    KTUnits scratch;
    UnitsView text;
    first.ForEach([&](Entry const &entry) {
        if (!entry.hasKey) {
            return;
        }
        if (!second.Find(entry.key, scratch, text)) {
            differences.Only('-', entry);
        } else if (text != entry.text) {
            differences.Changed(entry, text);
        }
    });
    second.ForEach([&](Entry const &entry) {
        if (entry.hasKey && !first.Find(entry.key, scratch, text)) {
            differences.Only('+', entry);
        }
    });
    CompareWithoutKeys(first, second, differences);
}

} // namespace

Status RunDiff(Options const &options, Report &report) {
    std::string why;
    auto const first = LoadedFile::Load(options.files[0], Reported::Damage, report, why);
    auto const second = first ? LoadedFile::Load(options.files[1], Reported::Damage, report, why) : nullptr;
    if (!second) {
        return report.Fail(why);
    }
    report.EndFindings();
    if (report.IsJson()) {
        report.Json().String("first", first->Path());
        report.Json().String("second", second->Path());
        report.Json().BeginArray("differences");
    }
    Differences differences(*first, *second, report);
    Compare(*first, *second, differences);
    if (report.IsJson()) {
        report.Json().End();
    }
    return Worse(report.Result(), differences.IsAny() ? Status::Found : Status::Fine);
}
