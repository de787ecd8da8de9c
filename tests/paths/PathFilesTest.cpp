// File operations against a real temporary directory. Paths are written in the host's form
// (the library hands them to the system unchanged).
#include "PathTestSupport.h"
#include "support/FaultInjection.h"
#include "support/ScratchDirectory.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <cerrno>
#include <filesystem>
#include <random>
#include <string>
#include <tuple>

using namespace tekit;
using tekit::testing::FaultKind;
using tekit::testing::Raised;
using tekit::testing::ReadFileBytes;
using tekit::testing::ScopedFault;
using tekit::testing::WriteFileBytes;
namespace native = tekit::platform::native;
namespace fs = std::filesystem;

namespace {

#if defined(_WIN32)
constexpr char kHostSeparator = '\\';
#else
constexpr char kHostSeparator = '/';
#endif

class PathFiles : public ::testing::Test {
protected:
    /// The host path of `name` inside the test directory.
    std::string At(std::string const& name) const { return m_rootText + kHostSeparator + name; }
    std::string At(std::string const& dir, std::string const& name) const {
        return At(dir + kHostSeparator + name);
    }
    void Write(std::string const& name, std::string const& contents) const {
        WriteFileBytes(At(name), contents);
    }
    std::string Read(std::string const& name) const { return ReadFileBytes(At(name)); }
    bool Has(std::string const& name) const { return fs::exists(At(name)); }
    /// The library's path of `name`, and its quoted form in messages.
    DynamicPath P(std::string const& name) const { return DynamicPath(At(name).c_str()); }
    std::string Q(std::string const& name) const { return "'" + At(name) + "'"; }
    size_t NumEntries() const {
        return size_t(std::distance(fs::directory_iterator(m_root), fs::directory_iterator()));
    }

    tekit::testing::ScratchDirectory m_scratch{"paths"};
    fs::path const m_root = m_scratch.Root();
    std::string const m_rootText = m_root.string();
};

// FILETIME of 2 January 2020, 03:04:05.1234567 UTC.
constexpr std::uint64_t kSomeTime = 132224474451234567ULL;

} // namespace

