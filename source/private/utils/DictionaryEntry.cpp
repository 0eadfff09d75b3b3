// DictionaryEntry.cpp: runs of bytes, and the chains of version 1.

#include "DictionaryEntry.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace orvik_private {

namespace {

std::uint32_t LengthOf(std::string_view bytes) {
    if (bytes.size() > 0xFFFFFFFFU) {
        throw std::length_error("a run of bytes of more than 4 GiB");
    }
    return static_cast<std::uint32_t>(bytes.size());
}

std::unique_ptr<char[]> Copy(std::string_view bytes) {
    auto copy = std::make_unique_for_overwrite<char[]>(bytes.size());
    std::copy(bytes.begin(), bytes.end(), copy.get());
    return copy;
}

void WriteRun(ByteSink &sink, std::string_view bytes) {
    std::uint32_t const length = static_cast<std::uint32_t>(bytes.size());
    unsigned char const field[] = {static_cast<unsigned char>(length), static_cast<unsigned char>(length >> 8),
                                   static_cast<unsigned char>(length >> 16), static_cast<unsigned char>(length >> 24)};
    sink.Write(field, sizeof field);
    sink.Write(bytes.data(), bytes.size());
}

} // namespace

ByteRunKey::ByteRunKey(std::string_view bytes, bool ownsBytes)
    : m_Own(ownsBytes ? Copy(bytes) : nullptr), m_Bytes(ownsBytes ? m_Own.get() : bytes.data()),
      m_Length(LengthOf(bytes)) {}

void ByteRunKey::Write(ByteSink &sink) const { WriteRun(sink, Bytes()); }

bool ByteRunKey::Equals(HashItem const &other) const noexcept {
    return Bytes() == static_cast<ByteRunKey const &>(other).Bytes();
}

std::uint32_t ByteRunKey::HashOf(std::string_view bytes, std::uint32_t modulus) noexcept {
    constexpr std::size_t kSamples = 5;
    std::size_t const step = std::max<std::size_t>(bytes.size() / kSamples, 1);
    // At most nine bytes are looked at, so their sum fits, and one division at the end gives what one each would.
    std::uint64_t hash = 0;
    for (std::size_t at = 0; at < bytes.size(); at += step) {
        hash = hash * 32 + static_cast<unsigned char>(bytes[at]);
    }
    return static_cast<std::uint32_t>(hash % modulus);
}

ByteRunValue::ByteRunValue(std::string_view bytes, bool ownsBytes)
    : m_Own(ownsBytes ? Copy(bytes) : nullptr), m_Bytes(ownsBytes ? m_Own.get() : bytes.data()),
      m_Length(LengthOf(bytes)) {}

ByteRunValue::ByteRunValue(UnitsView units)
    : ByteRunValue({reinterpret_cast<char const *>(units.data()), units.size() * sizeof(unsigned short)}, true) {}

KTUnits ByteRunValue::Units() const {
    KTUnits units(UnitLength(), 0);
    std::copy_n(m_Bytes, units.size() * sizeof(unsigned short), reinterpret_cast<char *>(units.data()));
    return units;
}

DictionaryEntry::DictionaryEntry(std::string_view key, bool ownsKey, ByteRunValue value)
    : ByteRunKey(key, ownsKey), m_Value(std::move(value)) {}

void DictionaryEntry::Write(ByteSink &sink) const {
    ByteRunKey::Write(sink);
    WriteRun(sink, m_Value.Bytes());
}

LegacyTable::~LegacyTable() {
    for (DictionaryEntry *entry : m_Heads) {
        while (entry != nullptr) {
            delete std::exchange(entry, entry->NextEntry());
        }
    }
}

void LegacyTable::PutAhead(std::uint32_t bucket, std::vector<std::unique_ptr<DictionaryEntry>> entries) {
    m_Count += entries.size();
    while (!entries.empty()) {
        entries.back()->SetNext(m_Heads[bucket]);
        m_Heads[bucket] = entries.back().release();
        entries.pop_back();
    }
}

void LegacyTable::Replace(std::unique_ptr<DictionaryEntry> entry) {
    DictionaryEntry *&head = m_Heads[entry->Hash(kBucketCount)];
    HashItem *before = nullptr;
    for (DictionaryEntry *old = head; old != nullptr; before = old, old = old->NextEntry()) {
        if (!old->Equals(*entry)) {
            continue;
        }
        entry->SetNext(old->Next());
        if (before == nullptr) {
            head = entry.release();
        } else {
            before->SetNext(entry.release());
        }
        delete old;
        return;
    }
    entry->SetNext(head);
    head = entry.release();
    ++m_Count;
}

DictionaryEntry const *LegacyTable::Find(std::string_view key) const noexcept {
    DictionaryEntry const *entry = m_Heads[ByteRunKey::HashOf(key, kBucketCount)];
    while (entry != nullptr && entry->Bytes() != key) {
        entry = entry->NextEntry();
    }
    return entry;
}

} // namespace orvik_private
