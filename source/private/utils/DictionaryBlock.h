// DictionaryBlock.h: one block of a FastArray: the entries of a file, then those that were added here.

#pragma once

#include "DictionaryBytes.h"
#include "DictionaryConversion.h"

#include <cstdint>
#include <memory>
#include <string_view>
#include <utility>
#include <vector>

namespace orvik_private {

/// Where a file's entry is in the file's bytes. Nothing is copied: 12 bytes for each entry beside them.
struct FileRecord {
    std::uint32_t keyOffset;
    std::uint32_t valueOffset; ///< or one of the marks below
    std::uint16_t keyLength;
    std::uint16_t valueLength; ///< in bytes
};

/// Where an added entry is: its key, a byte if that makes the text's address even, its text.
struct AddedRecord {
    unsigned char const *key;
    std::uint32_t keyLength;
    std::uint32_t valueLength; ///< in bytes, or one of the marks below
};

/// Stand where a place is expected: the text has been replaced and is kept elsewhere, or the entry is dead. No entry of
/// a file that the reader takes has such a place, and no added text such a length.
constexpr std::uint32_t kReplacedMark = 0xFFFFFFFF;
constexpr std::uint32_t kDeadMark = 0xFFFFFFFE;

/// Memory for texts that are never freed singly: pieces of 1 KiB at first, each twice as large as the one before, up to
/// 256 KiB.
class TextArena {
  public:
    /// Memory of that size at an even address.
    unsigned char *Take(std::size_t size);

  private:
    std::vector<std::unique_ptr<unsigned char[]>> m_Pieces;
    std::size_t m_Size = 0; // of the last piece that others share
    unsigned char *m_Next = nullptr;
    std::size_t m_Left = 0;
};

class DictionaryBlock {
  public:
    DictionaryBlock(std::uint32_t base, bool hasKeys) : m_Base(base), m_HasKeys(hasKeys) {}

    // ---- the file's part, set before the block is used ----

    struct FilePart {
        std::unique_ptr<FileRecord[]> records;
        std::uint32_t count = 0;
        int encoding = kEncodingNone;
        unsigned char const *keys = nullptr;
        unsigned char const *values = nullptr;
        std::shared_ptr<DictionaryBuffer const> bytes; ///< what the three point into
    };
    void SetFilePart(FilePart part) { m_File = std::move(part); }

    // ---- entries by their position in the block ----

    std::uint32_t Base() const noexcept { return m_Base; }
    std::uint32_t Count() const noexcept { return m_File.count + m_AddedCount; }
    bool HasKeys() const noexcept { return m_HasKeys; }

    std::string_view Key(std::uint32_t position) const noexcept;
    bool IsAlive(std::uint32_t position) const noexcept { return Mark(position) != kDeadMark; }
    bool IsReplaced(std::uint32_t position) const noexcept { return Mark(position) == kReplacedMark; }
    void SetMark(std::uint32_t position, std::uint32_t mark) noexcept;

    /// A text's units in the host's byte order, as bytes, which may begin at an odd address. In `scratch` where the
    /// stored form is another one. REQUIRES: alive and not replaced.
    std::string_view ValueBytes(std::uint32_t position, KTUnits &scratch) const;

    /// Appends an entry. REQUIRES: both sizes fit in 32 bits, the text's bytes below the marks.
    void Add(std::string_view key, UnitsView value);

  private:
    static constexpr std::uint32_t kRecordsInPiece = 256;

    std::uint32_t Mark(std::uint32_t position) const noexcept {
        return position < m_File.count ? m_File.records[position].valueOffset
                                       : Added(position - m_File.count).valueLength;
    }
    AddedRecord &Added(std::uint32_t position) const noexcept {
        return m_Added[position / kRecordsInPiece][position % kRecordsInPiece];
    }

    std::uint32_t m_Base;
    bool m_HasKeys;
    FilePart m_File;
    std::vector<std::unique_ptr<AddedRecord[]>> m_Added;
    std::uint32_t m_AddedCount = 0;
    TextArena m_Arena;
};

} // namespace orvik_private
