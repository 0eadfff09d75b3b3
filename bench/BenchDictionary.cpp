// BenchDictionary.cpp: the string dictionary beside a plain hash map, and its files beside JSON.
//
// Keys look like those of an application, "$$$/Area12/Dialog34/Control567"; texts have 10 to 60 units. Both sides look
// keys up in another order than they were added in, as callers do. The map is filled with the same UTF-16 keys and
// texts; a lookup copies the text out, as GetKeyValue does.

#include "Bench.h"

#include "KTFile.h"
#include "KTStringDictionary.h"

#include <rapidjson/encodings.h>
#include <rapidjson/error/en.h>
#include <rapidjson/reader.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <random>
#include <string>
#include <unordered_map>
#include <vector>

namespace bench {

namespace {

constexpr char kLoad[] = "dictionary-load";
constexpr char kFind[] = "dictionary-find";
constexpr char kGrowth[] = "dictionary-growth";
constexpr char kMap[] = "unordered_map";
constexpr char kJson[] = "RapidJSON";
constexpr char kText[] = "text-form";

using Map = std::unordered_map<std::u16string, std::u16string>;

struct Size {
    char const *name;
    std::size_t entries;
};
constexpr Size kSizes[] = {{"1K", 1'000}, {"100K", 100'000}, {"1M", 1'000'000}};

std::u16string Wide(std::string const &ascii) { return {ascii.begin(), ascii.end()}; }

std::u16string KeyOf(std::size_t i) {
    return Wide("$$$/Area" + std::to_string(i % 17) + "/Dialog" + std::to_string(i % 1013) + "/Control" +
                std::to_string(i));
}

std::u16string TextOf(std::size_t i) {
    std::u16string text = Wide("Text " + std::to_string(i) + " ");
    text.resize(10 + i * 7919 % 51, static_cast<char16_t>(i % 5 == 0 ? 0xE9 : 'x'));
    return text;
}

KTString TextFor(std::u16string const &text) {
    KTString result;
    result.append(reinterpret_cast<unsigned short const *>(text.data()), text.size());
    return result;
}

// How many of the entries the process-wide dictionary holds; 0 when it is not known to hold any. Benchmarks come in a
// random order and share it.
std::size_t filled = 0;

// The process-wide dictionary, empty.
KTStringDictionary &Fresh() {
    filled = 0;
    delete KTStringDictionary::m_StringDictionary;
    return *KTStringDictionary::GetStringDictionary();
}

KTStringDictionary &Filled(std::size_t entries) {
    if (filled != entries) {
        KTStringDictionary &dictionary = Fresh();
        for (std::size_t i = 0; i < entries; ++i) {
            dictionary.AddString(TextFor(KeyOf(i)), TextFor(TextOf(i)));
        }
        filled = entries;
    }
    return *KTStringDictionary::GetStringDictionary();
}

Map const &FilledMap(std::size_t entries) {
    static std::map<std::size_t, Map> maps;
    Map &map = maps[entries];
    if (map.empty()) {
        for (std::size_t i = 0; i < entries; ++i) {
            map.emplace(KeyOf(i), TextOf(i));
        }
    }
    return map;
}

// Up to 100,000 keys of the first `entries` in a random order.
std::vector<std::u16string> Asked(std::size_t entries, std::u16string const &suffix, std::size_t first = 0) {
    std::mt19937 random(1);
    std::uniform_int_distribution<std::size_t> any(0, entries - 1);
    std::vector<std::u16string> keys;
    for (std::size_t i = 0; i < std::min<std::size_t>(entries, 100'000); ++i) {
        keys.push_back(KeyOf(first + any(random)) + suffix);
    }
    return keys;
}

void AddOurFind(Task const &task, std::size_t entries, std::u16string const &suffix, std::size_t first) {
    Add(task, kOurs, [=](benchmark::State &state) {
        KTStringDictionary &dictionary = Filled(entries);
        std::vector<KTString> keys;
        for (std::u16string const &key : Asked(entries, suffix, first)) {
            keys.push_back(TextFor(key));
        }
        std::size_t at = 0;
        for (auto _ : state) {
            benchmark::DoNotOptimize(dictionary.GetKeyValue(keys[at]));
            at = at + 1 == keys.size() ? 0 : at + 1;
        }
        if (dictionary.GetKeyValue(keys[at]).empty()) {
            state.SkipWithError("nothing found");
        }
    });
}

void AddMapFind(Task const &task, std::size_t entries) {
    Add(task, kMap, [entries](benchmark::State &state) {
        Map const &map = FilledMap(entries);
        std::vector<std::u16string> const keys = Asked(entries, {});
        std::size_t at = 0;
        for (auto _ : state) {
            auto const found = map.find(keys[at]);
            benchmark::DoNotOptimize(found == map.end() ? std::u16string() : found->second);
            at = at + 1 == keys.size() ? 0 : at + 1;
        }
    });
}

void AddFinds() {
    static std::u16string const kDefault = u"=A default text of some length";
    for (Size const &size : kSizes) {
        AddOurFind({kFind, "found", size.name}, size.entries, {}, 0);
        AddMapFind({kFind, "found", size.name}, size.entries);
        // Keys that are not there, with a default behind them, which is the result.
        AddOurFind({kFind, "default", size.name}, size.entries, kDefault, size.entries);
        Add({kFind, "default", size.name}, kMap, [entries = size.entries](benchmark::State &state) {
            Map const &map = FilledMap(entries);
            std::vector<std::u16string> const keys = Asked(entries, kDefault, entries);
            std::size_t at = 0;
            for (auto _ : state) {
                std::u16string const &key = keys[at];
                std::size_t const equals = key.find(u'=');
                auto const found = map.find(key.substr(0, equals));
                benchmark::DoNotOptimize(found == map.end() ? key.substr(equals + 1) : found->second);
                at = at + 1 == keys.size() ? 0 : at + 1;
            }
        });
    }
}

// ---- files ----

// The same entries in each form; gone with the program's temporary folder.
struct Files {
    std::filesystem::path binary;
    std::filesystem::path text;
    std::filesystem::path json;
};

KTFile FileOf(std::filesystem::path const &path) { return KTFile(KTString(path.c_str())); }

Files const &FilesOf(std::size_t entries) {
    static Files files;
    if (files.binary.empty()) {
        std::filesystem::path const folder = std::filesystem::temp_directory_path();
        files = {folder / "bench.lxdc", folder / "bench.txt", folder / "bench.json"};
        for (auto const &path : {files.binary, files.text, files.json}) {
            std::filesystem::remove(path);
        }
        KTStringDictionary &dictionary = Filled(entries);
        dictionary.WriteToFile(FileOf(files.binary), true);
        dictionary.WriteToFile(FileOf(files.text), false);
        std::ofstream json(files.json, std::ios::binary);
        for (std::size_t i = 0; i < entries; ++i) {
            json << (i == 0 ? "{\n" : ",\n") << '"' << TextFor(KeyOf(i)).GetUTF8String() << "\": \""
                 << TextFor(TextOf(i)).GetUTF8String() << '"';
        }
        json << "\n}\n";
    }
    return files;
}

// Puts the members of one JSON object into a map, without making a document of them first.
struct MapHandler : rapidjson::BaseReaderHandler<rapidjson::UTF16<char16_t>, MapHandler> {
    explicit MapHandler(Map &target) : map(target) {}

    bool Key(char16_t const *text, rapidjson::SizeType length, bool) {
        key.assign(text, length);
        return true;
    }
    bool String(char16_t const *text, rapidjson::SizeType length, bool) {
        map.insert_or_assign(std::move(key), std::u16string(text, length));
        return true;
    }

    Map &map;
    std::u16string key;
};

void AddLoads() {
    constexpr std::size_t kEntries = 100'000;
    Task const task{kLoad, "load", "100K"};
    auto const load = [](std::filesystem::path Files::*form) {
        return [form](benchmark::State &state) {
            KTFile const file = FileOf(FilesOf(kEntries).*form);
            for (auto _ : state) {
                KTStringDictionary &dictionary = Fresh();
                dictionary.ReadFromFile(file);
                benchmark::DoNotOptimize(&dictionary);
            }
            if (Fresh().ReadFromFile(file); // what was measured is what was wanted
                KTStringDictionary::GetStringDictionary()->GetKeyValue(TextFor(KeyOf(kEntries - 1))).empty()) {
                state.SkipWithError("not loaded");
            }
            Fresh();
        };
    };
    Add(task, kOurs, load(&Files::binary));
    Add(task, kText, load(&Files::text));
    Add(task, kJson, [](benchmark::State &state) {
        std::filesystem::path const path = FilesOf(kEntries).json;
        for (auto _ : state) {
            std::ifstream file(path, std::ios::binary);
            std::string bytes(std::filesystem::file_size(path), '\0');
            file.read(bytes.data(), static_cast<std::streamsize>(bytes.size()));
            Map map;
            map.reserve(kEntries);
            MapHandler handler(map);
            rapidjson::GenericReader<rapidjson::UTF8<>, rapidjson::UTF16<char16_t>> reader;
            rapidjson::StringStream stream(bytes.c_str());
            reader.Parse(stream, handler);
            if (map.size() != kEntries) {
                state.SkipWithError("not loaded");
            }
            benchmark::DoNotOptimize(&map);
        }
    });
}

void AddGrowth() {
    for (Size const &size : kSizes) {
        AddOurFind({kGrowth, "find", size.name}, size.entries, {}, 0);
        AddMapFind({kGrowth, "find", size.name}, size.entries);
        Add({kGrowth, "fill", size.name}, kOurs, [entries = size.entries](benchmark::State &state) {
            std::vector<std::pair<KTString, KTString>> texts;
            texts.reserve(entries);
            for (std::size_t i = 0; i < entries; ++i) {
                texts.emplace_back(TextFor(KeyOf(i)), TextFor(TextOf(i)));
            }
            for (auto _ : state) {
                KTStringDictionary &dictionary = Fresh();
                for (auto const &[key, text] : texts) {
                    dictionary.AddString(key, text);
                }
            }
            Fresh();
        });
        Add({kGrowth, "fill", size.name}, kMap, [entries = size.entries](benchmark::State &state) {
            std::vector<std::pair<std::u16string, std::u16string>> texts;
            texts.reserve(entries);
            for (std::size_t i = 0; i < entries; ++i) {
                texts.emplace_back(KeyOf(i), TextOf(i));
            }
            for (auto _ : state) {
                Map map;
                for (auto const &[key, text] : texts) {
                    map.emplace(key, text);
                }
                benchmark::DoNotOptimize(&map);
            }
        });
    }
}

} // namespace

void AddDictionaryBenchmarks() {
    DescribeGroup(kLoad, "100,000 texts from a file into memory");
    ExpectSpeed(kLoad, kJson, 5.0);
    ExpectSpeed(kLoad, kText, 5.0);
    AddLoads();
    DescribeGroup(kFind, "GetKeyValue");
    ExpectSpeed(kFind, kMap, 1 / 1.2);
    AddFinds();
    DescribeGrowthGroup(kGrowth, "cost as the dictionary grows from 1,000 to 1,000,000 entries: of one lookup, and of "
                                 "filling it from empty, which stays at 100 and 1,000 if each entry costs the same");
    AddGrowth();
}

} // namespace bench
