// INI files: reading bad bytes, and saving through a temporary file that replaces the target in
// one step, whatever fails and even when the process dies on the way.
#include "ini/IniSeams.h"
#include "ini/IniTestSupport.h"
#include "platform/Process.h"
#include "support/FaultInjection.h"
#include "support/ScratchDirectory.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <thread>

namespace fs = std::filesystem;
using namespace std::chrono_literals;

namespace tekit::testing {
namespace {

#if defined(_WIN32)
constexpr char kLineEnd[] = "\r\n";
#else
constexpr char kLineEnd[] = "\n";
#endif

class IniFile : public ::testing::Test {
protected:
    std::string At(char const* name) const { return (m_root / name).string(); }

    /// Names in the test directory that a save left behind.
    std::vector<std::string> Temporaries() const {
        std::vector<std::string> names;
        for (auto const& entry : fs::directory_iterator(m_root))
            if (entry.path().filename().string().starts_with("ini$$"))
                names.push_back(entry.path().string());
        return names;
    }

    tekit::testing::ScratchDirectory m_scratch{"ini"};
    fs::path const m_root = m_scratch.Root();
};

TEST_F(IniFile, BadBytesReadAsDocumented) {
    std::string const longValue(700, 'v');
    struct {
        char const* name;
        std::string bytes;
        char const* dump;
    } const cases[] = {
        {"LongLineIsCutAt640Bytes", "[s]\nK=" + longValue + "\nL=1",
         nullptr}, // checked below: K holds 638 bytes
        {"NulEndsALine", std::string("[s]\nK=a\0L=b\n", 12), "[s]\nK=a\nL=b\n"},
        {"LoneCrEndsALine", "[s]\rK=a\rL=b", "[s]\nK=a\nL=b\n"},
        {"CrLfAndLfCrAreOneLineEnd", "[s]\r\nK=a\n\rL=b\r\n", "[s]\nK=a\nL=b\n"},
        {"EndsInsideAMultiLineRun", "[s]\nT Line0001=a\nT Line0002=b", "[s]\nT=ab\n"},
        {"LineNumbersCountEmptyLines", "; x\r\n\r\n[s]\r\n\r\n\r\nA=1\r\n", "[s]@3\nA=1@6\n"},
        {"Empty", "", ""},
    };
    for (auto const& c : cases) {
        SCOPED_TRACE(c.name);
        WriteFileBytes(At("in.ini"), c.bytes);
        IniObject ini;
        ASSERT_EQ(Ini_ReadFromFile(ini, At("in.ini").c_str()), 0);
        if (c.dump)
            EXPECT_EQ(Dump(ini, std::strchr(c.dump, '@') != nullptr), c.dump);
        else
            EXPECT_EQ(Raw(ini, "s", "K"), std::string(638, 'v'));
    }
}

// A hundred thousand sections, and a value of more than 9999 pieces, whose numbers widen past
// four digits.
TEST_F(IniFile, LargeObjectsReadAndWriteWhole) {
    std::string text;
    for (int i = 0; i < 100000; ++i)
        text += "[S" + std::to_string(i) + "]\nK=" + std::to_string(i) + "\n";
    WriteFileBytes(At("many.ini"), text);
    IniObject ini;
    ASSERT_EQ(Ini_ReadFromFile(ini, At("many.ini").c_str()), 0);
    EXPECT_EQ(Ini_NumberOfSections(ini), 100000);
    std::string value(3 * 1024 * 1024 + 7, ' ');
    std::mt19937 random(1);
    for (char& c : value)
        c = static_cast<char>('!' + random() % 90);
    ASSERT_EQ(Ini_PutRawString(ini, "S5", "Big", value.c_str()), 0);
    ASSERT_EQ(Ini_WriteToFile(ini, At("copy.ini").c_str()), 0);
    text = ReadFileBytes(At("copy.ini"));
    EXPECT_NE(text.find("\nBig Line9999 = "), std::string::npos);
    EXPECT_NE(text.find("\nBig Line10000 = "), std::string::npos);
    IniObject back;
    ASSERT_EQ(Ini_ReadFromFile(back, At("copy.ini").c_str()), 0);
    ASSERT_EQ(Ini_SortInternally(back), 0);
    EXPECT_EQ(Ini_NumberOfSections(back), 100000);
    EXPECT_EQ(Ini_NumberOfItems(back, "S5"), 2);
    EXPECT_TRUE(Raw(back, "S5", "Big") == value);
    EXPECT_EQ(Raw(back, "S99999", "K"), "99999");
}

TEST_F(IniFile, OpenAndReadFailuresHaveTheirStatus) {
    IniObject ini;
    EXPECT_EQ(Ini_ReadFromFile(ini, At("missing.ini").c_str()), INI_ERR_CANT_OPEN_FILE);
    WriteFileBytes(At("in.ini"), "[s]\nK=1");
    {
        ScopedFault const fault(FaultKind::Open, 1, native::kAccessDenied);
        EXPECT_EQ(Ini_ReadFromFile(ini, At("in.ini").c_str()), INI_ERR_CANT_OPEN_FILE);
    }
    {
        ScopedFault const fault(FaultKind::Read, 1, native::kAccessDenied);
        EXPECT_EQ(Ini_ReadFromFile(ini, At("in.ini").c_str()), INI_ERR_CANT_READ_FILE);
        EXPECT_TRUE(fault.Fired());
    }
    EXPECT_EQ(Ini_NumberOfSections(ini), 0);
    EXPECT_EQ(Ini_ReadFromFile(ini, At("in.ini").c_str()), 0);
    EXPECT_EQ(Dump(ini), "[s]\nK=1\n");
}

TEST_F(IniFile, ExhaustedMemoryDuringAReadLeavesAUsableObject) {
    std::string text;
    for (int i = 0; i < 300; ++i)
        text += "[S" + std::to_string(i % 7) + "]\nT Line1=" + std::string(i, 'x') +
                "\nT Line2=y\nK=" + std::to_string(i) + "\n";
    WriteFileBytes(At("in.ini"), text);
    for (std::uint32_t nth = 1;; ++nth) {
        IniObject ini;
        int status = 0;
        {
            ScopedFault const fault(FaultKind::Allocate, nth, 0);
            status = Ini_ReadFromFile(ini, At("in.ini").c_str());
            if (!fault.Fired()) {
                EXPECT_EQ(status, 0);
                EXPECT_EQ(Ini_NumberOfSections(ini), 300);
                break;
            }
        }
        ASSERT_EQ(status, INI_ERR_OUT_OF_MEMORY) << nth;
        ASSERT_LE(Ini_NumberOfSections(ini), 300);
        WriteText(ini); // still whole
        ASSERT_EQ(Ini_PutInt(ini, "S0", "After", 1), 0);
    }
}

TEST_F(IniFile, FailedSaveLeavesTargetAndNoTemporaryFile) {
    // clang-format off
    struct {
        char const* name;
        FaultKind kind;
        std::uint32_t nth;
        long error;
        int status;
    } const faults[] = {
        {"DiskFullOnFirstBlock", FaultKind::Write, 1, native::kDiskFull, INI_ERR_WRITE_FAILED},
        {"DiskFullOnLaterBlock", FaultKind::Write, 2, native::kDiskFull, INI_ERR_WRITE_FAILED},
        {"FlushFails", FaultKind::Flush, 1, native::kDiskFull, INI_ERR_WRITE_FAILED},
        {"CloseFails", FaultKind::Close, 1, native::kDiskFull, INI_ERR_WRITE_FAILED},
        {"RenameFails", FaultKind::Rename, 1, native::kAccessDenied, INI_ERR_WRITE_FAILED},
        {"TemporaryRefused", FaultKind::TemporaryFile, 1, native::kAccessDenied, INI_ERR_CANT_WRITE_FILE},
        {"TemporaryOnFullDisk", FaultKind::TemporaryFile, 1, native::kDiskFull, INI_ERR_WRITE_FAILED},
        {"TargetUnreadable", FaultKind::Stat, 1, native::kAccessDenied, INI_ERR_CANT_WRITE_FILE},
    };
    // clang-format on
    std::string const old = "[old]\nK=1\n";
    IniObject ini;
    for (int i = 0; i < 3000; ++i) // more than one 64 KB block
        ASSERT_EQ(Ini_PutString(ini, "new", ("Tag" + std::to_string(i)).c_str(),
                                std::string(40, 'n').c_str()),
                  0);
    for (auto const& f : faults) {
        SCOPED_TRACE(f.name);
        WriteFileBytes(At("target.ini"), old);
        {
            ScopedFault const fault(f.kind, f.nth, f.error);
            EXPECT_EQ(Ini_WriteToFile(ini, At("target.ini").c_str()), f.status);
            EXPECT_TRUE(fault.Fired());
        }
        EXPECT_EQ(ReadFileBytes(At("target.ini")), old);
        EXPECT_TRUE(Temporaries().empty());
    }
}

TEST_F(IniFile, ReadOnlyOrDirectoryTargetIsNotWritable) {
    IniObject ini;
    ASSERT_EQ(Ini_PutInt(ini, "s", "K", 1), 0);
    WriteFileBytes(At("locked.ini"), "[old]\n");
    fs::permissions(At("locked.ini"),
                    fs::perms::owner_write | fs::perms::group_write | fs::perms::others_write,
                    fs::perm_options::remove);
    EXPECT_EQ(Ini_WriteToFile(ini, At("locked.ini").c_str()), INI_ERR_CANT_WRITE_FILE);
    EXPECT_EQ(ReadFileBytes(At("locked.ini")), "[old]\n");
    fs::create_directory(At("folder.ini"));
    EXPECT_EQ(Ini_WriteToFile(ini, At("folder.ini").c_str()), INI_ERR_CANT_WRITE_FILE);
    EXPECT_TRUE(fs::is_directory(At("folder.ini")));
    EXPECT_EQ(Ini_WriteToFile(ini, (m_root / "no" / "such.ini").string().c_str()),
              INI_ERR_CANT_WRITE_FILE);
    EXPECT_TRUE(Temporaries().empty());
}

#if !defined(_WIN32)
TEST_F(IniFile, ReplacedFileKeepsItsPermissionsAndNewFileGetsTheUsualOnes) {
    auto const shared = fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read;
    WriteFileBytes(At("shared.ini"), "[old]\n");
    fs::permissions(At("shared.ini"), shared);
    IniObject ini;
    ASSERT_EQ(Ini_PutInt(ini, "s", "K", 1), 0);
    ASSERT_EQ(Ini_WriteToFile(ini, At("shared.ini").c_str()), 0);
    EXPECT_EQ(fs::status(At("shared.ini")).permissions() & fs::perms::all, shared);
    ASSERT_EQ(Ini_WriteToFile(ini, At("new.ini").c_str()), 0);
    WriteFileBytes(At("plain.ini"), "");
    EXPECT_EQ(fs::status(At("new.ini")).permissions(), fs::status(At("plain.ini")).permissions());
    // Where permissions cannot be set, the save goes on and the file is its owner's only.
    ScopedFault const refused(FaultKind::Attributes, 1, native::kAccessDenied);
    ASSERT_EQ(Ini_WriteToFile(ini, At("shared.ini").c_str()), 0);
    EXPECT_TRUE(refused.Fired());
    EXPECT_EQ(fs::status(At("shared.ini")).permissions() & fs::perms::all,
              fs::perms::owner_read | fs::perms::owner_write);
}
#endif

// ---- A process that dies while saving -----------------------------------------------------

constexpr char kChildVariable[] = "TEKIT_INI_SAVE_CHILD";

/// An object of `variant` 0 or 1.
void FillVariant(IniHandle ini, int variant) {
    for (int i = 0; i < 4000; ++i)
        Ini_PutInt(ini, "s", ("Tag" + std::to_string(i)).c_str(), variant * 100000 + i);
}

std::string VariantText(int variant) {
    IniObject ini;
    FillVariant(ini, variant);
    std::string text = WriteText(ini);
    for (std::size_t at = 0; (at = text.find('\n', at)) != std::string::npos;
         at += sizeof kLineEnd - 1)
        text.replace(at, 1, kLineEnd);
    return text;
}

std::string gReadyMarker;

void StopBeforeReplacing(char const*) {
    std::ofstream(gReadyMarker) << "ready";
    for (;;)
        std::this_thread::sleep_for(1h);
}

// The child half of the test below, run in a process of its own: saves variant 1 to the target
// it is given, stopping for good just before the rename.
TEST(IniSaveChildProcess, StopsBeforeReplacing) {
    char const* const target = std::getenv(kChildVariable);
    ASSERT_NE(target, nullptr) << "runs only as the child of the IniFile save-and-kill test";
    IniObject ini;
    FillVariant(ini, 1);
    gReadyMarker = std::string(target) + ".ready";
    ini::gBeforeReplaceHook = StopBeforeReplacing;
    Ini_WriteToFile(ini, target);
}

TEST_F(IniFile, KilledBetweenTemporaryWriteAndRenameLeavesTheOldTarget) {
    std::string const target = At("target.ini");
    std::string const old = VariantText(0);
    WriteFileBytes(target, old);
    platform::ProcessHandle child = nullptr;
    ASSERT_FALSE(platform::StartProcess(platform::CurrentProgramPath().c_str(),
                                        {"--gtest_filter=IniSaveChildProcess.*"},
                                        {std::string(kChildVariable) + "=" + target}, child));
    auto const deadline = std::chrono::steady_clock::now() + 60s;
    while (!fs::exists(target + ".ready") && std::chrono::steady_clock::now() < deadline)
        std::this_thread::sleep_for(10ms);
    bool const stopped = fs::exists(target + ".ready");
    platform::CloseProcess(child); // kills it where it stands
    ASSERT_TRUE(stopped) << "the child never reached the rename";
    EXPECT_EQ(ReadFileBytes(target), old);
    // The complete temporary file is what the dead process leaves.
    ASSERT_EQ(Temporaries().size(), 1u);
    EXPECT_EQ(ReadFileBytes(Temporaries()[0]), VariantText(1));
}

} // namespace
} // namespace tekit::testing
