// Table.h: text in columns for a terminal with fixed-width letters.

#pragma once

#include "KTString.h"

#include <string>
#include <vector>

/// UTF-8 of the text with control characters replaced by "?", so that no file name or file content can break a line or
/// reach the terminal as a command.
std::string Printable(KTString const &text);

/// Printable, cut to `width` columns with an ellipsis at its end.
std::string PrintableCut(KTString const &text, std::size_t width);

/// Printable, cut to its last `width` columns behind an ellipsis: of a long path, the end tells most.
std::string PrintableTail(KTString const &text, std::size_t width);

/// The number in decimal digits; with `digits`, so many behind the point. By the library's texts.
std::string Number(KTUInt64 number);
std::string Number(double number, int digits);

/// Columns that the text takes in a terminal: East Asian letters and emoji take two, combining marks none.
std::size_t DisplayWidth(KTString const &text);

/// Rows of cells, aligned when printed.
class Table {
  public:
    enum class Align { Left, Right };

    struct Column {
        std::string title;
        Align align = Align::Left;
    };

    explicit Table(std::vector<Column> columns) : m_Columns(std::move(columns)) {}

    /// Adds a row of UTF-8 texts. REQUIRES: as many as there are columns.
    void AddRow(std::vector<std::string> cells) { m_Rows.push_back(std::move(cells)); }

    /// Adds a row that stands below a rule of its own, for totals.
    void AddTotal(std::vector<std::string> cells) { m_Total = std::move(cells); }

    /// The rows with a title line, two blanks at the left and between columns, no blanks at the ends of lines.
    std::string Print() const;

  private:
    std::vector<std::size_t> Widths() const;

    std::vector<Column> m_Columns;
    std::vector<std::vector<std::string>> m_Rows;
    std::vector<std::string> m_Total;
};
