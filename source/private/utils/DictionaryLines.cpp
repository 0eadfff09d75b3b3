// DictionaryLines.cpp: lines and the entries in them.

#include "DictionaryLines.h"

#include "DictionaryUnescape.h"

#include <algorithm>

namespace orvik_private {

namespace {

constexpr std::size_t kNone = static_cast<std::size_t>(-1);

// A quotation mark that no backslash precedes.
std::size_t FindQuote(UnitsView line, std::size_t from) noexcept {
    for (std::size_t at = from; at < line.size(); ++at) {
        if (line[at] == '"' && (at == 0 || line[at - 1] != '\\')) {
            return at;
        }
    }
    return kNone;
}

bool IsBlank(UnitsView text) noexcept {
    return std::all_of(text.begin(), text.end(), [](unsigned short unit) { return unit == ' ' || unit == '\t'; });
}

void AppendEscaped(KTUnits &line, UnitsView value) {
    for (unsigned short const unit : value) {
        if (unit == '\n' || unit == '\r' || unit == '"') {
            line.push_back('\\');
            line.push_back(unit == '\n' ? 'n' : unit == '\r' ? 'r' : '"');
        } else {
            line.push_back(unit);
        }
    }
}

void AppendUnits(std::string &bytes, UnitsView units, std::endian order) {
    for (unsigned short const unit : units) {
        char const low = static_cast<char>(unit & 0xFF);
        char const high = static_cast<char>(unit >> 8);
        bytes.push_back(order == std::endian::little ? low : high);
        bytes.push_back(order == std::endian::little ? high : low);
    }
}

// Low and high byte, or the reverse, as a unit; -1 at the end, also in the middle of a unit.
template <std::endian Order> int TakeUnit(BufferedSource &source, bool &hasOddByte) {
    int const first = source.Take();
    if (first < 0) {
        return -1;
    }
    int const second = source.Take();
    if (second < 0) {
        hasOddByte = true;
        return -1;
    }
    return Order == std::endian::little ? first | second << 8 : first << 8 | second;
}

} // namespace

void DictionaryReader::LineReader::CountEnd(int end) noexcept {
    if (m_LastEnd != '\r' || end != '\n') {
        ++m_Ends;
    }
    // The LF of a CR LF has had its turn; the next one begins an empty line.
    m_LastEnd = m_LastEnd == '\r' && end == '\n' ? 0 : end;
}

template <typename Take, typename Put> bool DictionaryReader::LineReader::NextLine(Take const &take, Put const &put) {
    int unit = take();
    while (unit == '\r' || unit == '\n') {
        CountEnd(unit);
        unit = take();
    }
    if (unit <= 0) {
        m_EndedEarly = unit == 0;
        m_Line = m_Ends + 1;
        return false;
    }
    m_Line = m_Ends + 1;
    m_LastEnd = 0;
    for (; unit >= 0 && unit != '\r' && unit != '\n'; unit = take()) {
        put(unit);
    }
    if (unit >= 0) {
        CountEnd(unit);
    }
    return true;
}

bool MultibyteReader::Next(KTUnits &line) {
    m_Bytes.clear();
    if (!NextLine([this] { return m_Source.Take(); },
                  [this](int byte) { m_Bytes.push_back(static_cast<char>(byte)); })) {
        return false;
    }
    line = MultibyteToUnits(kEncodingAnsi, m_Bytes);
    return true;
}

bool UnicodeReader::Next(KTUnits &line) {
    line.clear();
    return NextLine([this] { return TakeUnit<std::endian::little>(m_Source, m_HasOddByte); },
                    [&](int unit) { line.push_back(static_cast<unsigned short>(unit)); });
}

bool ByteSwapUnicodeReader::Next(KTUnits &line) {
    line.clear();
    return NextLine([this] { return TakeUnit<std::endian::big>(m_Source, m_HasOddByte); },
                    [&](int unit) { line.push_back(static_cast<unsigned short>(unit)); });
}

EntryPart FindEntry(UnitsView line) noexcept {
    EntryPart part;
    std::size_t const open = FindQuote(line, 0);
    if (open == kNone) {
        part.text = line;
        return part;
    }
    std::size_t const close = FindQuote(line, open + 1);
    part.isQuoted = true;
    part.isClosed = close != kNone;
    part.text = line.substr(open + 1, part.isClosed ? close - open - 1 : kNone);
    part.hasTextBefore = !IsBlank(line.substr(0, open));
    part.hasTextAfter = part.isClosed && !IsBlank(line.substr(close + 1));
    return part;
}

KTUnits EntryLine(std::string_view key, UnitsView value) {
    KTUnits line;
    line.reserve(key.size() + value.size() + 3);
    line.push_back('"');
    for (char const byte : key) {
        line.push_back(static_cast<unsigned char>(byte));
    }
    line.push_back('=');
    AppendEscaped(line, value);
    line.push_back('"');
    return line;
}

bool SurvivesTextForm(std::string_view key, UnitsView value, int encoding) {
    KTUnits line = EntryLine(key, value);
    if (encoding != kEncodingNone) {
        bool lossy = false;
        line = MultibyteToUnits(kEncodingAnsi, UnitsToMultibyte(kEncodingAnsi, line, &lossy));
        if (lossy) {
            return false;
        }
    }
    if (line.find('\n') != KTUnits::npos || line.find('\r') != KTUnits::npos) {
        return false; // in the key
    }
    UnitsView entry = FindEntry(line).text;
    std::size_t const equals = entry.find('=');
    if (key.empty() || entry.empty() || entry[0] == '$' || equals != key.size()) {
        return false;
    }
    for (std::size_t i = 0; i < equals; ++i) {
        if ((entry[i] & 0xFF) != static_cast<unsigned char>(key[i])) {
            return false;
        }
    }
    // Zeros are kept by files, but nobody who looks the text up gets beyond one.
    return Unescape(entry.substr(equals + 1), CaretTable::First) == value;
}

void WriteText(FastArray const &array, ByteSink &sink, int encoding, std::endian order, DictionaryObserver *observer) {
    constexpr std::size_t kPiece = std::size_t{1} << 14;
    std::string bytes;
    if (encoding == kEncodingNone) {
        bytes.append(order == std::endian::little ? "\xFF\xFE" : "\xFE\xFF", 2);
    }
    array.ForEach([&](ListedEntry const &entry) {
        if (entry.key.empty() && entry.value.empty()) {
            return;
        }
        KTUnits line = EntryLine(entry.key, entry.value);
        line.push_back('\r');
        line.push_back('\n');
        if (encoding == kEncodingNone) {
            AppendUnits(bytes, line, order);
        } else {
            bool lossy = false;
            bytes += UnitsToMultibyte(kEncodingAnsi, line, &lossy);
            if (lossy && observer != nullptr) {
                observer->OnProblem({DictionaryProblemKind::UnmappableText, 0, 0, std::string(entry.key),
                                     "not all characters are in the ANSI code page"});
            }
        }
        if (bytes.size() >= kPiece) {
            sink.Write(bytes.data(), bytes.size());
            bytes.clear();
        }
    });
    sink.Write(bytes.data(), bytes.size());
}

} // namespace orvik_private
