// BenchMain.cpp: ktbench [--page=FILE] [Google Benchmark's options]
//
// Prints the ratios as text; with --page they are written as an HTML page as well. The defaults, which options on the
// command line override, give medians of nine interleaved repetitions.

#include "Bench.h"
#include "BenchReport.h"

#include <cstdio>
#include <fstream>
#include <string>
#include <string_view>
#include <vector>

namespace {

constexpr std::string_view kPageOption = "--page=";

// The arguments with our defaults before them, so that later ones win, and without --page, whose value goes to `page`.
std::vector<std::string> TakeArguments(int argc, char **argv, std::string &page) {
    std::vector<std::string> arguments{argv[0], "--benchmark_repetitions=9", "--benchmark_min_time=0.04",
                                       "--benchmark_enable_random_interleaving=true"};
    for (int i = 1; i < argc; ++i) {
        std::string_view const argument = argv[i];
        if (argument.starts_with(kPageOption)) {
            page = argument.substr(kPageOption.size());
        } else {
            arguments.emplace_back(argument);
        }
    }
    return arguments;
}

} // namespace

int main(int argc, char **argv) {
    std::string page;
    std::vector<std::string> arguments = TakeArguments(argc, argv, page);
    std::vector<char *> pointers;
    pointers.reserve(arguments.size());
    for (std::string &argument : arguments) {
        pointers.push_back(argument.data());
    }
    int count = static_cast<int>(pointers.size());
    benchmark::Initialize(&count, pointers.data());
    if (benchmark::ReportUnrecognizedArguments(count, pointers.data())) {
        return 2;
    }
    bench::AddTextBenchmarks();
    bench::AddLoggerBenchmarks();
    bench::AddLockBenchmarks();
    bench::AddGrowthBenchmarks();
    bench::AddFileBenchmarks();
    bench::AddAnimationBenchmarks();
    bench::AddDigestBenchmarks();
    bench::AddStreamBenchmarks();
    bench::AddExceptionBenchmarks();
    bench::AddDictionaryBenchmarks();
    bench::AddThreadBenchmarks();
    bench::AddServiceBenchmarks();
    bench::AddReaderBenchmarks();
    bench::AddPictureBenchmarks();
    bench::AddTimerBenchmarks();

    bench::Report report;
    if (benchmark::RunSpecifiedBenchmarks(&report) == 0) {
        return 1; // it has said that no benchmark matches
    }
    auto const groups = report.Groups();
    std::fputs(bench::TextOf(groups).c_str(), stdout);
    if (!page.empty() && !(std::ofstream(page, std::ios::binary) << bench::PageOf(groups))) {
        std::fprintf(stderr, "ktbench: cannot write %s\n", page.c_str());
        return 1;
    }
    return 0;
}
