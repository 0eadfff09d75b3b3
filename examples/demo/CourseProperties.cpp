// CourseProperties.cpp: settings into variants and variants into tables.

#include "CourseProperties.h"

#include "Table.h"
#include "TextReader.h"
#include "WDisk.h"

#include <algorithm>
#include <cstdio>

namespace {

using Map = std::map<KTString, KTVariant>;

constexpr char kShortCutSection[] = "Shortcuts";
constexpr std::size_t kMostProperties = 10'000;
constexpr std::size_t kTextWidth = 52;
constexpr KTUInt64 kMostSettings = 1ULL << 20; // of a settings file

bool ConsistsOf(KTString const &text, char const *set) {
    return !text.empty() && text.find_first_not_of(KTString(set)) == KTString::npos;
}

bool IsHex(KTString const &text) { return ConsistsOf(text, "0123456789abcdefABCDEF"); }

// A variable of the settings, and its text.
struct Setting {
    KTSimpleIniFileReader &settings;
    KTString const &section;
    KTString const &name;
    KTString const &text;
};

// "26" and "0x1A" as numbers of at most nine and eight digits, which any int holds. The reader's numbers are decimal.
bool ReadInt(Setting const &setting, int &value) {
    KTString const &text = setting.text;
    if (ConsistsOf(text, "0123456789") && text.size() <= 9) {
        return setting.settings.GetIntValForVariable(setting.section, setting.name, value);
    }
    bool const isHex = text.size() > 2 && text.size() <= 10 && text.substr(0, 2) == "0x" && IsHex(text.substr(2));
    value = isHex ? static_cast<int>(text.substr(2).GetIntValue(std::hex)) : value;
    return isHex;
}

KTVariant ValueOf(Setting const &setting) {
    KTString const &text = setting.text;
    int number = 0;
    double real = 0;
    if (text.empty()) {
        return {};
    }
    if (ReadInt(setting, number)) {
        return setting.section == kShortCutSection ? KTVariant(KTShortCut(number)) : KTVariant(number);
    }
    if (text.size() == 7 && text[0] == '#' && IsHex(text.substr(1))) {
        return {KTColor(0xFF000000 | text.substr(1).GetIntValue(std::hex))};
    }
    if (ConsistsOf(text, "0123456789.") && std::count(text.begin(), text.end(), '.') == 1 && text.size() > 1 &&
        setting.settings.GetDoubleValForVariable(setting.section, setting.name, real)) {
        return {real};
    }
    return {text};
}

char const *KindOf(KTVariant const &value) {
    switch (value.Type()) {
    case KTVariant::kColor:
        return "colour";
    case KTVariant::kDouble:
        return "double";
    case KTVariant::kInt:
        return "int";
    case KTVariant::kShortCut:
        return "shortcut";
    case KTVariant::kString:
        return "string";
    default:
        return "undefined";
    }
}

std::string TextOf(KTVariant const &value) {
    KTString text;
    switch (value.Type()) {
    case KTVariant::kColor:
        text += "#";
        text.AppendNumber(static_cast<int>(value.GetColor().GetColorAsUInt() & 0xFFFFFF), "%06X");
        break;
    case KTVariant::kDouble:
        text.AppendRealNumber(value.GetDouble(), 2);
        break;
    case KTVariant::kInt:
        text.AppendNumber(value.GetInt());
        break;
    case KTVariant::kShortCut:
        text = value.GetShortCut().GetShortCutString();
        break;
    case KTVariant::kString:
        text = value.GetString();
        break;
    default:
        break;
    }
    return PrintableCut(text, kTextWidth);
}

std::string More(std::size_t all, std::size_t shown) {
    return all <= shown ? "" : "  ... and " + std::to_string(all - shown) + " more; --all shows everything\n";
}

std::string ReportValues(KTVariant const &course, ReportLimits const &limits) {
    using enum Table::Align;
    Table table({{"Section", Left}, {"Property", Left}, {"Kind", Left}, {"Value", Left}});
    std::size_t count = 0;
    for (auto const &[section, properties] : course.GetObject()) {
        for (auto const &[key, value] : properties.GetObject()) {
            if (count++ < limits.rows) {
                table.AddRow(
                    {PrintableCut(section, kTextWidth), PrintableCut(key, kTextWidth), KindOf(value), TextOf(value)});
            }
        }
    }
    KTVariant copy;
    copy = course;
    return "Properties\n" + table.Print() + More(count, limits.rows) +
           "  a copy is equal: " + (copy == course ? "yes" : "no") + "\n\n";
}

std::string ReportShortCuts(Map const &properties, ReportLimits const &limits) {
    using enum Table::Align;
    Table table({{"Command", Left}, {"Shortcut", Left}, {"Virtual key", Right}, {"Hot-key flags", Right}});
    std::size_t count = 0;
    for (auto const &[key, value] : properties) {
        if (value.Type() == KTVariant::kShortCut && count++ < limits.rows) {
            unsigned int virtualKey = 0;
            unsigned int flags = 0;
            KTShortCut::GetPlatformShortCut(value.GetShortCut(), virtualKey, flags);
            table.AddRow(
                {PrintableCut(key, kTextWidth), TextOf(value), std::to_string(virtualKey), std::to_string(flags)});
        }
    }
    return count == 0 ? "" : "Shortcuts\n" + table.Print() + More(count, limits.rows) + "\n";
}

} // namespace

KTVariant PropertiesOf(KTString const &text, KTSimpleIniFileReader &settings) {
    std::map<KTString, Map> sections;
    KTString section;
    std::size_t count = 0;
    for (KTString const &line : text.Split("\r\n")) {
        KTString const start = line.substr(std::min(line.find_first_not_of(KTString(" \t")), line.size()));
        KTString::size_type const equals = start.find('=', 1);
        KTString::size_type const bracket = start.find(']');
        if (!start.empty() && start[0] == '[' && bracket != KTString::npos) {
            section = start.substr(1, bracket - 1) + start.substr(bracket + 1);
        } else if (equals != KTString::npos && count < kMostProperties) {
            KTString const name = start.substr(0, equals);
            KTString value;
            if (settings.GetStringValForVariable(section, name, value)) {
                sections[section][name] = ValueOf({settings, section, name, value});
                ++count;
            }
        }
    }
    Map course;
    for (auto &[name, properties] : sections) {
        course[name].SetObject(std::move(properties));
    }
    KTVariant all;
    all.SetObject(std::move(course));
    return all;
}

std::string ReportProperties(CourseFolder const &folder, ReportLimits const &limits) {
    KTString const ending(".ini");
    auto const file = std::find_if(folder.files.begin(), folder.files.end(), [&ending](CourseFile const &one) {
        return one.name.size() >= ending.size() && one.name.substr(one.name.size() - ending.size()) == ending;
    });
    if (file == folder.files.end()) {
        return "";
    }
    DiskBytes disk = DiskRead(file->path, kMostSettings);
    if (!disk.problem.empty() || disk.size > disk.bytes.size()) {
        return ""; // in use, a device, or too large to be settings
    }
    KTSimpleIniFileReader settings(file->path.GetPathAsKTString());
    KTVariant const course = PropertiesOf(DecodeText(std::move(disk.bytes), false).text, settings);
    if (course.GetObject().empty()) {
        return "";
    }
    auto const shortCuts = course.GetObject().find(kShortCutSection);
    return ReportValues(course, limits) +
           (shortCuts == course.GetObject().end() ? "" : ReportShortCuts(shortCuts->second.GetObject(), limits));
}
