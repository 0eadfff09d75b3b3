// Convert.cpp: a dictionary in another form.
//
//     input -> entries -> temporary file -> read back, compared -> output's name
//
// Nothing is at the output's name before the whole file is there, and nothing that is there is replaced unasked.

#include "Commands.h"
#include "LoadedFile.h"
#include "RoundTrip.h"
#include "WFiles.h"

#include <memory>

using namespace orvik_private;

namespace {

// Why an entry keeps the whole file from being written.
class WriteObserver final : public DictionaryObserver {
  public:
    void OnProblem(DictionaryProblem const &problem) override {
        if (problem.kind == DictionaryProblemKind::TooLong) {
            why = problem.detail + " (" + problem.key + ")";
        }
    }

    std::string why = "the disk does not take it";
};

DictionaryForm FormOf(ConvertOptions const &options) {
    DictionaryForm form;
    form.isBinary = options.isBinary;
    form.encoding = options.encoding;
    form.order = options.order;
    return form;
}

// The entries as they are to be written, made anew: those of version 1 among them, texts escaped where that is asked
// for, and none whose key would tear its line apart.
void CopyEntries(LoadedFile const &input, ConvertOptions const &options, DictionaryReader &copy) {
    DictionaryForm const form = FormOf(options);
    std::string key;
    input.ForEach([&](Entry const &entry) {
        if (CanHoldKey(entry, form)) {
            key = "$$$";
            key += entry.key;
            if (options.escapes) {
                copy.Add(key, EscapedForTextForm(entry.text, options.encoding));
            } else {
                copy.Add(key, entry.text);
            }
        }
    });
}

bool MustCopy(LoadedFile const &input, ConvertOptions const &options) {
    bool must = options.escapes || !input.OldEntries().empty();
    if (!must && !options.isBinary) {
        DictionaryForm const form = FormOf(options);
        input.ForEach([&](Entry const &entry) { must = must || !CanHoldKey(entry, form); });
    }
    return must;
}

class Conversion {
  public:
    Conversion(ConvertOptions const &options, Report &report) : m_Options(options), m_Report(report) {}

    Status Run() {
        if (AreSameFile(m_Options.input, m_Options.output)) {
            return m_Report.Fail(m_Options.output + " is the input, which is never written");
        }
        if (!m_Options.overwrites && IsThere(m_Options.output)) {
            return m_Report.Fail(m_Options.output + " is there already; --force replaces it");
        }
        std::string why;
        m_Input = LoadedFile::Load(m_Options.input, Reported::All, m_Report, why);
        if (!m_Input) {
            return m_Report.Fail(why);
        }
        if (!m_Input->IsWhole() && !m_Options.salvages) {
            return m_Report.Fail(m_Options.input + " is damaged; --salvage converts what can be read of it");
        }
        if (m_Options.locale) {
            m_Input->SetLocale(*m_Options.locale);
        }
        if (!Write(why)) {
            return m_Report.Fail(m_Options.output + " cannot be written: " + why);
        }
        Summarise();
        return m_Report.Result();
    }

  private:
    bool Write(std::string &why) {
        auto const file = OutputFile::Create(m_Options.output, why);
        if (!file || !WriteEntries(*file, why) || !file->Close(why)) {
            return false;
        }
        auto const source = file->Reopen(why);
        if (!source) {
            return false;
        }
        m_Written.Read(*source);
        if (source->Failed() || !m_Written.IsValid()) {
            why = "it cannot be read back";
            return false;
        }
        ReportChanges(*m_Input, m_Written, FormOf(m_Options), m_Report);
        return file->Publish(m_Options.overwrites, why);
    }

    bool WriteEntries(OutputFile &file, std::string &why) const {
        DictionaryReader copy;
        DictionaryReader const *content = &m_Input->Dictionary();
        if (MustCopy(*m_Input, m_Options)) {
            CopyEntries(*m_Input, m_Options, copy);
            if (auto const &locale = content->Locale(); locale) {
                copy.SetLocale(*locale);
            }
            content = &copy;
        }
        WriteObserver observer;
        bool isComplete = false;
        content->Write(file, FormOf(m_Options), &isComplete, &observer);
        why = observer.why;
        return isComplete;
    }

    void Summarise() {
        m_Report.EndFindings();
        FileFacts facts;
        facts.isBinary = m_Options.isBinary;
        facts.major = m_Written.Version().major;
        facts.minor = m_Written.Version().minor;
        facts.encoding = m_Options.encoding;
        facts.hasByteOrder = m_Options.isBinary || m_Options.encoding == kEncodingNone;
        facts.isBig = m_Options.order == std::endian::big;
        std::string const description = DescribeFile(facts, m_Written.Locale(), m_Written.Array().LivingCount());
        if (m_Report.IsJson()) {
            JsonWriter &json = m_Report.Json();
            json.String("input", m_Options.input);
            json.String("output", m_Options.output);
            json.String("description", description);
            json.Number("entryCount", m_Written.Array().LivingCount());
        } else {
            m_Report.Out().Print(m_Options.input + " -> " + m_Options.output + ": " + description + "\n");
        }
    }

    ConvertOptions const &m_Options;
    Report &m_Report;
    std::unique_ptr<LoadedFile> m_Input;
    DictionaryReader m_Written;
};

} // namespace

Status RunConvert(Options const &options, Report &report) { return Conversion(options.convert, report).Run(); }
