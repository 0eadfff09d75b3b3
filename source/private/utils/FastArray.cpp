// FastArray.cpp: adding, finding and listing entries.

#include "FastArray.h"

#include "DictionaryBlock.h"

#include <algorithm>
#include <array>
#include <limits>
#include <utility>

namespace orvik_private {

namespace {

constexpr std::uint32_t kMostEntries = 0xFFFFFFFE;

} // namespace

FastArray::FastArray() = default;

FastArray::~FastArray() = default;

DictionaryBlock &FastArray::BlockOf(std::uint32_t index) const noexcept {
    if (m_Blocks.size() == 1) {
        return *m_Blocks.front();
    }
    auto const after = std::upper_bound(m_Blocks.begin(), m_Blocks.end(), index,
                                        [](std::uint32_t at, auto const &block) { return at < block->Base(); });
    return **std::prev(after);
}

DictionaryBlock &FastArray::BlockForAdding() {
    if (m_Blocks.empty() || !m_Blocks.back()->HasKeys()) {
        m_Blocks.push_back(std::make_unique<DictionaryBlock>(m_EntryTotal, true));
    }
    return *m_Blocks.back();
}

std::string_view FastArray::Key(std::uint32_t index) const noexcept {
    DictionaryBlock const &block = BlockOf(index);
    return block.Key(index - block.Base());
}

bool FastArray::IsAlive(std::uint32_t index) const noexcept {
    DictionaryBlock const &block = BlockOf(index);
    return block.IsAlive(index - block.Base());
}

std::string_view FastArray::ValueBytes(std::uint32_t index, KTUnits &scratch) const {
    DictionaryBlock const &block = BlockOf(index);
    std::uint32_t const position = index - block.Base();
    if (block.IsReplaced(position)) {
        return BytesOf(m_Replaced.at(index));
    }
    return block.IsAlive(position) ? block.ValueBytes(position, scratch) : std::string_view();
}

UnitsView FastArray::Value(std::uint32_t index, KTUnits &scratch) const {
    return UnitsOf(ValueBytes(index, scratch), scratch);
}

std::uint32_t FastArray::FindTagged(std::uint32_t tag, std::string_view key) const noexcept {
    return m_Index.Find(tag, [&](std::uint32_t entry) { return EqualBytes(Key(entry), key); });
}

std::int64_t FastArray::Find(std::string_view key) const noexcept {
    if (key.empty()) {
        return kNotFound;
    }
    std::uint32_t const index = FindTagged(m_Index.TagOf(key), key);
    return index == KeyIndex::kNone ? kNotFound : index;
}

std::int64_t FastArray::Add(std::string_view key, UnitsView value) {
    constexpr std::size_t kMostBytes = 0xFFFFFFF0;
    if (key.empty() || key.size() > kMostBytes || value.size() > kMostBytes / sizeof(unsigned short)) {
        return kNotFound;
    }
    std::uint32_t const tag = m_Index.TagOf(key);
    if (std::uint32_t const index = FindTagged(tag, key); index != KeyIndex::kNone) {
        m_Replaced.insert_or_assign(index, KTUnits(value));
        DictionaryBlock &block = BlockOf(index);
        block.SetMark(index - block.Base(), kReplacedMark);
        return index;
    }
    if (m_EntryTotal == kMostEntries) {
        return kNotFound;
    }
    m_Index.Reserve(m_Index.Count() + 1);
    BlockForAdding().Add(key, value);
    std::uint32_t const index = m_EntryTotal++;
    m_Index.Link(tag, index, [](std::uint32_t) { return false; });
    AddToSecondTotal(1);
    return index;
}

void FastArray::AddToSecondTotal(std::uint32_t count) noexcept {
    m_SecondTotal = count > std::numeric_limits<std::uint32_t>::max() - m_SecondTotal
                        ? std::numeric_limits<std::uint32_t>::max()
                        : m_SecondTotal + count;
}

bool FastArray::List(std::uint32_t index, std::uint32_t &block, KTUnits &scratch, ListedEntry &entry) const {
    while (block + 1 < m_Blocks.size() && m_Blocks[block + 1]->Base() <= index) {
        ++block;
    }
    DictionaryBlock const &in = *m_Blocks[block];
    std::uint32_t const position = index - in.Base();
    if (!in.IsAlive(position)) {
        return false;
    }
    entry.index = index;
    entry.block = block;
    entry.hasKey = in.HasKeys();
    entry.key = in.HasKeys() ? in.Key(position) : std::string_view();
    entry.value = Value(index, scratch);
    return true;
}

void FastArray::Append(std::unique_ptr<DictionaryBlock> block, DictionaryObserver *observer) {
    std::uint32_t const count = block->Count();
    if (count == 0) {
        return;
    }
    if (block->HasKeys()) {
        m_Index.Reserve(m_Index.Count() + count);
    }
    m_Blocks.push_back(std::move(block));
    DictionaryBlock const &added = *m_Blocks.back();
    m_EntryTotal += count;
    // A large index is not in the processor's caches: the slots of some keys are fetched while others are hashed.
    constexpr std::uint32_t kAtOnce = 16;
    std::array<std::uint32_t, kAtOnce> tags{};
    for (std::uint32_t first = 0; added.HasKeys() && first < count; first += kAtOnce) {
        std::uint32_t const end = std::min(count - first, kAtOnce);
        for (std::uint32_t i = 0; i < end; ++i) {
            tags[i] = m_Index.TagOf(added.Key(first + i));
            m_Index.Prefetch(tags[i]);
        }
        for (std::uint32_t i = 0; i < end; ++i) {
            LinkEntry(tags[i], added.Base() + first + i, added.Key(first + i), observer);
        }
    }
}

void FastArray::LinkEntry(std::uint32_t tag, std::uint32_t index, std::string_view key, DictionaryObserver *observer) {
    if (key.empty()) {
        return;
    }
    std::uint32_t const before =
        m_Index.Link(tag, index, [&](std::uint32_t entry) { return EqualBytes(Key(entry), key); });
    if (before == KeyIndex::kNone) {
        return;
    }
    DictionaryBlock &earlier = BlockOf(before);
    earlier.SetMark(before - earlier.Base(), kDeadMark);
    m_Replaced.erase(before);
    ++m_DeadCount;
    if (observer != nullptr) {
        observer->OnProblem({DictionaryProblemKind::DuplicateKey, 0, 0, std::string(key),
                             "the key was there before; the later entry takes its place"});
    }
}

} // namespace orvik_private
