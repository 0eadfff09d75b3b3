// FastArrayRead.cpp: a block of the binary form. DictionaryReader.h draws it.

#include "DictionaryBlock.h"
#include "DictionaryEntry.h"
#include "FastArray.h"

#include <utility>
#include <vector>

namespace orvik_private {

namespace {

struct BlockHead {
    std::uint32_t base = 0;
    bool hasKeys = true;
    std::uint32_t entries = 0;
    std::uint32_t second = 0;
    std::uint32_t buckets = 0;
    std::uint32_t keyBytes = 0;
    std::uint32_t valueBytes = 0;
};

// Offsets and lengths of one kind of run, as the file has them.
struct RunTable {
    unsigned char const *offsets = nullptr;
    unsigned char const *lengths = nullptr;

    RunTable() = default;
    RunTable(ByteCursor &cursor, std::uint64_t count, char const *field)
        : offsets(cursor.Take(count * 4, field)), lengths(cursor.Take(count * 2, field)) {}
};

// Instead of a key's bucket: a list has had it; it has no bytes.
constexpr std::uint16_t kListed = 0xFFFF;
constexpr std::uint16_t kEmptyKey = 0xFFFE;

} // namespace

class DictionaryBlockReader {
  public:
    DictionaryBlockReader(FastArray &array, ByteCursor &cursor, int encoding, DictionaryObserver *observer)
        : m_Array(array), m_Cursor(cursor), m_Encoding(encoding), m_Observer(observer) {}

    bool Read(std::shared_ptr<DictionaryBuffer const> const &file) {
        ReadHead();
        if (m_Head.hasKeys) {
            m_KeyRuns = RunTable(m_Cursor, m_Head.entries, "the keys' places are cut off");
        }
        m_ValueRuns = RunTable(m_Cursor, m_Head.entries, "the texts' places are cut off");
        m_Keys = m_Head.hasKeys ? m_Cursor.Take(m_Head.keyBytes, "the keys are cut off") : nullptr;
        m_Values = m_Cursor.Take(m_Head.valueBytes, "the texts are cut off");

        bool const isKept = m_Head.second != 0;
        if (isKept) {
            Append(file);
        }
        return !m_Head.hasKeys || ReadLists(isKept);
    }

  private:
    void ReadHead() {
        constexpr char kField[] = "the block's head is cut off";
        std::size_t const start = m_Cursor.Position();
        m_Head.base = m_Cursor.TakeU32(kField);
        if (m_Head.base != 0 && m_Array.m_EntryTotal != 0 && m_Head.base != m_Array.m_EntryTotal) {
            throw DamagedFile("the block's base index is not the number of entries before it", start);
        }
        std::uint8_t const flag = m_Cursor.TakeU8(kField);
        if (flag == 'Y' || flag == 'N') {
            m_Array.m_FilesHaveKeys = flag == 'Y';
        }
        m_Head.hasKeys = m_Array.m_FilesHaveKeys;
        m_Head.entries = m_Cursor.TakeU32(kField);
        m_Head.second = m_Cursor.TakeU32(kField);
        m_Head.buckets = m_Cursor.TakeU32(kField);
        m_Head.keyBytes = m_Head.hasKeys ? m_Cursor.TakeU32(kField) : 0;
        m_Head.valueBytes = m_Cursor.TakeU32(kField);
        if (m_Head.entries >= kDeadMark - m_Array.m_EntryTotal) {
            throw DamagedFile("there are more entries than can be counted", start);
        }
    }

    void Append(std::shared_ptr<DictionaryBuffer const> const &file) {
        auto block = std::make_unique<DictionaryBlock>(m_Array.m_EntryTotal, m_Head.hasKeys);
        DictionaryBlock::FilePart part;
        part.records = std::make_unique_for_overwrite<FileRecord[]>(m_Head.entries);
        char const *problem = nullptr;
        while (part.count < m_Head.entries && problem == nullptr) {
            problem = MakeRecord(part.count, part.records[part.count]);
            part.count += problem == nullptr ? 1 : 0;
        }
        std::uint32_t const first = m_Array.m_EntryTotal;
        std::uint32_t const count = part.count;
        SwapTexts();
        part.encoding = m_Encoding;
        part.keys = m_Keys;
        part.values = m_Values;
        part.bytes = file;
        block->SetFilePart(std::move(part));
        m_Array.Append(std::move(block), m_Observer);
        m_Array.AddToSecondTotal(m_Head.second);
        if (problem != nullptr) {
            throw DamagedFile(problem, m_Cursor.Position());
        }
        m_First = first;
        m_Count = count;
    }

