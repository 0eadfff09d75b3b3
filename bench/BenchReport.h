// BenchReport.h: from measured times to ratios.
//
// Google Benchmark measures every contender several times, in random order; the report keeps the median of each. A
// ratio is the library's speed divided by the peer's in the same run, so 2 means twice as fast. Times themselves are
// not shown: they belong to the machine, the ratios to the code.

#pragma once

#include "Bench.h"

#include <benchmark/benchmark.h>

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace bench {

/// A contender's measured seconds per iteration, one for each repetition.
struct Contender {
    std::string name;
    std::vector<double> seconds;

    double Median() const;
};

/// The contenders of one case and size.
struct Row {
    std::string name; ///< "case/size"
    std::string kase;
    std::vector<Contender> contenders;

    Contender const *Find(std::string const &contender) const;
};

struct Group {
    std::string name;
    std::string text;
    bool growth = false;
    std::map<std::string, double> targets; ///< by peer
    std::vector<Row> rows;

    /// All contenders but the library, in the order of their first appearance.
    std::vector<std::string> Peers() const;

    /// How many times as fast as the peer the library is; nothing where either was not measured.
    std::optional<double> Speed(Row const &row, std::string const &peer) const;

    /// Whether the speed meets the peer's target; true where there is no target.
    bool IsMet(std::string const &peer, double speed) const;

    /// The row's cost as a multiple of that of its case's first row, for growth groups: the library's or a peer's.
    std::optional<double> Growth(Row const &row, std::string const &contender = kOurs) const;
};

/// Collects the repetitions of every benchmark.
class Report : public benchmark::BenchmarkReporter {
  public:
    /// Starts with everything that is registered, so that results in any order find their place.
    Report();

    bool ReportContext(Context const &) override { return true; }
    void ReportRuns(std::vector<Run> const &runs) override;

    /// What was measured, in the order of registration.
    std::vector<Group> Groups() const;

  private:
    std::vector<Group> m_Groups;
};

/// The tables as text.
std::string TextOf(std::vector<Group> const &groups);

/// The tables and plots as one HTML page that needs nothing else.
std::string PageOf(std::vector<Group> const &groups);

/// A ratio with three significant digits or two decimals, whichever is shorter: 0.97, 1.4, 12.3, 140.
std::string RatioText(double ratio);

/// "118 of 120 targets met", for all groups together.
std::string Summary(std::vector<Group> const &groups);

} // namespace bench
