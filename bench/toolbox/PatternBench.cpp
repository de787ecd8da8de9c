// The pattern engine against std::regex, RE2 and PCRE2 (without and with its JIT) over 50 MB
// of generated log lines: each counts the lines that hold a match of the same pattern, written
// in each engine's dialect. The peers search line by line; RegExpr_FindPatternInText is given
// the whole text and an offset, and after each match the next search starts at the next line.
//
//   bench_patterns --benchmark_filter=literal
#include "RatioReporter.h"

#include "tekit/toolbox/RegExpr.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstring>
#include <random>
#include <regex>
#include <string>
#include <string_view>

#if defined(TEKIT_BENCH_HAVE_RE2)
#include <re2/re2.h>
#endif
#if defined(TEKIT_BENCH_HAVE_PCRE2)
#define PCRE2_CODE_UNIT_WIDTH 8
#include <pcre2.h>
#endif

namespace {

/// One pattern in the engine's own dialect, in POSIX ERE (std::regex) and in Perl's (RE2, PCRE2).
struct Pattern {
    char const* name;
    char const* own;
    char const* ere;
    char const* perl;
};

Pattern const kPatterns[] = {
    {"literal", "connection refused", "connection refused", "connection refused"},
    {"literalset", "ERROR [0-9]+", "ERROR [0-9]+", "ERROR [0-9]+"},
    {"alternation", "{timeout|overflow|mismatch|denied|corrupt}",
     "(timeout|overflow|mismatch|denied|corrupt)", "(?:timeout|overflow|mismatch|denied|corrupt)"},
    {"leadingany", ".*timeout", ".*timeout", ".*timeout"},
};

/// About 50 MB of log lines; about 1 in 50 is an error, and a few name the words above.
std::string const& LogText() {
    static std::string const text = [] {
        char const* const levels[] = {"INFO ", "DEBUG", "WARN ", "INFO ", "DEBUG"};
        char const* const words[] = {"sequence", "step",  "limit",   "measurement", "channel",
                                     "voltage",  "retry", "station", "report",      "adapter"};
        char const* const rare[] = {"timeout", "overflow", "mismatch",
                                    "denied",  "corrupt",  "connection refused"};
        std::mt19937 random(17);
        std::string out;
        out.reserve(52u << 20);
        char line[256];
        while (out.size() < (50u << 20)) {
            unsigned const r = random();
            bool const error = r % 50 == 0;
            int n =
                std::snprintf(line, sizeof line, "2024-03-%02u 12:%02u:%02u.%03u [worker-%u] %s",
                              r % 28 + 1, r % 60, (r >> 8) % 60, (r >> 4) % 1000, (r >> 12) % 8,
                              error ? "ERROR" : levels[(r >> 16) % 5]);
            if (error)
                n += std::snprintf(line + n, sizeof line - n, " %u", (r >> 3) % 9000 + 1000);
            for (int w = 0; w < 8; ++w) {
                unsigned const pick = random();
                char const* word = pick % 97 == 0 ? rare[pick % 6] : words[pick % 10];
                n += std::snprintf(line + n, sizeof line - n, " %s", word);
            }
            out.append(line, static_cast<std::size_t>(n)).push_back('\n');
        }
        return out;
    }();
    return text;
}

/// Calls `matches(begin, end)` for each line of the text and counts the lines it accepts.
template <class Matches> std::size_t CountLines(std::string const& text, Matches&& matches) {
    std::size_t count = 0;
    char const* p = text.data();
    char const* const end = p + text.size();
    while (p < end) {
        auto const* nl = static_cast<char const*>(std::memchr(p, '\n', end - p));
        char const* const lineEnd = nl ? nl : end;
        count += matches(p, lineEnd) ? 1 : 0;
        p = lineEnd + 1;
    }
    return count;
}

void Report(benchmark::State& state, std::string const& text, std::size_t lines) {
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size()));
    state.counters["lines"] = static_cast<double>(lines);
}