TEST_F(PathFiles, ExistenceSizeAndDirectories) {
    Write("five.txt", "12345");
    DynamicPath file = P("five.txt");
    EXPECT_TRUE(file.Exists());
    EXPECT_EQ(file.GetFileSize(), 5u);
    EXPECT_TRUE(DynamicPath(m_rootText.c_str()).IsDirectory());
    EXPECT_TRUE(Path("no-such-dir\\").IsDirectory()); // the text says so

    DynamicPath missing = P("missing.txt");
    EXPECT_FALSE(missing.Exists());
    TEException const e = Raised([&] { missing.GetFileSize(); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_NOT_FOUND);
    EXPECT_EQ(std::string(e.GetDescription()),
              "Could not read the information of " + Q("missing.txt") + ". File not found.");
#if !defined(_WIN32)
    EXPECT_STREQ(e.GetAPIFunctionName(), "stat");
    EXPECT_EQ(e.GetAPIErrorCode(), ENOENT);
#endif
}

TEST_F(PathFiles, FileTimesReadBackWhatWasSet) {
    Write("times.txt", "t");
    DynamicPath file = P("times.txt");
    file.SetFileTime(PathBase::kLastWriteTime, kSomeTime);
    EXPECT_EQ(file.GetFileTime(PathBase::kLastWriteTime), kSomeTime);
#if defined(_WIN32)
    file.SetFileTime(PathBase::kCreationTime, kSomeTime);
    EXPECT_EQ(file.GetFileTime(PathBase::kCreationTime), kSomeTime);
#else
    EXPECT_RAISES(file.SetFileTime(PathBase::kCreationTime, kSomeTime), TE_NOT_SUPPORTED);
#endif
    // Before 1970 as well.
    file.SetFileTime(PathBase::kLastWriteTime, 100000000000000000ULL);
    EXPECT_EQ(file.GetFileTime(PathBase::kLastWriteTime), 100000000000000000ULL);
    DynamicPath missing = P("missing");
    EXPECT_RAISES(missing.SetFileTime(PathBase::kLastWriteTime, 1), TE_FILE_NOT_FOUND);
    EXPECT_RAISES(missing.GetFileTime(PathBase::kLastWriteTime), TE_FILE_NOT_FOUND);
    EXPECT_RAISES(missing.SetReadOnly(true), TE_FILE_NOT_FOUND);
}

TEST_F(PathFiles, ReadOnlyFilesAreNeitherDeletedNorReplaced) {
    Write("locked.txt", "keep");
    Write("other.txt", "new");
    DynamicPath locked = P("locked.txt");
    DynamicPath other = P("other.txt");
    locked.SetReadOnly(true);
    EXPECT_TRUE(locked.IsReadOnly());

    TEException e = Raised([&] { locked.Delete(); });
    EXPECT_EQ(e.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(std::string(e.GetDescription()),
              "Could not delete " + Q("locked.txt") + ". Access denied.");
    EXPECT_EQ(Raised([&] { other.CopyTo(locked, true); }).GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(Raised([&] { other.MoveToReplacing(locked); }).GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(Read("locked.txt"), "keep");
    EXPECT_EQ(Read("other.txt"), "new");
    EXPECT_EQ(NumEntries(), 2u); // no temporary copy left behind

    locked.SetReadOnly(false);
    locked.Delete();
    EXPECT_FALSE(Has("locked.txt"));
}

TEST_F(PathFiles, CopyKeepsContentsAndRefusesToOverwriteUnlessAsked) {
    Write("source.bin", std::string("a\0b\xFF", 4));
    DynamicPath source = P("source.bin");
    source.SetFileTime(PathBase::kLastWriteTime, kSomeTime);
    DynamicPath copy = P("copy.bin");
    source.CopyTo(copy, false);
    EXPECT_EQ(Read("copy.bin"), std::string("a\0b\xFF", 4));
    EXPECT_EQ(copy.GetFileTime(PathBase::kLastWriteTime), kSomeTime);

    Write("copy.bin", "older");
    TEException const e = Raised([&] { source.CopyTo(copy, false); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_ALREADY_EXISTS);
    EXPECT_EQ(std::string(e.GetDescription()), "Could not copy " + Q("source.bin") + " to " +
                                                   Q("copy.bin") + ". File already exists.");
    EXPECT_EQ(Read("copy.bin"), "older");
}

TEST_F(PathFiles, FailedCopiesLeaveNothingBehind) {
    DynamicPath target = P("target.txt");
    TEException e = Raised([&] { P("missing.txt").CopyTo(target, true); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_NOT_FOUND);
    fs::create_directory(At("folder"));
    e = Raised([&] { P("folder").CopyTo(target, true); });
#if defined(_WIN32)
    EXPECT_EQ(e.GetErrorCode(), TE_ACCESS_DENIED);
#else
    EXPECT_EQ(e.GetErrorCode(), TE_INVALID_OR_OUT_OF_RANGE); // EISDIR
#endif
    EXPECT_EQ(NumEntries(), 1u);
}

TEST_F(PathFiles, MoveRenamesAndRefusesAnExistingDestinationUnlessReplacing) {
    Write("a.txt", "A");
    Write("b.txt", "B");
    DynamicPath a = P("a.txt");
    DynamicPath b = P("b.txt");
    DynamicPath c = P("c.txt");
    TEException const e = Raised([&] { a.MoveTo(b); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_ALREADY_EXISTS);
    EXPECT_EQ(std::string(e.GetDescription()),
              "Could not move " + Q("a.txt") + " to " + Q("b.txt") + ". File already exists.");
    EXPECT_EQ(Read("b.txt"), "B");

    a.MoveTo(c);
    EXPECT_FALSE(Has("a.txt"));
    EXPECT_EQ(Read("c.txt"), "A");
    c.MoveToReplacing(b);
    EXPECT_EQ(Read("b.txt"), "A");
}

TEST_F(PathFiles, BackupCopySitsBesideTheFile) {
    Write("station.ini", "v1");
    DynamicPath backup;
    P("station.ini").MakeBackupCopy(backup);
    EXPECT_EQ(std::string(backup.CStr()), At("station.ini.bak"));
}

TEST_F(PathFiles, AllDirectoriesOfAPathAreMadeOrNoneAre) {
    std::string const nested = At(std::string("a") + kHostSeparator + "b" + kHostSeparator + "c");
    DynamicPath(nested.c_str()).MakeAllDirectoriesInPathNameLong();
    EXPECT_TRUE(fs::is_directory(nested));
    DynamicPath(nested.c_str()).MakeAllDirectoriesInPathNameLong(); // already there

    Write("plain", "file");
    std::string const blocked = At("plain", "sub");
    TEException e =
        Raised([&] { DynamicPath(blocked.c_str()).MakeAllDirectoriesInPathNameLong(); });
    EXPECT_STREQ(e.GetFunctionName(), "PathBase::MakeAllDirectoriesInPathNameLong");

    // The third level cannot be made: the first two go again.
    std::string const tooLong =
        At(std::string("new1") + kHostSeparator + "new2" + kHostSeparator + std::string(300, 'x'));
    e = Raised([&] { DynamicPath(tooLong.c_str()).MakeAllDirectoriesInPathNameLong(); });
    EXPECT_NE(e.GetErrorCode(), TE_NO_ERROR);
    EXPECT_FALSE(Has("new1"));
}

TEST_F(PathFiles, WildcardListingFillsTheOrderedSet) {
    Write("a.txt", "");
    Write("B.TXT", "");
    Write("c.log", "");
    fs::create_directory(At("d.txt"));
    PathBase::PathSet files;
    EXPECT_EQ(P("*.txt").FindFilesEx(files, false), 2);
    ASSERT_EQ(files.size(), 2u);
    EXPECT_EQ(std::string(files.begin()->CStr()), At("a.txt"));
    EXPECT_EQ(std::string(files.rbegin()->CStr()), At("B.TXT"));

    files.clear();
    EXPECT_EQ(P("*.TXT").FindFilesEx(files, true), 3);
    EXPECT_EQ(files.count(Path(At("d.txt").c_str())), 1u);

    TEException const e =
        Raised([&] { DynamicPath(At("nowhere", "*").c_str()).FindFilesEx(files, false); });
#if defined(_WIN32)
    EXPECT_EQ(e.GetErrorCode(), TE_PATH_NOT_FOUND);
#else
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_NOT_FOUND);
#endif
}

TEST_F(PathFiles, UniqueTemporaryFilesAreCreatedBesideTheTarget) {
    DynamicPath target = P("settings.ini");
    DynamicPath first, second;
    target.CreateUniqueTempFile("ini$$", first);
    target.CreateUniqueTempFile("ini$$", second);
    EXPECT_TRUE(second.Exists());
    EXPECT_NE(std::string(first.CStr()), std::string(second.CStr()));
    std::string const name = fs::path(first.CStr()).filename().string();
    EXPECT_TRUE(name.size() == 15 && name.starts_with("ini$$") && name.ends_with(".tmp")) << name;

    DynamicPath inDirectory((m_rootText + kHostSeparator).c_str());
    DynamicPath third;
    inDirectory.CreateUniqueTempFile(nullptr, third);
    EXPECT_EQ(fs::path(third.CStr()).parent_path(), m_root);

    DynamicPath nowhere(At("missing", "x.ini").c_str());
    EXPECT_NE(Raised([&] { nowhere.CreateUniqueTempFile("ini$$", third); }).GetErrorCode(),
              TE_NO_ERROR);
}

TEST_F(PathFiles, SameFileUnderAnotherSpelling) {
    Write("same.txt", "s");
    DynamicPath const plain = P("same.txt");
    std::string const dotted = m_rootText + kHostSeparator + "." + kHostSeparator + "same.txt";
    EXPECT_FALSE(plain.ShortPathNameAwareEquals(dotted.c_str(), false));
    EXPECT_TRUE(plain.ShortPathNameAwareEquals(DynamicPath(dotted.c_str()), true));
    EXPECT_FALSE(plain.ShortPathNameAwareEquals(At("other.txt").c_str(), true));
}

TEST(PathProcess, CurrentDirectoryAndProgramFileExist) {
    Path current;
    ASSERT_TRUE(PathBase::GetCurrentDir(current));
    EXPECT_EQ(fs::path(current.CStr()), fs::current_path());

    Path program("stale");
    program.SetUsingGetModuleFileName(nullptr);
    EXPECT_NE(std::string(program.CStr()).find("paths_tests"), std::string::npos) << program.CStr();
}

// ---- Failures injected through the fault seam ---------------------------------------------

// A full disk while writing, or no temporary file to write to: the copy raises the injected
// error and leaves the target as it was, with no temporary file behind.
TEST_F(PathFiles, FailedCopyLeavesTheTargetAsItWas) {
    Write("source.txt", "new contents");
    DynamicPath const source = P("source.txt");
    std::tuple<FaultKind, long, TEError, char const*> const faults[] = {
        {FaultKind::Write, native::kDiskFull, TE_DISK_FULL, "The disk is full."},
        {FaultKind::TemporaryFile, native::kAccessDenied, TE_ACCESS_DENIED, "Access denied."}};
    for (auto const& [kind, code, error, reason] : faults) {
        for (bool const targetExists : {false, true}) {
            SCOPED_TRACE(::testing::Message() << static_cast<int>(kind) << " " << targetExists);
            fs::remove(At("target.txt"));
            if (targetExists)
                Write("target.txt", "old contents");
            size_t const entries = NumEntries();
            ScopedFault const armed(kind, 1, code);
            TEException const e = Raised([&] { source.CopyTo(P("target.txt"), true); });
            EXPECT_EQ(std::tuple(e.GetErrorCode(), e.GetAPIErrorCode(), e.GetDescription()),
                      std::tuple(error, code,
                                 "Could not copy " + Q("source.txt") + " to " + Q("target.txt") +
                                     ". " + reason));
            EXPECT_STREQ(e.GetFunctionName(), "PathBase::CopyTo");
            EXPECT_EQ(Has("target.txt") ? Read("target.txt") : "none",
                      targetExists ? "old contents" : "none");
            EXPECT_EQ(NumEntries(), entries); // no temporary file left behind
        }
    }
}

TEST_F(PathFiles, AccessDeniedOnDeleteKeepsTheFile) {
    Write("busy.txt", "x");
    ScopedFault const denied(FaultKind::Delete, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(P("busy.txt").Delete(), TE_ACCESS_DENIED, "PathBase::Delete",
                     ("Could not delete " + Q("busy.txt") + ". Access denied.").c_str());
    EXPECT_EQ(Read("busy.txt"), "x");
}

TEST_F(PathFiles, FailedRenameDuringAMoveKeepsSourceAndTarget) {
    Write("a.txt", "A");
    Write("b.txt", "B");
    DynamicPath const a = P("a.txt");
    std::string const fresh =
        "Could not move " + Q("a.txt") + " to " + Q("c.txt") + ". Access denied.";
    ScopedFault const denied(FaultKind::Rename, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(a.MoveTo(P("c.txt")), TE_ACCESS_DENIED, "PathBase::MoveTo", fresh.c_str());
    EXPECT_EQ(Read("a.txt"), "A");
    EXPECT_EQ(Read("b.txt"), "B");
    EXPECT_FALSE(Has("c.txt"));
}

// Whichever call of a copy or a move fails, the operation is all or nothing: it raises the
// injected error and leaves both files as they were, or it is complete.
TEST_F(PathFiles, AnyFailedCallLeavesACopyOrMoveAllOrNothing) {
    DynamicPath const source = P("source.txt");
    DynamicPath const target = P("target.txt");
    for (bool const move : {false, true}) {
        auto const run = [&] {
            fs::remove(At("source.txt"));
            Write("source.txt", "new");
            Write("target.txt", "old");
            move ? source.MoveToReplacing(target) : source.CopyTo(target, true);
        };
        for (FaultKind const kind :
             {FaultKind::Open, FaultKind::Stat, FaultKind::TemporaryFile, FaultKind::Read,
              FaultKind::Write, FaultKind::Attributes, FaultKind::Flush, FaultKind::Close,
              FaultKind::Rename, FaultKind::Delete}) {
            std::uint32_t calls = 0;
            {
                ScopedFault const counter(kind, ScopedFault::kCountOnly);
                run();
                calls = counter.Calls();
            }
            for (std::uint32_t nth = 1; nth <= calls; ++nth) {
                SCOPED_TRACE(::testing::Message()
                             << move << ", kind " << static_cast<int>(kind) << ", call " << nth);
                ScopedFault const fault(kind, nth, native::kAccessDenied);
                bool raised = false;
                try {
                    run();
                } catch (TEException const& e) {
                    raised = e.GetErrorCode() == TE_ACCESS_DENIED;
                }
                EXPECT_EQ(Read("target.txt"), raised ? "old" : "new");
                EXPECT_EQ(NumEntries(), raised || !move ? 2u : 1u);
            }
        }
    }
}

TEST_F(PathFiles, AMoveAcrossVolumesCopiesThenRemovesTheSource) {
    Write("a.txt", "A");
    DynamicPath const a = P("a.txt");
    {
        ScopedFault const otherVolume(FaultKind::Rename, 1, native::kCrossDevice);
        a.MoveTo(P("b.txt"));
    }
    EXPECT_FALSE(Has("a.txt"));
    EXPECT_EQ(Read("b.txt"), "A");

    // The source cannot be removed: the copy goes again and the source stays.
    Write("a.txt", "A");
    ScopedFault const otherVolume(FaultKind::Rename, 1, native::kCrossDevice);
    ScopedFault const denied(FaultKind::Delete, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(a.MoveTo(P("c.txt")), TE_ACCESS_DENIED, "PathBase::MoveTo");
    EXPECT_EQ(Read("a.txt"), "A");
    EXPECT_FALSE(Has("c.txt"));
}
