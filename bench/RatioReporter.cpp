// The ratio table printed after a benchmark run: tekit's median CPU time against each peer's.
#include "RatioReporter.h"

#include <algorithm>
#include <cstdio>
#include <ostream>

namespace tekit::bench {

namespace {

/// The median: one slow repetition (a page fault, a preemption) does not move it.
double Median(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    size_t const middle = values.size() / 2;
    return values.size() % 2 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

/// A time with a unit that keeps three significant digits or so.
std::string Time(double nanoseconds) {
    char text[32];
    if (nanoseconds >= 1e6)
        std::snprintf(text, sizeof text, "%.2f ms", nanoseconds / 1e6);
    else if (nanoseconds >= 1e4)
        std::snprintf(text, sizeof text, "%.1f us", nanoseconds / 1e3);
    else
        std::snprintf(text, sizeof text, "%.1f ns", nanoseconds);
    return text;
}

/// One line of the table: case, tekit's time, peer, the peer's time, ratio.
std::string Line(std::string const& name, std::string const& own, std::string const& peer,
                 std::string const& theirs, std::string const& ratio) {
    char text[200];
    std::snprintf(text, sizeof text, "%-30s %11s   %-10s %11s %7s\n", name.c_str(), own.c_str(),
                  peer.c_str(), theirs.c_str(), ratio.c_str());
    return text;
}

} // namespace

RatioReporter::RatioReporter(std::vector<std::string> peers)
    : benchmark::ConsoleReporter(OO_Tabular), m_peers(std::move(peers)) {}

RatioReporter::RatioReporter(std::string peer) : RatioReporter(std::vector{std::move(peer)}) {}

void RatioReporter::ReportRuns(std::vector<Run> const& runs) {
    ConsoleReporter::ReportRuns(runs);
    for (Run const& run : runs) {
        if (run.run_type != Run::RT_Iteration || run.error_occurred)
            continue;
        // CPU time: on a shared machine wall time also counts the time other programs ran.
        double const nanoseconds =
            run.GetAdjustedCPUTime() / benchmark::GetTimeUnitMultiplier(run.time_unit) * 1e9;
        std::string const name = run.benchmark_name();
        auto& times = m_times[name];
        if (times.empty())
            m_order.push_back(name);
        times.push_back(nanoseconds);
    }
}

void RatioReporter::Finalize() {
    ConsoleReporter::Finalize();
    std::ostream& out = GetOutputStream();
    bool headerPrinted = false;
    for (std::string const& name : m_order) {
        size_t const slash = name.rfind('/');
        if (slash == std::string::npos ||
            std::find(m_peers.begin(), m_peers.end(), name.substr(slash + 1)) != m_peers.end())
            continue;
        std::string const operation = name.substr(0, slash);
        double const own = Median(m_times[name]);
        bool first = true;
        for (std::string const& peer : m_peers) {
            auto const theirs = m_times.find(operation + "/" + peer);
            if (theirs == m_times.end())
                continue;
            if (!headerPrinted) {
                out << "\nTime as a ratio of the peer's (below 1: tekit is faster)\n"
                    << Line("benchmark", "CPU time", "peer", "peer time", "ratio");
                headerPrinted = true;
            }
            double const peerTime = Median(theirs->second);
            char ratio[16];
            std::snprintf(ratio, sizeof ratio, "%.2f", peerTime > 0 ? own / peerTime : 0.0);
            out << Line(first ? name : "", first ? Time(own) : "", peer, Time(peerTime), ratio);
            first = false;
        }
    }
}

} // namespace tekit::bench
