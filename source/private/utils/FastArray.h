// FastArray.h: the entries of a dictionary, as version 2 of the binary form holds them.
//
// Entries have global indices from 0 on and stand in blocks, each of which is a file's or was filled by Add, or begins
// as the one and goes on as the other:
//
//     block  base index, entry count, second count, keys-present flag
//            the file's part    12 bytes for each entry, which say where in the file's own bytes key and text are;
//                               these stay in memory as they were read
//            the added part     16 bytes for each entry, and an arena with its text and key
//
// A replaced text is kept by itself. When a file brings a key that is there already, the earlier entry keeps its index
// and is dead from then on: it is not found, not listed and not written.
//
// The 1021 buckets of the form are made when a file is written and checked when one is read; finding goes through a
// KeyIndex. Not locked: distinct arrays may be used from any thread, one that nobody changes may be read by several.

#pragma once

#include "DictionaryBytes.h"
#include "DictionaryConversion.h"
#include "DictionaryProblem.h"
#include "KeyIndex.h"
#include "RefCountObj.h"

#include <cstdint>
#include <memory>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace orvik_private {

class DictionaryBlock;

/// One living entry, as a listing gives it. The views are valid until the array changes or the next entry comes.
struct ListedEntry {
    std::uint32_t index = 0; ///< global
    std::uint32_t block = 0;
    bool hasKey = false;  ///< false for the entries of a block without keys; the key is empty then
    std::string_view key; ///< without the "$$$"
    UnitsView value;
};

class FastArray final : public RefCountObj {
  public:
    static constexpr std::int64_t kNotFound = -1;

    FastArray();

    /// Adds an entry, or replaces the text of the one with that key, and returns its global index; kNotFound when the
    /// key is empty, key or text has 4 GiB, or there are 2^32 - 2 entries. Throws std::bad_alloc; nothing has changed
    /// then.
    std::int64_t Add(std::string_view key, UnitsView value);

    /// The global index of the living entry with that key, or kNotFound. An empty key is never found.
    std::int64_t Find(std::string_view key) const noexcept;

    /// Entries of all blocks, the dead ones too: the next entry's global index.
    std::uint32_t EntryTotal() const noexcept { return m_EntryTotal; }

    /// The second counts of all blocks, as files bring them, and one for each entry added here. It stops at 2^32 - 1
    /// instead of beginning again.
    std::uint32_t SecondTotal() const noexcept { return m_SecondTotal; }

    std::uint32_t LivingCount() const noexcept { return m_EntryTotal - m_DeadCount; }
    std::size_t BlockCount() const noexcept { return m_Blocks.size(); }

    /// The text of an entry. The view points into the array, or into `scratch` where the stored form is another one.
    /// REQUIRES: index < EntryTotal().
    UnitsView Value(std::uint32_t index, KTUnits &scratch) const;

    /// The same as the bytes of its units, which may begin at an odd address: nothing is copied for that.
    std::string_view ValueBytes(std::uint32_t index, KTUnits &scratch) const;

    /// The key of an entry; empty when it has none. REQUIRES: index < EntryTotal().
    std::string_view Key(std::uint32_t index) const noexcept;

    /// Whether the entry has not been overtaken by a later one with its key. REQUIRES: index < EntryTotal().
    bool IsAlive(std::uint32_t index) const noexcept;

    /// Calls visit(ListedEntry const &) for each living entry, by block and index. The array must not change meanwhile.
    template <typename Visit> void ForEach(Visit const &visit) const {
        KTUnits scratch;
        for (std::uint32_t index = 0, block = 0; index < m_EntryTotal; ++index) {
            ListedEntry entry;
            if (List(index, block, scratch, entry)) {
                visit(entry);
            }
        }
    }

    /// Reads one block from the cursor; the bytes belong to `file`, which the block keeps when it has entries. With an
    /// `encoding` other than kEncodingNone texts are multibyte and are converted as they are asked for. Throws
    /// DamagedFile: for tables or texts that are cut off nothing has been added then; for a run outside the texts the
    /// entries before it have been. False when all entries are there but the lists of the buckets are wrong.
    bool ReadBlock(ByteCursor &cursor, std::shared_ptr<DictionaryBuffer const> const &file, int encoding,
                   DictionaryObserver *observer);

    /// Writes all living entries as one block with base index 0, in the given byte order, the texts in UTF-16 or (with
    /// any other encoding) in UTF-8. Throws std::length_error, before anything is written, when a key or text has more
    /// bytes than 16 bits can count or all of them together more than 32; and what the sink throws.
    void WriteBlock(ByteSink &sink, std::endian order, int encoding, DictionaryObserver *observer) const;

  private:
    friend class DictionaryBlockReader;

    ~FastArray() override;

    DictionaryBlock &BlockOf(std::uint32_t index) const noexcept;
    DictionaryBlock &BlockForAdding();
    bool List(std::uint32_t index, std::uint32_t &block, KTUnits &scratch, ListedEntry &entry) const;
    std::uint32_t FindTagged(std::uint32_t tag, std::string_view key) const noexcept;

    /// Takes a block's entries over and links them; the ones whose keys were there before are reported.
    void Append(std::unique_ptr<DictionaryBlock> block, DictionaryObserver *observer);

    /// Makes a key find the entry; one that it found before is dead then.
    void LinkEntry(std::uint32_t tag, std::uint32_t index, std::string_view key, DictionaryObserver *observer);
    void AddToSecondTotal(std::uint32_t count) noexcept;

    std::vector<std::unique_ptr<DictionaryBlock>> m_Blocks; // by base index
    std::unordered_map<std::uint32_t, KTUnits> m_Replaced;  // texts by global index
    KeyIndex m_Index;
    std::uint32_t m_EntryTotal = 0;
    std::uint32_t m_SecondTotal = 0;
    std::uint32_t m_DeadCount = 0;
    bool m_FilesHaveKeys = true; // what the last file said, for files that do not say it
};

} // namespace orvik_private
