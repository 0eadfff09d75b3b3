// DictionaryLines.h: the lines of a dictionary's text form, and what an entry's line says.

#pragma once

#include "DictionaryReader.h"

namespace orvik_private {

/// Reads lines. They end at CR or LF, and empty ones are skipped; a zero or the end of the file where a line would begin
/// ends the text. A zero inside a line is part of it.
class DictionaryReader::LineReader {
  public:
    explicit LineReader(BufferedSource &source) : m_Source(source) {}
    LineReader(LineReader const &) = delete;
    LineReader &operator=(LineReader const &) = delete;
    virtual ~LineReader() = default;

    /// The next line without its end, as UTF-16; false when there is none.
    virtual bool Next(KTUnits &line) = 0;

    /// Number of the line that Next gave, from 1 on, counted as editors do: CR LF is one end.
    std::uint64_t LineNumber() const noexcept { return m_Line; }

    /// Whether the file ended in the middle of a unit.
    bool HasOddByte() const noexcept { return m_HasOddByte; }

    /// Whether a zero, and not the end of the file, ended the text.
    bool EndedEarly() const noexcept { return m_EndedEarly; }

  protected:
    /// Calls take() for units (or -1) and put(unit) for those of the next line; false at the end of the text.
    template <typename Take, typename Put> bool NextLine(Take const &take, Put const &put);

    BufferedSource &m_Source;
    std::uint64_t m_Line = 1;
    bool m_HasOddByte = false;

  private:
    void CountEnd(int end) noexcept;

    int m_LastEnd = 0; // the line end that was read last, if nothing has followed yet
    std::uint64_t m_Ends = 0;
    bool m_EndedEarly = false;
};

/// Bytes of the ANSI code page, converted line by line.
class MultibyteReader final : public DictionaryReader::LineReader {
  public:
    using LineReader::LineReader;
    bool Next(KTUnits &line) override;

  private:
    std::string m_Bytes;
};

/// UTF-16, low byte first.
class UnicodeReader final : public DictionaryReader::LineReader {
  public:
    using LineReader::LineReader;
    bool Next(KTUnits &line) override;
};

/// UTF-16, high byte first.
class ByteSwapUnicodeReader final : public DictionaryReader::LineReader {
  public:
    using LineReader::LineReader;
    bool Next(KTUnits &line) override;
};

/// The entry's part of a line: from behind the first quotation mark that no backslash precedes to the next such one, or
/// to the end; the whole line when it has none.
struct EntryPart {
    UnitsView text;
    bool isQuoted = false;
    bool isClosed = false;      ///< whether the second quotation mark was found
    bool hasTextBefore = false; ///< other than blanks
    bool hasTextAfter = false;
};
EntryPart FindEntry(UnitsView line) noexcept;

/// The line that WriteText writes for an entry, without CR LF: quotation mark, key bytes widened, "=", the text with LF,
/// CR and quotation mark escaped, quotation mark.
KTUnits EntryLine(std::string_view key, UnitsView value);

/// Whether the entry comes back as it is when the text form in that encoding (kEncodingNone: UTF-16, else ANSI) is
/// read. Backslashes, carets, "#{", zeros and some keys do not, as they are written as they stand.
bool SurvivesTextForm(std::string_view key, UnitsView value, int encoding);

/// Writes the text form: for UTF-16 FF FE or FE FF, then a line for each entry that has a key or a text, CR LF behind
/// each. Throws what the sink throws.
void WriteText(FastArray const &array, ByteSink &sink, int encoding, std::endian order, DictionaryObserver *observer);

} // namespace orvik_private
