// JsonValue.h: reads one JSON document strictly (RFC 8259, and the stricter RFC 7493: no half surrogates), so that a test
// can say what a program's JSON output holds.

#pragma once

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// A value with all that is in it. Members keep their order.
struct JsonValue {
    enum Kind { Null, Boolean, Number, String, Array, Object } kind = Null;
    bool boolean = false;
    double number = 0;
    std::string text;               ///< UTF-8
    std::vector<JsonValue> items;   ///< of an array, or the values of an object's members
    std::vector<std::string> names; ///< of the members

    bool Has(std::string_view name) const { return std::find(names.begin(), names.end(), name) != names.end(); }

    /// A member; throws std::runtime_error if there is none.
    JsonValue const &operator[](std::string_view name) const {
        for (std::size_t i = 0; i < names.size(); ++i) {
            if (names[i] == name) {
                return items[i];
            }
        }
        throw std::runtime_error("no member " + std::string(name));
    }
    JsonValue const &operator[](std::size_t index) const { return items.at(index); }
};

/// Reads a document; throws std::runtime_error where it is not well-formed.
class JsonReader {
  public:
    static JsonValue Read(std::string_view document) {
        JsonReader reader(document);
        JsonValue value = reader.Value();
        reader.SkipBlanks();
        if (reader.m_At != document.size()) {
            reader.Fail("text behind the value");
        }
        return value;
    }

  private:
    explicit JsonReader(std::string_view document) : m_Document(document) {}

    [[noreturn]] void Fail(char const *what) const {
        throw std::runtime_error(std::string("JSON: ") + what + " at byte " + std::to_string(m_At));
    }

    unsigned char Peek() const {
        if (m_At == m_Document.size()) {
            Fail("ends early");
        }
        return static_cast<unsigned char>(m_Document[m_At]);
    }
    unsigned char Take() {
        unsigned char const byte = Peek();
        ++m_At;
        return byte;
    }
    void Expect(char byte) {
        if (Take() != static_cast<unsigned char>(byte)) {
            Fail("unexpected character");
        }
    }
    bool TakeIf(char byte) {
        SkipBlanks();
        bool const is = Peek() == static_cast<unsigned char>(byte);
        m_At += is ? 1 : 0;
        return is;
    }
    void SkipBlanks() {
        while (m_At < m_Document.size() &&
               std::string_view(" \t\r\n").find(m_Document[m_At]) != std::string_view::npos) {
            ++m_At;
        }
    }

    JsonValue Value() {
        SkipBlanks();
        JsonValue value;
        switch (Peek()) {
        case '{':
            ReadObject(value);
            break;
        case '[':
            ReadArray(value);
            break;
        case '"':
            value.kind = JsonValue::String;
            value.text = Text();
            break;
        case 't':
        case 'f':
            value.kind = JsonValue::Boolean;
            value.boolean = Peek() == 't';
            Word(value.boolean ? "true" : "false");
            break;
        case 'n':
            Word("null");
            break;
        default:
            ReadNumber(value);
        }
        return value;
    }

    void Word(std::string_view word) {
        for (char const letter : word) {
            Expect(letter);
        }
    }

    void ReadNumber(JsonValue &value) {
        std::string digits;
        while (m_At < m_Document.size() &&
               std::string_view("+-.0123456789eE").find(m_Document[m_At]) != std::string_view::npos) {
            digits += m_Document[m_At++];
        }
        char *end = nullptr;
        value.kind = JsonValue::Number;
        value.number = std::strtod(digits.c_str(), &end);
        if (digits.empty() || *end != 0) {
            Fail("no value");
        }
    }

    void ReadArray(JsonValue &value) {
        value.kind = JsonValue::Array;
        Expect('[');
        if (TakeIf(']')) {
            return;
        }
        do {
            value.items.push_back(Value());
        } while (TakeIf(','));
        Expect(']');
    }

    void ReadObject(JsonValue &value) {
        value.kind = JsonValue::Object;
        Expect('{');
        if (TakeIf('}')) {
            return;
        }
        do {
            SkipBlanks();
            std::string name = Text();
            SkipBlanks();
            Expect(':');
            if (value.Has(name)) {
                Fail("a name twice");
            }
            value.names.push_back(std::move(name));
            value.items.push_back(Value());
        } while (TakeIf(','));
        Expect('}');
    }

    std::string Text() {
        std::string text;
        Expect('"');
        for (;;) {
            unsigned char const byte = Take();
            if (byte == '"') {
                return text;
            }
            if (byte < 0x20) {
                Fail("a control character in a string");
            }
            if (byte == '\\') {
                Escape(text);
            } else if (byte < 0x80) {
                text += static_cast<char>(byte);
            } else {
                Multibyte(text, byte);
            }
        }
    }

    void Multibyte(std::string &text, unsigned char first) {
        unsigned const more = first >= 0xF0 ? 3 : first >= 0xE0 ? 2 : 1;
        std::uint32_t code = first & (0x3FU >> more);
        text += static_cast<char>(first);
        for (unsigned i = 0; i < more; ++i) {
            unsigned char const byte = Take();
            if ((byte & 0xC0U) != 0x80) {
                Fail("not UTF-8");
            }
            code = code << 6 | (byte & 0x3FU);
            text += static_cast<char>(byte);
        }
        constexpr std::uint32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
        if (first < 0xC2 || code < kLeast[more] || code > 0x10FFFF || (code >= 0xD800 && code < 0xE000)) {
            Fail("not UTF-8");
        }
    }

    std::uint32_t Hex() {
        std::uint32_t value = 0;
        for (int i = 0; i < 4; ++i) {
            std::size_t const digit = std::string_view("0123456789ABCDEFabcdef").find(static_cast<char>(Take()));
            if (digit == std::string_view::npos) {
                Fail("no hexadecimal digit");
            }
            value = value * 16 + static_cast<std::uint32_t>(digit > 15 ? digit - 6 : digit);
        }
        return value;
    }

    void Escape(std::string &text) {
        constexpr std::string_view kLetters = "\"\\/bfnrt";
        constexpr std::string_view kGives = "\"\\/\b\f\n\r\t";
        char const letter = static_cast<char>(Take());
        if (letter != 'u') {
            std::size_t const at = kLetters.find(letter);
            if (at == std::string_view::npos) {
                Fail("no such escape");
            }
            text += kGives[at];
            return;
        }
        std::uint32_t code = Hex();
        if (code >= 0xD800 && code < 0xDC00) {
            Expect('\\');
            Expect('u');
            std::uint32_t const low = Hex();
            if (low < 0xDC00 || low >= 0xE000) {
                Fail("half a surrogate pair");
            }
            code = 0x10000 + ((code - 0xD800) << 10) + (low - 0xDC00);
        } else if (code >= 0xDC00 && code < 0xE000) {
            Fail("half a surrogate pair");
        }
        AppendUtf8(text, code);
    }

    static void AppendUtf8(std::string &text, std::uint32_t code) {
        if (code < 0x80) {
            text += static_cast<char>(code);
            return;
        }
        int const more = code < 0x800 ? 1 : code < 0x10000 ? 2 : 3;
        std::uint32_t const mark = more == 1 ? 0xC0 : more == 2 ? 0xE0 : 0xF0;
        text += static_cast<char>(mark | code >> (6 * more));
        for (int shift = 6 * (more - 1); shift >= 0; shift -= 6) {
            text += static_cast<char>(0x80U | (code >> shift & 0x3FU));
        }
    }

    std::string_view m_Document;
    std::size_t m_At = 0;
};
