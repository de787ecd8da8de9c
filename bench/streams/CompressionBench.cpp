// Framed compression of 64 MB of mixed text against zlib's compress and uncompress called
// directly: the framing (header, the module's function pointers, the size checks) should cost
// no more than 1%. Part of bench_streams, whose main prints the ratios against "zlib".
//
//   bench_streams --benchmark_filter=ompress --benchmark_repetitions=5
#include "tekit/streams/KaCompressor.h"

#include <benchmark/benchmark.h>
#include <zlib.h>

#include <random>
#include <string>
#include <vector>

namespace {

constexpr std::size_t kTextSize = 64u << 20;

/// INI-like lines of words, numbers and paths, with some random noise: text that compresses
/// about as configuration and log files do.
std::string const& MixedText() {
    static std::string const text = [] {
        std::mt19937 random(11);
        char const* const words[] = {"Station",  "Limit",   "Low",      "High",
                                     "Result",   "Passed",  "Failed",   "Step",
                                     "Sequence", "Voltage", "Current",  "C:\\Orvane\\Tests\\",
                                     "report",   "=",       "[Section]"};
        std::string out;
        out.reserve(kTextSize + 256);
        while (out.size() < kTextSize) {
            int const kind = static_cast<int>(random() % 4);
            if (kind == 0) {
                out += "[";
                out += words[random() % 11];
                out += std::to_string(random() % 1000) + "]\r\n";
            } else if (kind == 3) {
                for (int i = 0; i < 20; ++i)
                    out += static_cast<char>(' ' + random() % 95);
                out += "\r\n";
            } else {
                out += words[random() % 15];
                out += " = ";
                out += std::to_string(static_cast<double>(random() % 100000) / 7.0);
                out += "\r\n";
            }
        }
        out.resize(kTextSize);
        return out;
    }();
    return text;
}

unsigned char const* TextBytes() {
    return reinterpret_cast<unsigned char const*>(MixedText().data());
}

void CompressFramed(benchmark::State& state) {
    tekit::KaCompressor compressor;
    std::vector<unsigned char> block(compressor.CompressBound(kTextSize));
    unsigned long size = 0;
    for (auto _ : state) {
        size = static_cast<unsigned long>(block.size());
        compressor.Compress(block.data(), &size, TextBytes(), kTextSize);
        benchmark::DoNotOptimize(block.data());
    }
    state.SetBytesProcessed(static_cast<long long>(state.iterations()) * kTextSize);
    state.counters["ratio"] = static_cast<double>(kTextSize) / static_cast<double>(size);
}

void CompressZlib(benchmark::State& state) {
    std::vector<unsigned char> out(compressBound(kTextSize));
    for (auto _ : state) {
        uLongf size = static_cast<uLongf>(out.size());
        if (compress(out.data(), &size, TextBytes(), kTextSize) != Z_OK)
            state.SkipWithError("compress failed");
        benchmark::DoNotOptimize(out.data());
    }
    state.SetBytesProcessed(static_cast<long long>(state.iterations()) * kTextSize);
}

void UncompressFramed(benchmark::State& state) {
    tekit::KaCompressor compressor;
    std::vector<unsigned char> block(compressor.CompressBound(kTextSize));
    unsigned long blockSize = static_cast<unsigned long>(block.size());
    compressor.Compress(block.data(), &blockSize, TextBytes(), kTextSize);
    std::vector<unsigned char> out(kTextSize);
    for (auto _ : state) {
        unsigned long size = compressor.UncompressSize(block.data(), blockSize);
        compressor.Uncompress(out.data(), &size, block.data(), blockSize);
        benchmark::DoNotOptimize(out.data());
    }
    state.SetBytesProcessed(static_cast<long long>(state.iterations()) * kTextSize);
}

void UncompressZlib(benchmark::State& state) {
    std::vector<unsigned char> packed(compressBound(kTextSize));
    uLongf packedSize = static_cast<uLongf>(packed.size());
    compress(packed.data(), &packedSize, TextBytes(), kTextSize);
    std::vector<unsigned char> out(kTextSize);
    for (auto _ : state) {
        uLongf size = kTextSize;
        if (uncompress(out.data(), &size, packed.data(), packedSize) != Z_OK)
            state.SkipWithError("uncompress failed");
        benchmark::DoNotOptimize(out.data());
    }
    state.SetBytesProcessed(static_cast<long long>(state.iterations()) * kTextSize);
}

BENCHMARK(CompressFramed)->Name("Compress/64MB-text/tekit")->Unit(benchmark::kMillisecond);
BENCHMARK(CompressZlib)->Name("Compress/64MB-text/zlib")->Unit(benchmark::kMillisecond);
BENCHMARK(UncompressFramed)->Name("Uncompress/64MB-text/tekit")->Unit(benchmark::kMillisecond);
BENCHMARK(UncompressZlib)->Name("Uncompress/64MB-text/zlib")->Unit(benchmark::kMillisecond);

} // namespace
