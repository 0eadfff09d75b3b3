// ReaderModel.h: settings and caption files read by a plain model, one unit at a time, to compare the library with.

#pragma once

#include "KTString.h"
#include "Units.h"

#include <map>
#include <string>
#include <vector>

/// A file in UTF-16, low byte first, with its mark.
inline std::string Utf16File(Units const &units) {
    std::string bytes("\xFF\xFE");
    for (unsigned short const unit : units) {
        bytes.push_back(static_cast<char>(unit & 0xFF));
        bytes.push_back(static_cast<char>(unit >> 8));
    }
    return bytes;
}
inline std::string Utf16File(KTString const &text) { return Utf16File(UnitsOf(text)); }

/// Lines that have anything in them, of characters from the first chunk's beginning on.
template <typename Text> std::vector<Text> ModelLines(Text const &file, bool zerosEndChunks) {
    std::vector<Text> lines;
    Text line;
    bool isDropping = false;
    for (std::size_t i = 0; i < file.size(); ++i) {
        auto const one = file[i];
        isDropping = isDropping && i % 1024 != 0;
        isDropping = isDropping || (zerosEndChunks && one == 0);
        if (isDropping || one == '\r') {
            continue;
        }
        if (one == '\n') {
            if (!line.empty()) {
                lines.push_back(line);
            }
            line.clear();
        } else if (!line.empty() || (one != ' ' && one != '\t')) {
            line.push_back(one);
        }
    }
    if (!line.empty()) {
        lines.push_back(line);
    }
    return lines;
}

/// The lines of a file in either form; what is not UTF-8 is not modelled and asked of `ansi`.
template <typename Ansi>
std::vector<Units> ModelFileLines(std::string const &file, bool zerosEndChunks, Ansi const &ansi) {
    if (file.substr(0, 2) == "\xFF\xFE") {
        Units units;
        for (std::size_t i = 2; i + 1 < file.size(); i += 2) {
            units.push_back(static_cast<unsigned short>(static_cast<unsigned char>(file[i]) |
                                                        static_cast<unsigned char>(file[i + 1]) << 8));
        }
        return ModelLines(units, zerosEndChunks);
    }
    std::string bytes = file;
    if (bytes.substr(0, 3) == "\xEF\xBB\xBF") {
        bytes.replace(0, 3, "\r\r\r"); // dropped, and the chunks stay where they are
    }
    std::vector<Units> lines;
    for (std::string const &line : ModelLines(bytes, zerosEndChunks)) {
        Units const units = ReferenceDecode(line);
        lines.push_back(ReferenceEncode(units) == line ? units : ansi(line));
    }
    return lines;
}

/// Sections of variables, and the lines of the assertions that reading them reports.
struct ModelSettings {
    explicit ModelSettings(std::vector<Units> const &lines) {
        Units name;
        for (Units const &line : lines) {
            if (line.size() < 2) {
                continue;
            }
            std::size_t const bracket = Find(line, ']');
            if (line[0] == '[' && bracket != line.size()) {
                name = line;
                name.erase(name.begin() + static_cast<std::ptrdiff_t>(bracket));
                name.erase(name.begin());
                sections[name].clear();
            } else if (line[0] != '[' && line[0] != ';' && Find(line, '=') != line.size()) {
                Store(sections[name], line);
            }
        }
    }

    std::map<Units, std::map<Units, Units>> sections;
    std::vector<int> assertions;

  private:
    static std::size_t Find(Units const &line, unsigned short unit, std::size_t from = 0) {
        while (from < line.size() && line[from] != unit) {
            ++from;
        }
        return from;
    }

    void Store(std::map<Units, Units> &section, Units const &line) {
        std::size_t const equals = Find(line, '=', 1);
        if (equals == line.size()) {
            assertions.push_back(369);
            return;
        }
        auto const middle = line.begin() + static_cast<std::ptrdiff_t>(equals);
        if (!section.insert_or_assign(Units(line.begin(), middle), Units(middle + 1, line.end())).second) {
            assertions.push_back(379);
        }
    }
};

/// Rows of fields: mode 3 words, mode 4 columns, any other the line.
inline std::vector<std::vector<Units>> ModelRows(std::vector<Units> const &lines, unsigned int mode) {
    std::vector<std::vector<Units>> rows;
    auto const isBlank = [](unsigned short unit) { return unit == ' ' || unit == '\t'; };
    for (Units line : lines) {
        if (line.size() < 3) {
            continue;
        }
        while (!line.empty() && isBlank(line.back())) {
            line.pop_back();
        }
        std::vector<Units> fields(1);
        for (unsigned short const unit : line) {
            if ((mode == 3 && isBlank(unit)) || (mode == 4 && unit == '\t')) {
                fields.emplace_back();
            } else {
                fields.back().push_back(unit);
            }
        }
        if (mode == 3) {
            std::erase_if(fields, [](Units const &field) { return field.empty(); });
        }
        rows.push_back(fields);
    }
    return rows;
}
