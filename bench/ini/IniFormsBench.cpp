// The three INI file forms: one 10 MB document (sections of 100 items, as bench_ini generates
// them, until the text has 10 000 000 bytes) loaded with IniObj::ReadFile from INI text, the
// compressed binary form and the text binary form. The time ratios are against reading the text
// form ("text"), and against reading gzip -6 of the text (zlib's gz interface, then
// IniObj::ReadString: "gzip"). After the ratio table the program prints each file's size against
// the gzip -6 file.
//
//   bench_ini_forms --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/ini/IniObj.h"
#include "tekit/paths/Path.h"

#include <benchmark/benchmark.h>
#include <zlib.h>

#include <cstdio>
#include <filesystem>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

namespace fs = std::filesystem;

char const* const kWords[] = {"measure", "supply", "voltage", "channel",  "limit", "station",
                              "report",  "retry",  "adapter", "sequence", "step",  "current",
                              "fixture", "serial", "probe",   "nominal",  "range", "offset"};

/// Sections of 100 items cycling through an integer, a double, a quoted and a plain text of
/// words (80 to 118 bytes), until the text holds 10 000 000 bytes.
std::string Document() {
    std::mt19937 random(1000);
    std::string text;
    char line[256];
    auto const words = [&](std::size_t length) {
        std::string out;
        while (out.size() < length) {
            if (!out.empty())
                out += ' ';
            out += kWords[random() % std::size(kWords)];
        }
        out.resize(length);
        while (out.back() == ' ')
            out.pop_back();
        return out;
    };
    for (int s = 1; text.size() < 10000000; ++s) {
        std::snprintf(line, sizeof line, "[Station.Socket%04d]\n", s);
        text += line;
        for (int i = 1; i <= 100; ++i) {
            std::snprintf(line, sizeof line, "Step%03d.Measurement.%s = ", i,
                          kWords[random() % std::size(kWords)]);
            text += line;
            switch (i % 4) {
            case 0:
                text += std::to_string(static_cast<long>(random() % 2000001) - 1000000);
                break;
            case 1:
                std::snprintf(line, sizeof line, "%.16g", (random() % 1000000) / 977.0 - 500);
                text += line;
                break;
            case 2:
                text += '"';
                text += words(80 + random() % 39);
                text += '"';
                break;
            default:
                text += words(80 + random() % 39);
                break;
            }
            text += "\n";
        }
        text += "\n";
    }
    return text;
}

struct Files {
    fs::path text, binary, binaryText, gzip;
};

void Load(benchmark::State& state, fs::path const* file) {
    tekit::Path const path(file->string().c_str());
    for (auto _ : state) {
        tekit::IniObj ini;
        ini.ReadFile(path);
        benchmark::DoNotOptimize(Ini_NumberOfSections(ini.GetHandle()));
    }
}

void LoadGzip(benchmark::State& state, fs::path const* file) {
    for (auto _ : state) {
        gzFile in = gzopen(file->string().c_str(), "rb");
        std::string text;
        char block[1 << 16];
        for (int n; (n = gzread(in, block, sizeof block)) > 0;)
            text.append(block, static_cast<std::size_t>(n));
        gzclose(in);
        tekit::IniObj ini;
        ini.ReadString(tekit::DynamicString(text.c_str(), false));
        benchmark::DoNotOptimize(Ini_NumberOfSections(ini.GetHandle()));
    }
}

void WriteGzip(std::string const& text, fs::path const& file) {
    gzFile out = gzopen(file.string().c_str(), "wb6");
    gzwrite(out, text.data(), static_cast<unsigned>(text.size()));
    gzclose(out);
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    fs::path const folder = fs::temp_directory_path() / "tekit-bench-ini-forms";
    fs::create_directories(folder);
    Files const files{folder / "doc.ini", folder / "doc.bin", folder / "doc.txt",
                      folder / "doc.ini.gz"};
    std::string const text = Document();
    {
        tekit::IniObj ini(false, tekit::DynamicString(text.c_str(), false));
        ini.WriteFile(tekit::Path(files.text.string().c_str()));
        ini.WriteFile(tekit::Path(files.binary.string().c_str()), true, false);
        ini.WriteFile(tekit::Path(files.binaryText.string().c_str()), true, true);
        // The document each form holds is the same: a figure of a shorter read means nothing.
        for (fs::path const* file : {&files.text, &files.binary, &files.binaryText}) {
            tekit::IniObj back(false, tekit::Path(file->string().c_str()));
            if (!back.Compare(ini)) {
                std::fprintf(stderr, "bench_ini_forms: %s does not read back equal\n",
                             file->string().c_str());
                return 1;
            }
        }
    }
    WriteGzip(text, files.gzip);

    benchmark::RegisterBenchmark("Load/10MB/text", Load, &files.text)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark("Load/10MB/binary", Load, &files.binary)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark("Load/10MB/binary-text", Load, &files.binaryText)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark("Load/10MB/gzip", LoadGzip, &files.gzip)
        ->Unit(benchmark::kMillisecond);
    tekit::bench::RatioReporter reporter(std::vector<std::string>{"text", "gzip"});
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();

    auto const size = [](fs::path const& file) { return static_cast<double>(fs::file_size(file)); };
    double const gzipSize = size(files.gzip);
    std::printf("\nFile sizes (ratio to gzip -6 of the text file; below 1: smaller)\n");
    for (auto const& [name, file] : {std::pair("text", files.text),
                                     {"binary", files.binary},
                                     {"binary-text", files.binaryText},
                                     {"gzip -6", files.gzip}})
        std::printf("%-12s %10.0f bytes   %5.2f\n", name, size(file), size(file) / gzipSize);
    fs::remove_all(folder);
    return 0;
}
