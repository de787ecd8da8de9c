#include "tekit/paths/ExecutableFile.h"
#include "PEImageBuilder.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/paths/DependentModules.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/strings/StringVector.h"

#include <filesystem>
#include <fstream>
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
    struct {
        int bitness;
        std::uint16_t machine, characteristics, subsystem;
        char const* facts; ///< machine and subsystem names, large address aware, DLL
    } const rows[] = {
        {32, 0x14c, 0x0102, 2, "i386 windows-gui"},
        {32, 0x14c, 0x2122, 3, "i386 windows-cui large dll"},
        {64, 0x8664, 0x2022, 3, "x86-64 windows-cui large dll"},
        {64, 0xaa64, 0x0022, 10, "arm64 efi-application large"},
        {64, 0x1234, 0x0002, 99, "unknown unknown"},
    };
    for (auto const& row : rows) {
        PEImageBuilder pe(row.bitness);
        pe.machine = row.machine;
        pe.characteristics = row.characteristics;
        pe.subsystem = row.subsystem;
        pe.imageBase = row.bitness == 64 ? 0x180000000ull : 0x400000;
        ExecutableFile const file = Open(pe.Build());
        EXPECT_EQ(std::string(file.GetMachineName()) + " " + file.GetSubsystemName() +
                      (file.IsLargeAddressAware() ? " large" : "") + (file.IsDll() ? " dll" : ""),
                  row.facts);
        EXPECT_TRUE(file.GetBitness() == row.bitness && file.GetMachine() == row.machine);
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
    struct {
        std::vector<PEImageBuilder::Export> exports;
        char const* start;
        TEError code;
    } const rows[] = {
        {{{"Self", 0, "loop.Self"}}, "Self", TE_BAD_FILE_FORMAT},
        {{{"A", 0, "LOOP.B"}, {"B", 0, "loop.dll.C"}, {"C", 0, "loop.A"}}, "A", TE_BAD_FILE_FORMAT},
        {{{"A", 0, "loop.#2"}, {"B", 0, "loop.#1"}}, "B", TE_BAD_FILE_FORMAT},
        {{{"A", 0, "loop.Gone"}}, "A", TE_FUNC_NOT_IN_LIB},
    };
    for (auto const& row : rows) {
        PEImageBuilder pe;
        pe.AddExports("loop.dll", 1, row.exports);
        EXPECT_RAISES(Open(pe.Build()).ReadExports().Resolve(row.start), row.code);
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
        StringVector names, withDelayed;
        imports.GetModuleNames(names, false);
        imports.GetModuleNames(withDelayed, true); // A.DLL is a.dll again
        EXPECT_EQ(names.size(), 2u);
        ASSERT_EQ(withDelayed.size(), 3u);
        EXPECT_STREQ(withDelayed[2].GetBufferReadPtr(), "late.dll");
    }
}

TEST(ExecutableFile, OldDelayLoadDescriptorsHoldAddresses) {
    PEImageBuilder pe(32);
    pe.imageBase = 0x400000;
    std::uint32_t const directory = pe.AddImports({{"old.dll", {"f"}}}, true);
    // Attribute bit 0 clear: the name and name table are addresses, not RVAs (adding the base
    // 0x400000 to those RVAs sets their third byte).
    pe.Poke32(directory, 0);
    for (std::uint32_t field : {4u, 16u})
        pe.section.at(directory - PEImageBuilder::kSectionRva + field + 2) = 0x40;
    EXPECT_EQ(Describe(Open(pe.Build()).ReadImports()), "old.dll(delay)[f/7 ]");
    pe.imageBase = 0x800000; // the addresses now lie below the base
    EXPECT_RAISES(Open(pe.Build()).ReadImports(), TE_BAD_FILE_FORMAT);
}

std::vector<unsigned char> Valid(PEImageBuilder& pe) {
    pe.AddExports("ok.dll", 1, {{"A", 0x9010}, {"B", 0x9020}});
    pe.AddImports({{"x.dll", {"f"}}});
    return pe.Build();
}

