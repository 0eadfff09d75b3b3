// DictionaryEntry.h: keys and values as runs of bytes, and the chained items of the hash table of version 1.

#pragma once

#include "DictionaryBytes.h"
#include "DictionaryConversion.h"

#include <array>
#include <cstdint>
#include <memory>
#include <string_view>
#include <vector>

namespace orvik_private {

/// Buckets of both hash tables, the file's and the one of version 1.
constexpr std::uint32_t kBucketCount = 1021;

/// An item of a hash table, chained to the next one of its bucket.
class HashItem {
  public:
    HashItem() = default;
    HashItem(HashItem const &) = delete;
    HashItem &operator=(HashItem const &) = delete;
    virtual ~HashItem() = default;

    /// Writes the item as version 1 stores it.
    virtual void Write(ByteSink &sink) const = 0;

    /// The bucket among `modulus` of them.
    virtual std::uint32_t Hash(std::uint32_t modulus) const noexcept = 0;

    virtual bool Equals(HashItem const &other) const noexcept = 0;

    HashItem *Next() const noexcept { return m_Next; }
    void SetNext(HashItem *next) noexcept { m_Next = next; }

  private:
    HashItem *m_Next = nullptr; // owned by the table
};

/// A key: bytes of its own, or bytes that somebody else owns and keeps.
class ByteRunKey : public HashItem {
  public:
    /// Points at the bytes, or copies them.
    ByteRunKey(std::string_view bytes, bool ownsBytes);

    /// The length in 32 bits, then the bytes.
    void Write(ByteSink &sink) const override;
    std::uint32_t Hash(std::uint32_t modulus) const noexcept override { return HashOf(Bytes(), modulus); }

    /// Same length and same bytes; keys of no bytes are all equal. REQUIRES: other is a ByteRunKey.
    bool Equals(HashItem const &other) const noexcept override;

    std::string_view Bytes() const noexcept { return {m_Bytes, m_Length}; }
    bool OwnsBytes() const noexcept { return m_Own != nullptr; }

    /// The hash that files rely on: five or more bytes of the key, evenly spread. With step = length / 5, at least 1,
    /// h = (h * 32 + byte) mod modulus for the bytes 0, step, 2 * step, ... ; 0 for no bytes.
    static std::uint32_t HashOf(std::string_view bytes, std::uint32_t modulus) noexcept;

  private:
    std::unique_ptr<char[]> m_Own;
    char const *m_Bytes;
    std::uint32_t m_Length;
};

/// A value: UTF-16 units as bytes, its own or somebody else's. The bytes need not be aligned.
class ByteRunValue {
  public:
    ByteRunValue(std::string_view bytes, bool ownsBytes);
    explicit ByteRunValue(UnitsView units);

    std::string_view Bytes() const noexcept { return {m_Bytes, m_Length}; }

    /// Whole units; an odd byte at the end counts for nothing.
    std::size_t UnitLength() const noexcept { return m_Length / 2; }
    KTUnits Units() const;

  private:
    std::unique_ptr<char[]> m_Own;
    char const *m_Bytes;
    std::uint32_t m_Length;
};

/// A key with its value.
class DictionaryEntry final : public ByteRunKey {
  public:
    DictionaryEntry(std::string_view key, bool ownsKey, ByteRunValue value);

    /// The key as above, then the value in the same way.
    void Write(ByteSink &sink) const override;

    ByteRunValue const &Value() const noexcept { return m_Value; }

    DictionaryEntry *NextEntry() const noexcept { return static_cast<DictionaryEntry *>(Next()); }

  private:
    ByteRunValue m_Value;
};

/// The hash table of version 1: chains of entries. It owns them.
class LegacyTable {
  public:
    LegacyTable() = default;
    LegacyTable(LegacyTable const &) = delete;
    LegacyTable &operator=(LegacyTable const &) = delete;
    ~LegacyTable();

    /// Chains the entries, in their order, ahead of what the bucket holds. REQUIRES: bucket < kBucketCount.
    void PutAhead(std::uint32_t bucket, std::vector<std::unique_ptr<DictionaryEntry>> entries);

    /// Takes an equal key's entry out, if there is one, and chains this one in its place, else ahead of the bucket.
    void Replace(std::unique_ptr<DictionaryEntry> entry);

    /// The first entry with that key in the key's bucket, or null.
    DictionaryEntry const *Find(std::string_view key) const noexcept;

    /// The first entry of a bucket, or null. REQUIRES: bucket < kBucketCount.
    DictionaryEntry const *First(std::uint32_t bucket) const noexcept { return m_Heads[bucket]; }

    std::size_t Count() const noexcept { return m_Count; }

  private:
    std::array<DictionaryEntry *, kBucketCount> m_Heads{};
    std::size_t m_Count = 0;
};

} // namespace orvik_private
