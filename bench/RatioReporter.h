// A console reporter that, after the usual per-benchmark lines, prints each tekit benchmark's
// CPU time as a ratio of each of its peers' CPU times in the same run.
//
// Benchmarks are named "<operation>/<case>/<implementation>". Every implementation that is not
// a peer is tekit's: "Copy/1KiB/tekit" is compared with "Copy/1KiB/std" and "Copy/1KiB/qt",
// one line per peer that ran. A ratio below 1 means tekit is faster. Each figure is the median
// over repetitions, so one preempted repetition on a shared machine does not move it.
//
//   tekit::bench::RatioReporter reporter({"std", "qt"});
//   benchmark::RunSpecifiedBenchmarks(&reporter);
#pragma once

#include <benchmark/benchmark.h>

#include <map>
#include <string>
#include <vector>

namespace tekit::bench {

class RatioReporter : public benchmark::ConsoleReporter {
public:
    /// `peers` are the implementation parts of the names that tekit's figures are divided by,
    /// in the order their lines are printed.
    explicit RatioReporter(std::vector<std::string> peers);
    /// One peer.
    explicit RatioReporter(std::string peer);

    void ReportRuns(std::vector<Run> const& runs) override;
    /// Prints the ratio table after the run.
    void Finalize() override;

private:
    std::vector<std::string> m_peers;
    /// Benchmark names in the order they first ran.
    std::vector<std::string> m_order;
    /// CPU time per iteration in nanoseconds, every repetition, by benchmark name.
    std::map<std::string, std::vector<double>> m_times;
};

} // namespace tekit::bench
