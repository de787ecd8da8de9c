// Placeholder formatting and number conversion of the string family against the C library
// (snprintf, strtol, strtod), the C++ library's std::to_chars / std::from_chars, and a plain
// std::string implementation of the placeholder substitution:
//
//   - Format/int, Format/fixed: a template "value %1" filled with an int or a "%.3f" double,
//     against snprintf with "value %d" / "value %.3f" and against "value " + to_chars;
//   - Append/int: a number appended to a text;
//   - Read/int, Read/double: CvtToInt32 and CvtToFloat64 against strtol / strtod / from_chars;
//   - Format/message: a message's %1, %2, %3 filled with text and numbers, against std::string.
//
//   bench_format --benchmark_filter=Read --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/strings/DynamicString.h"

#include <benchmark/benchmark.h>

#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

using tekit::DynamicString;
using tekit::kDecimalPoint_AlwaysPeriod;

char const* const kMessage = "Could not find file '%1' at line %2 (%3 bytes read).";
char const* const kPath = "C:\\Users\\Public\\Documents\\Orvane\\Examples\\Numeric Limit.seq";
char const* const kIntText = "  -1234567 ";
char const* const kDoubleText = "6.02214076e23";

// ---- The peer of the message: the same substitution written over std::string. --------------

void PlainFill(std::string& s, std::string const& placeholder, std::string const& argument) {
    size_t const at = s.find(placeholder);
    if (at != std::string::npos)
        s.replace(at, placeholder.size(), argument);
}

std::string PlainShortest(double value) {
    char digits[64];
    return std::string(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
}

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

// ---- One number into a text. ----------------------------------------------------------------

void IntTekit(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        DynamicString s("value %1", false);
        s.Format(value++, 1);
        benchmark::DoNotOptimize(s.GetBufferReadPtr());
    }
}

void IntSnprintf(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        char s[64];
        std::snprintf(s, sizeof s, "value %d", value++);
        benchmark::DoNotOptimize(s);
    }
}

void IntToChars(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        char s[64] = "value ";
        *std::to_chars(s + 6, s + sizeof s - 1, value++).ptr = '\0';
        benchmark::DoNotOptimize(s);
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

void FixedSnprintf(benchmark::State& state) {
    double value = 3.14159;
    for (auto _ : state) {
        char s[64];
        std::snprintf(s, sizeof s, "value %.3f", value);
        value += 0.001;
        benchmark::DoNotOptimize(s);
    }
}

void FixedToChars(benchmark::State& state) {
    double value = 3.14159;
    for (auto _ : state) {
        char s[64] = "value ";
        *std::to_chars(s + 6, s + sizeof s - 1, value, std::chars_format::fixed, 3).ptr = '\0';
        value += 0.001;
        benchmark::DoNotOptimize(s);
    }
}

void AppendIntTekit(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        DynamicString s("value ", false);
        s.Append(value++);
        benchmark::DoNotOptimize(s.GetBufferReadPtr());
    }
}

void AppendIntSnprintf(benchmark::State& state) {
    int value = -123456;
    for (auto _ : state) {
        char s[64] = "value ";
        std::snprintf(s + 6, sizeof s - 6, "%d", value++);
        benchmark::DoNotOptimize(s);
    }
}

// ---- Reading numbers. -----------------------------------------------------------------------

void ReadIntTekit(benchmark::State& state) {
    DynamicString const text(kIntText);
    for (auto _ : state)
        benchmark::DoNotOptimize(text.CvtToInt32());
}

void ReadIntStrtol(benchmark::State& state) {
    char const* text = kIntText;
    for (auto _ : state) {
        benchmark::DoNotOptimize(text);
        benchmark::DoNotOptimize(std::strtol(text, nullptr, 10));
    }
}

// The text's address is hidden from the optimiser, which would otherwise read it at compile time.
void ReadIntFromChars(benchmark::State& state) {
    char const* first = kIntText + 2; // from_chars skips no white space
    char const* const last = kIntText + std::strlen(kIntText);
    for (auto _ : state) {
        benchmark::DoNotOptimize(first);
        int value = 0;
        std::from_chars(first, last, value);
        benchmark::DoNotOptimize(value);
    }
}

void ReadDoubleTekit(benchmark::State& state) {
    DynamicString const text(kDoubleText);
    for (auto _ : state)
        benchmark::DoNotOptimize(text.CvtToFloat64());
}

void ReadDoubleStrtod(benchmark::State& state) {
    char const* text = kDoubleText;
    for (auto _ : state) {
        benchmark::DoNotOptimize(text);
        benchmark::DoNotOptimize(std::strtod(text, nullptr));
    }
}

void ReadDoubleFromChars(benchmark::State& state) {
    char const* first = kDoubleText;
    char const* const last = kDoubleText + std::strlen(kDoubleText);
    for (auto _ : state) {
        benchmark::DoNotOptimize(first);
        double value = 0;
        std::from_chars(first, last, value);
        benchmark::DoNotOptimize(value);
    }
}

} // namespace

BENCHMARK(IntTekit)->Name("Format/int/tekit");
BENCHMARK(IntSnprintf)->Name("Format/int/snprintf");
BENCHMARK(IntToChars)->Name("Format/int/to_chars");
BENCHMARK(FixedTekit)->Name("Format/fixed/tekit");
BENCHMARK(FixedSnprintf)->Name("Format/fixed/snprintf");
BENCHMARK(FixedToChars)->Name("Format/fixed/to_chars");
BENCHMARK(AppendIntTekit)->Name("Append/int/tekit");
BENCHMARK(AppendIntSnprintf)->Name("Append/int/snprintf");
BENCHMARK(ReadIntTekit)->Name("Read/int/tekit");
BENCHMARK(ReadIntStrtol)->Name("Read/int/strtol");
BENCHMARK(ReadIntFromChars)->Name("Read/int/from_chars");
BENCHMARK(ReadDoubleTekit)->Name("Read/double/tekit");
BENCHMARK(ReadDoubleStrtod)->Name("Read/double/strtod");
BENCHMARK(ReadDoubleFromChars)->Name("Read/double/from_chars");
BENCHMARK(MessageTekit)->Name("Format/message/tekit");
BENCHMARK(MessageStd)->Name("Format/message/std");

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    tekit::bench::RatioReporter reporter(
        {"snprintf", "strtol", "strtod", "to_chars", "from_chars", "std"});
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
