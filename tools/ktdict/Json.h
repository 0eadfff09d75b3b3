// Json.h: one JSON document (RFC 8259), written as it comes.
//
// The document is well-formed UTF-8 that every parser takes (I-JSON, RFC 7493), whatever keys and texts hold: what is
// not well-formed has U+FFFD for each wrong part, and a second member has it exactly, in hexadecimal digits:
//
//     "text": "a\uFFFD", "textUnits": "0061D800"      UTF-16 units
//     "key": "/Gr\uFFFDn", "keyBytes": "2F4772FC6E"   bytes

#pragma once

#include "DictionaryConversion.h"
#include "WConsole.h"

#include <cstdint>
#include <string>
#include <string_view>

/// Writes to a console. Members and elements of the outer two levels get lines of their own. Scopes that are still open
/// when it is destroyed are closed: the document is whole even when the work ends early.
class JsonWriter {
  public:
    explicit JsonWriter(Console &console) : m_Console(console) {}
    JsonWriter(JsonWriter const &) = delete;
    JsonWriter &operator=(JsonWriter const &) = delete;
    ~JsonWriter();

    void BeginObject(std::string_view name = {}) { Begin(name, '{', '}'); }
    void BeginArray(std::string_view name = {}) { Begin(name, '[', ']'); }

    /// Closes the innermost scope.
    void End();

    /// The number of open scopes.
    std::size_t Depth() const noexcept { return m_Closing.size(); }

    // ---- members of the innermost object ----

    /// REQUIRES: text is UTF-8.
    void String(std::string_view name, std::string_view text);
    void Number(std::string_view name, std::uint64_t value);
    void Boolean(std::string_view name, bool value);
    void Null(std::string_view name);

    /// A dictionary's text and key, as above.
    void Text(std::string_view name, orvik_private::UnitsView text);
    void Key(std::string_view name, std::string_view key);

  private:
    void Begin(std::string_view name, char open, char close);
    void Name(std::string_view name);
    void Quoted(std::string_view text);

    Console &m_Console;
    std::string m_Closing; // of the open scopes
    bool m_HasElement = false;
};