// A valid image with exports and imports that each row spoils in one place: it cuts the file
// at `at`, fills it with `value` from `at` on, or writes `value`'s `width` low bytes there.
TEST(ExecutableFile, MalformedFilesRaiseNamingFileAndFault) {
    using B = PEImageBuilder;
    B pe;
    std::vector<unsigned char> const valid = Valid(pe);
    std::size_t const exports = pe.dirs[0][0] - B::kSectionRva + B::kHeaderSize,
                      imports = pe.dirs[1][0] - B::kSectionRva + B::kHeaderSize,
                      section = pe.SectionHeader(), directories = B::kOptionalHeader + 112;
    int const kCut = 0, kFill = -1;
    struct {
        std::size_t at;
        std::uint32_t value;
        int width;
        char const* step; ///< "open", "exports" or "imports": where the damage shows
        char const* detail;
    } const rows[] = {
        {0, 0, kCut, "open", "\"MZ\""},
        {40, 0, kCut, "open", "MS-DOS header"},
        {0, 'Z', 1, "open", "\"MZ\""},
        {0x3c, 0xfffffff0, 4, "open", "0xFFFFFFF0"}, // PE header past the end
        {B::kPeOffset + 1, 'X', 1, "open", "\"PE\""},
        {B::kFileHeader + 10, 0, kCut, "open", "file header"},
        {B::kOptionalHeader + 50, 0, kCut, "open", "optional header"},
        {B::kOptionalHeader, 0x107, 2, "open", "0x107"},
        {B::kFileHeader + 16, 20, 2, "open", "fixed fields"},
        {B::kFileHeader + 2, 900, 2, "open", "section table"},
        {section + 16, 0x7fffffff, 4, "open", "section '.data'"}, // bytes past the end
        {section + 20, 0xffffff00, 4, "open", "section '.data'"}, // offset wraps
        {directories, 0x90000, 4, "exports", "export directory at address 0x90000"},
        {directories, 0xfffffff0, 4, "exports", "export directory"},
        {exports + 24, 0x80000000, 4, "exports", "2147483648 entries"}, // names
        {exports + 20, 0xffffffff, 4, "exports", "export address table"},
        {exports + 32, 0x7ffffff0, 4, "exports", "export name table"},
        {exports + 16, 0xffffffff, 4, "exports", "ordinal base"},
        {imports + 20, 0xAB, kFill, "imports", "import"}, // descriptors without end
        {imports + 12, 0x1000000, 4, "imports", "imported DLL's name at address 0x1000000"},
    };
    for (auto const& row : rows) {
        SCOPED_TRACE(std::to_string(row.at) + " " + row.detail);
        std::vector<unsigned char> bytes = valid;
        if (row.width == kCut)
            bytes.resize(row.at);
        else if (row.width == kFill)
            std::fill(bytes.begin() + static_cast<long>(row.at), bytes.end(),
                      std::uint8_t(row.value));
        else
            B::Set(bytes, row.at, row.value, row.width);
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
    // The module's name is the section's last bytes, running into its end.
    pe.Poke32(pe.dirs[0][0] + 12, pe.Put("ABCD", 4));
    EXPECT_RAISES(Open(pe.Build()).ReadExports(), TE_BAD_FILE_FORMAT);
}

class ExecutableFileOnDisk : public ::testing::Test {
protected:
    void SetUp() override { fs::create_directories(m_root / "lib"); }
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
    tekit::testing::ScratchDirectory m_scratch{"exe"};
    fs::path const m_root = m_scratch.Root();
};

TEST_F(ExecutableFileOnDisk, ReadsTheSameAsFromMemoryAndMapsSystemErrors) {
    PEImageBuilder pe;
    std::vector<unsigned char> const bytes = Valid(pe);
    std::string const path = Write("ok.dll", bytes);
    ExecutableFile const file{DynamicPath(path.c_str())};
    EXPECT_EQ(Names(file.ReadExports()), Names(Open(bytes).ReadExports()));
    EXPECT_EQ(Describe(file.ReadImports()), "x.dll[f/7 ]");
    EXPECT_STREQ(file.GetFileName().GetBufferReadPtr(), path.c_str());

    std::string const missing = (m_root / "none.dll").string();
    EXPECT_RAISES(ExecutableFile{DynamicPath(missing.c_str())}, TE_FILE_NOT_FOUND);
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

    auto const relative = [&](char const* text) { // to the root
        fs::path const path(text);
        return (path.is_absolute() ? path.lexically_relative(m_root) : path).generic_string();
    };
    std::string found; // name, needed by, where found, how
    for (DependentModule const& m : modules)
        found += std::string(m.name.GetBufferReadPtr()) + " " +
                 relative(m.neededBy.GetBufferReadPtr()) + " " + relative(m.location.CStr()) +
                 (m.delayLoaded ? " delay" : "") + (m.forwarded ? " forwarded" : "") + "\n";
    EXPECT_EQ(found, "a.dll app.exe a.dll\n"
                     "b.dll app.exe lib/b.dll\n"
                     "missing.dll app.exe \n"
                     "late.dll app.exe late.dll\n" // not delay-loaded: a.dll needs it directly
                     "d.dll a.dll D.DLL\n"
                     "e.dll a.dll  forwarded\n");
}

} // namespace
