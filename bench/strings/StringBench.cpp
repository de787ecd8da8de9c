// DynamicString against std::string on the same texts: copying (a shared block against a byte
// copy), assignment and appending, for a short text (inside std::string's in-place buffer) and
// a long one.
//
//   bench_strings --benchmark_filter=Copy --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/strings/DynamicString.h"

#include <benchmark/benchmark.h>

#include <string>

namespace {

using tekit::DynamicString;

char const* const kShortText = "Step 12";
char const* const kLongText = "Numeric Limit Test: measures the supply voltage on channel 3 and "
                              "compares it with the limits of the running sequence";

template <class Text> void Copy(benchmark::State& state, char const* text) {
    Text const source(text);
    for (auto _ : state) {
        Text copy(source);
        benchmark::DoNotOptimize(copy);
    }
}

/// Alternates between two equal sources, so no assignment is of a text the target already has.
template <class Text> void Assign(benchmark::State& state, char const* text) {
    Text const first(text), second(text);
    Text target("x");
    bool odd = false;
    for (auto _ : state) {
        target = (odd = !odd) ? first : second;
        benchmark::DoNotOptimize(target);
    }
}

template <class Text> void AssignText(benchmark::State& state, char const* text) {
    Text target("x");
    for (auto _ : state) {
        target = text;
        benchmark::DoNotOptimize(target);
    }
}

/// Builds a text of eight pieces from empty, as report and log code does.
template <class Text> void Append(benchmark::State& state, char const* text) {
    for (auto _ : state) {
        Text built;
        for (int i = 0; i < 8; ++i)
            built += text;
        benchmark::DoNotOptimize(built);
    }
}

template <class Text> void RegisterFor(char const* implementation) {
    std::pair<char const*, char const*> const cases[] = {{"short", kShortText},
                                                         {"long", kLongText}};
    for (auto const& [caseName, text] : cases) {
        std::string const suffix = std::string("/") + caseName + "/" + implementation;
        benchmark::RegisterBenchmark(("Copy" + suffix).c_str(), Copy<Text>, text);
        benchmark::RegisterBenchmark(("Assign" + suffix).c_str(), Assign<Text>, text);
        benchmark::RegisterBenchmark(("AssignText" + suffix).c_str(), AssignText<Text>, text);
        benchmark::RegisterBenchmark(("Append" + suffix).c_str(), Append<Text>, text);
    }
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    RegisterFor<DynamicString>("tekit");
    RegisterFor<std::string>("std");
    tekit::bench::RatioReporter reporter("std");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
