// RoundTrip.cpp: comparing entries, and finding out why they differ.

#include "RoundTrip.h"

#include "DictionaryLines.h"
#include "Show.h"

#include <algorithm>

using namespace orvik_private;

namespace {

bool IsLossyInAnsi(UnitsView text) {
    bool lossy = false;
    UnitsToMultibyte(kEncodingAnsi, text, &lossy);
    return lossy;
}

void AppendEntity(KTUnits &text, unsigned short unit) {
    constexpr char kDigits[] = "0123456789ABCDEF";
    text.push_back('#');
    text.push_back('{');
    for (int shift = 12; shift >= 0; shift -= 4) {
        text.push_back(static_cast<unsigned char>(kDigits[unit >> shift & 0xF]));
    }
    text.push_back('}');
}

// The text with harmless letters in place of all that may begin an escape but `kept`.
KTUnits WithOnly(UnitsView text, unsigned short kept) {
    KTUnits result(text);
    for (unsigned short &unit : result) {
        unit = (unit == '\\' || unit == '^' || unit == '#') && unit != kept ? static_cast<unsigned short>('x') : unit;
    }
    return result;
}

class Comparison {
  public:
    Comparison(LoadedFile const &source, DictionaryReader const &written, DictionaryForm const &form, Report &report)
        : m_Source(source), m_Written(written), m_Form(form), m_Report(report) {}

    void Compare(Entry const &entry) {
        std::int64_t const index = Find(entry);
        if (index < 0) {
            Add(entry, "unwritable-key", "the form cannot hold the key; the entry is left out", nullptr);
            return;
        }
        UnitsView const back = m_Written.Array().Value(static_cast<std::uint32_t>(index), m_Scratch);
        if (back != entry.text) {
            AddReasons(entry, back);
        }
    }

  private:
    std::int64_t Find(Entry const &entry) const {
        if (entry.hasKey && !entry.key.empty()) {
            return m_Written.Find(entry.key);
        }
        // Without a key it is in its place or nowhere.
        bool const isThere = m_Form.isBinary && !entry.isOld && entry.position < m_Written.Array().EntryTotal() &&
                             m_Written.Array().Key(entry.position).empty();
        return isThere ? std::int64_t{entry.position} : FastArray::kNotFound;
    }

    void AddReasons(Entry const &entry, UnitsView back) {
        std::uint64_t const before = m_Report.Count();
        if (m_Form.isBinary) {
            if (m_Form.encoding != kEncodingNone && !IsUtf16(entry.text)) {
                Add(entry, "unpaired-surrogate", "UTF-8 cannot hold half of a character", &back);
            }
        } else {
            AddTextReasons(entry, back);
        }
        if (m_Report.Count() == before) {
            Add(entry, "changed-text", "the text is another one when it is read", &back);
        }
    }

    void AddTextReasons(Entry const &entry, UnitsView back) {
        if (IsChangedBy(entry.text, '\\')) {
            Add(entry, "backslash", "the text's backslash is read as an escape", &back);
        }
        if (IsChangedBy(entry.text, '^')) {
            Add(entry, "caret", "the text's caret is read as an escape", &back);
        }
        if (IsChangedBy(entry.text, '#')) {
            Add(entry, "entity", "the text's #{ is read as an entity", &back);
        }
        if (m_Form.encoding != kEncodingNone && IsLossyInAnsi(entry.text)) {
            Add(entry, "unmappable-text", "the ANSI code page does not have all characters of the text", &back);
        }
    }

    static bool IsChangedBy(UnitsView text, unsigned short unit) {
        return text.find(unit) != UnitsView::npos && !SurvivesTextForm("/", WithOnly(text, unit), kEncodingNone);
    }

    void Add(Entry const &entry, char const *kind, std::string detail, UnitsView const *back) {
        if (back != nullptr) {
            detail += "; it comes back as \"" + ShowBeginning(*back) + "\"";
        }
        Finding finding;
        finding.file = m_Source.Path();
        finding.kind = kind;
        if (entry.hasKey) {
            finding.key = entry.key;
        } else {
            detail = "entry " + std::to_string(entry.position + 1) + ": " + detail;
        }
        finding.detail = detail;
        m_Report.Add(finding);
    }

    LoadedFile const &m_Source;
    DictionaryReader const &m_Written;
    DictionaryForm const &m_Form;
    Report &m_Report;
    KTUnits m_Scratch;
};

} // namespace

bool CanHoldKey(Entry const &entry, DictionaryForm const &form) {
    if (entry.isOld || !form.isBinary) {
        // Those of version 1 are added anew, which cuts a key at its "=".
        bool const isName = entry.hasKey && !entry.key.empty() && entry.key.find('=') == std::string_view::npos;
        return isName && (form.isBinary || SurvivesTextForm(entry.key, {}, form.encoding));
    }
    return true;
}

KTUnits EscapedForTextForm(UnitsView text, int encoding) {
    bool const isLossy = encoding != kEncodingNone && IsLossyInAnsi(text);
    KTUnits escaped;
    escaped.reserve(text.size());
    for (std::size_t at = 0; at < text.size(); ++at) {
        unsigned short const unit = text[at];
        bool const isOpening = unit == '#' && at + 1 < text.size() && text[at + 1] == '{';
        if (unit == '\\' || unit == '^' || unit == 0 || isOpening ||
            (isLossy && unit >= 0x80 && IsLossyInAnsi(text.substr(at, 1)))) {
            AppendEntity(escaped, unit);
        } else {
            escaped.push_back(unit);
        }
    }
    return escaped;
}

void ReportChanges(LoadedFile const &source, DictionaryReader const &written, DictionaryForm const &form,
                   Report &report) {
    Comparison comparison(source, written, form, report);
    source.ForEach([&](Entry const &entry) { comparison.Compare(entry); });
}
