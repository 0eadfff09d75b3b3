// DictionaryBlock.cpp: entries in a file's bytes, and entries in an arena.

#include "DictionaryBlock.h"

#include <algorithm>

namespace orvik_private {

namespace {

constexpr std::size_t kUnit = sizeof(unsigned short);

std::size_t RoundedUp(std::size_t size) noexcept { return (size + kUnit - 1) / kUnit * kUnit; }

} // namespace

unsigned char *TextArena::Take(std::size_t size) {
    constexpr std::size_t kFirst = std::size_t{1} << 10;
    constexpr std::size_t kLargest = std::size_t{1} << 18;
    size = RoundedUp(size);
    if (size > m_Left) {
        std::size_t const next = m_Size == 0 ? kFirst : std::min(m_Size * 2, kLargest);
        bool const isAlone = size > next / 4; // a piece of its own; the present one is not given up for it
        m_Pieces.push_back(std::make_unique_for_overwrite<unsigned char[]>(isAlone ? size : next));
        if (isAlone) {
            return m_Pieces.back().get();
        }
        m_Size = next;
        m_Next = m_Pieces.back().get();
        m_Left = next;
    }
    m_Left -= size;
    return std::exchange(m_Next, m_Next + size);
}

std::string_view DictionaryBlock::Key(std::uint32_t position) const noexcept {
    if (position < m_File.count) {
        FileRecord const &record = m_File.records[position];
        return {reinterpret_cast<char const *>(m_File.keys + record.keyOffset), record.keyLength};
    }
    AddedRecord const &record = Added(position - m_File.count);
    return {reinterpret_cast<char const *>(record.key), record.keyLength};
}

void DictionaryBlock::SetMark(std::uint32_t position, std::uint32_t mark) noexcept {
    if (position < m_File.count) {
        m_File.records[position].valueOffset = mark;
    } else {
        Added(position - m_File.count).valueLength = mark;
    }
}

std::string_view DictionaryBlock::ValueBytes(std::uint32_t position, KTUnits &scratch) const {
    if (position >= m_File.count) {
        AddedRecord const &record = Added(position - m_File.count);
        return {reinterpret_cast<char const *>(record.key + RoundedUp(record.keyLength)), record.valueLength};
    }
    FileRecord const &record = m_File.records[position];
    std::string_view const stored(reinterpret_cast<char const *>(m_File.values + record.valueOffset),
                                  record.valueLength);
    if (m_File.encoding == kEncodingNone) {
        return stored.substr(0, stored.size() / kUnit * kUnit);
    }
    scratch = MultibyteToUnits(m_File.encoding, stored);
    return BytesOf(scratch);
}

void DictionaryBlock::Add(std::string_view key, UnitsView value) {
    std::size_t const valueBytes = value.size() * kUnit;
    if (m_AddedCount % kRecordsInPiece == 0 && m_Added.size() == m_AddedCount / kRecordsInPiece) {
        m_Added.push_back(std::make_unique<AddedRecord[]>(kRecordsInPiece));
    }
    unsigned char *const text = m_Arena.Take(RoundedUp(key.size()) + valueBytes);
    std::copy(key.begin(), key.end(), text);
    if (!value.empty()) {
        std::memcpy(text + RoundedUp(key.size()), value.data(), valueBytes);
    }
    Added(m_AddedCount) = {text, static_cast<std::uint32_t>(key.size()), static_cast<std::uint32_t>(valueBytes)};
    ++m_AddedCount;
}

} // namespace orvik_private
