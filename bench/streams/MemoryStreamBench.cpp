// The memory stream against its peers in the same run:
//
//   Write/Read 1M mixed values   typed values (int, double, string, bool in turn) against
//                                cereal's BinaryOutputArchive/BinaryInputArchive over a
//                                std::stringstream
//   WriteBytes/64KiB             64 KiB blocks into a stream against memcpy into a buffer
//   WriteString/10000x100        10 000 strings, 100 distinct, through a string table
//                                ("table") against written inline ("inline")
//
//   bench_streams --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/streams/OVMemoryStream.h"
#include "tekit/streams/OVStringTable.h"
#include "tekit/strings/DynamicString.h"

#include <benchmark/benchmark.h>

#if defined(TEKIT_BENCH_HAVE_CEREAL)
#include <cereal/archives/binary.hpp>
#include <cereal/types/string.hpp>
#endif

#include <cstring>
#include <random>
#include <sstream>
#include <string>
#include <vector>

namespace {

using namespace tekit;

constexpr int kValues = 1000000;
constexpr std::size_t kBlock = 64 * 1024;
constexpr std::size_t kBlocks = 256; // 16 MiB a pass

/// The texts of the mixed values: 64 strings of 4 to 27 letters.
std::vector<std::string> MakeTexts(std::size_t count, unsigned seed) {
    std::mt19937 random(seed);
    std::vector<std::string> texts;
    for (std::size_t i = 0; i < count; ++i) {
        std::string text(4 + random() % 24, ' ');
        for (char& c : text)
            c = static_cast<char>('a' + random() % 26);
        texts.push_back(text);
    }
    return texts;
}

std::vector<std::string> const gTexts = MakeTexts(64, 1);

std::vector<DynamicString> DynamicTexts(std::vector<std::string> const& texts) {
    std::vector<DynamicString> result;
    for (std::string const& text : texts)
        result.emplace_back(text.c_str());
    return result;
}

std::vector<DynamicString> const gDynamicTexts = DynamicTexts(gTexts);

// ---- Mixed values. -----------------------------------------------------------------------

void WriteMixed(OVMemoryStream& stream) {
    for (int i = 0; i < kValues; i += 4) {
        stream.WriteInt("i", i);
        stream.WriteDouble("d", i * 0.5);
        stream.WriteString("s", gDynamicTexts[static_cast<std::size_t>(i) % gDynamicTexts.size()]);
        stream.WriteBool("b", (i & 8) != 0);
    }
}

void WriteValues(benchmark::State& state) {
    for (auto _ : state) {
        OVMemoryStream stream;
        WriteMixed(stream);
        benchmark::DoNotOptimize(stream.GetDataPtr());
    }
}

void ReadValues(benchmark::State& state) {
    OVMemoryStream stream;
    WriteMixed(stream);
    DynamicString text;
    for (auto _ : state) {
        stream.SetOffset(0);
        long long sum = 0;
        for (int i = 0; i < kValues; i += 4) {
            sum += stream.ReadInt("i");
            sum += static_cast<long long>(stream.ReadDouble("d"));
            stream.ReadString("s", text);
            sum += text.GetNumBytes();
            sum += stream.ReadBool("b");
        }
        benchmark::DoNotOptimize(sum);
    }
}

#if defined(TEKIT_BENCH_HAVE_CEREAL)
template <class Archive> void WriteMixedCereal(Archive& archive) {
    for (int i = 0; i < kValues; i += 4) {
        double const d = i * 0.5;
        bool const b = (i & 8) != 0;
        archive(i, d, gTexts[static_cast<std::size_t>(i) % gTexts.size()], b);
    }
}

void WriteValuesCereal(benchmark::State& state) {
    for (auto _ : state) {
        std::stringstream out(std::ios::out | std::ios::binary);
        {
            cereal::BinaryOutputArchive archive(out);
            WriteMixedCereal(archive);
        }
        benchmark::DoNotOptimize(out.tellp());
    }
}

void ReadValuesCereal(benchmark::State& state) {
    std::stringstream written(std::ios::out | std::ios::binary);
    {
        cereal::BinaryOutputArchive archive(written);
        WriteMixedCereal(archive);
    }
    std::string const bytes = written.str();
    std::string text;
    for (auto _ : state) {
        std::stringstream in(bytes, std::ios::in | std::ios::binary);
        cereal::BinaryInputArchive archive(in);
        long long sum = 0;
        for (int i = 0; i < kValues; i += 4) {
            int n = 0;
            double d = 0;
            bool b = false;
            archive(n, d, text, b);
            sum += n + static_cast<long long>(d) + static_cast<long long>(text.size()) + b;
        }
        benchmark::DoNotOptimize(sum);
    }
}
#endif

// ---- Raw bytes. ----------------------------------------------------------------------------

std::vector<unsigned char> const gBlock(kBlock, 0x5A);

void WriteBytes(benchmark::State& state) {
    OVMemoryStream stream;
    for (std::size_t i = 0; i < kBlocks; ++i) // grown once, outside the measurement
        stream.WriteBytes(gBlock.data(), kBlock);
    for (auto _ : state) {
        stream.SetOffset(0);
        for (std::size_t i = 0; i < kBlocks; ++i)
            stream.WriteBytes(gBlock.data(), kBlock);
        benchmark::DoNotOptimize(stream.GetDataPtr());
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kBlock * kBlocks));
}

