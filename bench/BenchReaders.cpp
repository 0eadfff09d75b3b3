// BenchReaders.cpp: settings and caption files of 100,000 lines, beside SimpleIni, the system's profile calls, and the
// standard library with Boost's splitting.

#include "Bench.h"

#include "KTClosedCaptionFileReader.h"
#include "KTSimpleIniFileReader.h"

#define SI_IMPLEMENTATION // Debian's header has the templates' bodies for those who ask
#include <SimpleIni.h>
#include <windows.h>

#include <boost/algorithm/string.hpp>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

namespace bench {

namespace {

constexpr char kGroup[] = "readers";
constexpr char kGrowthGroup[] = "readers-growth";
constexpr char kSimpleIni[] = "simpleini";
constexpr char kSimpleIniWide[] = "simpleini-wide";
constexpr char kSystem[] = "system";
constexpr char kGetLine[] = "getline+boost-split";

constexpr int kLines = 100'000;
constexpr int kVariables = 99; // of a section

// Written once, gone when the program ends.
class File {
  public:
    File(char const *name, std::string const &content) : m_Path(std::filesystem::temp_directory_path() / name) {
        std::ofstream(m_Path, std::ios::binary) << content;
    }
    File(File const &) = delete;
    File &operator=(File const &) = delete;
    ~File() {
        std::error_code ignored;
        std::filesystem::remove(m_Path, ignored);
    }
    std::filesystem::path const &Path() const { return m_Path; }

  private:
    std::filesystem::path m_Path;
};

std::string SectionName(int section) { return "Section " + std::to_string(section); }
std::string VariableName(int variable) {
    std::string name("variable");
    return name.append(std::to_string(variable));
}

std::string Settings(int lines) {
    std::string text;
    for (int i = 0; i < lines; ++i) {
        int const place = i % (kVariables + 1);
        if (place == 0) {
            text.append("[").append(SectionName(i / (kVariables + 1))).append("]\r\n");
        } else {
            text.append(VariableName(place)).append("=a value of some words ").append(std::to_string(i)).append("\r\n");
        }
    }
    return text;
}

std::string Captions(int lines) {
    std::string text;
    for (int i = 0; i < lines; ++i) {
        text.append(std::to_string(i)).append(".25\t").append(std::to_string(i + 1));
        text.append(".00\tKeep at least two metres away from the edge of the quay.\r\n");
    }
    return text;
}

File const &SettingsFile() {
    static File const file("ktbench-settings.ini", Settings(kLines));
    return file;
}

File const &CaptionFile() {
    static File const file("ktbench-captions.txt", Captions(kLines));
    return file;
}

KTString TextOf(std::filesystem::path const &path) { return {path.c_str()}; }

// All names of the settings file, as each contender wants them.
template <typename Text> std::vector<std::pair<Text, Text>> Names(int lines) {
    std::vector<std::pair<Text, Text>> names;
    auto const make = [](std::string const &name) {
        if constexpr (std::is_same_v<Text, KTString>) {
            return KTString(name.c_str());
        } else {
            return Text(name.begin(), name.end());
        }
    };
    for (int section = 0; section < lines / (kVariables + 1); ++section) {
        for (int variable = 1; variable <= kVariables; ++variable) {
            names.emplace_back(make(SectionName(section)), make(VariableName(variable)));
        }
    }
    return names;
}

// ---- settings: load the file ----

void LoadOurs(benchmark::State &state) {
    KTString const path = TextOf(SettingsFile().Path());
    for ([[maybe_unused]] auto _ : state) {
        KTSimpleIniFileReader reader(path);
        benchmark::DoNotOptimize(&reader);
    }
}

// `Ini` is CSimpleIniCaseA, whose texts are the file's own bytes, or CSimpleIniCaseW, which makes UTF-16 of them.
template <typename Ini> void LoadSimpleIni(benchmark::State &state) {
    for ([[maybe_unused]] auto _ : state) {
        Ini ini(true);
        benchmark::DoNotOptimize(ini.LoadFile(SettingsFile().Path().c_str()));
    }
}

// ---- settings: load the file and get each value as a text of one's own ----

void GetOurs(benchmark::State &state) {
    KTString const path = TextOf(SettingsFile().Path());
    auto const names = Names<KTString>(kLines);
    for ([[maybe_unused]] auto _ : state) {
        KTSimpleIniFileReader reader(path);
        KTString value;
        for (auto const &[section, variable] : names) {
            benchmark::DoNotOptimize(reader.GetStringValForVariable(section, variable, value));
        }
    }
}

template <typename Ini, typename Text> void GetSimpleIni(benchmark::State &state) {
    auto const names = Names<Text>(kLines);
    for ([[maybe_unused]] auto _ : state) {
        Ini ini(true);
        ini.LoadFile(SettingsFile().Path().c_str());
        Text value;
        for (auto const &[section, variable] : names) {
            value = ini.GetValue(section.c_str(), variable.c_str());
            benchmark::DoNotOptimize(value);
        }
    }
}

// The system looks at the file again for each value, so all of them would take minutes: one after the other here, from
// all over the file. What the library does once, to load it, is in the tasks above.
void GetOneOurs(benchmark::State &state) {
    KTString const path = TextOf(SettingsFile().Path());
    auto const names = Names<KTString>(kLines);
    KTSimpleIniFileReader reader(path);
    KTString value;
    std::size_t next = 0;
    for ([[maybe_unused]] auto _ : state) {
        auto const &[section, variable] = names[next];
        benchmark::DoNotOptimize(reader.GetStringValForVariable(section, variable, value));
        next = (next + 7919) % names.size();
    }
}

void GetOneSystem(benchmark::State &state) {
    auto const names = Names<std::wstring>(kLines);
    std::size_t next = 0;
    wchar_t value[256];
    for ([[maybe_unused]] auto _ : state) {
        auto const &[section, variable] = names[next];
        benchmark::DoNotOptimize(GetPrivateProfileStringW(section.c_str(), variable.c_str(), L"", value, 256,
                                                          SettingsFile().Path().c_str()));
        next = (next + 7919) % names.size();
    }
}

// ---- numbers ----

void GetIntOurs(benchmark::State &state) {
    File const file("ktbench-numbers.ini", "[Player]\nWidth=1024\n");
    KTSimpleIniFileReader reader(TextOf(file.Path()));
    KTString const section("Player");
    KTString const variable("Width");
    int value = 0;
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(reader.GetIntValForVariable(section, variable, value));
        benchmark::DoNotOptimize(value);
    }
}

void GetIntSimpleIni(benchmark::State &state) {
    File const file("ktbench-numbers.ini", "[Player]\nWidth=1024\n");
    CSimpleIniCaseA ini(true);
    ini.LoadFile(file.Path().c_str());
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(ini.GetLongValue("Player", "Width"));
    }
}

