// KTClosedCaptionFileReader.cpp: lines of a caption file, cut into fields.

#include "KTClosedCaptionFileReader.h"

#include "CaptionRows.h"
#include "FileXferBytes.h"
#include "KTAssert.h"
#include "KTStreamUtil.h"
#include "TextLines.h"

#include <algorithm>
#include <memory>

using orvik_private::UnitsView;

namespace {

constexpr char kReportPath[] = "source/private/utils/KTClosedCaptionFileReader";
constexpr int kNoStreamLine = 165;

constexpr std::size_t kShortestLine = 3;
constexpr unsigned int kSplitAtBlanks = 3;
constexpr unsigned int kSplitAtTabs = 4;

using Row = std::vector<KTString>;

bool IsBlank(unsigned short unit) { return unit == ' ' || unit == '\t'; }
bool IsTab(unsigned short unit) { return unit == '\t'; }

UnitsView Trim(UnitsView line) {
    while (!line.empty() && IsBlank(line.front())) {
        line.remove_prefix(1);
    }
    while (!line.empty() && IsBlank(line.back())) {
        line.remove_suffix(1);
    }
    return line;
}

// Calls take() for each field.
template <typename IsSeparator, typename Take>
void ForEachField(UnitsView line, IsSeparator const &isSeparator, bool withEmpty, Take const &take) {
    for (;;) {
        auto const end = std::find_if(line.begin(), line.end(), isSeparator);
        auto const length = static_cast<std::size_t>(end - line.begin());
        if (withEmpty || length != 0) {
            take(line.substr(0, length));
        }
        if (length == line.size()) {
            return;
        }
        line.remove_prefix(length + 1);
    }
}

// Counting first makes a row of exactly the right size.
template <typename IsSeparator> Row Split(UnitsView line, IsSeparator const &isSeparator, bool withEmpty) {
    std::size_t count = 0;
    if (withEmpty) {
        count = 1 + static_cast<std::size_t>(std::count_if(line.begin(), line.end(), isSeparator));
    } else {
        ForEachField(line, isSeparator, withEmpty, [&](UnitsView) { ++count; });
    }
    Row row;
    row.reserve(count);
    ForEachField(line, isSeparator, withEmpty,
                 [&](UnitsView field) { row.emplace_back().assign(field.data(), field.size()); });
    return row;
}

Row FieldsOf(UnitsView line, unsigned int splitMode) {
    line = Trim(line);
    switch (splitMode) {
    case kSplitAtBlanks:
        return Split(line, IsBlank, false);
    case kSplitAtTabs:
        return Split(line, IsTab, true);
    default:
        return Split(line, [](unsigned short) { return false; }, true);
    }
}

} // namespace

std::vector<Row> ReadCaptionRows(IKTStream *stream, unsigned int splitMode) {
    std::vector<Row> rows;
    bool isWhole = stream != nullptr;
    if (isWhole) {
        TextLines lines(*stream, TextLines::Zeros::AreText);
        while (std::optional<UnitsView> const line = lines.Next()) {
            if (line->size() >= kShortestLine) {
                rows.push_back(FieldsOf(*line, splitMode));
            }
        }
        isWhole = !lines.HasFailed();
    }
    if (!isWhole) {
        rows.clear();
        KTAssertFailed("", kReportPath, kNoStreamLine);
    }
    return rows;
}

std::vector<Row> KTClosedCaptionFileReader::GetLinesFromFile(KTString const &path, unsigned int const &splitMode) {
    std::unique_ptr<IKTStream> const stream(
        KTStreamUtil::CreateFileStreamRead(KTFile(path), FileXferBytes::kOpenRead, 0, 0));
    return stream == nullptr ? std::vector<Row>() : ReadCaptionRows(stream.get(), splitMode);
}
