// Bench.h: how the benchmarks are named, registered and given their targets.
//
// A name has four parts, and the report is built from them:
//
//     group / case / size / contender           for example utf8-decode/cyrillic/64K/system
//
// All contenders of one group, case and size do the same work in one iteration, so their times compare directly. The
// library itself is always the contender kOurs.

#pragma once

#include <benchmark/benchmark.h>

#include <cstddef>
#include <memory>
#include <string>
#include <utility>

namespace bench {

inline constexpr char kOurs[] = "KTPublic";

/// Everything in a benchmark's name but the contender.
struct Task {
    std::string group;
    std::string kase;
    std::string size;
};

/// Gives a task its place in the report: the order of registration.
void PlaceInReport(Task const &task, std::string const &contender);

/// Registers one contender. `body` is called as body(benchmark::State &) and copied, so that it may own its input.
/// Times are taken from the wall clock: the processor clock is too coarse for short runs.
template <typename Body>
benchmark::internal::Benchmark *Add(Task const &task, std::string const &contender, Body body) {
    PlaceInReport(task, contender);
    std::string const name = task.group + '/' + task.kase + '/' + task.size + '/' + contender;
    return benchmark::RegisterBenchmark(name.c_str(), std::move(body))->UseRealTime();
}

/// While it lives, the heap has a free block of this size that is mapped and not its last one. A heap hands its last
/// pages back to the system when they are freed, and then a benchmark with results of some 100 KiB would, by the
/// accident of what was allocated before it, measure the mapping of pages.
class HeapRoom {
  public:
    explicit HeapRoom(std::size_t size) {
        auto const room = std::make_unique<char[]>(size);
        m_Behind = std::make_unique<char[]>(size);
        benchmark::DoNotOptimize(room.get());
    }

  private:
    std::unique_ptr<char[]> m_Behind;
};

/// Says what a group is, for the report's heading. Groups are reported in the order of these calls.
void DescribeGroup(std::string group, std::string text);

/// Like DescribeGroup, for a group whose sizes are reported as a multiple of the smallest one's cost.
void DescribeGrowthGroup(std::string group, std::string text);

/// Sets a target: in this group the library's speed is at least `speed` times that of the peer.
void ExpectSpeed(std::string const &group, std::string peer, double speed);

// ---- what each file brings ----

void AddTextBenchmarks();
void AddLoggerBenchmarks();
void AddLockBenchmarks();
void AddGrowthBenchmarks();
void AddFileBenchmarks();
void AddAnimationBenchmarks();
void AddDigestBenchmarks();
void AddStreamBenchmarks();
void AddExceptionBenchmarks();
void AddDictionaryBenchmarks();
void AddThreadBenchmarks();
void AddServiceBenchmarks();
void AddReaderBenchmarks();
void AddPictureBenchmarks();
void AddTimerBenchmarks();

} // namespace bench
