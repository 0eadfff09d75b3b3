// DictionaryReadBinary.cpp: the header of the binary form and the bodies of its versions.

#include "DictionaryForms.h"

#include <utility>

namespace orvik_private {

namespace {

// Entries of one bucket, chained in when all of them, or as many as the file has, are there.
class BucketEntries {
  public:
    BucketEntries(LegacyTable &table, std::uint32_t bucket) : m_Table(table), m_Bucket(bucket) {}
    BucketEntries(BucketEntries const &) = delete;
    BucketEntries &operator=(BucketEntries const &) = delete;
    ~BucketEntries() { m_Table.PutAhead(m_Bucket, std::move(m_Entries)); }

    void Add(std::unique_ptr<DictionaryEntry> entry) { m_Entries.push_back(std::move(entry)); }

  private:
    LegacyTable &m_Table;
    std::uint32_t m_Bucket;
    std::vector<std::unique_ptr<DictionaryEntry>> m_Entries;
};

std::string_view TakeRun(ByteCursor &cursor, std::uint64_t length, char const *field) {
    return {reinterpret_cast<char const *>(cursor.Take(length, field)), static_cast<std::size_t>(length)};
}

void CheckBucket(std::uint32_t bucket, std::uint64_t offset) {
    if (bucket >= kBucketCount) {
        throw DamagedFile("a bucket has a number above 1020", offset);
    }
}

} // namespace

void DictionaryBinaryReader::Report(DictionaryProblemKind kind, std::uint64_t offset, char const *detail) const {
    m_Dictionary.m_IsValid = false;
    if (m_Observer != nullptr) {
        m_Observer->OnProblem({kind, 0, offset, {}, detail});
    }
}

void DictionaryBinaryReader::Read(BufferedSource &source) {
    // Files of version 1 are small and old; they are read, so that only one kind of entry depends on a mapped file.
    std::string_view const head = source.Peek(kDictionaryMagic.size() + 1);
    bool const isVersion2 = head.size() > kDictionaryMagic.size() && head.back() == 2;
    std::shared_ptr<DictionaryBuffer> const file = source.TakeRest(isVersion2);
    ByteCursor cursor(file->Bytes(), file->Size());
    try {
        ReadBody(cursor, file);
    } catch (DamagedFile const &damage) {
        Report(DictionaryProblemKind::Damaged, damage.Offset(), damage.what());
    } catch (TextConversionException const &problem) {
        Report(DictionaryProblemKind::Damaged, cursor.Position(), problem.what());
    }
    if (source.Failed()) {
        Report(DictionaryProblemKind::ReadFailed, file->Size(), "the file could not be read to its end");
    }
}

void DictionaryBinaryReader::ReadBody(ByteCursor &cursor, std::shared_ptr<DictionaryBuffer const> const &file) {
    constexpr char kField[] = "the header is cut off";
    cursor.Take(kDictionaryMagic.size(), kField);
    m_Version.major = cursor.TakeU8(kField);
    m_Version.minor = cursor.TakeU8(kField);
    m_Encoding = cursor.TakeU8(kField);
    std::size_t const at = cursor.Position();
    if (m_Version.major >= 2 && m_Version.minor >= 1) {
        std::uint8_t const order = cursor.TakeU8(kField);
        if (order > 1) {
            throw DamagedFile("the byte order is neither 0 nor 1", at);
        }
        cursor.SetByteOrder(order == 0 ? std::endian::little : std::endian::big);
    }
    if (m_Version.major == 2) {
        ReadVersion2(cursor, file);
        return;
    }
    bool const is15 = m_Version == DictionaryVersion{1, 5};
    if (!is15 && m_Version != DictionaryVersion{1, 0}) {
        throw DamagedFile("there is no such version", kDictionaryMagic.size());
    }
    m_Dictionary.m_LegacyFiles.push_back(file); // before anything points into it
    if (is15) {
        ReadVersion15(cursor);
    } else {
        ReadVersion10(cursor);
    }
}

void DictionaryBinaryReader::ReadVersion2(ByteCursor &cursor, std::shared_ptr<DictionaryBuffer const> const &file) {
    constexpr char kField[] = "the locale is cut off";
    std::uint32_t const length = cursor.TakeU32(kField);
    std::string_view const locale = TakeRun(cursor, length, kField);
    m_Dictionary.m_Locale = std::string(locale.substr(0, locale.find('\0')));
    if (!m_Dictionary.m_Array->ReadBlock(cursor, file, m_Encoding, m_Observer)) {
        m_Dictionary.m_IsValid = false; // the block itself has said why
    }
    m_Dictionary.m_Version = {};
}

void DictionaryBinaryReader::ReadVersion15(ByteCursor &cursor) {
    constexpr char kTables[] = "the tables of the buckets are cut off";
    std::uint32_t const buckets = cursor.TakeU32(kTables);
    unsigned char const *const ends = cursor.Take(std::uint64_t{buckets} * 4, kTables);
    std::uint32_t const runs = buckets == 0 ? 0 : cursor.U32At(ends + std::size_t{buckets - 1} * 4);
    unsigned char const *const lengths = cursor.Take(std::uint64_t{runs} * 4, kTables);
    unsigned char const *const numbers = cursor.Take(std::uint64_t{buckets} * 2, kTables);
    auto const nextRun = [&](std::uint32_t run) {
        return TakeRun(cursor, cursor.U32At(lengths + std::size_t{run} * 4), "the entries are cut off");
    };
    std::uint32_t run = 0;
    for (std::size_t i = 0; i < buckets; ++i) {
        std::uint32_t const end = cursor.U32At(ends + i * 4);
        std::uint32_t const bucket = cursor.U16At(numbers + i * 2);
        CheckBucket(bucket, cursor.Position());
        if (end < run || end > runs || (end - run) % 2 != 0) {
            throw DamagedFile("the counts of the runs do not fit one another", cursor.Position());
        }
        BucketEntries entries(m_Dictionary.m_Legacy, bucket);
        while (run != end) {
            std::string_view const key = nextRun(run++);
            entries.Add(MakeEntry(key, nextRun(run++)));
        }
    }
}

void DictionaryBinaryReader::ReadVersion10(ByteCursor &cursor) {
    constexpr std::size_t kRecord = 6;
    constexpr char kEntries[] = "the entries are cut off";
    constexpr std::uint64_t kLengths = 8; // of key and text
    std::size_t const count = cursor.TakeU16("the records are cut off");
    unsigned char const *const records = cursor.Take(count * kRecord, "the records are cut off");
    std::uint64_t position = count == 0 ? 0 : cursor.U32At(records + 2);
    for (std::size_t i = 0; i + 1 < count; ++i) {
        std::uint32_t const bucket = cursor.U16At(records + i * kRecord);
        std::uint64_t const end = cursor.U32At(records + (i + 1) * kRecord + 2);
        CheckBucket(bucket, cursor.Position());
        BucketEntries entries(m_Dictionary.m_Legacy, bucket);
        while (position < end) {
            std::string_view const key = TakeRun(cursor, cursor.TakeU32(kEntries), kEntries);
            std::string_view const value = TakeRun(cursor, cursor.TakeU32(kEntries), kEntries);
            entries.Add(MakeEntry(key, value));
            position += kLengths + key.size() + value.size();
        }
        if (position != end) {
            throw DamagedFile("an entry goes on past the end of its record", cursor.Position());
        }
    }
}

// The entry points into the file's bytes, unless its text has to be converted.
std::unique_ptr<DictionaryEntry> DictionaryBinaryReader::MakeEntry(std::string_view key, std::string_view value) const {
    if (m_Encoding == kEncodingNone) {
        return std::make_unique<DictionaryEntry>(key, false, ByteRunValue(value, false));
    }
    return std::make_unique<DictionaryEntry>(key, false, ByteRunValue(MultibyteToUnits(m_Encoding, value)));
}

} // namespace orvik_private
