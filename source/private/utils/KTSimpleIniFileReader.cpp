// KTSimpleIniFileReader.cpp: settings by section and name, and their values as numbers.

#include "KTSimpleIniFileReader.h"

#include "FileXferBytes.h"
#include "KTAssert.h"
#include "KTStreamUtil.h"
#include "OUtf.h"
#include "SettingsTable.h"

#include <algorithm>
#include <cstdint>
#include <locale>
#include <sstream>

using orvik_private::UnitsView;

namespace {

constexpr char kReportPath[] = "source/private/utils/KTSimpleIniFileReader";
constexpr int kNoStreamLine = 220;
constexpr int kNoNameLine = 369;
constexpr int kRepeatedNameLine = 379;

constexpr std::size_t kShortestLine = 2;

// The section that the lines being read belong to. Not locked: settings are loaded on one thread at a time.
KTString &CurrentSection() {
    static KTString section;
    return section;
}

UnitsView ViewOf(KTString const &text) { return {text.c_str(), text.size()}; }

void Assign(KTString &text, UnitsView units) { text.assign(units.data(), units.size()); }

bool IsDigit(unsigned short unit) { return unit >= '0' && unit <= '9'; }

// A number as the standard streams read it: white space, a sign, digits, and the rest of the text.
struct PlainNumber {
    bool isNegative = false;
    UnitsView digits;
    UnitsView rest;
};

PlainNumber TakeApart(UnitsView text) {
    PlainNumber number;
    while (!text.empty() && (text[0] == ' ' || (text[0] >= '\t' && text[0] <= '\r'))) {
        text.remove_prefix(1);
    }
    if (!text.empty() && (text[0] == '-' || text[0] == '+')) {
        number.isNegative = text[0] == '-';
        text.remove_prefix(1);
    }
    auto const end = std::find_if_not(text.begin(), text.end(), IsDigit);
    auto const count = static_cast<std::size_t>(end - text.begin());
    number.digits = text.substr(0, count);
    number.rest = text.substr(count);
    return number;
}

std::int64_t ValueOf(UnitsView digits, std::int64_t value = 0) {
    for (unsigned short const digit : digits) {
        value = value * 10 + (digit - '0');
    }
    return value;
}

// Making a stream costs many times what reading a short number does. These read the numbers that any stream of the
// classic locale reads in the same way and exactly; all other texts are left to the stream.

template <typename Integer> bool ReadPlain(UnitsView text, Integer &value) {
    constexpr std::size_t kMostDigits = 9; // fit every type
    PlainNumber const number = TakeApart(text);
    if (number.digits.empty() || number.digits.size() > kMostDigits) {
        return false;
    }
    std::int64_t const digits = ValueOf(number.digits);
    value = static_cast<Integer>(number.isNegative ? -digits : digits);
    return true;
}

bool ReadPlain(UnitsView text, double &value) {
    constexpr std::size_t kMostDigits = 15; // below 2^53, so that one division rounds correctly
    static constexpr double kPowers[] = {1e0, 1e1, 1e2,  1e3,  1e4,  1e5,  1e6,  1e7,
                                         1e8, 1e9, 1e10, 1e11, 1e12, 1e13, 1e14, 1e15};
    PlainNumber const number = TakeApart(text);
    UnitsView fraction;
    if (!number.rest.empty()) {
        fraction = number.rest.substr(1);
        if (number.rest[0] != '.' || !std::all_of(fraction.begin(), fraction.end(), IsDigit)) {
            return false;
        }
    }
    if (number.digits.empty() || number.digits.size() + fraction.size() > kMostDigits) {
        return false;
    }
    double const digits = static_cast<double>(ValueOf(fraction, ValueOf(number.digits)));
    value = (number.isNegative ? -digits : digits) / kPowers[fraction.size()];
    return true;
}

template <typename Number> void Extract(UnitsView text, Number &value) {
    if (std::locale() == std::locale::classic() && ReadPlain(text, value)) {
        return;
    }
    std::istringstream stream(OUnitsToUtf8(text.data(), text.size()));
    stream >> value;
}

template <typename Number>
bool GetNumber(SettingsTable const &table, KTString const &section, KTString const &variable, Number &value) {
    std::optional<UnitsView> const text = table.Find(ViewOf(section), ViewOf(variable));
    if (text) {
        Extract(*text, value);
    }
    return text.has_value();
}

} // namespace

// ---- the table ----

void SettingsTable::Read(IKTStream *stream) {
    CurrentSection().clear();
    bool isWhole = stream != nullptr;
    if (isWhole) {
        TextLines lines(*stream, TextLines::Zeros::EndTheChunk);
        m_IsUtf16 = lines.IsUtf16();
        while (std::optional<Text> const line = lines.Next()) {
            AddLine(*line);
        }
        isWhole = !lines.HasFailed();
        StoreGathered();
    }
    if (!isWhole) {
        m_Sections.clear();
        KTAssertFailed("", kReportPath, kNoStreamLine);
    }
}

