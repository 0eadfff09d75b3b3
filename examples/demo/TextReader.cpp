// TextReader.cpp: bytes to text. It takes every way into a KTString that fits its source.

#include "TextReader.h"

#include <algorithm>
#include <utility>

namespace {

constexpr unsigned short kReplacement = 0xFFFD;

enum class Encoding { Utf8, Utf16Low, Utf16High, Unknown };

// The constructors from bytes end at a zero byte; files may hold some. So the runs between them are joined by zero units.
KTString FromBytes(std::string const &bytes, KTString::KTCharEncodingType encoding) {
    KTString text;
    std::size_t start = 0;
    for (;;) {
        text += KTString(bytes.c_str() + start, encoding);
        std::size_t const zero = bytes.find('\0', start);
        if (zero == std::string::npos) {
            return text;
        }
        text += static_cast<unsigned short>(0);
        start = zero + 1;
    }
}

// The library keeps the sign of single bytes: 0xE9 becomes the unit 0xFFE9. Its lower half is the Latin-1 character.
KTString FromLatin1(std::string const &bytes) {
    KTString text = FromBytes(bytes, KTString::kKTEncodingBytes);
    for (unsigned short &unit : text) {
        unit = static_cast<unsigned short>(unit & 0xFF);
    }
    return text;
}

bool IsHigh(unsigned short unit) { return (unit & 0xFC00) == 0xD800; }

DecodedText FromUtf16(std::string const &bytes, std::size_t start, bool highFirst, bool isCut) {
    DecodedText result{{}, highFirst ? "UTF-16 BE" : "UTF-16 LE", {}};
    std::size_t const count = (bytes.size() - start) / 2;
    KTUnits units(count, 0);
    for (std::size_t i = 0; i < count; ++i) {
        auto const first = static_cast<unsigned char>(bytes[start + i * 2]);
        auto const second = static_cast<unsigned char>(bytes[start + i * 2 + 1]);
        units[i] = static_cast<unsigned short>(highFirst ? first << 8 | second : second << 8 | first);
    }
    if ((bytes.size() - start) % 2 != 0 && !isCut) {
        result.notes.emplace_back("odd last byte left out");
    }
    if (isCut && !units.empty() && IsHigh(units.back())) {
        units.pop_back();
    }
    result.text = KTString(OString(std::move(units)));
    return result;
}

Encoding EncodingByMark(std::string const &bytes, std::size_t &markLength) {
    markLength = 2;
    if (bytes.starts_with("\xFF\xFE")) {
        return Encoding::Utf16Low;
    }
    if (bytes.starts_with("\xFE\xFF")) {
        return Encoding::Utf16High;
    }
    markLength = bytes.starts_with("\xEF\xBB\xBF") ? 3 : 0;
    return markLength == 0 ? Encoding::Unknown : Encoding::Utf8;
}

// Without a mark, text in UTF-16 shows by its zero bytes: most letters of most course texts are below 256.
Encoding GuessUtf16(std::string const &bytes) {
    constexpr std::size_t kSample = 1U << 16;
    std::size_t const pairs = std::min(bytes.size(), kSample) / 2;
    std::size_t zeros[2] = {0, 0};
    for (std::size_t i = 0; i < pairs * 2; ++i) {
        zeros[i % 2] += bytes[i] == 0 ? 1 : 0;
    }
    bool const low = zeros[1] * 10 >= pairs * 4 && zeros[0] * 20 <= pairs;
    bool const high = zeros[0] * 10 >= pairs * 4 && zeros[1] * 20 <= pairs;
    return pairs == 0 ? Encoding::Unknown : low ? Encoding::Utf16Low : high ? Encoding::Utf16High : Encoding::Unknown;
}

// Takes the bytes of a character that the cut broke off the end.
void TrimUtf8(std::string &bytes) {
    auto const byteAt = [&](std::size_t back) { return static_cast<unsigned char>(bytes[bytes.size() - back]); };
    for (std::size_t back = 1; back <= std::min<std::size_t>(3, bytes.size()); ++back) {
        unsigned char const byte = byteAt(back);
        if ((byte & 0xC0) == 0x80) {
            continue;
        }
        std::size_t const length = byte >= 0xF0 ? 4 : byte >= 0xE0 ? 3 : byte >= 0xC0 ? 2 : 1;
        if (length > back) {
            bytes.erase(bytes.size() - back);
        }
        return;
    }
}

// UTF-8 that is damaged here and there still has more good characters beyond ASCII than bad ones; single bytes have
// hardly any by chance.
bool LooksLikeUtf8(KTString const &text) {
    auto const bad = std::count(text.begin(), text.end(), kReplacement);
    auto const all = std::count_if(text.begin(), text.end(), [](unsigned short unit) { return unit > 0x7F; });
    return all - bad > bad;
}

DecodedText FromUnmarked(std::string bytes, bool isCut) {
    if (isCut) {
        TrimUtf8(bytes);
    }
    KTString text = FromBytes(bytes, KTString::kKTEncodingUTF8);
    // Well-formed bytes come back as they were, U+FFFD that the author wrote included.
    if (text.GetUTF8String() == bytes || LooksLikeUtf8(text)) {
        return {std::move(text), "UTF-8", {}};
    }
    return {FromLatin1(bytes), "bytes", {}};
}

} // namespace

DecodedText DecodeText(std::string bytes, bool isCut) {
    if (bytes.empty()) {
        return {{}, "empty", {}};
    }
    std::size_t markLength = 0;
    Encoding encoding = EncodingByMark(bytes, markLength);
    if (encoding == Encoding::Unknown) {
        encoding = GuessUtf16(bytes);
    }
    DecodedText result;
    if (encoding == Encoding::Utf16Low || encoding == Encoding::Utf16High) {
        result = FromUtf16(bytes, markLength, encoding == Encoding::Utf16High, isCut);
    } else if (encoding == Encoding::Utf8) {
        if (isCut) {
            TrimUtf8(bytes);
        }
        bytes.erase(0, markLength);
        result = {FromBytes(bytes, KTString::kKTEncodingUTF8), "UTF-8 BOM", {}};
    } else {
        result = FromUnmarked(std::move(bytes), isCut);
    }
    if (result.text.find(static_cast<unsigned short>(0)) != KTString::npos) {
        result.notes.emplace_back("zero units");
    }
    return result;
}