void WriteBytesMemcpy(benchmark::State& state) {
    std::vector<unsigned char> buffer(kBlock * kBlocks);
    for (auto _ : state) {
        for (std::size_t i = 0; i < kBlocks; ++i)
            std::memcpy(buffer.data() + i * kBlock, gBlock.data(), kBlock);
        benchmark::DoNotOptimize(buffer.data());
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kBlock * kBlocks));
}

// ---- Strings through a table. ----------------------------------------------------------------

std::vector<DynamicString> const gHundred = DynamicTexts(MakeTexts(100, 2));

void WriteStrings(benchmark::State& state, bool withTable) {
    std::size_t bytes = 0;
    for (auto _ : state) {
        OVStringTable table;
        OVMemoryStream stream(withTable ? &table : nullptr);
        for (int i = 0; i < 10000; ++i)
            stream.WriteString("s", gHundred[static_cast<std::size_t>(i) % gHundred.size()]);
        if (withTable)
            table.StoreToMemoryStream(stream);
        bytes = stream.GetSize();
        benchmark::DoNotOptimize(stream.GetDataPtr());
    }
    state.counters["stream_bytes"] = static_cast<double>(bytes);
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    auto unit = [](benchmark::internal::Benchmark* b) { b->Unit(benchmark::kMillisecond); };
    unit(benchmark::RegisterBenchmark("Write/1M-mixed/tekit", WriteValues));
    unit(benchmark::RegisterBenchmark("Read/1M-mixed/tekit", ReadValues));
#if defined(TEKIT_BENCH_HAVE_CEREAL)
    unit(benchmark::RegisterBenchmark("Write/1M-mixed/cereal", WriteValuesCereal));
    unit(benchmark::RegisterBenchmark("Read/1M-mixed/cereal", ReadValuesCereal));
#endif
    unit(benchmark::RegisterBenchmark("WriteBytes/64KiB/tekit", WriteBytes));
    unit(benchmark::RegisterBenchmark("WriteBytes/64KiB/memcpy", WriteBytesMemcpy));
    benchmark::RegisterBenchmark("WriteString/10000x100/table", WriteStrings, true)
        ->Unit(benchmark::kMicrosecond);
    benchmark::RegisterBenchmark("WriteString/10000x100/inline", WriteStrings, false)
        ->Unit(benchmark::kMicrosecond);

    tekit::bench::RatioReporter reporter({"cereal", "memcpy", "inline", "zlib"});
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
