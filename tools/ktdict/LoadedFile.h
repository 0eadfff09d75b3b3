// LoadedFile.h: one dictionary file in memory, with what its first bytes say and what was wrong with it.

#pragma once

#include "DictionaryReader.h"
#include "Json.h"
#include "Report.h"

#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

/// What kind of file it is, by its first bytes.
struct FileFacts {
    bool isBinary = false;
    unsigned major = 0; ///< these two of the binary form only
    unsigned minor = 0;
    int encoding = orvik_private::kEncodingNone;
    bool isBig = false;
    bool hasByteOrder = false;
};
FileFacts FactsOf(std::string_view head);

/// Which of a file's problems are reported.
enum class Reported {
    All,
    Damage ///< those that keep entries from being read
};

/// What tools print of a file: "binary 2.7, UTF-16, little-endian, locale en_US, 19 entries".
std::string DescribeFile(FileFacts const &facts, std::optional<std::string> const &locale, std::uint64_t entryCount);

/// One entry, wherever it is kept. The views are valid until the next one comes.
struct Entry {
    std::uint32_t position = 0; ///< from 0, among the living ones
    std::uint32_t index = 0;    ///< in the dictionary's array
    bool isOld = false;         ///< of version 1, and not in the array
    bool hasKey = false;        ///< false: of a block without keys, or with no key there
    std::string_view key;
    orvik_private::UnitsView text;
};

class LoadedFile {
  public:
    /// Reads a file and reports its problems. Null, and the reason in `why`, when it cannot be opened or the device
    /// fails. What is damaged is loaded as far as it goes. Throws std::bad_alloc.
    static std::unique_ptr<LoadedFile> Load(std::string const &path, Reported reported, Report &report,
                                            std::string &why);

    LoadedFile(LoadedFile const &) = delete;
    LoadedFile &operator=(LoadedFile const &) = delete;
    ~LoadedFile() = default;

    std::string const &Path() const noexcept { return m_Path; }
    FileFacts const &Facts() const noexcept { return m_Facts; }
    orvik_private::DictionaryReader const &Dictionary() const noexcept { return m_Dictionary; }

    /// Names the locale that the dictionary is written with.
    void SetLocale(std::string name) { m_Dictionary.SetLocale(std::move(name)); }

    /// Whether all of the file could be read.
    bool IsWhole() const noexcept { return m_IsWhole; }

    /// Entries of a file of version 1, of each key the first one. The application does not look there.
    std::vector<orvik_private::DictionaryEntry const *> const &OldEntries() const noexcept { return m_OldEntries; }
    bool HasOldEntry(std::string_view key) const { return m_OldByKey.contains(key); }

    std::uint64_t EntryCount() const noexcept { return m_Dictionary.Array().LivingCount() + m_OldEntries.size(); }

    /// Calls visit(Entry const &) for each entry, those of version 1 included, in the file's order.
    template <typename Visit> void ForEach(Visit const &visit) const {
        Entry entry;
        m_Dictionary.Array().ForEach([&](orvik_private::ListedEntry const &listed) {
            entry.index = listed.index;
            entry.hasKey = listed.hasKey && !listed.key.empty();
            entry.key = listed.key;
            entry.text = listed.value;
            visit(std::as_const(entry));
            ++entry.position;
        });
        for (orvik_private::DictionaryEntry const *const old : m_OldEntries) {
            KTUnits const text = old->Value().Units();
            entry.isOld = true;
            entry.hasKey = true;
            entry.key = old->Bytes();
            entry.text = text;
            visit(std::as_const(entry));
            ++entry.position;
        }
    }

    /// The text of a key, entries of version 1 included; false if it has none. The view is valid until `scratch`
    /// changes.
    bool Find(std::string_view key, KTUnits &scratch, orvik_private::UnitsView &text) const;

    std::string Describe() const { return DescribeFile(m_Facts, m_Dictionary.Locale(), EntryCount()); }

    /// Members "file", "form", ... of the innermost object.
    void Describe(JsonWriter &json) const;

  private:
    class Observer;

    explicit LoadedFile(std::string path) : m_Path(std::move(path)) {}
    void ListOldEntries(Observer &observer);

    std::string m_Path;
    FileFacts m_Facts;
    orvik_private::DictionaryReader m_Dictionary;
    std::vector<orvik_private::DictionaryEntry const *> m_OldEntries;
    std::unordered_map<std::string_view, orvik_private::DictionaryEntry const *> m_OldByKey;
    bool m_IsWhole = true;
};
