// The binary file stream against the C library's buffered files in the same run, each pass
// writing a new file in a scratch directory and closing it (no flush to the disk):
//
//   WriteBytes/256MiB   256 MiB in 64 KiB WriteBytes calls against fwrite with stdio's
//                       default buffer
//   WriteInt/1M         1 000 000 WriteInt calls against fwrite of 4 bytes each
//
//   bench_file_stream --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/streams/OVBinaryFileStream.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <filesystem>
#include <random>
#include <string>
#include <system_error>
#include <vector>

namespace {

using namespace tekit;
namespace fs = std::filesystem;

constexpr std::size_t kBlock = 64 * 1024;
constexpr std::size_t kBlocks = 4096; // 256 MiB
constexpr int kInts = 1000000;

/// The scratch directory of this run, removed with its files at the end.
fs::path const& Scratch() {
    static fs::path const directory = [] {
        fs::path path = fs::temp_directory_path() /
                        ("tekit-bench-filestream-" + std::to_string(std::random_device{}()));
        fs::create_directories(path);
        return path;
    }();
    return directory;
}

std::string const& Target() {
    static std::string const path = (Scratch() / "bench.bin").string();
    return path;
}

std::vector<char> const& Block() {
    static std::vector<char> const block(kBlock, 'x');
    return block;
}

/// Removes the last pass's file outside the timing, so no pass pays for emptying it.
void RemoveTarget(benchmark::State& state) {
    state.PauseTiming();
    std::error_code ignored;
    fs::remove(Target(), ignored);
    state.ResumeTiming();
}

void WriteBlocks(benchmark::State& state) {
    for (auto _ : state) {
        RemoveTarget(state);
        OVBinaryFileStream stream(Target().c_str(), kOVFileStreamCreateForWrite);
        for (std::size_t i = 0; i < kBlocks; ++i)
            stream.WriteBytes(Block().data(), kBlock);
    }
    state.SetBytesProcessed(state.iterations() * std::int64_t(kBlock * kBlocks));
}

void WriteBlocksStdio(benchmark::State& state) {
    for (auto _ : state) {
        RemoveTarget(state);
        std::FILE* file = std::fopen(Target().c_str(), "wb");
        if (!file) {
            state.SkipWithError("fopen failed");
            return;
        }
        for (std::size_t i = 0; i < kBlocks; ++i)
            std::fwrite(Block().data(), 1, kBlock, file);
        std::fclose(file);
    }
    state.SetBytesProcessed(state.iterations() * std::int64_t(kBlock * kBlocks));
}

void WriteInts(benchmark::State& state) {
    for (auto _ : state) {
        RemoveTarget(state);
        OVBinaryFileStream stream(Target().c_str(), kOVFileStreamCreateForWrite);
        for (int i = 0; i < kInts; ++i)
            stream.WriteInt("Value", i);
    }
}

void WriteIntsStdio(benchmark::State& state) {
    for (auto _ : state) {
        RemoveTarget(state);
        std::FILE* file = std::fopen(Target().c_str(), "wb");
        if (!file) {
            state.SkipWithError("fopen failed");
            return;
        }
        for (int i = 0; i < kInts; ++i)
            std::fwrite(&i, sizeof i, 1, file);
        std::fclose(file);
    }
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    auto unit = [](benchmark::internal::Benchmark* b) { b->Unit(benchmark::kMillisecond); };
    unit(benchmark::RegisterBenchmark("WriteBytes/256MiB/tekit", WriteBlocks));
    unit(benchmark::RegisterBenchmark("WriteBytes/256MiB/fwrite", WriteBlocksStdio));
    unit(benchmark::RegisterBenchmark("WriteInt/1M/tekit", WriteInts));
    unit(benchmark::RegisterBenchmark("WriteInt/1M/fwrite", WriteIntsStdio));

    tekit::bench::RatioReporter reporter("fwrite");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    std::error_code ignored;
    fs::remove_all(Scratch(), ignored);
    return 0;
}