std::optional<UnitsView> SettingsTable::Find(Text section, Text variable) const {
    auto const variables = m_Sections.find(section);
    if (variables == m_Sections.end()) {
        return std::nullopt;
    }
    auto const value = variables->second.find(variable);
    return value == variables->second.end() ? std::nullopt : std::optional(value->second);
}

void SettingsTable::AddLine(Text line) {
    if (line.size() < kShortestLine) {
        return;
    }
    if (line[0] == '[') {
        std::size_t const closing = line.find(']');
        if (closing != Text::npos) {
            BeginSection(line, closing);
        }
        return; // without the bracket it is nothing
    }
    if (line[0] != ';' && line.find('=') != Text::npos) {
        m_Gathered.push_back(Keep(line));
    }
}

// "[name]rest" begins the section "namerest".
void SettingsTable::BeginSection(Text line, std::size_t closing) {
    StoreGathered();
    KTString &name = CurrentSection();
    Assign(name, line.substr(1, closing - 1));
    name.append(line.data() + closing + 1, line.size() - closing - 1);
    auto const old = m_Sections.find(ViewOf(name));
    if (old != m_Sections.end()) {
        old->second.clear();
    } else {
        m_Sections.try_emplace(Keep(ViewOf(name)));
    }
}

void SettingsTable::StoreGathered() {
    if (m_Gathered.empty()) {
        return;
    }
    Text const name = ViewOf(CurrentSection());
    auto section = m_Sections.find(name);
    if (section == m_Sections.end()) {
        section = m_Sections.try_emplace(Keep(name)).first; // the one without a name, which has no header
    }
    for (Text const line : m_Gathered) {
        StoreLine(section->second, line);
    }
    m_Gathered.clear();
}

void SettingsTable::StoreLine(Section &section, Text line) {
    std::size_t const equals = line.find('=', 1);
    if (equals == Text::npos) {
        KTAssertFailed("", kReportPath, kNoNameLine);
        return;
    }
    auto const [place, isNew] = section.try_emplace(line.substr(0, equals));
    if (!isNew) {
        KTAssertFailed("", kReportPath, kRepeatedNameLine);
    }
    place->second = line.substr(equals + 1);
}

UnitsView SettingsTable::Keep(Text text) {
    if (text.empty()) {
        return {};
    }
    void *const memory = m_Memory.allocate(text.size() * sizeof(unsigned short), alignof(unsigned short));
    auto *const units = static_cast<unsigned short *>(memory);
    std::copy(text.begin(), text.end(), units);
    return {units, text.size()};
}

// ---- the reader ----

KTSimpleIniFileReader::KTSimpleIniFileReader(KTString const &path) : m_Table(std::make_unique<SettingsTable>()) {
    LoadFile(path);
}

KTSimpleIniFileReader::~KTSimpleIniFileReader() = default;

bool KTSimpleIniFileReader::GetStringValForVariable(KTString const &section, KTString const &variable,
                                                    KTString &value) {
    std::optional<UnitsView> const text = m_Table->Find(ViewOf(section), ViewOf(variable));
    if (text) {
        Assign(value, *text);
    }
    return text.has_value();
}

bool KTSimpleIniFileReader::GetBoolValForVariable(KTString const &section, KTString const &variable, bool &value) {
    static constexpr unsigned short kTrue[] = {'t', 'r', 'u', 'e'};
    std::optional<UnitsView> const text = m_Table->Find(ViewOf(section), ViewOf(variable));
    if (text) {
        value = *text == UnitsView(kTrue, std::size(kTrue));
    }
    return text.has_value();
}

bool KTSimpleIniFileReader::GetIntValForVariable(KTString const &section, KTString const &variable, int &value) {
    return GetNumber(*m_Table, section, variable, value);
}

bool KTSimpleIniFileReader::GetUIntValForVariable(KTString const &section, KTString const &variable,
                                                  unsigned int &value) {
    return GetNumber(*m_Table, section, variable, value);
}

bool KTSimpleIniFileReader::GetDoubleValForVariable(KTString const &section, KTString const &variable, double &value) {
    return GetNumber(*m_Table, section, variable, value);
}

bool KTSimpleIniFileReader::LoadFile(KTString const &path) {
    std::unique_ptr<IKTStream> const stream(
        KTStreamUtil::CreateFileStreamRead(KTFile(path), FileXferBytes::kOpenRead, 0, 0));
    if (stream == nullptr) {
        return false;
    }
    m_Table->Read(stream.get());
    return true;
}
