// BenchExceptions.cpp: a try block on the path without faults, on a thread that has the translator of structured
// exceptions and on one that has not. The work in it may fault: it reads memory and calls a function.

#include "Bench.h"

#include "KTExceptionUtils.h"

#include <cstdint>
#include <exception>
#include <numeric>
#include <vector>

namespace bench {

namespace {

constexpr char kGroup[] = "try-block";
constexpr char kWithout[] = "no-handler";

[[gnu::noinline]] std::uint64_t Work(std::vector<std::uint64_t> const &numbers) {
    try {
        std::vector<std::uint64_t> const copy(numbers.begin(), numbers.end()); // something to destroy
        return std::accumulate(copy.begin(), copy.end(), std::uint64_t{0});
    } catch (std::exception const &) {
        return 0;
    }
}

void AddWork(std::size_t size, char const *name) {
    Add({kGroup, "copy-and-sum", name}, kOurs, [size](benchmark::State &state) {
        std::vector<std::uint64_t> const numbers(size, 1);
        KTExceptionUtils::InstallExceptionHandler();
        for (auto _ : state) {
            benchmark::DoNotOptimize(Work(numbers));
        }
        KTExceptionUtils::GetInstance().RestorePreviousHandler();
    });
    Add({kGroup, "copy-and-sum", name}, kWithout, [size](benchmark::State &state) {
        std::vector<std::uint64_t> const numbers(size, 1);
        for (auto _ : state) {
            benchmark::DoNotOptimize(Work(numbers));
        }
    });
}

} // namespace

void AddExceptionBenchmarks() {
    DescribeGroup(kGroup, "A try block without faults, with the handler installed on the thread and without");
    ExpectSpeed(kGroup, kWithout, 0.97); // nothing but noise
    AddWork(1, "1");
    AddWork(1000, "1000");
}

} // namespace bench
