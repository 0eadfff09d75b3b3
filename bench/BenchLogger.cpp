// BenchLogger.cpp: log lines on their way to a file that is flushed after every line, one thread and four.
//
// The peer's pattern writes milliseconds, a colon and the message, as the library does, so both write lines of about
// the same length. Four threads share one logger; the time is that of a line, whichever thread wrote it.

#include "Bench.h"

#include "KTLogger.h"

#include <spdlog/sinks/basic_file_sink.h>
#include <spdlog/spdlog.h>

#include <filesystem>
#include <memory>
#include <string>

namespace bench {

namespace {

constexpr char kGroup[] = "logger";
constexpr char kSpdlog[] = "spdlog";

std::string const g_Message = "saved 128 objects of course 'Introduction to safety at work' in chapter 3";
constexpr char kCourse[] = "Introduction to safety at work";

// The peer's file lies beside the library's.
std::shared_ptr<spdlog::logger> PeerLogger() {
    static std::shared_ptr<spdlog::logger> const logger = [] {
        std::filesystem::path const folder = std::filesystem::temp_directory_path();
        auto made = spdlog::basic_logger_mt("bench", (folder / "ktbench_spdlog.txt").string(), true);
        made->set_pattern("%e: %v");
        made->flush_on(spdlog::level::info);
        return made;
    }();
    return logger;
}

template <typename Line> void AddLines(char const *kase, char const *contender, Line line) {
    for (int const threads : {1, 4}) {
        Task const task{kGroup, kase, threads == 1 ? "1-thread" : "4-threads"};
        Add(task, contender, [line](benchmark::State &state) {
            for (auto _ : state) {
                line();
            }
            state.SetItemsProcessed(state.iterations());
        })->Threads(threads);
    }
}

} // namespace

void AddLoggerBenchmarks() {
    DescribeGroup(kGroup, "gKTLogger->Log, lines per second");
    ExpectSpeed(kGroup, kSpdlog, 1.0);
    AddLines("message", kOurs, [] { gKTLogger->Log(g_Message); });
    AddLines("message", kSpdlog, [logger = PeerLogger().get()] { logger->info(g_Message); });
    AddLines("variadic", kOurs,
             [] { gKTLogger->Log("saved %d objects of course '%s' in chapter %d", 128, kCourse, 3); });
    AddLines("variadic", kSpdlog, [logger = PeerLogger().get()] {
        logger->info("saved {} objects of course '{}' in chapter {}", 128, kCourse, 3);
    });
}

} // namespace bench
