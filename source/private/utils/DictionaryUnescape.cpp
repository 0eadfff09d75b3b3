// DictionaryUnescape.cpp: the two passes over a text.

#include "DictionaryUnescape.h"

#include "DictionaryEntities.h"

#include <algorithm>
#include <atomic>

namespace orvik_private {

namespace {

std::atomic<bool> platformCaretFlag{false};

template <std::size_t Size>
bool LookUp(EscapedUnit const (&escapes)[Size], unsigned short letter, unsigned short &unit) noexcept {
    for (EscapedUnit const &escape : escapes) {
        if (escape.letter == letter) {
            unit = escape.unit;
            return true;
        }
    }
    return false;
}

bool LookUpEscape(unsigned short escape, unsigned short letter, CaretTable table, unsigned short &unit) noexcept {
    if (escape == '\\') {
        return LookUp(kBackslashEscapes, letter, unit);
    }
    if (table == CaretTable::Second && letter == kSecondTablesCaretEscape.letter) {
        unit = kSecondTablesCaretEscape.unit;
        return true;
    }
    return LookUp(kCaretEscapes, letter, unit);
}

KTUnits UnescapePairs(UnitsView text, CaretTable table, EscapeProblems const &problems) {
    KTUnits result;
    result.reserve(text.size());
    for (std::size_t at = 0; at < text.size(); ++at) {
        unsigned short const unit = text[at];
        if (unit != '\\' && unit != '^') {
            result.push_back(unit);
            continue;
        }
        if (at + 1 == text.size()) {
            result.push_back(unit);
            if (problems) {
                problems({EscapeProblem::TrailingEscape, at});
            }
            break;
        }
        unsigned short const letter = text[++at];
        unsigned short replacement = 0;
        if (LookUpEscape(unit, letter, table, replacement)) {
            result.push_back(replacement);
            continue;
        }
        result.push_back(unit);
        if (letter != unit) {
            result.push_back(letter);
            if (problems) {
                problems({unit == '\\' ? EscapeProblem::UnknownEscape : EscapeProblem::UnknownCaret, at - 1});
            }
        }
    }
    return result;
}

bool BeginsWith(UnitsView text, std::string_view name) noexcept {
    return text.size() >= name.size() &&
           std::equal(name.begin(), name.end(), text.begin(),
                      [](char letter, unsigned short unit) { return static_cast<unsigned char>(letter) == unit; });
}

int HexValue(unsigned short unit) noexcept {
    if (unit >= '0' && unit <= '9') {
        return unit - '0';
    }
    unsigned const lower = unit | 0x20U;
    return unit < 0x80 && lower >= 'a' && lower <= 'f' ? static_cast<int>(lower) - 'a' + 10 : -1;
}

// Units of "U+263A}" and its other forms at the beginning of the text, or 0.
std::size_t ReadNumber(UnitsView text, unsigned short &unit) noexcept {
    constexpr std::size_t kMostDigits = 4;
    std::size_t at = BeginsWith(text, "U+") ? 2 : BeginsWith(text, "u") ? 1 : 0;
    std::size_t const first = at;
    unsigned value = 0;
    while (at < text.size() && at < first + kMostDigits && HexValue(text[at]) >= 0) {
        value = value * 16 + static_cast<unsigned>(HexValue(text[at++]));
    }
    if (at == first || at == text.size() || text[at] != '}') {
        return 0;
    }
    unit = static_cast<unsigned short>(value);
    return at + 1;
}

// What follows "#{": units that the entity takes, its "}" included, or 0 when it is none. The first name that the text
// begins with decides, even when another one would fit better.
std::size_t ReadEntity(UnitsView text, KTUnits &result) {
    for (Entity const &entity : kEntities) {
        if (!BeginsWith(text, entity.name)) {
            continue;
        }
        if (text.size() == entity.name.size() || text[entity.name.size()] != '}') {
            return 0;
        }
        result.push_back(entity.unit);
        if (entity.name == kEndOfLineEntity) {
            result.push_back('\n');
        }
        return entity.name.size() + 1;
    }
    unsigned short unit = 0;
    std::size_t const length = ReadNumber(text, unit);
    if (length != 0) {
        result.push_back(unit);
    }
    return length;
}

KTUnits ReplaceEntities(UnitsView text, EscapeProblems const &problems) {
    constexpr std::size_t kOpening = 2; // "#{"
    constexpr std::size_t kShortest = 2;
    KTUnits result;
    result.reserve(text.size());
    for (std::size_t at = 0; at < text.size();) {
        if (text[at] == '#' && at + 1 < text.size() && text[at + 1] == '{') {
            std::size_t length = 0;
            if (text.size() - at >= kOpening + kShortest) {
                length = ReadEntity(text.substr(at + kOpening), result);
            }
            if (length != 0) {
                at += kOpening + length;
                continue;
            }
            if (problems) {
                problems({EscapeProblem::UnknownEntity, at});
            }
        }
        result.push_back(text[at++]);
    }
    return result;
}

} // namespace

CaretTable PlatformCaretTable() noexcept {
    return platformCaretFlag.load(std::memory_order_relaxed) ? CaretTable::Second : CaretTable::First;
}

void SetPlatformCaretFlag(bool set) noexcept { platformCaretFlag.store(set, std::memory_order_relaxed); }

bool MayHaveEscapes(UnitsView text) noexcept {
    bool may = false; // most texts have none, so all units are looked at, several at a time
    for (unsigned short const unit : text) {
        may |= unit == '\\' || unit == '^' || unit == '#';
    }
    return may;
}

KTUnits Unescape(UnitsView text, CaretTable table, EscapeProblems const &problems) {
    if (!MayHaveEscapes(text)) {
        return KTUnits(text);
    }
    KTUnits const pairs = UnescapePairs(text, table, problems);
    return ReplaceEntities(pairs, problems);
}

KTUnits Unescape(UnitsView text) { return Unescape(text, PlatformCaretTable()); }

} // namespace orvik_private
