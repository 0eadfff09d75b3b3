// DictionaryForms.h: the readers of the two forms, which fill a dictionary's stores. DictionaryReader.h draws the forms.

#pragma once

#include "DictionaryLines.h"

#include <array>
#include <string_view>

namespace orvik_private {

/// What a binary file begins with.
constexpr std::string_view kDictionaryMagic = "LexiStr Binary Format";

/// Reads one file of the binary form, which is in memory as a whole.
class DictionaryBinaryReader {
  public:
    DictionaryBinaryReader(DictionaryReader &dictionary, DictionaryObserver *observer)
        : m_Dictionary(dictionary), m_Observer(observer) {}

    /// Reads what is left of the source and takes it apart; clears the valid flag when it is damaged.
    void Read(BufferedSource &source);

  private:
    void ReadBody(ByteCursor &cursor, std::shared_ptr<DictionaryBuffer const> const &file);
    void ReadVersion2(ByteCursor &cursor, std::shared_ptr<DictionaryBuffer const> const &file);
    void ReadVersion15(ByteCursor &cursor);
    void ReadVersion10(ByteCursor &cursor);
    std::unique_ptr<DictionaryEntry> MakeEntry(std::string_view key, std::string_view value) const;
    void Report(DictionaryProblemKind kind, std::uint64_t offset, char const *detail) const;

    DictionaryReader &m_Dictionary;
    DictionaryObserver *m_Observer;
    DictionaryVersion m_Version;
    int m_Encoding = kEncodingNone;
};

/// Reads one file of the text form.
class DictionaryTextReader {
  public:
    DictionaryTextReader(DictionaryReader &dictionary, DictionaryObserver *observer)
        : m_Dictionary(dictionary), m_Observer(observer) {}

    void Read(BufferedSource &source);

  private:
    void ReadLine(UnitsView line);
    void Add(UnitsView value);
    KTUnits UnescapeValue(UnitsView value);
    void ReportPlaces(EntryPart const &part, bool hasEquals);
    void Report(DictionaryProblemKind kind, std::uint64_t offset, char const *detail);

    DictionaryReader &m_Dictionary;
    DictionaryObserver *m_Observer;
    std::uint64_t m_Line = 0;
    std::string m_Key; // of the line
};

} // namespace orvik_private
