// The INI store against SimpleIni, POCO's IniFileConfiguration and inih (its handler filling a
// map of maps), over generated files of 10 MB (1 000 sections of 100 items) and 100 KB (10
// sections): parsing text into an object that answers lookups, 100 000 random integer lookups
// (tekit without and with its sorted indexes), and writing the whole object back, to a file and
// to text. Peers that are not installed (scripts/bench.sh installs them) are left out.
//
//   bench_ini --benchmark_filter=Parse/10MB
//
// Parsing starts from text in memory for every implementation ("tekit-file" reads the file
// through Ini_ReadFromFile instead) and each iteration builds and destroys one object. After
// the ratio table the program prints the peak memory (RSS growth) of reading the 10 MB file,
// each implementation measured in a fresh process of its own.
#include "RatioReporter.h"

#include "tekit/ini/Ini.h"
#include "tekit/toolbox/LineFile.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <random>
#include <streambuf>
#include <string>
#include <utility>
#include <vector>

#if defined(__linux__)
#include <sys/wait.h>
#include <unistd.h>
#endif

#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
#include <SimpleIni.h>
#endif
#if defined(TEKIT_BENCH_HAVE_POCO)
#include <Poco/AutoPtr.h>
#include <Poco/Util/IniFileConfiguration.h>
#endif
#if defined(TEKIT_BENCH_HAVE_INIH)
#include <ini.h>
#endif

