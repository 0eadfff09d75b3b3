// OStreamText.cpp: texts on their way between strings and the bytes of a stream.

#include "OStreamText.h"

#include "KTAssert.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>

namespace {

constexpr int kFirstPiece = 0x40000; // memory that a length in front of a text may ask for before any byte has come

// Copies the characters one by one, from bytes to units or back. Whether all were ASCII, and none of them zero.
template <typename From, typename To> bool CopyAscii(From const *from, std::size_t count, To *to) {
    unsigned int all = 0;
    for (std::size_t i = 0; i < count; ++i) {
        auto const character = static_cast<unsigned int>(static_cast<std::make_unsigned_t<From>>(from[i]));
        all |= character | (character - 1); // a zero sets all bits
        to[i] = static_cast<To>(character);
    }
    return all < 0x80;
}

} // namespace

int OStreamTextSize(KTString const &text, bool utf8) {
    std::size_t const size = utf8 ? text.GetUTF8String().size() : text.size() * sizeof(unsigned short);
    return static_cast<int>(std::min<std::size_t>(size, std::numeric_limits<int>::max()));
}

void OReportNoMemory(char const *message, char const *path, int line) noexcept {
    try {
        KTAssertFailed(message, path, line);
    } catch (std::bad_alloc const &) { // NOLINT(bugprone-empty-catch)
    }
}

// NOLINTNEXTLINE(cppcoreguidelines-pro-type-member-init): the array is written as far as it is used
OStreamTextWriter::OStreamTextWriter(KTString const &text, bool utf8) {
    std::size_t count = text.size();
    if (!utf8) {
        m_Bytes = const_cast<unsigned short *>(text.c_str());
        count *= sizeof(unsigned short);
    } else if (count <= kOShortTextUnits && CopyAscii(text.c_str(), count, m_Short)) {
        m_Bytes = m_Short;
    } else {
        m_Long = text.GetUTF8String();
        m_Bytes = m_Long.data();
        count = m_Long.size();
    }
    m_Count = static_cast<unsigned int>(count);
}

// Room for the next piece of `count` bytes in all; returns its size. A text that fits the first piece is read at once,
// then each piece is as large as all that came before. REQUIRES: count is more than the capacity.
int OStreamTextReader::MakeRoom(int count) {
    int const doubled = count / 2 < m_Count ? count : m_Count * 2;
    int const capacity = m_Count < kFirstPiece ? std::min(count, kFirstPiece) : doubled;
    auto const units = (static_cast<std::size_t>(capacity) + 1) / sizeof(unsigned short);
    auto larger = std::make_unique_for_overwrite<unsigned short[]>(units);
    if (m_Count != 0) {
        std::memcpy(larger.get(), m_Units, static_cast<std::size_t>(m_Count));
    }
    m_Long = std::move(larger);
    m_Units = m_Long.get();
    m_Capacity = capacity;
    return m_Capacity - m_Count;
}

void OStreamTextReader::Assign(KTString &text, bool utf8) const {
    auto const count = static_cast<std::size_t>(m_Count);
    if (!utf8) {
        text.assign(m_Units, count / sizeof(unsigned short));
        return;
    }
    auto const *const bytes = reinterpret_cast<char const *>(m_Units);
    unsigned short units[kOShortTextUnits];
    if (count <= kOShortTextUnits && CopyAscii(bytes, count, units)) {
        text.assign(units, count);
        return;
    }
    auto const *const zero = static_cast<char const *>(std::memchr(bytes, 0, count));
    text = KTString(OString::FromUTF8({bytes, zero == nullptr ? count : static_cast<std::size_t>(zero - bytes)}));
}