void Tekit(benchmark::State& state, Pattern const& pattern) {
    std::string const& text = LogText();
    auto const size = static_cast<int>(text.size());
    std::size_t lines = 0;
    for (auto _ : state) {
        lines = 0;
        int found = 0, position = -1, length = -1, offset = 0;
        while (RegExpr_FindPatternInText(pattern.own, 1, text.data(), size, offset, 1,
                                         REGEXPR_MATCH_FIRST, &found, &position, &length,
                                         nullptr) == 0 &&
               found) {
            ++lines;
            auto const* nl = static_cast<char const*>(
                std::memchr(text.data() + position, '\n', text.size() - position));
            if (nl == nullptr)
                break;
            offset = static_cast<int>(nl - text.data()) + 1;
        }
    }
    Report(state, text, lines);
}

void Std(benchmark::State& state, Pattern const& pattern) {
    std::string const& text = LogText();
    std::regex const re(pattern.ere, std::regex::extended);
    std::size_t lines = 0;
    for (auto _ : state)
        lines = CountLines(
            text, [&](char const* b, char const* e) { return std::regex_search(b, e, re); });
    Report(state, text, lines);
}

#if defined(TEKIT_BENCH_HAVE_RE2)
void Re2(benchmark::State& state, Pattern const& pattern) {
    std::string const& text = LogText();
    RE2::Options options;
    options.set_encoding(RE2::Options::EncodingLatin1);
    RE2 const re(pattern.perl, options);
    std::size_t lines = 0;
    for (auto _ : state)
        lines = CountLines(text, [&](char const* b, char const* e) {
            return RE2::PartialMatch(std::string_view(b, static_cast<std::size_t>(e - b)), re);
        });
    Report(state, text, lines);
}
#endif

#if defined(TEKIT_BENCH_HAVE_PCRE2)
void Pcre2(benchmark::State& state, Pattern const& pattern, bool jit) {
    std::string const& text = LogText();
    int error = 0;
    PCRE2_SIZE offset = 0;
    pcre2_code* const code = pcre2_compile(reinterpret_cast<PCRE2_SPTR>(pattern.perl),
                                           PCRE2_ZERO_TERMINATED, 0, &error, &offset, nullptr);
    if (jit)
        pcre2_jit_compile(code, PCRE2_JIT_COMPLETE);
    pcre2_match_data* const data = pcre2_match_data_create_from_pattern(code, nullptr);
    std::size_t lines = 0;
    for (auto _ : state)
        lines = CountLines(text, [&](char const* b, char const* e) {
            return pcre2_match(code, reinterpret_cast<PCRE2_SPTR>(b),
                               static_cast<PCRE2_SIZE>(e - b), 0, jit ? 0 : PCRE2_NO_JIT, data,
                               nullptr) >= 0;
        });
    Report(state, text, lines);
    pcre2_match_data_free(data);
    pcre2_code_free(code);
}
#endif

void Register() {
    for (Pattern const& p : kPatterns) {
        std::string const prefix = std::string("Find/") + p.name + "/";
        benchmark::RegisterBenchmark((prefix + "tekit").c_str(), Tekit, p)
            ->Unit(benchmark::kMillisecond);
        benchmark::RegisterBenchmark((prefix + "std").c_str(), Std, p)
            ->Unit(benchmark::kMillisecond);
#if defined(TEKIT_BENCH_HAVE_RE2)
        benchmark::RegisterBenchmark((prefix + "re2").c_str(), Re2, p)
            ->Unit(benchmark::kMillisecond);
#endif
#if defined(TEKIT_BENCH_HAVE_PCRE2)
        benchmark::RegisterBenchmark((prefix + "pcre2").c_str(), Pcre2, p, false)
            ->Unit(benchmark::kMillisecond);
        benchmark::RegisterBenchmark((prefix + "pcre2jit").c_str(), Pcre2, p, true)
            ->Unit(benchmark::kMillisecond);
#endif
    }
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    Register();
    tekit::bench::RatioReporter reporter("std");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