// ---- captions ----

void ReadCaptions(benchmark::State &state, unsigned int mode) {
    KTString const path = TextOf(CaptionFile().Path());
    KTClosedCaptionFileReader reader;
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(reader.GetLinesFromFile(path, mode));
    }
}

void SplitLines(benchmark::State &state, char const *separators, boost::algorithm::token_compress_mode_type mode) {
    for ([[maybe_unused]] auto _ : state) {
        std::vector<std::vector<std::string>> rows;
        std::ifstream file(CaptionFile().Path(), std::ios::binary);
        std::string line;
        while (std::getline(file, line)) {
            boost::trim(line);
            boost::split(rows.emplace_back(), line, boost::is_any_of(separators), mode);
        }
        benchmark::DoNotOptimize(rows);
    }
}

void AddGrowth() {
    DescribeGrowthGroup(kGrowthGroup, "settings and captions, as the file grows");
    for (int const lines : {1'000, 10'000, 100'000}) {
        std::string const size = std::to_string(lines);
        Add({kGrowthGroup, "settings", size}, kOurs, [lines](benchmark::State &state) {
            File const file("ktbench-growth.ini", Settings(lines));
            for ([[maybe_unused]] auto _ : state) {
                KTSimpleIniFileReader reader(TextOf(file.Path()));
                benchmark::DoNotOptimize(&reader);
            }
        });
        Add({kGrowthGroup, "captions", size}, kOurs, [lines](benchmark::State &state) {
            File const file("ktbench-growth.txt", Captions(lines));
            for ([[maybe_unused]] auto _ : state) {
                benchmark::DoNotOptimize(KTClosedCaptionFileReader().GetLinesFromFile(TextOf(file.Path()), 4U));
            }
        });
    }
}

} // namespace

void AddReaderBenchmarks() {
    DescribeGroup(kGroup, "settings and caption files of 100,000 lines");
    ExpectSpeed(kGroup, kSimpleIni, 1.0);
    ExpectSpeed(kGroup, kSimpleIniWide, 1.0);
    ExpectSpeed(kGroup, kSystem, 20.0);
    ExpectSpeed(kGroup, kGetLine, 2.0);
    Task const load{kGroup, "settings-load", "100000"};
    Add(load, kOurs, LoadOurs);
    Add(load, kSimpleIni, LoadSimpleIni<CSimpleIniCaseA>);
    Add(load, kSimpleIniWide, LoadSimpleIni<CSimpleIniCaseW>);
    Task const all{kGroup, "settings-all-keys", "100000"};
    Add(all, kOurs, GetOurs);
    Add(all, kSimpleIni, GetSimpleIni<CSimpleIniCaseA, std::string>);
    Add(all, kSimpleIniWide, GetSimpleIni<CSimpleIniCaseW, std::wstring>);
    Task const one{kGroup, "settings-next-key", "100000"};
    Add(one, kOurs, GetOneOurs);
    Add(one, kSystem, GetOneSystem);
    Task const number{kGroup, "settings-int", "one"};
    Add(number, kOurs, GetIntOurs);
    Add(number, kSimpleIni, GetIntSimpleIni);
    Task const columns{kGroup, "captions-columns", "100000"};
    Add(columns, kOurs, [](benchmark::State &state) { ReadCaptions(state, 4); });
    Add(columns, kGetLine, [](benchmark::State &state) { SplitLines(state, "\t", boost::token_compress_off); });
    Task const words{kGroup, "captions-words", "100000"};
    Add(words, kOurs, [](benchmark::State &state) { ReadCaptions(state, 3); });
    Add(words, kGetLine, [](benchmark::State &state) { SplitLines(state, " \t", boost::token_compress_on); });
    AddGrowth();
}

} // namespace bench
