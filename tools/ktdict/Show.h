// Show.h: keys and texts for people: one line each, and nothing in it that cannot be told apart.
//
//     \n \r \t \\            line feed, carriage return, tab, backslash
//     \u001B \u2028 \uD83D   other control characters, line separators, surrogates without their partner
//     \xE9                   in keys: a byte, where the key is not UTF-8
//     \u003D                 in keys: an equals sign
//
// All else is UTF-8. Pure functions; any thread.

#pragma once

#include "DictionaryConversion.h"

#include <string>
#include <string_view>

/// Appends the text.
void AppendText(std::string &line, orvik_private::UnitsView text);

/// Appends the key.
void AppendKey(std::string &line, std::string_view key);

std::string ShowText(orvik_private::UnitsView text);
std::string ShowKey(std::string_view key);

/// The beginning of a text, for messages; "..." tells that it goes on.
std::string ShowBeginning(orvik_private::UnitsView text);

/// Whether the bytes are well-formed UTF-8.
bool IsUtf8(std::string_view bytes);

/// Whether each surrogate has its partner.
bool IsUtf16(orvik_private::UnitsView text) noexcept;
