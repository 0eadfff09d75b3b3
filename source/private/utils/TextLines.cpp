// TextLines.cpp: chunks into lines, and lines of bytes into text.

#include "TextLines.h"

#include "OUtf.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <string_view>
#include <utility>

using orvik_private::UnitsView;

static_assert(std::endian::native == std::endian::little, "units are read as they lie in the file");

namespace {

constexpr std::string_view kUtf16Mark("\xFF\xFE");
constexpr std::string_view kUtf8Mark("\xEF\xBB\xBF");
constexpr unsigned short kReplacement = 0xFFFD;

unsigned char const *Find(unsigned char const *from, unsigned char const *to, unsigned char byte) {
    void const *const found = from == to ? nullptr : std::memchr(from, byte, static_cast<std::size_t>(to - from));
    return found == nullptr ? to : static_cast<unsigned char const *>(found);
}

unsigned short const *Find(unsigned short const *from, unsigned short const *to, unsigned short unit) {
    return std::find(from, to, unit);
}

void Append(std::string &line, unsigned char const *from, unsigned char const *to) {
    line.append(reinterpret_cast<char const *>(from), static_cast<std::size_t>(to - from));
}

void Append(KTUnits &line, unsigned short const *from, unsigned short const *to) {
    line.append(from, static_cast<std::size_t>(to - from));
}

template <typename Unit> bool IsDroppedAtStart(Unit unit) { return unit == ' ' || unit == '\t' || unit == '\r'; }

bool IsAscii(std::string_view bytes) {
    unsigned int all = 0;
    for (char const byte : bytes) {
        all |= static_cast<unsigned char>(byte);
    }
    return all < 0x80;
}

// Well-formed text comes back as it was, U+FFFD that the author wrote included.
bool IsWellFormed(std::string_view bytes, KTUnits const &decoded) {
    return decoded.find(kReplacement) == KTUnits::npos || OUnitsToUtf8(decoded.data(), decoded.size()) == bytes;
}

// The system refuses lines of 2 GiB: what is well-formed of one stays then.
KTUnits FromAnsi(std::string_view bytes, KTUnits decoded) {
    try {
        return orvik_private::MultibyteToUnits(orvik_private::kEncodingAnsi, bytes);
    } catch (orvik_private::TextConversionException const &) {
        return decoded;
    }
}

void Decode(std::string_view bytes, KTUnits &text) {
    if (IsAscii(bytes)) { // nearly every line is
        text.resize(bytes.size());
        std::transform(bytes.begin(), bytes.end(), text.begin(),
                       [](char byte) { return static_cast<unsigned char>(byte); });
        return;
    }
    text = OUtf8ToUnits(bytes);
    if (!IsWellFormed(bytes, text)) {
        text = FromAnsi(bytes, std::move(text));
    }
}

} // namespace

TextLines::TextLines(IKTStream &stream, Zeros zeros) : m_Stream(stream), m_Zeros(zeros) {
    unsigned char mark[kUtf16Mark.size()] = {};
    bool const isLongEnough = m_Stream.XferByte(mark, sizeof mark) == sizeof mark;
    CheckStream();
    m_IsUtf16 = isLongEnough && std::equal(kUtf16Mark.begin(), kUtf16Mark.end(), mark,
                                           [](char a, unsigned char b) { return static_cast<unsigned char>(a) == b; });
    if (!m_IsUtf16) {
        m_Stream.Seek(0, kKTSeekFromBeginning);
    }
}

// The end of the data is no failure.
void TextLines::CheckStream() {
    KTStreamState const state = m_Stream.GetStreamState();
    m_HasFailed = m_HasFailed || state == kKTStreamStateError || state == kKTStreamStateClosed;
    m_IsAtEnd = m_IsAtEnd || m_HasFailed;
}

bool TextLines::ReadChunk() {
    if (m_IsAtEnd) {
        return false;
    }
    unsigned char *const chunk = m_IsUtf16 ? reinterpret_cast<unsigned char *>(m_UnitChunk.data()) : m_ByteChunk.data();
    std::size_t const unitSize = m_IsUtf16 ? sizeof(unsigned short) : 1;
    int const count = m_Stream.XferByte(chunk, static_cast<int>(kChunk * unitSize));
    CheckStream();
    m_Next = 0;
    m_End = static_cast<std::size_t>(std::max(count, 0)) / unitSize;
    m_IsAtEnd = m_IsAtEnd || m_End == 0;
    if (m_IsAtEnd) {
        m_End = 0;
        return false;
    }
    bool const isMarked = m_IsAtStart && !m_IsUtf16 && m_End >= kUtf8Mark.size() &&
                          std::memcmp(chunk, kUtf8Mark.data(), kUtf8Mark.size()) == 0;
    m_Next = isMarked ? kUtf8Mark.size() : 0;
    m_IsAtStart = false;
    if (m_Zeros == Zeros::EndTheChunk) {
        m_End = static_cast<std::size_t>(
            m_IsUtf16 ? Find(m_UnitChunk.data(), m_UnitChunk.data() + m_End, 0) - m_UnitChunk.data()
                      : Find(m_ByteChunk.data(), m_ByteChunk.data() + m_End, 0) - m_ByteChunk.data());
    }
    return true;
}

// Adds the chunk's part of the line. Whether the line ended.
template <typename Unit, typename Text> bool TextLines::Gather(Unit const *chunk, Text &line) {
    Unit const *from = chunk + m_Next;
    Unit const *const end = chunk + m_End;
    Unit const *const lineEnd = Find(from, end, '\n');
    bool const hasEnded = lineEnd != end;
    m_Next = static_cast<std::size_t>(lineEnd - chunk) + (hasEnded ? 1 : 0);
    while (from != lineEnd) {
        if (line.empty()) {
            from = std::find_if_not(from, lineEnd, IsDroppedAtStart<Unit>);
        }
        Unit const *const kept = Find(from, lineEnd, '\r');
        Append(line, from, kept);
        from = kept == lineEnd ? lineEnd : kept + 1;
    }
    return hasEnded;
}

bool TextLines::GatherFromChunk() {
    return m_IsUtf16 ? Gather(m_UnitChunk.data(), m_Units) : Gather(m_ByteChunk.data(), m_Bytes);
}

std::optional<UnitsView> TextLines::Line() {
    if (!m_IsUtf16) {
        Decode(m_Bytes, m_Units);
    }
    return UnitsView(m_Units);
}

std::optional<UnitsView> TextLines::Next() {
    m_Bytes.clear();
    m_Units.clear();
    for (;;) {
        while (m_Next == m_End) {
            if (!ReadChunk()) {
                bool const isEmpty = m_IsUtf16 ? m_Units.empty() : m_Bytes.empty();
                return m_HasFailed || isEmpty ? std::nullopt : Line();
            }
        }
        bool const hasEnded = GatherFromChunk();
        if (hasEnded && !(m_IsUtf16 ? m_Units.empty() : m_Bytes.empty())) {
            return Line();
        }
    }
}
