// OStreamText.cpp: texts on their way between strings and the bytes of a stream.

#include "OStreamText.h"

#include "OUtfBlocks.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace {

constexpr int kFirstPiece = 0x40000; // memory that a length in front of a text may ask for before any byte has come

// ASCII is copied in blocks; of a longer text the last one overlaps the one before.

using OUtf::HighBits;
using OUtf::Load;
using OUtf::LoadAs;
using OUtf::StoreAs;

// One character to a unit each.
struct Widen16 {
    static constexpr std::size_t kSize = 16;
    bool operator()(char const *from, unsigned short *to) const {
        __m128i const bytes = Load(from);
        OUtf::WidenBlock(bytes, to);
        return HighBits(_mm_cmpgt_epi8(bytes, _mm_setzero_si128())) == 0xFFFF;
    }
};

// Less than 16 characters, with zeros behind them.
__m128i LoadFew(char const *from, std::size_t count) {
    std::uint64_t low = 0;
    std::uint64_t high = 0;
    if (count >= 8) {
        low = LoadAs<std::uint64_t>(from);
        high = LoadAs<std::uint64_t>(from + count - 8) >> 8 >> (8 * (15 - count)); // without those of `low`
    } else if (count >= 4) {
        auto const last = LoadAs<std::uint32_t>(from + count - 4);
        low = LoadAs<std::uint32_t>(from) | (std::uint64_t{last} << (8 * (count - 4))); // where both have one, the same
    } else {
        for (std::size_t i = 0; i < count; ++i) {
            low |= std::uint64_t{static_cast<unsigned char>(from[i])} << (8 * i);
        }
    }
    return _mm_unpacklo_epi64(_mm_cvtsi64_si128(static_cast<long long>(low)),
                              _mm_cvtsi64_si128(static_cast<long long>(high)));
}

// One unit to a character each.
struct Narrow8 {
    static constexpr std::size_t kSize = 8;
    bool operator()(unsigned short const *from, unsigned char *to) const {
        __m128i const units = Load(from);
        StoreAs(to, _mm_cvtsi128_si64(_mm_packus_epi16(units, units)));
        __m128i const other = _mm_and_si128(units, _mm_set1_epi16(static_cast<short>(0xFF80)));
        return HighBits(_mm_cmpeq_epi16(other, _mm_setzero_si128())) == 0xFFFF;
    }
};
struct Narrow4 {
    static constexpr std::size_t kSize = 4;
    bool operator()(unsigned short const *from, unsigned char *to) const {
        auto const four = LoadAs<std::uint64_t>(from);
        __m128i const units = _mm_cvtsi64_si128(static_cast<long long>(four));
        StoreAs(to, _mm_cvtsi128_si32(_mm_packus_epi16(units, units)));
        return (four & 0xFF80FF80FF80FF80U) == 0;
    }
};

// REQUIRES: at least one block.
template <typename Block, typename From, typename To>
bool CopyBlocks(From const *from, std::size_t count, To *to, Block block) {
    bool isPlain = true;
    for (std::size_t i = 0; i + Block::kSize < count; i += Block::kSize) {
        isPlain &= block(from + i, to + i);
    }
    std::size_t const last = count - Block::kSize;
    return block(from + last, to + last) && isPlain;
}

// Whether all are ASCII and none of them is zero; each has its unit then. A few are written as one block of 16, as whoever
// reads them next would have to wait for blocks that overlap. REQUIRES: room for 16 units at least.
bool WidenPlain(char const *from, std::size_t count, unsigned short *to) {
    if (count >= Widen16::kSize) {
        return CopyBlocks(from, count, to, Widen16());
    }
    __m128i const bytes = LoadFew(from, count);
    OUtf::WidenBlock(bytes, to);
    return HighBits(_mm_cmpgt_epi8(bytes, _mm_setzero_si128())) == (1U << count) - 1;
}

// Whether all are ASCII, zeros among them; each has its byte then.
bool NarrowPlain(unsigned short const *from, std::size_t count, unsigned char *to) {
    if (count >= Narrow8::kSize) {
        return CopyBlocks(from, count, to, Narrow8());
    }
    if (count >= Narrow4::kSize) {
        return CopyBlocks(from, count, to, Narrow4());
    }
    bool isPlain = true;
    for (std::size_t i = 0; i < count; ++i) {
        to[i] = static_cast<unsigned char>(from[i]);
        isPlain &= from[i] < 0x80;
    }
    return isPlain;
}

// Whole units of UTF-16, which may lie at any address.
void AssignUnits(KTString &text, unsigned char const *bytes, std::size_t count) {
    if (count > kOShortTextUnits) {
        text.assign(count, 0);
        std::memcpy(&text[0], bytes, count * sizeof(unsigned short));
        return;
    }
    unsigned short units[kOShortTextUnits];
    if (count != 0) {
        std::memcpy(units, bytes, count * sizeof(unsigned short));
    }
    text.assign(units, count);
}

} // namespace

int OStreamTextSize(KTString const &text, bool utf8) {
    std::size_t const size = utf8 ? text.GetUTF8String().size() : text.size() * sizeof(unsigned short);
    return static_cast<int>(std::min<std::size_t>(size, std::numeric_limits<int>::max()));
}

void OAssignStreamText(KTString &text, unsigned char const *bytes, std::size_t count, bool utf8) {
    if (!utf8) {
        AssignUnits(text, bytes, count / sizeof(unsigned short));
        return;
    }
    unsigned short units[kOShortTextUnits];
    auto const *const characters = reinterpret_cast<char const *>(bytes);
    if (count <= kOShortTextUnits && WidenPlain(characters, count, units)) {
        text.assign(units, count);
    } else {
        auto const *const zero = static_cast<char const *>(std::memchr(characters, 0, count));
        std::size_t const length = zero == nullptr ? count : static_cast<std::size_t>(zero - characters);
        text = KTString(OString::FromUTF8({characters, length}));
    }
}

bool OPutStreamText(KTString const &text, unsigned char *to, bool utf8) noexcept {
    if (utf8) {
        return NarrowPlain(text.c_str(), text.size(), to);
    }
    std::memcpy(to, text.c_str(), text.size() * sizeof(unsigned short));
    return true;
}

// NOLINTNEXTLINE(cppcoreguidelines-pro-type-member-init): the array is written as far as it is used
OStreamTextWriter::OStreamTextWriter(KTString const &text, bool utf8) {
    std::size_t count = text.size();
    if (!utf8) {
        m_Bytes = const_cast<unsigned short *>(text.c_str());
        count *= sizeof(unsigned short);
    } else if (count <= kOShortTextUnits && NarrowPlain(text.c_str(), count, m_Short)) {
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
    OAssignStreamText(text, reinterpret_cast<unsigned char const *>(m_Units), static_cast<std::size_t>(m_Count), utf8);
}
