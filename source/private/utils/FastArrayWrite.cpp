// FastArrayWrite.cpp: all entries as one block of the binary form. DictionaryReader.h draws it.

#include "DictionaryEntry.h"
#include "FastArray.h"

#include <array>
#include <stdexcept>
#include <utility>
#include <vector>

namespace orvik_private {

namespace {

// Puts numbers and units in a byte order, some thousand bytes at a time.
class FieldWriter {
  public:
    // NOLINTNEXTLINE(cppcoreguidelines-pro-type-member-init): the array is written as far as it is used
    FieldWriter(ByteSink &sink, std::endian order) : m_Sink(sink), m_Swap(order != std::endian::native) {}

    void U16(std::uint16_t value) {
        value = m_Swap ? static_cast<std::uint16_t>(value << 8 | value >> 8) : value;
        Bytes(&value, sizeof value);
    }
    void U32(std::uint32_t value) {
        value = m_Swap ? value << 24 | (value & 0xFF00U) << 8 | (value >> 8 & 0xFF00U) | value >> 24 : value;
        Bytes(&value, sizeof value);
    }
    void Units(UnitsView units) {
        if (!m_Swap) {
            Bytes(units.data(), units.size() * sizeof(unsigned short));
            return;
        }
        for (unsigned short const unit : units) {
            U16(unit);
        }
    }
    void Bytes(void const *bytes, std::size_t count) {
        if (count > m_Pending.size() - m_Count) {
            Flush();
        }
        if (count > m_Pending.size()) {
            m_Sink.Write(bytes, count);
        } else if (count != 0) {
            std::memcpy(m_Pending.data() + m_Count, bytes, count);
            m_Count += count;
        }
    }
    void Flush() {
        if (m_Count != 0) {
            m_Sink.Write(m_Pending.data(), std::exchange(m_Count, 0));
        }
    }

  private:
    ByteSink &m_Sink;
    bool m_Swap;
    std::size_t m_Count = 0;
    std::array<unsigned char, 8192> m_Pending;
};

// What must be known of all entries before the first byte is written.
struct BlockPlan {
    std::vector<std::uint16_t> keyLengths;
    std::vector<std::uint16_t> valueLengths;
    std::vector<std::uint16_t> buckets; // kNone for entries without a key
    std::array<std::uint32_t, kBucketCount> counts{};
    std::uint32_t usedBuckets = 0;
    std::uint32_t keyBytes = 0;
    std::uint32_t valueBytes = 0;
    bool hasKeys = false;

    static constexpr std::uint16_t kNone = 0xFFFF;
};

std::uint16_t Length(std::size_t bytes, std::uint32_t &total, ListedEntry const &entry, char const *what,
                     DictionaryObserver *observer) {
    if (bytes > 0xFFFF || bytes > 0xFFFFFFFFU - total) {
        if (observer != nullptr) {
            observer->OnProblem({DictionaryProblemKind::TooLong, 0, 0, std::string(entry.key), what});
        }
        throw std::length_error(what);
    }
    total += static_cast<std::uint32_t>(bytes);
    return static_cast<std::uint16_t>(bytes);
}

BlockPlan MakePlan(FastArray const &array, int encoding, DictionaryObserver *observer) {
    BlockPlan plan;
    plan.keyLengths.reserve(array.LivingCount());
    plan.valueLengths.reserve(array.LivingCount());
    plan.buckets.reserve(array.LivingCount());
    array.ForEach([&](ListedEntry const &entry) {
        bool lossy = false;
        std::size_t const valueBytes = encoding == kEncodingNone
                                           ? entry.value.size() * sizeof(unsigned short)
                                           : UnitsToMultibyte(kEncodingUtf8, entry.value, &lossy).size();
        if (lossy && observer != nullptr) {
            observer->OnProblem({DictionaryProblemKind::UnmappableText, 0, 0, std::string(entry.key),
                                 "an unpaired surrogate becomes U+FFFD"});
        }
        plan.keyLengths.push_back(
            Length(entry.key.size(), plan.keyBytes, entry, "the key is too long for the binary form", observer));
        plan.valueLengths.push_back(
            Length(valueBytes, plan.valueBytes, entry, "the text is too long for the binary form", observer));
        std::uint16_t bucket = BlockPlan::kNone;
        if (!entry.key.empty()) {
            bucket = static_cast<std::uint16_t>(ByteRunKey::HashOf(entry.key, kBucketCount));
            plan.usedBuckets += plan.counts[bucket]++ == 0 ? 1 : 0;
            plan.hasKeys = true;
        }
        plan.buckets.push_back(bucket);
    });
    return plan;
}

void WriteRuns(FieldWriter &writer, std::vector<std::uint16_t> const &lengths) {
    std::uint32_t offset = 0;
    for (std::uint16_t const length : lengths) {
        writer.U32(offset);
        offset += length;
    }
    for (std::uint16_t const length : lengths) {
        writer.U16(length);
    }
}

// The lists of the buckets, each in the order of the entries.
void WriteLists(FieldWriter &writer, BlockPlan const &plan) {
    std::array<std::uint32_t, kBucketCount> next{};
    std::uint32_t total = 0;
    for (std::uint16_t bucket = 0; bucket < kBucketCount; ++bucket) {
        next[bucket] = total;
        total += plan.counts[bucket];
        if (plan.counts[bucket] != 0) {
            writer.U16(bucket);
        }
    }
    for (std::uint32_t const count : plan.counts) {
        if (count != 0) {
            writer.U32(count);
        }
    }
    std::vector<std::uint32_t> indices(total);
    for (std::uint32_t index = 0; index < plan.buckets.size(); ++index) {
        if (plan.buckets[index] != BlockPlan::kNone) {
            indices[next[plan.buckets[index]]++] = index;
        }
    }
    for (std::uint32_t const index : indices) {
        writer.U32(index);
    }
}

} // namespace

void FastArray::WriteBlock(ByteSink &sink, std::endian order, int encoding, DictionaryObserver *observer) const {
    BlockPlan const plan = MakePlan(*this, encoding, observer);
    FieldWriter writer(sink, order);
    writer.U32(0); // base index
    writer.Bytes(plan.hasKeys ? "Y" : "N", 1);
    writer.U32(LivingCount());
    writer.U32(m_SecondTotal);
    writer.U32(plan.usedBuckets);
    if (plan.hasKeys) {
        writer.U32(plan.keyBytes);
    }
    writer.U32(plan.valueBytes);
    if (plan.hasKeys) {
        WriteRuns(writer, plan.keyLengths);
    }
    WriteRuns(writer, plan.valueLengths);
    if (plan.hasKeys) {
        ForEach([&](ListedEntry const &entry) { writer.Bytes(entry.key.data(), entry.key.size()); });
    }
    ForEach([&](ListedEntry const &entry) {
        if (encoding == kEncodingNone) {
            writer.Units(entry.value);
        } else {
            std::string const text = UnitsToMultibyte(kEncodingUtf8, entry.value);
            writer.Bytes(text.data(), text.size());
        }
    });
    if (plan.hasKeys) {
        WriteLists(writer, plan);
    }
    writer.Flush();
}

} // namespace orvik_private
