// DictionaryEntities.h: the characters that escapes and entities stand for, as tables.

#pragma once

#include <array>
#include <cstddef>
#include <string_view>

namespace orvik_private {

struct EscapedUnit {
    char letter;
    unsigned short unit;
};

/// After a backslash.
constexpr EscapedUnit kBackslashEscapes[] = {{'"', '"'}, {'n', 0x0A}, {'r', 0x0D}, {'t', 0x09}, {'b', 0x08}};

/// After "^"; the second table has "^e" in front.
constexpr EscapedUnit kCaretEscapes[] = {
    {'Q', 0x0022}, {'[', 0x201C}, {']', 0x201D}, {'{', 0x2018}, {'}', 0x2019}, {'C', 0x00A9},
    {'R', 0x00AE}, {'T', 0x2122}, {'B', 0x2022}, {'#', 0x2318}, {'!', 0x00AC}, {'I', 0x2206},
    {'S', 0x2211}, {'n', 0x000A}, {'r', 0x000D}, {'D', 0x00B0},
};
constexpr EscapedUnit kSecondTablesCaretEscape = {'e', 0x00E9};

/// Names of entities in the order in which they are tried.
struct Entity {
    std::string_view name;
    unsigned short unit;
};

/// The entity that stands for two units, CR LF.
constexpr std::string_view kEndOfLineEntity = "endl";

/// HTML 4.01, section 24.2.1: the names of U+00A0 to U+00FF.
constexpr std::string_view kLatin1Names[] = {
    "nbsp",   "iexcl",  "cent",   "pound",  "curren", "yen",    "brvbar", "sect",   "uml",    "copy",   "ordf",
    "laquo",  "not",    "shy",    "reg",    "macr",   "deg",    "plusmn", "sup2",   "sup3",   "acute",  "micro",
    "para",   "middot", "cedil",  "sup1",   "ordm",   "raquo",  "frac14", "frac12", "frac34", "iquest", "Agrave",
    "Aacute", "Acirc",  "Atilde", "Auml",   "Aring",  "AElig",  "Ccedil", "Egrave", "Eacute", "Ecirc",  "Euml",
    "Igrave", "Iacute", "Icirc",  "Iuml",   "ETH",    "Ntilde", "Ograve", "Oacute", "Ocirc",  "Otilde", "Ouml",
    "times",  "Oslash", "Ugrave", "Uacute", "Ucirc",  "Uuml",   "Yacute", "THORN",  "szlig",  "agrave", "aacute",
    "acirc",  "atilde", "auml",   "aring",  "aelig",  "ccedil", "egrave", "eacute", "ecirc",  "euml",   "igrave",
    "iacute", "icirc",  "iuml",   "eth",    "ntilde", "ograve", "oacute", "ocirc",  "otilde", "ouml",   "divide",
    "oslash", "ugrave", "uacute", "ucirc",  "uuml",   "yacute", "thorn",  "yuml",
};

constexpr Entity kControlEntities[] = {{kEndOfLineEntity, 0x0D}, {"tab", 0x09}, {"cr", 0x0D}, {"lf", 0x0A}};

/// HTML 4.01, section 24.4.1.
constexpr Entity kSpecialEntities[] = {
    {"quot", 0x0022},   {"amp", 0x0026},    {"lt", 0x003C},     {"gt", 0x003E},     {"OElig", 0x0152},
    {"oelig", 0x0153},  {"Scaron", 0x0160}, {"scaron", 0x0161}, {"Yuml", 0x0178},   {"circ", 0x02C6},
    {"tilde", 0x02DC},  {"ensp", 0x2002},   {"emsp", 0x2003},   {"thinsp", 0x2009}, {"zwnj", 0x200C},
    {"zwj", 0x200D},    {"lrm", 0x200E},    {"rlm", 0x200F},    {"ndash", 0x2013},  {"mdash", 0x2014},
    {"lsquo", 0x2018},  {"rsquo", 0x2019},  {"sbquo", 0x201A},  {"ldquo", 0x201C},  {"rdquo", 0x201D},
    {"bdquo", 0x201E},  {"dagger", 0x2020}, {"Dagger", 0x2021}, {"permil", 0x2030}, {"lsaquo", 0x2039},
    {"rsaquo", 0x203A}, {"euro", 0x20AC},
};

constexpr std::size_t kEntityCount =
    std::size(kControlEntities) + std::size(kLatin1Names) + std::size(kSpecialEntities);

constexpr std::array<Entity, kEntityCount> MakeEntities() {
    std::array<Entity, kEntityCount> all{};
    std::size_t at = 0;
    for (Entity const &entity : kControlEntities) {
        all[at++] = entity;
    }
    unsigned short unit = 0xA0;
    for (std::string_view const name : kLatin1Names) {
        all[at++] = {name, unit++};
    }
    for (Entity const &entity : kSpecialEntities) {
        all[at++] = entity;
    }
    return all;
}

constexpr std::array<Entity, kEntityCount> kEntities = MakeEntities();

static_assert(std::size(kLatin1Names) == 96);
static_assert(kEntityCount == 132);

} // namespace orvik_private