    // What is wrong with the entry, or null. Runs of no bytes may stand anywhere.
    char const *MakeRecord(std::uint32_t position, FileRecord &record) const {
        record = {};
        if (m_Head.hasKeys) {
            record.keyOffset = m_Cursor.U32At(m_KeyRuns.offsets + std::size_t{position} * 4);
            record.keyLength = m_Cursor.U16At(m_KeyRuns.lengths + std::size_t{position} * 2);
            if (record.keyLength == 0) {
                record.keyOffset = 0;
            } else if (std::uint64_t{record.keyOffset} + record.keyLength > m_Head.keyBytes) {
                return "an entry's key lies outside the keys";
            }
        }
        record.valueOffset = m_Cursor.U32At(m_ValueRuns.offsets + std::size_t{position} * 4);
        record.valueLength = m_Cursor.U16At(m_ValueRuns.lengths + std::size_t{position} * 2);
        if (record.valueLength == 0) {
            record.valueOffset = 0;
        } else if (std::uint64_t{record.valueOffset} + record.valueLength > m_Head.valueBytes ||
                   record.valueOffset >= kDeadMark) {
            return "an entry's text lies outside the texts";
        }
        return nullptr;
    }

    // Makes units of the texts in the host's byte order, where they are.
    void SwapTexts() {
        if (m_Encoding != kEncodingNone || m_Cursor.ByteOrder() == std::endian::native) {
            return;
        }
        for (std::size_t at = 0; at + 1 < m_Head.valueBytes; at += 2) {
            std::swap(m_Values[at], m_Values[at + 1]);
        }
    }

    // Reads the buckets' lists to the end and tells whether they say what the keys' hashes say. Finding does not need
    // them. Each key is hashed once, in order, as its entry comes by there and not in the order of the lists.
    bool ReadLists(bool check) {
        constexpr char kField[] = "the lists of the buckets are cut off";
        std::uint64_t const start = m_Cursor.Position();
        std::vector<std::uint16_t> bucketOf(check ? m_Count : 0, kEmptyKey);
        std::uint32_t missing = 0;
        for (std::uint32_t position = 0; position < bucketOf.size(); ++position) {
            std::string_view const key = m_Array.Key(m_First + position);
            if (!key.empty()) {
                bucketOf[position] = static_cast<std::uint16_t>(ByteRunKey::HashOf(key, kBucketCount));
                ++missing;
            }
        }
        unsigned char const *const numbers = m_Cursor.Take(std::uint64_t{m_Head.buckets} * 2, kField);
        unsigned char const *const counts = m_Cursor.Take(std::uint64_t{m_Head.buckets} * 4, kField);
        bool isRight = m_Head.buckets <= kBucketCount;
        for (std::size_t list = 0; list < m_Head.buckets; ++list) {
            std::uint16_t const bucket = m_Cursor.U16At(numbers + list * 2);
            std::uint32_t const count = m_Cursor.U32At(counts + list * 4);
            isRight = isRight && bucket < kBucketCount;
            unsigned char const *const indices = m_Cursor.Take(std::uint64_t{count} * 4, kField);
            for (std::size_t i = 0; check && i < count; ++i) {
                std::uint32_t const position = m_Cursor.U32At(indices + i * 4);
                std::uint16_t const wanted = position < bucketOf.size() ? bucketOf[position] : kListed;
                if (wanted == bucket && bucket < kBucketCount) { // no mark, which an entry that is not there has, too
                    bucketOf[position] = kListed;
                    --missing;
                } else {
                    isRight = isRight && wanted == kEmptyKey; // in whatever list
                }
            }
        }
        isRight = isRight && missing == 0;
        if (!isRight && m_Observer != nullptr) {
            m_Observer->OnProblem(
                {DictionaryProblemKind::BadBucket, 0, start, {}, "the lists of the buckets do not fit the keys"});
        }
        return isRight;
    }

    FastArray &m_Array;
    ByteCursor &m_Cursor;
    int m_Encoding;
    DictionaryObserver *m_Observer;
    BlockHead m_Head;
    RunTable m_KeyRuns;
    RunTable m_ValueRuns;
    unsigned char *m_Keys = nullptr;
    unsigned char *m_Values = nullptr;
    std::uint32_t m_First = 0; // entries that were appended
    std::uint32_t m_Count = 0;
};

bool FastArray::ReadBlock(ByteCursor &cursor, std::shared_ptr<DictionaryBuffer const> const &file, int encoding,
                          DictionaryObserver *observer) {
    return DictionaryBlockReader(*this, cursor, encoding, observer).Read(file);
}

} // namespace orvik_private
