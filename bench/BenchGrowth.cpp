// BenchGrowth.cpp: what an operation costs when its text is ten and a hundred times as long. The library alone is
// measured: the report gives each size's cost as a multiple of the smallest one's, which a linear operation keeps at
// 10 and 100.

#include "Bench.h"
#include "BenchSamples.h"

#include "KTString.h"

namespace bench {

namespace {

constexpr char kGroup[] = "growth";

struct Step {
    char const *name;
    std::size_t bytes;
};

constexpr Step kSteps[] = {{"1x", 512}, {"10x", 5120}, {"100x", 51200}};

template <typename Operation> void AddSteps(char const *kase, Script script, Operation operation) {
    for (Step const &step : kSteps) {
        std::string const bytes = SampleText(script, step.bytes);
        Add({kGroup, kase, step.name}, kOurs, [bytes, operation](benchmark::State &state) {
            HeapRoom const room(8 * bytes.size());
            KTString const text(bytes.c_str());
            for (auto _ : state) {
                benchmark::DoNotOptimize(operation(text, bytes));
            }
        });
    }
}

} // namespace

void AddGrowthBenchmarks() {
    DescribeGrowthGroup(kGroup, "cost as the text grows");
    AddSteps("utf8-decode", Script::kCyrillic, [](KTString const &, std::string const &bytes) {
        return KTString(bytes.c_str(), KTString::kKTEncodingUTF8);
    });
    AddSteps("utf8-encode", Script::kCyrillic,
             [](KTString const &text, std::string const &) { return text.GetUTF8String(); });
    AddSteps("replace-all-2", Script::kAscii, [](KTString const &text, std::string const &) {
        return KTString(text).ReplaceAll2(KTString("the"), KTString("every"));
    });
    AddSteps("replace-all-same-length", Script::kAscii, [](KTString const &text, std::string const &) {
        return KTString(text).ReplaceAll(KTString("the"), KTString("any"));
    });
    AddSteps("replace-all-longer", Script::kAscii, [](KTString const &text, std::string const &) {
        return KTString(text).ReplaceAll(KTString("the"), KTString("every"));
    });
    AddSteps("split", Script::kAscii,
             [](KTString const &text, std::string const &) { return text.Split(KTString(" ,.")); });
}

} // namespace bench
