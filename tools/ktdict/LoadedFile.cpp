// LoadedFile.cpp: reading a file and telling what it is.

#include "LoadedFile.h"

#include "DictionaryForms.h"
#include "OUtf.h"
#include "Show.h"
#include "WFiles.h"

#include <algorithm>

using namespace orvik_private;

namespace {

// The engine keeps nothing of a file's head; this remembers the bytes as they come by.
class HeadSource final : public ByteSource {
  public:
    explicit HeadSource(ByteSource &source) : m_Source(source) {}

    std::uint64_t Size() const override { return m_Source.Size(); }
    bool Failed() const override { return m_Source.Failed(); }

    std::size_t Read(void *bytes, std::size_t count) override {
        std::size_t const got = m_Source.Read(bytes, count);
        if (m_Head.size() < kHead) {
            m_Head.append(static_cast<char const *>(bytes), std::min(got, kHead - m_Head.size()));
        }
        return got;
    }

    std::string_view Head() const { return m_Head; }

  private:
    static constexpr std::size_t kHead = 25; // magic, version, encoding, byte order

    ByteSource &m_Source;
    std::string m_Head;
};

char const *EncodingName(FileFacts const &facts) {
    return facts.encoding == kEncodingNone ? "UTF-16" : facts.encoding == kEncodingUtf8 ? "UTF-8" : "ANSI";
}

// Whether entries may have been lost to it.
bool IsDamage(DictionaryProblemKind kind) {
    switch (kind) {
    case DictionaryProblemKind::LoneDollar:
    case DictionaryProblemKind::OddByte:
    case DictionaryProblemKind::EarlyEnd:
    case DictionaryProblemKind::Damaged:
    case DictionaryProblemKind::BadBucket:
    case DictionaryProblemKind::ReadFailed:
        return true;
    default:
        return false;
    }
}

} // namespace

FileFacts FactsOf(std::string_view head) {
    FileFacts facts;
    std::size_t const magic = kDictionaryMagic.size();
    facts.isBinary = head.starts_with(kDictionaryMagic);
    if (!facts.isBinary) {
        facts.isBig = head.starts_with("\xFE\xFF");
        facts.hasByteOrder = facts.isBig || head.starts_with("\xFF\xFE");
        facts.encoding = facts.hasByteOrder ? kEncodingNone : kEncodingAnsi;
        return facts;
    }
    auto const field = [&](std::size_t at) {
        return magic + at < head.size() ? static_cast<unsigned char>(head[magic + at]) : 0U;
    };
    facts.major = field(0);
    facts.minor = field(1);
    facts.encoding = static_cast<int>(field(2));
    facts.hasByteOrder = true;
    facts.isBig = facts.major >= 2 && facts.minor >= 1 && field(3) == 1;
    return facts;
}

class LoadedFile::Observer final : public DictionaryObserver {
  public:
    Observer(LoadedFile &file, Reported reported, Report &report)
        : m_File(file), m_Reported(reported), m_Report(report) {}

    void OnProblem(DictionaryProblem const &problem) override {
        bool const isDamage = IsDamage(problem.kind);
        m_File.m_IsWhole = m_File.m_IsWhole && !isDamage;
        if (!isDamage && m_Reported == Reported::Damage) {
            return;
        }
        Finding finding;
        finding.file = m_File.m_Path;
        finding.line = problem.line;
        if (problem.line == 0 && problem.kind != DictionaryProblemKind::DuplicateKey) {
            finding.byte = problem.offset;
        }
        finding.kind = DictionaryProblemName(problem.kind);
        if (!problem.key.empty()) {
            finding.key = problem.key;
        }
        finding.detail = problem.detail;
        m_Report.Add(finding);
    }

  private:
    LoadedFile &m_File;
    Reported m_Reported;
    Report &m_Report;
};

std::unique_ptr<LoadedFile> LoadedFile::Load(std::string const &path, Reported reported, Report &report,
                                             std::string &why) {
    std::unique_ptr<ByteSource> const source = OpenInput(path, why);
    if (!source) {
        why = path + " cannot be read: " + why;
        return nullptr;
    }
    std::unique_ptr<LoadedFile> file(new LoadedFile(path));
    Observer observer(*file, reported, report);
    HeadSource head(*source);
    file->m_Dictionary.Read(head, &observer);
    if (head.Failed()) {
        why = path + " cannot be read to its end";
        return nullptr;
    }
    file->m_Facts = FactsOf(head.Head());
    file->m_IsWhole = file->m_IsWhole && file->m_Dictionary.IsValid();
    file->ListOldEntries(observer);
    return file;
}

void LoadedFile::ListOldEntries(Observer &observer) {
    LegacyTable const &table = m_Dictionary.Legacy();
    for (std::uint32_t bucket = 0; bucket < kBucketCount; ++bucket) {
        for (DictionaryEntry const *entry = table.First(bucket); entry != nullptr; entry = entry->NextEntry()) {
            if (m_OldByKey.emplace(entry->Bytes(), entry).second) {
                m_OldEntries.push_back(entry);
            } else {
                observer.OnProblem({DictionaryProblemKind::DuplicateKey, 0, 0, std::string(entry->Bytes()),
                                    "the key is there more than once; the first one counts"});
            }
        }
    }
}

bool LoadedFile::Find(std::string_view key, KTUnits &scratch, UnitsView &text) const {
    std::int64_t const index = m_Dictionary.Find(key);
    if (index >= 0) {
        text = m_Dictionary.Array().Value(static_cast<std::uint32_t>(index), scratch);
        return true;
    }
    auto const old = m_OldByKey.find(key);
    if (old == m_OldByKey.end()) {
        return false;
    }
    scratch = old->second->Value().Units();
    text = scratch;
    return true;
}

std::string DescribeFile(FileFacts const &facts, std::optional<std::string> const &locale, std::uint64_t entryCount) {
    std::string text = facts.isBinary ? "binary " + std::to_string(facts.major) + "." + std::to_string(facts.minor)
                                      : std::string("text");
    text += std::string(", ") + EncodingName(facts);
    if (facts.hasByteOrder) {
        text += facts.isBig ? ", big-endian" : ", little-endian";
    }
    if (locale) {
        text += ", locale " + ShowKey(*locale);
    }
    return text + ", " + std::to_string(entryCount) + (entryCount == 1 ? " entry" : " entries");
}

void LoadedFile::Describe(JsonWriter &json) const {
    json.String("file", m_Path);
    json.String("form", m_Facts.isBinary ? "binary" : "text");
    if (m_Facts.isBinary) {
        json.String("version", std::to_string(m_Facts.major) + "." + std::to_string(m_Facts.minor));
    }
    json.String("encoding", EncodingName(m_Facts));
    if (m_Facts.hasByteOrder) {
        json.String("byteOrder", m_Facts.isBig ? "big" : "little");
    }
    if (auto const &locale = m_Dictionary.Locale(); locale) {
        json.Key("locale", *locale);
    }
    json.Boolean("isWhole", m_IsWhole);
    json.Number("entryCount", EntryCount());
}
