// Placeholder formatting and number conversion of the string family against a plain
// std::string implementation: filling a message's %1, %2, %3 with text and numbers, writing an
// int or a double into a placeholder, and reading numbers back.
//
//   bench_format --benchmark_filter=Message --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/strings/DynamicString.h"

#include <benchmark/benchmark.h>

#include <charconv>
#include <cstdio>
#include <string>

namespace {

using tekit::DynamicString;
using tekit::kDecimalPoint_AlwaysPeriod;

char const* const kMessage = "Could not find file '%1' at line %2 (%3 bytes read).";
char const* const kPath = "C:\\Users\\Public\\Documents\\Orvane\\Examples\\Numeric Limit.seq";

// ---- The peer: the same substitution written the obvious way over std::string. -------------

void PlainFill(std::string& s, std::string const& placeholder, std::string const& argument) {
    size_t const at = s.find(placeholder);
    if (at != std::string::npos)
        s.replace(at, placeholder.size(), argument);
}

std::string PlainShortest(double value) {
    char digits[64];
    return std::string(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
}

// ---- The benchmarks. ---------------------------------------------------------------------

void MessageTekit(benchmark::State& state) {
    for (auto _ : state) {
        DynamicString message(kMessage, false);
        message.Format(kPath, 1);
        message.Format(1234, 2);
        message.Format(65536.5, 3, kDecimalPoint_AlwaysPeriod);
        benchmark::DoNotOptimize(message.GetBufferReadPtr());
    }
}

void MessageStd(benchmark::State& state) {
    for (auto _ : state) {
        std::string message(kMessage);
        PlainFill(message, "%1", kPath);
        PlainFill(message, "%2", std::to_string(1234));
        PlainFill(message, "%3", PlainShortest(65536.5));
        benchmark::DoNotOptimize(message.data());
    }
}

void IntTekit(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        DynamicString s("value %1", false);
        s.Format(value++, 1);
        benchmark::DoNotOptimize(s.GetBufferReadPtr());
    }
}

void IntStd(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        std::string s("value %1");
        PlainFill(s, "%1", std::to_string(value++));
        benchmark::DoNotOptimize(s.data());
    }
}

void FixedTekit(benchmark::State& state) {
    double value = 3.14159;
    for (auto _ : state) {
        DynamicString s("value %1", false);
        s.Format(value, 1, kDecimalPoint_AlwaysPeriod, "%.3f");
        value += 0.001;
        benchmark::DoNotOptimize(s.GetBufferReadPtr());
    }
}

void FixedStd(benchmark::State& state) {
    double value = 3.14159;
    for (auto _ : state) {
        std::string s("value %1");
        char text[64];
        std::snprintf(text, sizeof text, "%.3f", value);
        PlainFill(s, "%1", text);
        value += 0.001;
        benchmark::DoNotOptimize(s.data());
    }
}

void ReadIntTekit(benchmark::State& state) {
    DynamicString const text("  -1234567 ");
    for (auto _ : state)
        benchmark::DoNotOptimize(text.CvtToInt32());
}

void ReadIntStd(benchmark::State& state) {
    std::string const text("  -1234567 ");
    for (auto _ : state)
        benchmark::DoNotOptimize(std::stoi(text));
}

void ReadDoubleTekit(benchmark::State& state) {
    DynamicString const text("6.02214076e23");
    for (auto _ : state)
        benchmark::DoNotOptimize(text.CvtToFloat64());
}

void ReadDoubleStd(benchmark::State& state) {
    std::string const text("6.02214076e23");
    for (auto _ : state)
        benchmark::DoNotOptimize(std::stod(text));
}

} // namespace

BENCHMARK(MessageTekit)->Name("Format/message/tekit");
BENCHMARK(MessageStd)->Name("Format/message/std");
BENCHMARK(IntTekit)->Name("Format/int/tekit");
BENCHMARK(IntStd)->Name("Format/int/std");
BENCHMARK(FixedTekit)->Name("Format/fixed/tekit");
BENCHMARK(FixedStd)->Name("Format/fixed/std");
BENCHMARK(ReadIntTekit)->Name("Read/int/tekit");
BENCHMARK(ReadIntStd)->Name("Read/int/std");
BENCHMARK(ReadDoubleTekit)->Name("Read/double/tekit");
BENCHMARK(ReadDoubleStd)->Name("Read/double/std");

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    tekit::bench::RatioReporter reporter("std");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
