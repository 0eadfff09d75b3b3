// Json.cpp: commas, line ends and escapes.

#include "Json.h"

#include "OUtf.h"
#include "Show.h"

using orvik_private::UnitsView;

namespace {

constexpr char kDigits[] = "0123456789ABCDEF";
constexpr std::size_t kLinedScopes = 2; // inner ones stand in one line

void AppendHex(std::string &digits, unsigned value, int count) {
    for (int shift = 4 * (count - 1); shift >= 0; shift -= 4) {
        digits += kDigits[value >> shift & 0xFU];
    }
}

} // namespace

JsonWriter::~JsonWriter() {
    while (!m_Closing.empty()) {
        End();
    }
}

void JsonWriter::Name(std::string_view name) {
    if (m_HasElement) {
        m_Console.Print(m_Closing.size() <= kLinedScopes ? "," : ", ");
    }
    if (!m_Closing.empty() && m_Closing.size() <= kLinedScopes) {
        m_Console.Print("\n");
        m_Console.Print(std::string(2 * m_Closing.size(), ' '));
    }
    if (!m_Closing.empty() && m_Closing.back() == '}') {
        Quoted(name);
        m_Console.Print(": ");
    }
    m_HasElement = true;
}

void JsonWriter::Begin(std::string_view name, char open, char close) {
    Name(name);
    m_Console.Print(std::string_view(&open, 1));
    m_Closing.push_back(close);
    m_HasElement = false;
}

void JsonWriter::End() {
    if (m_HasElement && m_Closing.size() <= kLinedScopes) {
        m_Console.Print("\n");
        m_Console.Print(std::string(2 * (m_Closing.size() - 1), ' '));
    }
    m_Console.Print(std::string_view(&m_Closing.back(), 1));
    m_Closing.pop_back();
    m_HasElement = true;
    if (m_Closing.empty()) {
        m_Console.Print("\n");
    }
}

void JsonWriter::Quoted(std::string_view text) {
    std::string quoted = "\"";
    for (char const byte : text) {
        unsigned char const value = static_cast<unsigned char>(byte);
        if (byte == '"' || byte == '\\') {
            quoted += '\\';
            quoted += byte;
        } else if (byte == '\n') {
            quoted += "\\n";
        } else if (value < 0x20 || value == 0x7F) {
            quoted += "\\u";
            AppendHex(quoted, value, 4);
        } else {
            quoted += byte;
        }
    }
    quoted += '"';
    m_Console.Print(quoted);
}

void JsonWriter::String(std::string_view name, std::string_view text) {
    Name(name);
    Quoted(text);
}

void JsonWriter::Number(std::string_view name, std::uint64_t value) {
    Name(name);
    m_Console.Print(std::to_string(value));
}

void JsonWriter::Boolean(std::string_view name, bool value) {
    Name(name);
    m_Console.Print(value ? "true" : "false");
}

void JsonWriter::Null(std::string_view name) {
    Name(name);
    m_Console.Print("null");
}

void JsonWriter::Text(std::string_view name, UnitsView text) {
    String(name, OUnitsToUtf8(text.data(), text.size()));
    if (!IsUtf16(text)) {
        std::string digits;
        for (unsigned short const unit : text) {
            AppendHex(digits, unit, 4);
        }
        String(std::string(name) + "Units", digits);
    }
}

void JsonWriter::Key(std::string_view name, std::string_view key) {
    if (IsUtf8(key)) {
        String(name, key);
        return;
    }
    KTUnits const units = OUtf8ToUnits(key);
    String(name, OUnitsToUtf8(units.data(), units.size()));
    std::string digits;
    for (char const byte : key) {
        AppendHex(digits, static_cast<unsigned char>(byte), 2);
    }
    String(std::string(name) + "Bytes", digits);
}