namespace {

namespace fs = std::filesystem;

constexpr int kItemsPerSection = 100;
constexpr int kLookups = 100000;

/// One generated file: its text, where it was written, and the integer items to look up.
struct Corpus {
    std::string name; // "10MB", "100KB"
    int sections = 0;
    std::string text;
    fs::path path;
    std::vector<std::pair<std::string, std::string>> lookups; // section, tag
};

char const* const kWords[] = {"measure", "supply", "voltage", "channel",  "limit", "station",
                              "report",  "retry",  "adapter", "sequence", "step",  "current",
                              "fixture", "serial", "probe",   "nominal",  "range", "offset"};

/// Words separated by blanks, about `length` bytes; no quote, backslash or semicolon, so
/// every reader takes the value as it is.
std::string Words(std::mt19937& random, std::size_t length) {
    std::string out;
    while (out.size() < length) {
        out += out.empty() ? "" : " ";
        out += kWords[random() % std::size(kWords)];
    }
    out.resize(length);
    while (!out.empty() && out.back() == ' ')
        out.pop_back();
    return out;
}

/// `sections` sections of 100 items in the form the library writes (" = " between tag and
/// value, a blank line after each section). Items cycle through an integer, a double, a
/// quoted text and a plain text of 80 to 118 bytes, so lines average about 100 bytes and no
/// value needs continuation lines.
Corpus Generate(std::string name, int sections, fs::path const& folder) {
    std::mt19937 random(static_cast<unsigned>(sections));
    Corpus corpus;
    corpus.name = std::move(name);
    corpus.sections = sections;
    std::string& text = corpus.text;
    text.reserve(static_cast<std::size_t>(sections) * kItemsPerSection * 104);
    std::vector<std::pair<std::string, std::string>> integers;
    char line[256];
    for (int s = 1; s <= sections; ++s) {
        std::snprintf(line, sizeof line, "Station.Socket%04d", s);
        std::string const section = line;
        text += "[" + section + "]\n";
        for (int i = 1; i <= kItemsPerSection; ++i) {
            std::snprintf(line, sizeof line, "Step%03d.Measurement.%s", i,
                          kWords[random() % std::size(kWords)]);
            std::string const tag = line;
            std::string value;
            switch (i % 4) {
            case 0:
                value = std::to_string(static_cast<long>(random() % 2000001) - 1000000);
                integers.emplace_back(section, tag);
                break;
            case 1:
                std::snprintf(line, sizeof line, "%.16g", (random() % 1000000) / 977.0 - 500);
                value = line;
                break;
            case 2:
                value.assign(1, '"').append(Words(random, 80 + random() % 39)).push_back('"');
                break;
            default:
                value = Words(random, 80 + random() % 39);
                break;
            }
            text += tag + " = " + value + "\n";
        }
        text += "\n";
    }
    for (int i = 0; i < kLookups; ++i)
        corpus.lookups.push_back(integers[random() % integers.size()]);
    corpus.path = folder / ("generated-" + corpus.name + ".ini");
    std::ofstream(corpus.path, std::ios::binary)
        .write(text.data(), static_cast<std::streamsize>(text.size()));
    return corpus;
}

/// A read-only stream buffer over text in memory, so POCO reads it without a copy.
class MemoryBuffer : public std::streambuf {
public:
    explicit MemoryBuffer(std::string const& text) {
        char* const begin = const_cast<char*>(text.data());
        setg(begin, begin, begin + text.size());
    }
};

// ---- tekit -----------------------------------------------------------------------------------

/// The chunk source of a line reader over text in memory.
struct MemorySource {
    char const* data;
    std::size_t size;
    std::size_t position = 0;
};

int TEKIT_STDCALL ReadChunk(void* source, int numBytes, int* numBytesRead, void* buffer) {
    auto* memory = static_cast<MemorySource*>(source);
    std::size_t const count =
        std::min(static_cast<std::size_t>(numBytes), memory->size - memory->position);
    std::memcpy(buffer, memory->data + memory->position, count);
    memory->position += count;
    *numBytesRead = static_cast<int>(count);
    return 0;
}

/// Ini_ReadGeneric's line source: the non-empty lines of text in memory, as Ini_ReadFromFile
/// reads a file.
struct LineSource {
    MemorySource memory;
    LineFile reader;
};

int TEKIT_STDCALL ReadLine(void* data, char* buffer, int size, int* endOfInput, int* lineNumber) {
    auto* source = static_cast<LineSource*>(data);
    int length = 0;
    int const status = LineFile_ReadNonEmpty(source->reader, buffer, size, &length, endOfInput);
    *lineNumber = LineFile_NumLinesRead(source->reader);
    return status < 0 ? status : length;
}

IniHandle ParseText(std::string const& text) {
    IniHandle ini = Ini_New(0, nullptr);
    LineSource source{{text.data(), text.size()}, nullptr};
    source.reader = LineFile_New(ReadChunk, &source.memory);
    Ini_ReadGeneric(ini, ReadLine, &source);
    LineFile_Dispose(source.reader);
    return ini;
}

int TEKIT_STDCALL AppendLine(void* data, char const* line) {
    static_cast<std::string*>(data)->append(line).push_back('\n');
    return 0;
}

void ParseTekit(benchmark::State& state, Corpus const* corpus) {
    for (auto _ : state) {
        IniHandle ini = ParseText(corpus->text);
        benchmark::DoNotOptimize(Ini_NumberOfSections(ini));
        Ini_Dispose(ini);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}

void ParseTekitFile(benchmark::State& state, Corpus const* corpus) {
    for (auto _ : state) {
        IniHandle ini = Ini_New(0, nullptr);
        Ini_ReadFromFile(ini, corpus->path.string().c_str());
        benchmark::DoNotOptimize(Ini_NumberOfSections(ini));
        Ini_Dispose(ini);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}

void GetIntTekit(benchmark::State& state, Corpus const* corpus, bool index) {
    IniHandle ini = ParseText(corpus->text);
    if (index)
        Ini_SortInternally(ini);
    long long sum = 0;
    for (auto _ : state) {
        for (auto const& [section, tag] : corpus->lookups) {
            int value = 0;
            Ini_GetInt(ini, section.c_str(), tag.c_str(), &value);
            sum += value;
        }
    }
    benchmark::DoNotOptimize(sum);
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations() * kLookups));
    Ini_Dispose(ini);
}

void WriteTekit(benchmark::State& state, Corpus const* corpus) {
    IniHandle ini = ParseText(corpus->text);
    fs::path const target = corpus->path.parent_path() / "written-tekit.ini";
    for (auto _ : state)
        Ini_WriteToFile(ini, target.string().c_str());
    Ini_Dispose(ini);
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}

void WriteTextTekit(benchmark::State& state, Corpus const* corpus) {
    IniHandle ini = ParseText(corpus->text);
    for (auto _ : state) {
        std::string out;
        Ini_WriteGeneric(ini, AppendLine, &out);
        benchmark::DoNotOptimize(out.data());
    }
    Ini_Dispose(ini);
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}

// ---- SimpleIni -------------------------------------------------------------------------------

#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
/// Case-sensitive, as tekit's names are.
using SimpleIni = CSimpleIniCaseA;

void ParseSimpleIni(benchmark::State& state, Corpus const* corpus) {
    for (auto _ : state) {
        SimpleIni ini;
        ini.LoadData(corpus->text);
        benchmark::DoNotOptimize(ini.GetSectionSize(corpus->lookups[0].first.c_str()));
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}

void GetIntSimpleIni(benchmark::State& state, Corpus const* corpus) {
    SimpleIni ini;
    ini.LoadData(corpus->text);
    long long sum = 0;
    for (auto _ : state)
        for (auto const& [section, tag] : corpus->lookups)
            sum += ini.GetLongValue(section.c_str(), tag.c_str(), 0);
    benchmark::DoNotOptimize(sum);
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations() * kLookups));
}

