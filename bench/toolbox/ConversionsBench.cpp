// The line reader against std::getline on an ifstream and getline(3) on a FILE*, over a
// 100 MB file of mixed line ends (CR LF, LF, CR, LF CR); and the data-to-text encoding of
// 64 MB each way, with memcpy of the same bytes as the yardstick.
//
//   bench_conversions --benchmark_repetitions=5
//
// The file is written to a temporary folder at start and removed at the end. Throughput is in
// the bytes_per_second column.
#include "RatioReporter.h"

#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/LineFile.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;

constexpr std::size_t kFileSize = 100u << 20;
constexpr std::size_t kDataSize = 64u << 20;

fs::path gFile;

/// Lines of 0 to 120 printable characters, each ended by one of the four line ends.
void WriteLinesFile(fs::path const& path) {
    std::mt19937 random(1);
    char const* const ends[] = {"\r\n", "\n", "\r", "\n\r"};
    std::string block;
    std::ofstream out(path, std::ios::binary);
    std::size_t written = 0;
    while (written < kFileSize) {
        block.clear();
        while (block.size() < (1u << 20)) {
            std::size_t const length = random() % 121;
            for (std::size_t i = 0; i < length; ++i)
                block += static_cast<char>(' ' + random() % 95);
            block += ends[random() % 4];
        }
        out.write(block.data(), static_cast<std::streamsize>(block.size()));
        written += block.size();
    }
}

void ReadLines(benchmark::State& state) {
    std::vector<char> line(1025);
    for (auto _ : state) {
        std::FILE* file = std::fopen(gFile.string().c_str(), "rb");
        LineFile reader = LineFile_New(nullptr, file);
        long long lines = 0, bytes = 0;
        int length = 0, end = 0;
        while (LineFile_Read(reader, line.data(), 1024, &length, &end) == 0 && !end) {
            ++lines;
            bytes += length;
        }
        LineFile_Dispose(reader);
        std::fclose(file);
        benchmark::DoNotOptimize(lines + bytes);
    }
    state.SetBytesProcessed(state.iterations() * static_cast<long long>(fs::file_size(gFile)));
}

void ReadLinesStd(benchmark::State& state) {
    std::string line;
    for (auto _ : state) {
        std::ifstream in(gFile, std::ios::binary);
        long long lines = 0, bytes = 0;
        while (std::getline(in, line)) {
            ++lines;
            bytes += static_cast<long long>(line.size());
        }
        benchmark::DoNotOptimize(lines + bytes);
    }
    state.SetBytesProcessed(state.iterations() * static_cast<long long>(fs::file_size(gFile)));
}

void ReadLinesGetline(benchmark::State& state) {
    char* line = nullptr;
    std::size_t capacity = 0;
    for (auto _ : state) {
        std::FILE* file = std::fopen(gFile.string().c_str(), "rb");
        long long lines = 0, bytes = 0;
        ssize_t length;
        while ((length = ::getline(&line, &capacity, file)) >= 0) {
            ++lines;
            bytes += length;
        }
        std::fclose(file);
        benchmark::DoNotOptimize(lines + bytes);
    }
    std::free(line);
    state.SetBytesProcessed(state.iterations() * static_cast<long long>(fs::file_size(gFile)));
}

std::vector<unsigned char> RandomData() {
    std::vector<unsigned char> data(kDataSize);
    std::mt19937 random(2);
    for (auto& b : data)
        b = static_cast<unsigned char>(random());
    return data;
}

void Encode(benchmark::State& state) {
    auto const data = RandomData();
    std::vector<char> text(static_cast<std::size_t>(GetTextSizeForData(kDataSize)) + 1);
    for (auto _ : state) {
        int const n = ConvertDataToTextInBuffer(data.data(), kDataSize, text.data(),
                                                static_cast<int>(text.size()));
        benchmark::DoNotOptimize(n);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(state.iterations() * static_cast<long long>(kDataSize));
}

void Decode(benchmark::State& state) {
    auto const data = RandomData();
    std::vector<char> text(static_cast<std::size_t>(GetTextSizeForData(kDataSize)) + 1);
    ConvertDataToTextInBuffer(data.data(), kDataSize, text.data(), static_cast<int>(text.size()));
    std::vector<unsigned char> back(kDataSize);
    for (auto _ : state) {
        int const n = ConvertTextToDataInBuffer(text.data(), static_cast<int>(text.size()) - 1,
                                                back.data(), kDataSize);
        benchmark::DoNotOptimize(n);
        benchmark::ClobberMemory();
    }
    if (back != data)
        state.SkipWithError("decoded bytes differ");
    state.SetBytesProcessed(state.iterations() * static_cast<long long>(kDataSize));
}

/// The cost of merely touching the bytes once: the floor for any encoding.
void Copy(benchmark::State& state) {
    auto const data = RandomData();
    std::vector<unsigned char> copy(kDataSize);
    for (auto _ : state) {
        std::memcpy(copy.data(), data.data(), kDataSize);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(state.iterations() * static_cast<long long>(kDataSize));
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    fs::path const folder =
        fs::temp_directory_path() / ("tekit-bench-lines-" + std::to_string(std::random_device{}()));
    fs::create_directories(folder);
    gFile = folder / "mixed-line-ends.txt";
    WriteLinesFile(gFile);

    auto unit = [](benchmark::internal::Benchmark* b) { b->Unit(benchmark::kMillisecond); };
    unit(benchmark::RegisterBenchmark("ReadLines/100MB/tekit", ReadLines));
    unit(benchmark::RegisterBenchmark("ReadLines/100MB/std", ReadLinesStd));
    unit(benchmark::RegisterBenchmark("ReadLines/100MB/getline", ReadLinesGetline));
    unit(benchmark::RegisterBenchmark("Encode/64MB/tekit", Encode));
    unit(benchmark::RegisterBenchmark("Encode/64MB/memcpy", Copy));
    unit(benchmark::RegisterBenchmark("Decode/64MB/tekit", Decode));
    unit(benchmark::RegisterBenchmark("Decode/64MB/memcpy", Copy));

    tekit::bench::RatioReporter reporter({"getline", "std", "memcpy"});
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    std::error_code ignored;
    fs::remove_all(folder, ignored);
    return 0;
}
