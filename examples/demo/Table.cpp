// Table.cpp: text in columns.

#include "Table.h"

#include "KTReal.h"

#include <algorithm>
#include <array>

namespace {

struct Range {
    char32_t first;
    char32_t last;
};

// Characters of double width, and of none, in the blocks that captions and dictionaries use.
constexpr std::array kWide = {
    Range{0x1100, 0x115F},   Range{0x231A, 0x231B},   Range{0x2614, 0x2615},   Range{0x2693, 0x2693},
    Range{0x26A1, 0x26A1},   Range{0x2E80, 0x303E},   Range{0x3041, 0xA4CF},   Range{0xAC00, 0xD7A3},
    Range{0xF900, 0xFAFF},   Range{0xFE30, 0xFE6F},   Range{0xFF00, 0xFF60},   Range{0xFFE0, 0xFFE6},
    Range{0x1F300, 0x1F64F}, Range{0x1F680, 0x1F6FF}, Range{0x1F900, 0x1FAFF}, Range{0x20000, 0x3FFFD}};
constexpr std::array kZero = {Range{0x0300, 0x036F}, Range{0x200B, 0x200F}, Range{0x202A, 0x202E},
                              Range{0x2060, 0x2064}, Range{0x20D0, 0x20F0}, Range{0xFE00, 0xFE0F},
                              Range{0xFEFF, 0xFEFF}};

template <typename Ranges> bool IsIn(Ranges const &ranges, char32_t point) {
    return std::any_of(ranges.begin(), ranges.end(),
                       [point](Range range) { return point >= range.first && point <= range.last; });
}

std::size_t WidthOf(char32_t point) { return IsIn(kZero, point) ? 0 : IsIn(kWide, point) ? 2 : 1; }

bool IsHigh(unsigned short unit) { return (unit & 0xFC00) == 0xD800; }
bool IsLow(unsigned short unit) { return (unit & 0xFC00) == 0xDC00; }

// The character at `pos` and, in `units`, how many units it takes.
char32_t PointAt(KTString const &text, std::size_t pos, std::size_t &units) {
    units = 1;
    if (IsHigh(text[pos]) && IsLow(text[pos + 1])) { // at the end stands a zero unit
        units = 2;
        return 0x10000U + ((text[pos] & 0x3FFU) << 10) + (text[pos + 1] & 0x3FFU);
    }
    return text[pos];
}

// Control characters, and those that turn the direction of what follows.
bool IsControl(unsigned short unit) {
    return unit < 0x20 || (unit >= 0x7F && unit < 0xA0) || (unit >= 0x2028 && unit <= 0x202E) ||
           (unit >= 0x2066 && unit <= 0x2069);
}

void AppendCell(std::string &line, std::string const &cell, std::size_t width, Table::Align align) {
    std::string const padding(width - std::min(width, DisplayWidth(KTString(cell.c_str()))), ' ');
    line += "  ";
    line += align == Table::Align::Right ? padding + cell : cell + padding;
}

void EndLine(std::string &text) {
    text.erase(text.find_last_not_of(' ') + 1);
    text += '\n';
}

} // namespace

std::string Printable(KTString const &text) {
    KTString clean(text);
    std::replace_if(clean.begin(), clean.end(), IsControl, static_cast<unsigned short>('?'));
    return clean.GetUTF8String();
}

std::string PrintableCut(KTString const &text, std::size_t width) {
    // No character takes more than a few units, so a long line need not be measured to its end.
    KTString const start = text.substr(0, width * 4);
    if (start.size() == text.size() && DisplayWidth(text) <= width) {
        return Printable(text);
    }
    std::size_t used = 0;
    std::size_t pos = 0;
    while (pos < start.size()) {
        std::size_t units = 0;
        std::size_t const next = WidthOf(PointAt(start, pos, units));
        if (used + next > width - 1) {
            break;
        }
        used += next;
        pos += units;
    }
    return Printable(start.substr(0, pos)) + "…";
}

std::string PrintableTail(KTString const &text, std::size_t width) {
    if (text.size() <= width * 2 && DisplayWidth(text) <= width) {
        return Printable(text);
    }
    // Marks without a width may make this a little shorter than it could be.
    KTString tail = text.substr(text.size() - std::min(text.size(), width - 1));
    while (!tail.empty() && (IsLow(tail[0]) || DisplayWidth(tail) > width - 1)) {
        tail = tail.substr(1);
    }
    return "…" + Printable(tail);
}

std::string Number(KTUInt64 number) {
    KTString text;
    text.AppendUInt64(number);
    return text.GetUTF8String();
}

std::string Number(double number, int digits) {
    KTString text;
    text.AppendRealNumber(KTReal(number), digits);
    return text.GetUTF8String();
}

std::size_t DisplayWidth(KTString const &text) {
    std::size_t width = 0;
    std::size_t units = 0;
    for (std::size_t pos = 0; pos < text.size(); pos += units) {
        width += WidthOf(PointAt(text, pos, units));
    }
    return width;
}

std::vector<std::size_t> Table::Widths() const {
    std::vector<std::size_t> widths(m_Columns.size(), 0);
    auto const widen = [&](std::size_t column, std::string const &cell) {
        widths[column] = std::max(widths[column], DisplayWidth(KTString(cell.c_str())));
    };
    for (std::size_t column = 0; column < m_Columns.size(); ++column) {
        widen(column, m_Columns[column].title);
        for (auto const &row : m_Rows) {
            widen(column, row[column]);
        }
        if (!m_Total.empty()) {
            widen(column, m_Total[column]);
        }
    }
    return widths;
}

std::string Table::Print() const {
    std::vector<std::size_t> const widths = Widths();
    std::string text;
    auto const addLine = [&](auto const &cellOf) {
        for (std::size_t column = 0; column < m_Columns.size(); ++column) {
            AppendCell(text, cellOf(column), widths[column], m_Columns[column].align);
        }
        EndLine(text);
    };
    auto const addRule = [&] { addLine([&](std::size_t column) { return std::string(widths[column], '-'); }); };

    addLine([&](std::size_t column) { return m_Columns[column].title; });
    addRule();
    for (auto const &row : m_Rows) {
        addLine([&](std::size_t column) { return row[column]; });
    }
    if (!m_Total.empty()) {
        addRule();
        addLine([&](std::size_t column) { return m_Total[column]; });
    }
    return text;
}