void WriteSimpleIni(benchmark::State& state, Corpus const* corpus) {
    SimpleIni ini;
    ini.LoadData(corpus->text);
    std::string const target = (corpus->path.parent_path() / "written-simpleini.ini").string();
    for (auto _ : state)
        ini.SaveFile(target.c_str(), false);
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}

void WriteTextSimpleIni(benchmark::State& state, Corpus const* corpus) {
    SimpleIni ini;
    ini.LoadData(corpus->text);
    for (auto _ : state) {
        std::string out;
        ini.Save(out, false);
        benchmark::DoNotOptimize(out.data());
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}
#endif

// ---- POCO ------------------------------------------------------------------------------------

#if defined(TEKIT_BENCH_HAVE_POCO)
void ParsePoco(benchmark::State& state, Corpus const* corpus) {
    for (auto _ : state) {
        MemoryBuffer buffer(corpus->text);
        std::istream in(&buffer);
        Poco::AutoPtr<Poco::Util::IniFileConfiguration> ini(
            new Poco::Util::IniFileConfiguration(in));
        benchmark::DoNotOptimize(ini.get());
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}
#endif

// ---- inih ------------------------------------------------------------------------------------

#if defined(TEKIT_BENCH_HAVE_INIH)
using IniMap = std::map<std::string, std::map<std::string, std::string>>;

int StoreInMap(void* user, char const* section, char const* name, char const* value) {
    (*static_cast<IniMap*>(user))[section][name] = value;
    return 1;
}

void ParseInih(benchmark::State& state, Corpus const* corpus) {
    for (auto _ : state) {
        IniMap map;
        ini_parse_string(corpus->text.c_str(), StoreInMap, &map);
        benchmark::DoNotOptimize(map.size());
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * corpus->text.size()));
}
#endif

// ---- Checks --------------------------------------------------------------------------------

/// Whether every implementation read the whole corpus and finds the looked-up values: a
/// figure of a reader that stopped early would mean nothing.
bool Check(Corpus const& corpus) {
    int const sections = corpus.sections;
    bool ok = true;
    auto const expect = [&](bool condition, char const* what) {
        if (!condition)
            std::fprintf(stderr, "bench_ini: %s: %s\n", corpus.name.c_str(), what);
        ok = ok && condition;
    };
    IniHandle ini = ParseText(corpus.text);
    int items = 0;
    for (int s = 1; s <= Ini_NumberOfSections(ini); ++s) {
        IniSection section = nullptr;
        Ini_NthSection(ini, s, &section);
        items += Ini_NumberOfItemsSP(ini, section);
    }
    expect(Ini_NumberOfSections(ini) == sections && items == sections * kItemsPerSection,
           "tekit did not read every section and item");
    int value = 0;
    expect(Ini_GetInt(ini, corpus.lookups[0].first.c_str(), corpus.lookups[0].second.c_str(),
                      &value) == 1,
           "tekit does not find an integer");
    std::string written;
    Ini_WriteGeneric(ini, AppendLine, &written);
    expect(written == corpus.text, "tekit does not write back the text it read");
    Ini_Dispose(ini);
#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
    SimpleIni simple;
    simple.LoadData(corpus.text);
    CSimpleIniCaseA::TNamesDepend names;
    simple.GetAllSections(names);
    expect(static_cast<int>(names.size()) == sections, "SimpleIni did not read every section");
#endif
#if defined(TEKIT_BENCH_HAVE_INIH)
    IniMap map;
    ini_parse_string(corpus.text.c_str(), StoreInMap, &map);
    expect(static_cast<int>(map.size()) == sections, "inih did not read every section");
#endif
    return ok;
}

// ---- Registration ----------------------------------------------------------------------------

template <class... Args>
void Add(std::string const& name, void (*function)(benchmark::State&, Corpus const*, Args...),
         Corpus const& corpus, Args... args) {
    benchmark::RegisterBenchmark(name.c_str(), function, &corpus, args...)
        ->Unit(corpus.text.size() > (1u << 20) ? benchmark::kMillisecond : benchmark::kMicrosecond);
}

void Register(Corpus const& corpus) {
    std::string const parse = "Parse/" + corpus.name + "/";
    Add(parse + "tekit", ParseTekit, corpus);
    Add(parse + "tekit-file", ParseTekitFile, corpus);
#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
    Add(parse + "simpleini", ParseSimpleIni, corpus);
#endif
#if defined(TEKIT_BENCH_HAVE_POCO)
    Add(parse + "poco", ParsePoco, corpus);
#endif
#if defined(TEKIT_BENCH_HAVE_INIH)
    Add(parse + "inih-map", ParseInih, corpus);
#endif
    std::string const get = "GetInt/" + corpus.name + "/";
    Add(get + "tekit", GetIntTekit, corpus, false);
    Add(get + "tekit-index", GetIntTekit, corpus, true);
#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
    Add(get + "simpleini", GetIntSimpleIni, corpus);
#endif
    Add("WriteFile/" + corpus.name + "/tekit", WriteTekit, corpus);
    Add("WriteText/" + corpus.name + "/tekit", WriteTextTekit, corpus);
#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
    Add("WriteFile/" + corpus.name + "/simpleini", WriteSimpleIni, corpus);
    Add("WriteText/" + corpus.name + "/simpleini", WriteTextSimpleIni, corpus);
#endif
}

// ---- Peak memory -----------------------------------------------------------------------------

#if defined(__linux__)
/// A field of /proc/self/status in bytes ("VmRSS", "VmHWM").
long long StatusBytes(char const* field) {
    std::ifstream status("/proc/self/status");
    std::string line;
    std::size_t const length = std::strlen(field);
    while (std::getline(status, line))
        if (line.compare(0, length, field) == 0 && line[length] == ':')
            return std::atoll(line.c_str() + length + 1) * 1024;
    return -1;
}

/// In a fresh process: reads `path` with `implementation` and prints the growth of the peak
/// resident set over the resident set before reading, in bytes.
int MeasureMemory(std::string const& implementation, char const* path) {
    long long const before = StatusBytes("VmRSS");
    void const* keep = nullptr;
    if (implementation == "tekit") {
        IniHandle ini = Ini_New(0, nullptr);
        Ini_ReadFromFile(ini, path);
        keep = ini;
    }
#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
    if (implementation == "simpleini") {
        auto* ini = new SimpleIni;
        ini->LoadFile(path);
        keep = ini;
    }
#endif
#if defined(TEKIT_BENCH_HAVE_POCO)
    if (implementation == "poco")
        keep = new Poco::Util::IniFileConfiguration(path);
#endif
#if defined(TEKIT_BENCH_HAVE_INIH)
    if (implementation == "inih-map") {
        auto* map = new IniMap;
        ini_parse(path, StoreInMap, map);
        keep = map;
    }
#endif
    if (!keep)
        return 1;
    std::printf("%lld\n", StatusBytes("VmHWM") - before);
    return 0; // the object is left to the end of the process
}

/// Runs this program again as "--measure-memory IMPLEMENTATION FILE"; the bytes it reports,
/// or -1.
long long MeasureInChild(std::string const& implementation, fs::path const& file) {
    int pipeEnds[2];
    if (pipe(pipeEnds) != 0)
        return -1;
    pid_t const child = fork();
    if (child == 0) {
        dup2(pipeEnds[1], 1);
        close(pipeEnds[0]);
        execl("/proc/self/exe", "bench_ini", "--measure-memory", implementation.c_str(),
              file.c_str(), static_cast<char*>(nullptr));
        _exit(127);
    }
    close(pipeEnds[1]);
    char text[64] = {};
    ssize_t const size = read(pipeEnds[0], text, sizeof text - 1);
    close(pipeEnds[0]);
    int status = 0;
    waitpid(child, &status, 0);
    return size > 0 && WIFEXITED(status) && WEXITSTATUS(status) == 0 ? std::atoll(text) : -1;
}

void ReportMemory(Corpus const& corpus) {
    std::vector<std::string> implementations{"tekit"};
#if defined(TEKIT_BENCH_HAVE_SIMPLEINI)
    implementations.push_back("simpleini");
#endif
#if defined(TEKIT_BENCH_HAVE_POCO)
    implementations.push_back("poco");
#endif
#if defined(TEKIT_BENCH_HAVE_INIH)
    implementations.push_back("inih-map");
#endif
    std::vector<long long> bytes;
    for (std::string const& implementation : implementations)
        bytes.push_back(MeasureInChild(implementation, corpus.path));
    std::printf("\nPeak memory reading the %s file (RSS growth; ratio below 1: tekit uses less)\n",
                corpus.name.c_str());
    for (std::size_t i = 0; i < implementations.size(); ++i) {
        std::printf("%-12s %8.1f MB", implementations[i].c_str(), bytes[i] / 1048576.0);
        if (i > 0 && bytes[i] > 0 && bytes[0] > 0)
            std::printf("   tekit / %s %.2f", implementations[i].c_str(),
                        static_cast<double>(bytes[0]) / static_cast<double>(bytes[i]));
        std::printf("\n");
    }
}
#endif

} // namespace

int main(int argc, char** argv) {
#if defined(__linux__)
    if (argc == 4 && std::strcmp(argv[1], "--measure-memory") == 0)
        return MeasureMemory(argv[2], argv[3]);
#endif
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    fs::path const folder = fs::temp_directory_path() / ("tekit-bench-ini-" + std::to_string(
#if defined(__linux__)
                                                                                  getpid()
#else
                                                                                  0
#endif
                                                                                      ));
    fs::create_directories(folder);
    std::vector<std::unique_ptr<Corpus>> corpora;
    corpora.push_back(std::make_unique<Corpus>(Generate("100KB", 10, folder)));
    corpora.push_back(std::make_unique<Corpus>(Generate("10MB", 1000, folder)));
    for (auto const& corpus : corpora) {
        if (!Check(*corpus))
            return 1;
        Register(*corpus);
    }
    tekit::bench::RatioReporter reporter({"simpleini", "poco", "inih-map"});
    benchmark::RunSpecifiedBenchmarks(&reporter);
#if defined(__linux__)
    ReportMemory(*corpora.back());
#endif
    benchmark::Shutdown();
    std::error_code ignored;
    fs::remove_all(folder, ignored);
    return 0;
}
