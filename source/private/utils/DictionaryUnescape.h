// DictionaryUnescape.h: how authors write characters that a line of a dictionary cannot hold, or that keyboards lack.
//
//     \n \r \t \b \"       line feed, carriage return, tab, backspace, quotation mark
//     ^[ ^] ^T ...         typographic marks (caret escapes)
//     #{copy} #{U+263A}    the HTML 4.01 names of Latin-1 and some more; one UTF-16 unit by its number
//
// Two passes: first the escapes with "\" and "^", then the entities, so an entity may hold characters that the first
// pass made. All functions are pure apart from the platform's flag. Any thread.

#pragma once

#include "DictionaryConversion.h"

#include <cstddef>
#include <functional>

namespace orvik_private {

/// Which caret escapes there are: the second table has "^e" (U+00E9) before the others.
enum class CaretTable { First, Second };

/// The table in use: the second when the platform's flag is set.
CaretTable PlatformCaretTable() noexcept;

/// Sets the platform's flag, process-wide and not locked. Nothing in this system does but tests.
void SetPlatformCaretFlag(bool set) noexcept;

/// Something in a text that looks like an escape and is none.
struct EscapeProblem {
    enum Kind { UnknownEscape, UnknownCaret, TrailingEscape, UnknownEntity } kind{};
    std::size_t at = 0; ///< unit of the text that the pass was given
};
using EscapeProblems = std::function<void(EscapeProblem const &)>;

/// The text with its escapes and entities replaced. A character after "\" or "^" that has no meaning stays with it,
/// except that the escape character itself is halved ("\\" gives "\"); one at the very end stays. What begins with "#{"
/// and is no entity stays. `problems`, if it is set, hears of each.
KTUnits Unescape(UnitsView text, CaretTable table, EscapeProblems const &problems = nullptr);

/// The same with the platform's table.
KTUnits Unescape(UnitsView text);

/// Whether any unit of the text can be the beginning of an escape or entity; if not, Unescape gives the text itself.
bool MayHaveEscapes(UnitsView text) noexcept;

} // namespace orvik_private
