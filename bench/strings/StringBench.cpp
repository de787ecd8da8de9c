// DynamicString against std::string and, when Qt 5 Core was found, QString (whose copy shares
// an implicitly shared block as ours does), on texts of 8 bytes (inside std::string's in-place
// buffer), 120 bytes, 1 KiB and 64 KiB: copying, assignment from another string and from a C
// text, appending 10-byte pieces, finding a word at the end, and comparing equal texts.
// StaticString<256> is timed against a char[256] written with snprintf and strncat.
//
//   bench_strings --benchmark_filter=Copy --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <benchmark/benchmark.h>

#if defined(TEKIT_BENCH_HAVE_QT)
#include <QString>
#endif

#include <cstdio>
#include <cstring>
#include <string>
#include <type_traits>

namespace {

using tekit::DynamicString;
using tekit::StaticString;

char const* const kPiece = "0123456789";
char const* const kNeedle = "needle";

/// A text of exactly `size` bytes: words that never hold the needle, and the needle last.
std::string TextOfSize(int size) {
    static char const kWords[] = "Numeric Limit Test: channel 3 supply voltage ";
    std::string text;
    while (int(text.size()) < size)
        text += kWords;
    text.resize(size_t(size));
    int const needle = int(std::strlen(kNeedle));
    if (size >= needle)
        text.replace(size_t(size - needle), size_t(needle), kNeedle);
    return text;
}

// ---- How each implementation is built from and read as 8-bit text. ------------------------

template <class Text> Text Make(std::string const& text) {
    return Text(text.c_str());
}
template <class Text> Text Empty() {
    return Text();
}
#if defined(TEKIT_BENCH_HAVE_QT)
template <> QString Make<QString>(std::string const& text) {
    return QString::fromLatin1(text.data(), int(text.size()));
}
#endif

int Find(DynamicString const& s, char const* what) {
    return s.FindSubstring(what);
}
int Find(std::string const& s, char const* what) {
    return int(s.find(what));
}
long Compare(DynamicString const& a, DynamicString const& b) {
    return a.Compare(b);
}
long Compare(std::string const& a, std::string const& b) {
    return a.compare(b);
}
#if defined(TEKIT_BENCH_HAVE_QT)
int Find(QString const& s, char const* what) {
    return s.indexOf(QLatin1String(what));
}
long Compare(QString const& a, QString const& b) {
    return QString::compare(a, b);
}
#endif

// ---- The operations. ------------------------------------------------------------------------

template <class Text> void Copy(benchmark::State& state, std::string const& text) {
    Text const source = Make<Text>(text);
    for (auto _ : state) {
        Text copy(source);
        benchmark::DoNotOptimize(copy);
    }
}

/// Alternates between two equal sources, so no assignment is of a text the target already has.
template <class Text> void Assign(benchmark::State& state, std::string const& text) {
    Text const first = Make<Text>(text), second = Make<Text>(text);
    Text target = Make<Text>("x");
    bool odd = false;
    for (auto _ : state) {
        target = (odd = !odd) ? first : second;
        benchmark::DoNotOptimize(target);
    }
}

template <class Text> void AssignText(benchmark::State& state, std::string const& text) {
    Text target = Make<Text>("x");
    char const* const source = text.c_str();
    for (auto _ : state) {
        if constexpr (std::is_same_v<Text, std::string> || std::is_same_v<Text, DynamicString>)
            target = source;
#if defined(TEKIT_BENCH_HAVE_QT)
        else
            target = QLatin1String(source);
#endif
        benchmark::DoNotOptimize(target);
    }
}

/// Builds a text from empty with `count` appends of `piece`, as report and log code does.
template <class Text>
void AppendPieces(benchmark::State& state, std::string const& piece, int count) {
    Text const appended = Make<Text>(piece);
    for (auto _ : state) {
        Text built = Empty<Text>();
        for (int i = 0; i < count; ++i)
            built += appended;
        benchmark::DoNotOptimize(built);
    }
}

template <class Text> void FindWord(benchmark::State& state, std::string const& text) {
    Text const haystack = Make<Text>(text);
    for (auto _ : state)
        benchmark::DoNotOptimize(Find(haystack, kNeedle));
}

/// Equal texts in two buffers, so the whole text is read.
template <class Text> void CompareEqual(benchmark::State& state, std::string const& text) {
    Text const a = Make<Text>(text), b = Make<Text>(text);
    for (auto _ : state)
        benchmark::DoNotOptimize(Compare(a, b));
}

struct Size {
    char const* name;
    int bytes;
};
constexpr Size kSizes[] = {{"8", 8}, {"120", 120}, {"1KiB", 1024}, {"64KiB", 65536}};

template <class Text> void RegisterFor(char const* implementation) {
    auto name = [&](char const* operation, char const* size) {
        return std::string(operation) + "/" + size + "/" + implementation;
    };
    for (Size const& size : kSizes) {
        std::string const text = TextOfSize(size.bytes);
        benchmark::RegisterBenchmark(name("Copy", size.name).c_str(), Copy<Text>, text);
        benchmark::RegisterBenchmark(name("Assign", size.name).c_str(), Assign<Text>, text);
        benchmark::RegisterBenchmark(name("AssignText", size.name).c_str(), AssignText<Text>, text);
        // The text built from 10-byte pieces (8 bytes: one piece of 8).
        std::string const piece = size.bytes < 10 ? text : kPiece;
        benchmark::RegisterBenchmark(name("Append", size.name).c_str(), AppendPieces<Text>, piece,
                                     size.bytes < 10 ? 1 : size.bytes / 10);
        benchmark::RegisterBenchmark(name("Find", size.name).c_str(), FindWord<Text>, text);
        benchmark::RegisterBenchmark(name("Compare", size.name).c_str(), CompareEqual<Text>, text);
    }
    benchmark::RegisterBenchmark(name("Append", "8x10").c_str(), AppendPieces<Text>, kPiece, 8);
    benchmark::RegisterBenchmark(name("Append", "100000x10").c_str(), AppendPieces<Text>, kPiece,
                                 100000);
}

// ---- StaticString<256> against a char[256]. --------------------------------------------------

char const* const kStart = "value: ";

void StaticAssignTekit(benchmark::State& state) {
    StaticString<256> s;
    std::string const text = TextOfSize(120);
    for (auto _ : state) {
        s = text.c_str();
        benchmark::DoNotOptimize(s);
    }
}

void StaticAssignC(benchmark::State& state) {
    char s[257];
    std::string const text = TextOfSize(120);
    for (auto _ : state) {
        std::snprintf(s, sizeof s, "%s", text.c_str());
        benchmark::DoNotOptimize(s);
    }
}

void StaticAppendTekit(benchmark::State& state) {
    StaticString<256> s;
    for (auto _ : state) {
        s = kStart;
        for (int i = 0; i < 8; ++i)
            s += kPiece;
        benchmark::DoNotOptimize(s);
    }
}

void StaticAppendC(benchmark::State& state) {
    char s[257];
    for (auto _ : state) {
        std::strcpy(s, kStart);
        for (int i = 0; i < 8; ++i)
            std::strncat(s, kPiece, sizeof s - 1 - std::strlen(s));
        benchmark::DoNotOptimize(s);
    }
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    RegisterFor<DynamicString>("tekit");
    RegisterFor<std::string>("std");
#if defined(TEKIT_BENCH_HAVE_QT)
    RegisterFor<QString>("qt");
#endif
    benchmark::RegisterBenchmark("Static256/assign/tekit", StaticAssignTekit);
    benchmark::RegisterBenchmark("Static256/assign/snprintf", StaticAssignC);
    benchmark::RegisterBenchmark("Static256/append8x10/tekit", StaticAppendTekit);
    benchmark::RegisterBenchmark("Static256/append8x10/strncat", StaticAppendC);
    tekit::bench::RatioReporter reporter({"std", "qt", "snprintf", "strncat"});
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
