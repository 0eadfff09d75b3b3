// DictionaryConversion.cpp: multibyte texts; UTF-8 as it is decoded everywhere else.

#include "DictionaryConversion.h"

#include "OUtf.h"

#include <cstring>
#include <limits>

namespace orvik_private {

namespace {

// What the system's conversions take in one call.
constexpr std::size_t kMostBytes = std::numeric_limits<std::int32_t>::max();

} // namespace

char const *TextConversionException::what() const noexcept {
    return m_Code == kBufferTooSmall ? "text conversion: the buffer is too small" : "text conversion failed";
}

UnitsView UnitsOf(std::string_view bytes, KTUnits &scratch) {
    std::size_t const count = bytes.size() / sizeof(unsigned short);
    if (reinterpret_cast<std::uintptr_t>(bytes.data()) % sizeof(unsigned short) == 0) {
        return {reinterpret_cast<unsigned short const *>(bytes.data()), count};
    }
    scratch.resize(count);
    std::memcpy(scratch.data(), bytes.data(), count * sizeof(unsigned short));
    return scratch;
}

std::size_t ConvertMultibyte(int encoding, std::string_view bytes, unsigned short *units, std::size_t capacity) {
    if (bytes.size() > kMostBytes) {
        throw TextConversionException(TextConversionException::kFailed);
    }
    if (encoding == kEncodingUtf8) {
        KTUnits const decoded = OUtf8ToUnits(bytes);
        if (decoded.length() > capacity) {
            throw TextConversionException(TextConversionException::kBufferTooSmall);
        }
        KTUnitTraits::copy(units, decoded.data(), decoded.length());
        return decoded.length();
    }
    std::int64_t const count = AnsiToUnits(bytes, units, capacity);
    if (count < 0) {
        throw TextConversionException(TextConversionException::kFailed);
    }
    if (static_cast<std::size_t>(count) > capacity) {
        throw TextConversionException(TextConversionException::kBufferTooSmall);
    }
    return static_cast<std::size_t>(count);
}

KTUnits MultibyteToUnits(int encoding, std::string_view bytes) {
    if (bytes.size() > kMostBytes) {
        throw TextConversionException(TextConversionException::kFailed);
    }
    if (encoding == kEncodingUtf8) {
        return OUtf8ToUnits(bytes);
    }
    KTUnits units(bytes.size(), 0); // no code page gives more units than bytes
    units.erase(ConvertMultibyte(encoding, bytes, units.data(), units.size()));
    return units;
}

std::string UnitsToMultibyte(int encoding, UnitsView units, bool *lossy) {
    if (units.size() > kMostBytes) {
        throw TextConversionException(TextConversionException::kFailed);
    }
    std::string bytes;
    if (encoding == kEncodingUtf8) {
        bytes = OUnitsToUtf8(units.data(), units.size());
        if (lossy != nullptr && UnitsView(OUtf8ToUnits(bytes)) != units) {
            *lossy = true; // an unpaired surrogate
        }
    } else if (!UnitsToAnsi(units, bytes, lossy)) {
        throw TextConversionException(TextConversionException::kFailed);
    }
    return bytes;
}

} // namespace orvik_private
