// DictionaryReader.h: the dictionary itself: keys with texts, read from files of every form and written to them.
//
// Key texts, as callers write them, are
//
//     [$$$]name[=default]
//
// and the name is what is stored and found. Two stores stand behind it: a FastArray for version 2, and the hash table of
// version 1, into which files of version 1 go whatever the dictionary's own version is. Only a dictionary whose major
// version is below 2 looks there.
//
// Binary form, little-endian or as the byte-order byte says:
//
//     21  "LexiStr Binary Format"
//      1  u8  major version        2 here
//      1  u8  minor version        7 here
//      1  u8  encoding             0: texts are UTF-16; 1: UTF-8; others: the ANSI code page
//      1  u8  byte order           0 little, 1 big; only from major 2 and minor 1 on
//
// version 2 goes on with
//
//      4  u32 L, then L bytes      locale
//      4  u32 base index
//      1  "Y" with keys, "N" without; any other byte: as the store has it
//      4  u32 N                    entries
//      4  u32 second count         0: the block is read and dropped
//      4  u32 B                    buckets that are not empty
//     [4] u32 K                    bytes of all keys
//      4  u32 V                    bytes of all texts
//    [6N] u32 key offsets, then u16 key lengths
//     6N  u32 text offsets, then u16 text lengths in bytes
//     [K] keys
//      V  texts
//         [B u16 bucket numbers, B u32 counts, and for each bucket its count of u32 entry indices]
//
// where the brackets are there with keys only. Version 1.5:
//
//      4  u32 M                    buckets that are used
//     4M  u32 runs in buckets 0..i; an entry has two
//     4T  u32 run lengths, T being the last of these counts
//     2M  u16 bucket numbers
//         for each bucket its entries: key bytes, text bytes
//
// version 1.0:
//
//      2  u16 R
//     6R  u16 bucket number, u32 running position; the last one is an end mark
//         entries up to the next record's position: u32 length and key, u32 length and text
//
// Text form: FF FE and UTF-16, FE FF and swapped UTF-16, or bytes of the ANSI code page; one entry a line, "key=text" in
// quotation marks, the text with escapes (DictionaryUnescape.h).

#pragma once

#include "DictionaryBytes.h"
#include "DictionaryConversion.h"
#include "DictionaryEntry.h"
#include "DictionaryProblem.h"
#include "FastArray.h"

#include <bit>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orvik_private {

struct DictionaryVersion {
    std::uint8_t major = 2;
    std::uint8_t minor = 7;
    friend bool operator==(DictionaryVersion const &, DictionaryVersion const &) = default;
};

/// What Write makes of a dictionary.
struct DictionaryForm {
    bool isBinary = true;

    /// Binary: kEncodingNone for UTF-16 texts, any other for UTF-8. Text: kEncodingNone for UTF-16, any other for the
    /// ANSI code page.
    int encoding = kEncodingNone;

    /// Of every number and unit.
    std::endian order = std::endian::little;
};

/// A key text taken apart. The views point into the text.
struct KeyText {
    std::string_view name;        ///< empty: there is no such key, nor can there be
    std::string_view defaultText; ///< behind the first "="
    bool hasDefault = false;      ///< whether there was an "="
    bool isMalformed = false;     ///< "$" without "$$$"; all else is empty then
};
KeyText SplitKeyText(std::string_view text) noexcept;

/// What a lookup found.
enum class DictionaryFound { Nothing, Default, Entry };

/// A dictionary. Not locked: fill it on one thread; several may then read it.
class DictionaryReader {
  public:
    class LineReader; // DictionaryLines.h: the readers of the text form

    explicit DictionaryReader(DictionaryVersion version = {});
    DictionaryReader(DictionaryReader const &) = delete;
    DictionaryReader &operator=(DictionaryReader const &) = delete;

    /// Leaves the default dictionary's slot if it is the one there.
    ~DictionaryReader();

    // ---- entries ----

    /// Adds the text as it stands under the key text's name, a default being ignored, or replaces the text that is
    /// there. Returns the entry's global index; -1 for an empty name, for "$" without "$$$" and below version 2.
    std::int64_t Add(std::string_view keyText, UnitsView value);

    /// The global index of a name in the FastArray, or -1.
    std::int64_t Find(std::string_view name) const noexcept { return m_Array->Find(name); }

    /// Looks a key text up: here, then in the default dictionary, then its own default, unescaped. `text` is the
    /// result, pointing into the dictionary or into `scratch`, valid until either changes; empty when nothing is found.
    /// Without an encoding each byte of a default becomes one unit, sign-extended.
    DictionaryFound Lookup(std::string_view keyText, KTUnits &scratch, UnitsView &text,
                           int encoding = kEncodingNone) const;

    /// The first part of that for a name alone: here, then in the default dictionary. False if neither has it, or its
    /// text cannot be converted.
    bool LookupName(std::string_view name, KTUnits &scratch, UnitsView &text) const;

    /// The same, the text as the bytes of its units, which may begin at an odd address: nothing is copied for that.
    bool LookupBytes(std::string_view name, KTUnits &scratch, std::string_view &bytes) const;

    FastArray const &Array() const noexcept { return *m_Array; }
    LegacyTable const &Legacy() const noexcept { return m_Legacy; }

    // ---- files ----

    /// Adds what the source holds, whatever its form. Malformed input raises nothing: the valid flag is cleared, and
    /// what was read before the trouble stays. Throws std::bad_alloc.
    void Read(ByteSource &source, DictionaryObserver *observer = nullptr);

    /// Writes the entries of the FastArray and returns the number of bytes written. What the sink throws, or an entry
    /// that the form cannot hold, ends the writing: "Serialize2" and ": Caught exception" go to the standard error,
    /// `isComplete` (if not null) becomes false, and the result counts what was written until then.
    std::uint64_t Write(ByteSink &sink, DictionaryForm const &form, bool *isComplete = nullptr,
                        DictionaryObserver *observer = nullptr) const;

    // ---- state ----

    /// Whether all that was read was well-formed; once false it stays so.
    bool IsValid() const noexcept { return m_IsValid; }

    DictionaryVersion Version() const noexcept { return m_Version; }

    /// The locale of the last binary file that had one, up to its first zero byte.
    std::optional<std::string> const &Locale() const noexcept { return m_Locale; }
    void SetLocale(std::string name) { m_Locale = std::move(name); }

    /// The process-wide dictionary that others ask for what they do not have; null, as nothing here sets it. Not locked.
    static DictionaryReader *GetDefault() noexcept;
    static void SetDefault(DictionaryReader *dictionary) noexcept;

  private:
    friend class DictionaryBinaryReader; // the forms' own files work on the stores directly
    friend class DictionaryTextReader;

    bool FindBytes(std::string_view name, KTUnits &scratch, std::string_view &bytes) const;
    void WriteForm(ByteSink &sink, DictionaryForm const &form, DictionaryObserver *observer) const;

    DictionaryVersion m_Version;
    bool m_IsValid = true;
    std::optional<std::string> m_Locale;
    boost::intrusive_ptr<FastArray> m_Array;
    LegacyTable m_Legacy;
    std::vector<std::shared_ptr<DictionaryBuffer const>> m_LegacyFiles; // what entries of the table point into
};

} // namespace orvik_private
