// BenchReport.cpp: the collected medians, the ratios and the text tables.

#include "BenchReport.h"

#include "Bench.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <utility>

namespace bench {

namespace {

// The described groups with all registered rows and contenders, nothing measured yet.
std::vector<Group> &DescribedGroups() {
    static std::vector<Group> groups;
    return groups;
}

// The parts of group/case/size/contender; empty parts where the name has fewer.
std::array<std::string, 4> SplitName(std::string const &name) {
    std::array<std::string, 4> parts;
    std::size_t part = 0;
    for (char const letter : name) {
        if (letter == '/' && part + 1 < parts.size()) {
            ++part;
        } else {
            parts[part] += letter;
        }
    }
    return parts;
}

template <typename Items, typename Name> auto *FindByName(Items &items, Name const &name) {
    auto const found = std::find_if(items.begin(), items.end(), [&](auto const &item) { return item.name == name; });
    return found == items.end() ? nullptr : &*found;
}

template <typename Item> Item &FindOrAdd(std::vector<Item> &items, std::string const &name) {
    if (Item *const found = FindByName(items, name)) {
        return *found;
    }
    Item &added = items.emplace_back();
    added.name = name;
    return added;
}

std::string Padded(std::string text, std::size_t width) {
    text.resize(std::max(width, text.size()), ' ');
    return text;
}

std::string PeerTable(Group const &group) {
    std::vector<std::string> const peers = group.Peers();
    std::string text = Padded("", 34);
    for (std::string const &peer : peers) {
        text += Padded(peer, 15);
    }
    text += '\n';
    for (Row const &row : group.rows) {
        text += "  " + Padded(row.name, 32);
        for (std::string const &peer : peers) {
            auto const speed = group.Speed(row, peer);
            std::string cell = speed ? RatioText(*speed) : "";
            cell += speed && !group.IsMet(peer, *speed) ? " missed" : "";
            text += Padded(cell, 15);
        }
        text += '\n';
    }
    for (auto const &[peer, target] : group.targets) {
        text += "  target: at least " + RatioText(target) + " of " + peer + "'s speed\n";
    }
    return text;
}

std::string GrowthTable(Group const &group) {
    std::string text;
    for (Row const &row : group.rows) {
        auto const growth = group.Growth(row);
        text += "  " + Padded(row.name, 32) + Padded(growth ? RatioText(*growth) : "", 10);
        for (std::string const &peer : group.Peers()) {
            auto const peers = group.Growth(row, peer);
            text += peers ? "  " + peer + ' ' + RatioText(*peers) : "";
        }
        text += '\n';
    }
    return text;
}

} // namespace

void DescribeGroup(std::string group, std::string text) {
    DescribedGroups().push_back({std::move(group), std::move(text), false, {}, {}});
}

void DescribeGrowthGroup(std::string group, std::string text) {
    DescribedGroups().push_back({std::move(group), std::move(text), true, {}, {}});
}

void PlaceInReport(Task const &task, std::string const &contender) {
    Row &row = FindOrAdd(FindOrAdd(DescribedGroups(), task.group).rows, task.kase + '/' + task.size);
    row.kase = task.kase;
    FindOrAdd(row.contenders, contender);
}

void ExpectSpeed(std::string const &group, std::string peer, double speed) {
    FindOrAdd(DescribedGroups(), group).targets[std::move(peer)] = speed;
}

double Contender::Median() const {
    std::vector<double> sorted = seconds;
    std::sort(sorted.begin(), sorted.end());
    std::size_t const middle = sorted.size() / 2;
    return sorted.size() % 2 != 0 ? sorted[middle] : (sorted[middle - 1] + sorted[middle]) / 2;
}

Contender const *Row::Find(std::string const &contender) const { return FindByName(contenders, contender); }

std::vector<std::string> Group::Peers() const {
    std::vector<std::string> peers;
    for (Row const &row : rows) {
        for (Contender const &contender : row.contenders) {
            if (contender.name != kOurs && std::find(peers.begin(), peers.end(), contender.name) == peers.end()) {
                peers.push_back(contender.name);
            }
        }
    }
    return peers;
}

std::optional<double> Group::Speed(Row const &row, std::string const &peer) const {
    Contender const *const ours = row.Find(kOurs);
    Contender const *const other = row.Find(peer);
    if (ours == nullptr || other == nullptr) {
        return std::nullopt;
    }
    return other->Median() / ours->Median();
}

bool Group::IsMet(std::string const &peer, double speed) const {
    auto const target = targets.find(peer);
    return target == targets.end() || speed >= target->second;
}

std::optional<double> Group::Growth(Row const &row, std::string const &contender) const {
    auto const first =
        std::find_if(rows.begin(), rows.end(), [&](Row const &candidate) { return candidate.kase == row.kase; });
    Contender const *const smallest = first->Find(contender);
    Contender const *const present = row.Find(contender);
    if (smallest == nullptr || present == nullptr) {
        return std::nullopt;
    }
    return present->Median() / smallest->Median();
}

Report::Report() : m_Groups(DescribedGroups()) {}

void Report::ReportRuns(std::vector<Run> const &runs) {
    for (Run const &run : runs) {
        if (run.run_type != Run::RT_Iteration || run.error_occurred || run.iterations == 0) {
            continue;
        }
        auto const [group, kase, size, contender] = SplitName(run.run_name.function_name);
        std::string name = kase;
        name.append(1, '/').append(size);
        Row &row = FindOrAdd(FindOrAdd(m_Groups, group).rows, name);
        FindOrAdd(row.contenders, contender)
            .seconds.push_back(run.real_accumulated_time / static_cast<double>(run.iterations));
    }
}

std::vector<Group> Report::Groups() const {
    std::vector<Group> groups = m_Groups;
    for (Group &group : groups) {
        auto const isUnmeasured = [](auto const &contender) { return contender.seconds.empty(); };
        for (Row &row : group.rows) {
            std::erase_if(row.contenders, isUnmeasured);
        }
        std::erase_if(group.rows, [](Row const &row) { return row.contenders.empty(); });
    }
    std::erase_if(groups, [](Group const &group) { return group.rows.empty(); });
    return groups;
}

std::string RatioText(double ratio) {
    char text[32];
    std::snprintf(text, sizeof text, ratio < 10 ? "%.2f" : ratio < 100 ? "%.1f" : "%.0f", ratio);
    return text;
}

std::string Summary(std::vector<Group> const &groups) {
    std::size_t met = 0;
    std::size_t all = 0;
    for (Group const &group : groups) {
        for (Row const &row : group.rows) {
            for (auto const &[peer, target] : group.targets) {
                if (auto const speed = group.Speed(row, peer)) {
                    ++all;
                    met += static_cast<std::size_t>(group.IsMet(peer, *speed));
                }
            }
        }
    }
    return std::to_string(met) + " of " + std::to_string(all) + " targets met";
}

std::string TextOf(std::vector<Group> const &groups) {
    std::string text;
    for (Group const &group : groups) {
        text += group.name + ": " + group.text;
        text += group.growth ? " (multiples of the smallest size's cost)\n" : " (speed in multiples of the peer's)\n";
        text += group.growth ? GrowthTable(group) : PeerTable(group);
        text += '\n';
    }
    return text + Summary(groups) + '\n';
}

} // namespace bench
