// DictionaryFiles.h: dictionary files for tests, put together by hand, field by field.

#pragma once

#include "DictionaryReader.h"

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

namespace orvik_private {

/// Shows failures readably.
inline void PrintTo(DictionaryProblemKind kind, std::ostream *out) { *out << DictionaryProblemName(kind); }

} // namespace orvik_private

namespace dictionary_files {

using orvik_private::DictionaryObserver;
using orvik_private::DictionaryProblem;
using orvik_private::DictionaryProblemKind;
using orvik_private::DictionaryReader;
using orvik_private::UnitsView;

/// A u"" literal, zeros inside included, as units.
template <std::size_t Size> UnitsView V(char16_t const (&text)[Size]) {
    return {reinterpret_cast<unsigned short const *>(text), Size - 1};
}

/// A "" literal, zeros inside included.
template <std::size_t Size> std::string B(char const (&text)[Size]) { return {text, Size - 1}; }

/// Units as text for messages and comparisons: ASCII as it is, all else as <XXXX>.
inline std::string Show(UnitsView units) {
    std::string text;
    constexpr char kDigits[] = "0123456789ABCDEF";
    for (unsigned short const unit : units) {
        if (unit >= 0x20 && unit < 0x7F) {
            text.push_back(static_cast<char>(unit));
        } else {
            text += '<';
            for (int shift = 12; shift >= 0; shift -= 4) {
                text.push_back(kDigits[unit >> shift & 0xF]);
            }
            text += '>';
        }
    }
    return text;
}

/// Puts fields one behind the other, in either byte order.
class Fields {
  public:
    explicit Fields(bool isBig = false) : m_IsBig(isBig) {}

    Fields &U8(unsigned value) {
        m_Bytes.push_back(static_cast<char>(value));
        return *this;
    }
    Fields &U16(std::uint32_t value) { return Number(value, 2); }
    Fields &U32(std::uint32_t value) { return Number(value, 4); }
    Fields &U16s(std::initializer_list<std::uint32_t> values) {
        for (std::uint32_t const value : values) {
            U16(value);
        }
        return *this;
    }
    Fields &U32s(std::initializer_list<std::uint32_t> values) {
        for (std::uint32_t const value : values) {
            U32(value);
        }
        return *this;
    }
    Fields &Raw(std::string_view bytes) {
        m_Bytes += bytes;
        return *this;
    }
    Fields &Units(UnitsView units) {
        for (unsigned short const unit : units) {
            U16(unit);
        }
        return *this;
    }

    std::string const &Bytes() const { return m_Bytes; }

  private:
    Fields &Number(std::uint32_t value, unsigned size) {
        for (unsigned i = 0; i < size; ++i) {
            U8(value >> (8 * (m_IsBig ? size - 1 - i : i)) & 0xFF);
        }
        return *this;
    }

    bool m_IsBig;
    std::string m_Bytes;
};

/// The header of a binary file; the byte order only where the version has it.
inline Fields Header(unsigned major, unsigned minor, unsigned encoding, bool isBig = false) {
    Fields file(isBig);
    file.Raw("LexiStr Binary Format").U8(major).U8(minor).U8(encoding);
    if (major >= 2 && minor >= 1) {
        file.U8(isBig ? 1 : 0);
    }
    return file;
}

/// The fields of a version 2 block with the entries "/A" = "B" and "/Bc" = "H\u00E9", which tests change one by one.
struct SmallFile {
    unsigned major = 2;
    unsigned minor = 7;
    unsigned encoding = 0;
    bool isBig = false;
    std::string locale = "en_US";
    std::uint32_t localeLength = 5;
    std::uint32_t base = 0;
    char keysPresent = 'Y';
    bool hasKeys = true; ///< what the fields after the flag are like
    std::uint32_t entries = 2;
    std::uint32_t second = 2;
    std::uint32_t buckets = 2;
    std::uint32_t keyBytes = 5;
    std::uint32_t valueBytes = 6;
    std::vector<std::uint32_t> keyOffsets{0, 2};
    std::vector<std::uint32_t> keyLengths{2, 3};
    std::vector<std::uint32_t> valueOffsets{0, 2};
    std::vector<std::uint32_t> valueLengths{2, 4};
    std::string keys = "/A/Bc";
    std::u16string values = u"BH\u00E9";
    std::string rawValues; ///< instead of `values`, if not empty
    std::vector<std::uint32_t> numbers{310, 548};
    std::vector<std::uint32_t> counts{1, 1};
    std::vector<std::uint32_t> indices{1, 0};

    std::string Bytes() const {
        Fields file = Header(major, minor, encoding, isBig);
        file.U32(localeLength).Raw(locale).U32(base).U8(static_cast<unsigned char>(keysPresent));
        file.U32s({entries, second, buckets});
        if (hasKeys) {
            file.U32(keyBytes);
        }
        file.U32(valueBytes);
        if (hasKeys) {
            Put32(file, keyOffsets);
            Put16(file, keyLengths);
        }
        Put32(file, valueOffsets);
        Put16(file, valueLengths);
        if (hasKeys) {
            file.Raw(keys);
        }
        if (rawValues.empty()) {
            file.Units({reinterpret_cast<unsigned short const *>(values.data()), values.size()});
        } else {
            file.Raw(rawValues);
        }
        if (hasKeys) {
            Put16(file, numbers);
            Put32(file, counts);
            Put32(file, indices);
        }
        return file.Bytes();
    }

    static void Put16(Fields &file, std::vector<std::uint32_t> const &values) {
        for (std::uint32_t const value : values) {
            file.U16(value);
        }
    }
    static void Put32(Fields &file, std::vector<std::uint32_t> const &values) {
        for (std::uint32_t const value : values) {
            file.U32(value);
        }
    }
};

/// Remembers what it is told.
class Problems final : public DictionaryObserver {
  public:
    void OnProblem(DictionaryProblem const &problem) override { all.push_back(problem); }

    /// "line:kind:key" of each, separated by blanks.
    std::string Text() const {
        std::string text;
        for (DictionaryProblem const &problem : all) {
            text += text.empty() ? "" : " ";
            text += std::to_string(problem.line) + ":" + DictionaryProblemName(problem.kind) + ":" + problem.key;
        }
        return text;
    }

    std::vector<DictionaryProblem> all;
};

inline void ReadBytes(DictionaryReader &dictionary, std::string_view bytes, DictionaryObserver *observer = nullptr) {
    orvik_private::MemorySource source(bytes);
    dictionary.Read(source, observer);
}

inline std::string WriteBytes(DictionaryReader const &dictionary, orvik_private::DictionaryForm const &form = {},
                              DictionaryObserver *observer = nullptr) {
    orvik_private::MemorySink sink;
    dictionary.Write(sink, form, nullptr, observer);
    return sink.Bytes();
}

/// What a lookup gives, as Show writes it; "-" when nothing is found.
inline std::string Look(DictionaryReader const &dictionary, std::string_view keyText, int encoding = 0) {
    KTUnits scratch;
    UnitsView text;
    auto const found = dictionary.Lookup(keyText, scratch, text, encoding);
    return found == orvik_private::DictionaryFound::Nothing ? "-" : Show(text);
}

/// All living entries in order, "key=text" separated by blanks.
inline std::string List(DictionaryReader const &dictionary) {
    std::string text;
    dictionary.Array().ForEach([&](orvik_private::ListedEntry const &entry) {
        text += text.empty() ? "" : " ";
        text += std::string(entry.key) + "=" + Show(entry.value);
    });
    return text;
}

} // namespace dictionary_files
