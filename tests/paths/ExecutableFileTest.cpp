// The executable-file reader over synthetic images: header facts, exports with forwarders,
// imports and delay-load imports, and malformed files of every kind raising, never crashing.
#include "tekit/paths/ExecutableFile.h"
#include "PEImageBuilder.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "tekit/paths/DependentModules.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/strings/StringVector.h"

#include <filesystem>
#include <fstream>
#include <functional>
#include <random>
#include <string>

using namespace tekit;
using tekit::testing::FaultKind;
using tekit::testing::PEImageBuilder;
using tekit::testing::Raised;
using tekit::testing::ScopedFault;
namespace fs = std::filesystem;

namespace {

ExecutableFile Open(std::vector<unsigned char> const& bytes, char const* name = "test.dll") {
    return ExecutableFile(bytes.data(), bytes.size(), name);
}

std::string Names(ExportTable const& exports) {
    std::string text;
    for (ExportedFunction const& f : exports.GetFunctions())
        text += std::to_string(f.ordinal) + ":" +
                (f.name.IsEmpty() ? "-" : f.name.GetBufferReadPtr()) +
                (f.IsForwarded() ? std::string(">") + f.forwarder.GetBufferReadPtr() : "") + " ";
    return text;
}

std::string Describe(ImportTable const& imports) {
    std::string text;
    for (ImportedModule const& m : imports.GetModules()) {
        text += std::string(m.name.GetBufferReadPtr()) + (m.delayLoaded ? "(delay)" : "") + "[";
        for (ImportedFunction const& f : m.functions)
            text += f.byOrdinal ? "#" + std::to_string(f.ordinal) + " "
                                : std::string(f.name.GetBufferReadPtr()) + "/" +
                                      std::to_string(f.hint) + " ";
        text += "]";
    }
    return text;
}

TEST(ExecutableFile, HeaderFactsOfEachKind) {
    struct Row {
        int bitness;
        std::uint16_t machine, characteristics, subsystem;
        char const* machineName;
        bool largeAddressAware, dll;
        char const* subsystemName;
    } const rows[] = {
        {32, 0x14c, 0x0102, 2, "i386", false, false, "windows-gui"},
        {32, 0x14c, 0x2122, 3, "i386", true, true, "windows-cui"},
        {64, 0x8664, 0x2022, 3, "x86-64", true, true, "windows-cui"},
        {64, 0xaa64, 0x0022, 10, "arm64", true, false, "efi-application"},
        {64, 0x1234, 0x0002, 99, "unknown", false, false, "unknown"},
    };
    for (Row const& row : rows) {
        PEImageBuilder pe(row.bitness);
        pe.machine = row.machine;
        pe.characteristics = row.characteristics;
        pe.subsystem = row.subsystem;
        pe.imageBase = row.bitness == 64 ? 0x180000000ull : 0x400000;
        ExecutableFile const file = Open(pe.Build());
        SCOPED_TRACE(row.machineName);
        EXPECT_EQ(file.GetBitness(), row.bitness);
        EXPECT_EQ(file.GetMachine(), row.machine);
        EXPECT_STREQ(file.GetMachineName(), row.machineName);
        EXPECT_EQ(file.IsLargeAddressAware(), row.largeAddressAware);
        EXPECT_EQ(file.IsDll(), row.dll);
        EXPECT_STREQ(file.GetSubsystemName(), row.subsystemName);
        EXPECT_EQ(file.GetImageBase(), pe.imageBase);
        ASSERT_EQ(file.GetNumberOfSections(), 1u);
        EXPECT_STREQ(file.GetSection(0).name, ".data");
        EXPECT_TRUE(file.ReadExports().IsEmpty());
        EXPECT_TRUE(file.ReadImports().IsEmpty());
    }
}

TEST(ExecutableFile, ExportsByOrdinalWithNamesAndForwarders) {
    PEImageBuilder pe;
    pe.AddExports("lib.dll", 5,
                  {{"Open", 0x9010},
                   {"Close", 0x9020},
                   {"", 0x9030},                      // by ordinal only
                   {"Alias", 0x9010, "", 0},          // a second name for slot 0
                   {"Heap", 0, "KERNEL32.HeapAlloc"}, // into another module
                   {"Again", 0, "lib.Close"},         // into this one
                   {"ByNumber", 0, "LIB.#6"}});
    ExportTable const exports = Open(pe.Build()).ReadExports();
    EXPECT_STREQ(exports.GetModuleName().GetBufferReadPtr(), "lib.dll");
    EXPECT_EQ(exports.GetOrdinalBase(), 5u);
    EXPECT_EQ(Names(exports), "5:Alias 5:Open 6:Close 7:- 9:Heap>KERNEL32.HeapAlloc "
                              "10:Again>lib.Close 11:ByNumber>LIB.#6 ");
    ASSERT_NE(exports.Find("Close"), nullptr);
    EXPECT_EQ(exports.Find("Close")->rva, 0x9020u);
    EXPECT_EQ(exports.Find("close"), nullptr); // case matters, as for GetProcAddress
    EXPECT_EQ(exports.FindOrdinal(7)->rva, 0x9030u);
    EXPECT_EQ(exports.FindOrdinal(8), nullptr); // the unused slot
    EXPECT_EQ(exports.Resolve("Again").ordinal, 6u);
    EXPECT_EQ(exports.Resolve("ByNumber").ordinal, 6u);
    EXPECT_STREQ(exports.Resolve("Heap").forwarder.GetBufferReadPtr(), "KERNEL32.HeapAlloc");
    EXPECT_RAISES(exports.Resolve("Missing"), TE_FUNC_NOT_IN_LIB);
}

TEST(ExecutableFile, ForwardersThatReturnToThemselvesRaise) {
    struct Row {
        std::vector<PEImageBuilder::Export> exports;
        char const* start;
        TEError code;
    } const rows[] = {
        {{{"Self", 0, "loop.Self"}}, "Self", TE_BAD_FILE_FORMAT},
        {{{"A", 0, "LOOP.B"}, {"B", 0, "loop.dll.C"}, {"C", 0, "loop.A"}}, "A", TE_BAD_FILE_FORMAT},
        {{{"A", 0, "loop.#2"}, {"B", 0, "loop.#1"}}, "B", TE_BAD_FILE_FORMAT},
        {{{"A", 0, "loop.Gone"}}, "A", TE_FUNC_NOT_IN_LIB},
    };
    for (Row const& row : rows) {
        PEImageBuilder pe;
        pe.AddExports("loop.dll", 1, row.exports);
        ExportTable const exports = Open(pe.Build()).ReadExports();
        EXPECT_RAISES(exports.Resolve(row.start), row.code);
    }
}

TEST(ExecutableFile, ImportsOrdinaryThenDelayLoadedOfBothWidths) {
    for (int bitness : {32, 64}) {
        PEImageBuilder pe(bitness);
        pe.AddImports({{"KERNEL32.dll", {"CloseHandle", "#12"}}, {"a.dll", {"f"}}});
        pe.AddImports({{"late.dll", {"g", "#3"}}, {"A.DLL", {}}}, true);
        ImportTable const imports = Open(pe.Build()).ReadImports();
        EXPECT_EQ(Describe(imports), "KERNEL32.dll[CloseHandle/7 #12 ]a.dll[f/7 ]"
                                     "late.dll(delay)[g/7 #3 ]A.DLL(delay)[]");
        StringVector names;
        imports.GetModuleNames(names, false);
        EXPECT_EQ(names.size(), 2u);
        names.clear();
        imports.GetModuleNames(names, true); // A.DLL is a.dll again
        ASSERT_EQ(names.size(), 3u);
        EXPECT_STREQ(names[2].GetBufferReadPtr(), "late.dll");
    }
}

TEST(ExecutableFile, OldDelayLoadDescriptorsHoldAddresses) {
    PEImageBuilder pe(32);
    pe.imageBase = 0x400000;
    std::uint32_t const directory = pe.AddImports({{"old.dll", {"f"}}}, true);
    // Attribute bit 0 clear: the name and name table are addresses, not RVAs.
    for (std::uint32_t field : {0u, 4u, 16u})
        pe.Poke32(directory + field,
                  field == 0 ? 0
                             : pe.section.at(directory - 0x1000 + field) |
                                   pe.section.at(directory - 0x1000 + field + 1) << 8 | 0x400000);
    EXPECT_EQ(Describe(Open(pe.Build()).ReadImports()), "old.dll(delay)[f/7 ]");

    pe.imageBase = 0x800000; // the addresses now lie below the base
    EXPECT_RAISES(Open(pe.Build()).ReadImports(), TE_BAD_FILE_FORMAT);
}

/// A valid image with exports and imports that each row spoils in one place.
struct Spoiled {
    char const* what;
    std::function<void(PEImageBuilder&, std::vector<unsigned char>&)> spoil;
    char const* step;   ///< "open", "exports" or "imports": where the damage shows
    char const* detail; ///< a part of the message that says what is wrong
};

std::vector<unsigned char> Valid(PEImageBuilder& pe) {
    pe.AddExports("ok.dll", 1, {{"A", 0x9010}, {"B", 0x9020}});
    pe.AddImports({{"x.dll", {"f"}}});
    return pe.Build();
}

std::uint32_t ExportField(PEImageBuilder const& pe, int field) {
    return pe.dirs[0][0] - PEImageBuilder::kSectionRva + PEImageBuilder::kHeaderSize +
           4 * static_cast<std::uint32_t>(field);
}

TEST(ExecutableFile, MalformedFilesRaiseNamingFileAndFault) {
    using B = PEImageBuilder;
    auto set32 = [](std::vector<unsigned char>& b, std::size_t at, std::uint32_t v) {
        B::Set32(b, at, v);
    };
    Spoiled const rows[] = {
        {"empty", [](B&, auto& b) { b.clear(); }, "open", "\"MZ\""},
        {"cut DOS header", [](B&, auto& b) { b.resize(40); }, "open", "MS-DOS header"},
        {"no MZ", [](B&, auto& b) { b[0] = 'Z'; }, "open", "\"MZ\""},
        {"PE pointer past the end", [&](B&, auto& b) { set32(b, 0x3c, 0xfffffff0); }, "open",
         "0xFFFFFFF0"},
        {"no PE signature", [](B&, auto& b) { b[B::kPeOffset + 1] = 'X'; }, "open", "\"PE\""},
        {"cut file header", [](B&, auto& b) { b.resize(B::kFileHeader + 10); }, "open",
         "file header"},
        {"cut optional header", [](B&, auto& b) { b.resize(B::kOptionalHeader + 50); }, "open",
         "optional header"},
        {"bad magic", [](B&, auto& b) { B::Set16(b, B::kOptionalHeader, 0x107); }, "open", "0x107"},
        {"optional header too small", [](B&, auto& b) { B::Set16(b, B::kFileHeader + 16, 20); },
         "open", "fixed fields"},
        {"section table past the end", [](B&, auto& b) { B::Set16(b, B::kFileHeader + 2, 900); },
         "open", "section table"},
        {"section bytes past the end",
         [&](B& pe, auto& b) { set32(b, pe.SectionHeader() + 16, 0x7fffffff); }, "open",
         "section '.data'"},
        {"section offset wraps",
         [&](B& pe, auto& b) { set32(b, pe.SectionHeader() + 20, 0xffffff00); }, "open",
         "section '.data'"},
        {"export directory in no section",
         [&](B&, auto& b) { set32(b, B::kOptionalHeader + 112, 0x90000); }, "exports",
         "export directory at address 0x90000"},
        {"export directory wraps",
         [&](B&, auto& b) { set32(b, B::kOptionalHeader + 112, 0xfffffff0); }, "exports",
         "export directory"},
        {"2^31 names", [&](B& pe, auto& b) { set32(b, ExportField(pe, 6), 0x80000000); }, "exports",
         "2147483648 entries"},
        {"2^32-1 functions", [&](B& pe, auto& b) { set32(b, ExportField(pe, 5), 0xffffffff); },
         "exports", "export address table"},
        {"name table outside", [&](B& pe, auto& b) { set32(b, ExportField(pe, 8), 0x7ffffff0); },
         "exports", "export name table"},
        {"ordinal base wraps", [&](B& pe, auto& b) { set32(b, ExportField(pe, 4), 0xffffffff); },
         "exports", "ordinal base"},
        {"import descriptors without end",
         [&](B& pe, auto& b) {
             std::size_t const end = pe.dirs[1][0] - B::kSectionRva + B::kHeaderSize + 20;
             std::fill(b.begin() + static_cast<long>(end), b.end(), 0xAB);
         },
         "imports", "import"},
        {"import name outside",
         [&](B& pe, auto& b) {
             set32(b, pe.dirs[1][0] - B::kSectionRva + B::kHeaderSize + 12, 0x1000000);
         },
         "imports", "imported DLL's name at address 0x1000000"},
    };
    for (Spoiled const& row : rows) {
        SCOPED_TRACE(row.what);
        PEImageBuilder pe;
        std::vector<unsigned char> bytes = Valid(pe);
        row.spoil(pe, bytes);
        std::string const step = row.step;
        TEException const e = Raised([&] {
            ExecutableFile const file = Open(bytes, "bad.dll");
            if (step == "exports")
                file.ReadExports();
            if (step == "imports")
                file.ReadImports();
        });
        EXPECT_EQ(e.GetErrorCode(), TE_BAD_FILE_FORMAT);
        std::string const message = e.GetDescription();
        EXPECT_EQ(message.rfind("'bad.dll' is not a valid executable file: ", 0), 0u) << message;
        EXPECT_NE(message.find(row.detail), std::string::npos) << message;
    }
}

TEST(ExecutableFile, NamesWithoutTheirNulRaise) {
    PEImageBuilder pe;
    pe.AddExports("n.dll", 1, {{"A", 0x9010}});
    // The last bytes of the section: a name that runs into the section's end.
    std::uint32_t const text = pe.Put("ABCD", 4);
    pe.Poke32(pe.dirs[0][0] + 12, text);
    EXPECT_RAISES(Open(pe.Build()).ReadExports(), TE_BAD_FILE_FORMAT);
}

class ExecutableFileOnDisk : public ::testing::Test {
protected:
    void SetUp() override {
        std::random_device random;
        m_root = fs::temp_directory_path() / ("tekit-exe-" + std::to_string(random()));
        fs::create_directories(m_root / "lib");
    }
    void TearDown() override {
        std::error_code ignored;
        fs::remove_all(m_root, ignored);
    }
    std::string Write(std::string const& name, std::vector<unsigned char> const& bytes) {
        fs::path const path = m_root / name;
        std::ofstream(path, std::ios::binary)
            .write(reinterpret_cast<char const*>(bytes.data()),
                   static_cast<std::streamsize>(bytes.size()));
        return path.string();
    }
    static std::vector<unsigned char> Dll(std::vector<PEImageBuilder::Import> const& imports,
                                          std::vector<PEImageBuilder::Import> const& delayed = {},
                                          std::vector<PEImageBuilder::Export> const& exports = {}) {
        PEImageBuilder pe;
        if (!exports.empty())
            pe.AddExports("self.dll", 1, exports);
        if (!imports.empty())
            pe.AddImports(imports);
        if (!delayed.empty())
            pe.AddImports(delayed, true);
        return pe.Build();
    }
    fs::path m_root;
};

TEST_F(ExecutableFileOnDisk, ReadsTheSameAsFromMemoryAndMapsSystemErrors) {
    PEImageBuilder pe;
    std::vector<unsigned char> const bytes = Valid(pe);
    std::string const path = Write("ok.dll", bytes);
    ExecutableFile const file{DynamicPath(path.c_str())};
    EXPECT_EQ(Names(file.ReadExports()), Names(Open(bytes).ReadExports()));
    EXPECT_EQ(Describe(file.ReadImports()), "x.dll[f/7 ]");
    EXPECT_STREQ(file.GetFileName().GetBufferReadPtr(), path.c_str());

    EXPECT_RAISES(ExecutableFile{DynamicPath((m_root / "none.dll").string().c_str())},
                  TE_FILE_NOT_FOUND);
    {
        ScopedFault const failing(FaultKind::Read, 1, tekit::platform::native::kAccessDenied);
        EXPECT_RAISES(file.ReadImports(), TE_ACCESS_DENIED);
    }
    // The flat interface answers with statuses.
    EXPECT_EQ(GetExecutableBitness(path.c_str()), 64);
    EXPECT_EQ(IsExecutableLargeAddressAware(path.c_str()), 1);
    EXPECT_EQ(GetExecutableMachine(path.c_str()), 0x8664);
    EXPECT_EQ(ExecutableExportsFunction(path.c_str(), "B"), 1);
    EXPECT_EQ(ExecutableExportsFunction(path.c_str(), "b"), 0);
    std::string const missing = (m_root / "none.dll").string();
    EXPECT_EQ(GetExecutableBitness(missing.c_str()), TE_FILE_NOT_FOUND);
    std::string const text = Write("text.dll", {'h', 'i'});
    EXPECT_EQ(IsExecutableLargeAddressAware(text.c_str()), TE_BAD_FILE_FORMAT);
    EXPECT_LT(GetExecutableMachine(nullptr), 0); // no file: the system says which error
}

TEST_F(ExecutableFileOnDisk, DependentModulesAreFoundBreadthFirstEachOnce) {
    // app.exe needs a.dll (beside it), b.dll (in lib/), missing.dll, and late.dll delay-loaded;
    // a.dll needs B.DLL again and d.dll (beside app, stored as D.DLL) and forwards to e.dll.
    Write("app.exe",
          Dll({{"a.dll", {"f"}}, {"b.dll", {"g"}}, {"missing.dll", {"h"}}}, {{"late.dll", {"i"}}}));
    Write("a.dll", Dll({{"B.DLL", {"g"}}, {"d.dll", {"k"}}, {"late.dll", {"i"}}}, {},
                       {{"Fwd", 0, "e.Func"}, {"Own", 0, "self.Own2"}, {"Own2", 0x9010}}));
    Write("lib/b.dll", Dll({{"app.exe", {"main"}}}));
    Write("D.DLL", Dll({}));
    Write("late.dll", Dll({}));
    PathBase::PathVector search;
    search.push_back(Path((m_root / "lib").string().c_str()));
    std::vector<DependentModule> const modules =
        FindDependentModules(DynamicPath((m_root / "app.exe").string().c_str()), search);

    struct Row {
        char const* name;
        char const* file; ///< where found, relative to the root; null: not found
        char const* neededBy;
        bool delayLoaded, forwarded;
    } const expected[] = {
        {"a.dll", "a.dll", nullptr, false, false},
        {"b.dll", "lib/b.dll", nullptr, false, false},
        {"missing.dll", nullptr, nullptr, false, false},
        {"late.dll", "late.dll", nullptr, false, false}, // a.dll needs it directly
        {"d.dll", "D.DLL", "a.dll", false, false},
        {"e.dll", nullptr, "a.dll", false, true},
    };
    std::string found;
    for (DependentModule const& module : modules)
        found += std::string(module.name.GetBufferReadPtr()) + " ";
    ASSERT_EQ(modules.size(), std::size(expected)) << found;
    for (std::size_t i = 0; i < modules.size(); ++i) {
        Row const& row = expected[i];
        SCOPED_TRACE(row.name);
        EXPECT_STREQ(modules[i].name.GetBufferReadPtr(), row.name);
        std::string const where = row.file ? (m_root / row.file).string() : "";
        EXPECT_EQ(fs::path(modules[i].location.CStr()), fs::path(where));
        if (row.neededBy) {
            EXPECT_STREQ(modules[i].neededBy.GetBufferReadPtr(), row.neededBy);
        }
        EXPECT_EQ(modules[i].delayLoaded, row.delayLoaded);
        EXPECT_EQ(modules[i].forwarded, row.forwarded);
    }
}

} // namespace
