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

/// One line of the ratio table: name, own time, the baseline's time, ratio.
std::string Line(std::string const& name, std::string const& own, std::string const& theirs,
                 std::string const& ratio) {
    char text[160];
    std::snprintf(text, sizeof text, "%-28s %12s %12s %7s\n", name.c_str(), own.c_str(),
                  theirs.c_str(), ratio.c_str());
    return text;
}

std::string Format(char const* format, double value) {
    char text[32];
    std::snprintf(text, sizeof text, format, value);
    return text;
}

} // namespace

RatioReporter::RatioReporter(std::string baseline)
    : benchmark::ConsoleReporter(OO_Tabular), m_baseline(std::move(baseline)) {}

void RatioReporter::ReportRuns(std::vector<Run> const& runs) {
    ConsoleReporter::ReportRuns(runs);
    for (Run const& run : runs) {
        if (run.run_type != Run::RT_Iteration || run.error_occurred)
            continue;
        // CPU time: on a shared machine wall time also counts the time other programs ran.
        double const nanoseconds =
            run.GetAdjustedCPUTime() / benchmark::GetTimeUnitMultiplier(run.time_unit) * 1e9;
        m_times[run.benchmark_name()].push_back(nanoseconds);
    }
}

void RatioReporter::Finalize() {
    ConsoleReporter::Finalize();
    std::ostream& out = GetOutputStream();
    bool headerPrinted = false;
    for (auto const& [name, times] : m_times) {
        size_t const slash = name.rfind('/');
        if (slash == std::string::npos ||
            name.compare(slash + 1, std::string::npos, m_baseline) == 0)
            continue;
        auto const peer = m_times.find(name.substr(0, slash + 1) + m_baseline);
        if (peer == m_times.end())
            continue;
        if (!headerPrinted) {
            out << "\nTime as a ratio of " << m_baseline << "'s (below 1: faster)\n"
                << Line("benchmark", "CPU time", m_baseline, "ratio");
            headerPrinted = true;
        }
        double const own = Median(times), theirs = Median(peer->second);
        out << Line(name, Format("%.1f ns", own), Format("%.1f ns", theirs),
                    Format("%.2f", theirs > 0 ? own / theirs : 0.0));
    }
}

} // namespace tekit::bench
