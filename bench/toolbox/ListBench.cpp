// Lists and sorting against the standard library on the same data: appending 1 M ints one at a
// time (ListInsertItem against std::vector::push_back), ordered insertion of 100 k random ints
// (ListInsertInOrder against std::lower_bound + vector::insert), and sorting 1 M random ints
// (ListHeapSort and ListQuickSort against std::sort). Both sides compare through a function
// pointer, as the list functions must.
//
//   bench_lists --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/toolbox/List.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdint>
#include <random>
#include <vector>

namespace {

int TEKIT_CDECL CompareInts(void const* a, void const* b) {
    int const x = *static_cast<int const*>(a), y = *static_cast<int const*>(b);
    return x < y ? -1 : x > y;
}

/// std::sort's comparator, called through a pointer like the list's callback.
bool (*volatile gLess)(int, int) = [](int a, int b) { return a < b; };

std::vector<int> RandomInts(std::size_t n) {
    std::mt19937 random(12345);
    std::vector<int> values(n);
    for (int& v : values)
        v = int(random());
    return values;
}

constexpr int kAppends = 1'000'000;
constexpr std::size_t kOrdered = 100'000;
constexpr std::size_t kSorted = 1'000'000;

void AppendList(benchmark::State& state) {
    for (auto _ : state) {
        ListType list = ListCreate(sizeof(int));
        for (int i = 0; i < kAppends; ++i)
            ListInsertItem(list, &i, LIST_POS_END);
        benchmark::DoNotOptimize(ListGetDataPtr(list));
        ListDispose(list);
    }
}

void AppendVector(benchmark::State& state) {
    for (auto _ : state) {
        std::vector<int> values;
        for (int i = 0; i < kAppends; ++i)
            values.push_back(i);
        benchmark::DoNotOptimize(values.data());
    }
}

void InOrderList(benchmark::State& state) {
    std::vector<int> const input = RandomInts(kOrdered);
    for (auto _ : state) {
        ListType list = ListCreate(sizeof(int));
        for (int const& v : input)
            ListInsertInOrder(list, &v, CompareInts);
        benchmark::DoNotOptimize(ListGetDataPtr(list));
        ListDispose(list);
    }
}

void InOrderVector(benchmark::State& state) {
    std::vector<int> const input = RandomInts(kOrdered);
    auto const less = gLess;
    for (auto _ : state) {
        std::vector<int> values;
        for (int v : input)
            values.insert(std::lower_bound(values.begin(), values.end(), v, less), v);
        benchmark::DoNotOptimize(values.data());
    }
}

template <void(TEKIT_STDCALL* Sort)(ListType, CompareFunction)>
void SortList(benchmark::State& state) {
    std::vector<int> const input = RandomInts(kSorted);
    ListType list = ListCreate(sizeof(int));
    for (auto _ : state) {
        state.PauseTiming();
        ListClear(list);
        ListInsertItems(list, input.data(), LIST_POS_END, std::int32_t(input.size()));
        state.ResumeTiming();
        Sort(list, CompareInts);
        benchmark::DoNotOptimize(ListGetDataPtr(list));
    }
    ListDispose(list);
}

void SortVector(benchmark::State& state) {
    std::vector<int> const input = RandomInts(kSorted);
    std::vector<int> values;
    auto const less = gLess;
    for (auto _ : state) {
        state.PauseTiming();
        values = input;
        state.ResumeTiming();
        std::sort(values.begin(), values.end(), less);
        benchmark::DoNotOptimize(values.data());
    }
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    auto const ms = benchmark::kMillisecond;
    benchmark::RegisterBenchmark("Append/1M/tekit", AppendList)->Unit(ms);
    benchmark::RegisterBenchmark("Append/1M/std", AppendVector)->Unit(ms);
    benchmark::RegisterBenchmark("InsertInOrder/100k/tekit", InOrderList)->Unit(ms);
    benchmark::RegisterBenchmark("InsertInOrder/100k/std", InOrderVector)->Unit(ms);
    benchmark::RegisterBenchmark("HeapSort/1M/tekit", SortList<ListHeapSort>)->Unit(ms);
    benchmark::RegisterBenchmark("HeapSort/1M/std", SortVector)->Unit(ms);
    benchmark::RegisterBenchmark("QuickSort/1M/tekit", SortList<ListQuickSort>)->Unit(ms);
    benchmark::RegisterBenchmark("QuickSort/1M/std", SortVector)->Unit(ms);
    tekit::bench::RatioReporter reporter("std");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
