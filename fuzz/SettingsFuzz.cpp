// SettingsFuzz.cpp: any bytes as a settings file, against a plain model.

#include "ReaderInput.h"
#include "ReaderModel.h"
#include "SettingsTable.h"

namespace {

SettingsTable::Text View(Units const &units) { return {units.data(), units.size()}; }

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    gKTLogger->LogEnableAtRuntime(false); // of the assertions, which are many
    std::string const file(reinterpret_cast<char const *>(data), size);
    ModelSettings const model(ModelFileLines(file, true, FromLatin1));
    SettingsTable table;
    table.Read(StreamOn(file).get());
    for (auto const &[section, variables] : model.sections) {
        for (auto const &[name, value] : variables) {
            auto const found = table.Find(View(section), View(name));
            Check(found && *found == View(value));
            // What differs in one unit is not there, unless the file has that, too.
            Units other = name;
            other.back() = static_cast<unsigned short>(other.back() + 1);
            Check(table.Find(View(section), View(other)).has_value() == variables.contains(other));
            auto const renamed = model.sections.find(other);
            bool const isThere = renamed != model.sections.end() && renamed->second.contains(name);
            Check(table.Find(View(other), View(name)).has_value() == isThere);
        }
    }
    return 0;
}
