// A console reporter that, after the usual per-benchmark lines, prints each tekit benchmark's
// CPU time as a ratio of its peer's CPU time in the same run.
//
// Benchmarks are named "<operation>/<case>/<implementation>": "Copy/short/tekit" is compared
// with "Copy/short/std". A ratio below 1 means tekit is faster.
//
//   tekit::bench::RatioReporter reporter("std");
//   benchmark::RunSpecifiedBenchmarks(&reporter);
#pragma once

#include <benchmark/benchmark.h>

#include <map>
#include <string>
#include <vector>

namespace tekit::bench {

class RatioReporter : public benchmark::ConsoleReporter {
public:
    /// `baseline` is the implementation part of the names that the others are divided by.
    explicit RatioReporter(std::string baseline);

    void ReportRuns(std::vector<Run> const& runs) override;
    /// Prints the ratio table after the run.
    void Finalize() override;

private:
    std::string m_baseline;
    /// CPU time per iteration in nanoseconds, every repetition, by benchmark name.
    std::map<std::string, std::vector<double>> m_times;
};

} // namespace tekit::bench
