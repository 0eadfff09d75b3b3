// BenchPage.cpp: the report as one HTML page: a table for each group and, beside it, bars.
//
// In a bar chart of peers each bar is a contender's speed where the library's own is 1, so the library's bars end at
// the line. In a growth chart each bar is a cost on a logarithmic scale from 1 to 10 000.

#include "Bench.h"
#include "BenchReport.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

namespace bench {

namespace {

constexpr char kHead[] = R"(<!doctype html>
<html lang="en"><head><meta charset="utf-8"><title>KTPublic benchmarks</title>
<style>
body { font: 15px/1.45 system-ui, sans-serif; margin: 2em auto; max-width: 72em; padding: 0 1em; color: #222; }
h2 { margin-top: 2em; }
table { border-collapse: collapse; margin: 1em 0; }
th, td { padding: .2em .8em; text-align: right; border-bottom: 1px solid #ddd; }
th:first-child, td:first-child { text-align: left; }
td.missed { background: #f7d4cf; }
td.met { background: #dcefdc; }
svg { font: 12px system-ui, sans-serif; display: block; margin: 1em 0; }
</style></head><body>
<h1>KTPublic benchmarks</h1>
<p>Ratios of medians in one run, all contenders interleaved at random. A table's number is the library's speed divided
by the peer's: 2 is twice as fast. Coloured cells have a target; red ones miss it.</p>
)";

constexpr int kRowHeight = 15;
constexpr int kLabelWidth = 250;
constexpr int kPlotWidth = 480;
constexpr double kMostDecades = 4; // a growth chart's scale

std::string Number(double value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.1f", value);
    return text;
}

std::string HtmlOf(std::string const &text) {
    std::string html;
    for (char const letter : text) {
        html += letter == '<' ? "&lt;" : letter == '&' ? "&amp;" : std::string(1, letter);
    }
    return html;
}

// One labelled bar; `share` is its part of the plot's width.
std::string Bar(int y, std::string const &label, double share, std::string const &value, bool ours) {
    double const width = std::max(1.0, std::min(share, 1.0) * kPlotWidth);
    std::string const middle = std::to_string(y + kRowHeight - 4);
    return "<text x=\"" + std::to_string(kLabelWidth - 8) + "\" y=\"" + middle + "\" text-anchor=\"end\">" +
           HtmlOf(label) + "</text><rect x=\"" + std::to_string(kLabelWidth) + "\" y=\"" + std::to_string(y + 2) +
           "\" width=\"" + Number(width) + "\" height=\"" + std::to_string(kRowHeight - 4) + "\" fill=\"" +
           (ours ? "#2b6cb0" : "#b8c4d0") + "\"/><text x=\"" + Number(kLabelWidth + width + 5) + "\" y=\"" + middle +
           "\">" + value + "</text>\n";
}

std::string Svg(std::string const &bars, int height) {
    return "<svg role=\"img\" width=\"" + std::to_string(kLabelWidth + kPlotWidth + 70) + "\" height=\"" +
           std::to_string(height) + "\">\n" + bars + "</svg>\n";
}

// The speed of the row's fastest contender, where the library's own is 1.
double Fastest(Row const &row, Contender const &ours) {
    double fastest = 1;
    for (Contender const &contender : row.contenders) {
        fastest = std::max(fastest, ours.Median() / contender.Median());
    }
    return fastest;
}

std::string PeerPlot(Group const &group) {
    double fastest = 1;
    for (Row const &row : group.rows) {
        if (Contender const *const ours = row.Find(kOurs)) {
            fastest = std::max(fastest, Fastest(row, *ours));
        }
    }
    std::string bars;
    int y = 0;
    for (Row const &row : group.rows) {
        Contender const *const ours = row.Find(kOurs);
        if (ours == nullptr) {
            continue;
        }
        for (Contender const &contender : row.contenders) {
            double const speed = ours->Median() / contender.Median();
            bool const first = &contender == &row.contenders.front();
            std::string const label = (first ? row.name + "   " : "") + contender.name;
            bars += Bar(y, label, speed / fastest, RatioText(speed), contender.name == kOurs);
            y += kRowHeight;
        }
        y += kRowHeight / 2;
    }
    return Svg(bars, y);
}

std::string GrowthPlot(Group const &group) {
    std::string bars;
    int y = 0;
    for (Row const &row : group.rows) {
        if (auto const growth = group.Growth(row)) {
            bars += Bar(y, row.name, std::log10(std::max(*growth, 1.0)) / kMostDecades, RatioText(*growth), true);
            y += kRowHeight;
        }
    }
    return Svg(bars, y);
}

std::string PeerTable(Group const &group) {
    std::vector<std::string> const peers = group.Peers();
    std::string html = "<table><tr><th>case</th>";
    for (std::string const &peer : peers) {
        auto const target = group.targets.find(peer);
        html += "<th>" + HtmlOf(peer);
        html += target == group.targets.end() ? "</th>" : "<br>(at least " + RatioText(target->second) + ")</th>";
    }
    html += "</tr>\n";
    for (Row const &row : group.rows) {
        html += "<tr><td>" + HtmlOf(row.name) + "</td>";
        for (std::string const &peer : peers) {
            auto const speed = group.Speed(row, peer);
            if (!speed) {
                html += "<td></td>";
                continue;
            }
            char const *const kind = !group.targets.contains(peer) ? ""
                                     : group.IsMet(peer, *speed)   ? " class=\"met\""
                                                                   : " class=\"missed\"";
            html += std::string("<td") + kind + ">" + RatioText(*speed) + "</td>";
        }
        html += "</tr>\n";
    }
    return html + "</table>\n";
}

std::string GrowthTable(Group const &group) {
    std::string html = "<table><tr><th>case</th><th>cost</th></tr>\n";
    for (Row const &row : group.rows) {
        auto const growth = group.Growth(row);
        html += "<tr><td>" + HtmlOf(row.name) + "</td><td>" + (growth ? RatioText(*growth) : "");
        for (std::string const &peer : group.Peers()) {
            auto const peers = group.Growth(row, peer);
            html += peers ? " (" + HtmlOf(peer) + ' ' + RatioText(*peers) + ')' : "";
        }
        html += "</td></tr>\n";
    }
    return html + "</table>\n";
}

} // namespace

std::string PageOf(std::vector<Group> const &groups) {
    std::string html = kHead;
    html += "<p><b>" + Summary(groups) + "</b></p>\n";
    for (Group const &group : groups) {
        html += "<h2>" + HtmlOf(group.name) + "</h2>\n<p>" + HtmlOf(group.text) + "</p>\n";
        html += group.growth ? GrowthTable(group) + GrowthPlot(group) : PeerTable(group) + PeerPlot(group);
    }
    return html + "</body></html>\n";
}

} // namespace bench
