// File operations against a real temporary directory. Paths are written in the host's form
// (the library hands them to the system unchanged).
#include "PathTestSupport.h"
#include "support/FaultInjection.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <functional>
#include <random>
#include <sstream>
#include <string>

using namespace tekit;
using tekit::testing::Caught;
using tekit::testing::FaultKind;
using tekit::testing::Raised;
using tekit::testing::ScopedFault;
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
    void SetUp() override {
        std::random_device random;
        m_root = fs::temp_directory_path() / ("tekit-paths-" + std::to_string(random()));
        fs::create_directories(m_root);
        m_rootText = m_root.string();
    }
    void TearDown() override {
        std::error_code ignored;
        for (auto const& entry : fs::recursive_directory_iterator(m_root, ignored))
            fs::permissions(entry.path(), fs::perms::owner_all, fs::perm_options::add, ignored);
        fs::remove_all(m_root, ignored);
    }

    /// The host path of `name` inside the test directory.
    std::string At(std::string const& name) const { return m_rootText + kHostSeparator + name; }
    void Write(std::string const& name, std::string const& contents) const {
        std::ofstream(At(name), std::ios::binary) << contents;
    }
    std::string Read(std::string const& name) const {
        std::ifstream in(At(name), std::ios::binary);
        std::ostringstream contents;
        contents << in.rdbuf();
        return contents.str();
    }
    bool Has(std::string const& name) const { return fs::exists(At(name)); }
    size_t NumEntries() const {
        return size_t(std::distance(fs::directory_iterator(m_root), fs::directory_iterator()));
    }

    fs::path m_root;
    std::string m_rootText;
};

/// "<message> <path>" of a failed file operation, as the library writes it.
std::string Quoted(std::string const& path) {
    return "'" + path + "'";
}

// FILETIME of 2 January 2020, 03:04:05.1234567 UTC.
constexpr std::uint64_t kSomeTime = 132224474451234567ULL;

} // namespace

TEST_F(PathFiles, ExistenceSizeAndDirectories) {
    Write("five.txt", "12345");
    DynamicPath file(At("five.txt").c_str());
    EXPECT_TRUE(file.Exists());
    EXPECT_EQ(file.GetFileSize(), 5u);
    EXPECT_FALSE(file.IsDirectory());
    EXPECT_TRUE(DynamicPath(m_rootText.c_str()).IsDirectory());
    EXPECT_TRUE(Path("no-such-dir\\").IsDirectory()); // the text says so

    DynamicPath missing(At("missing.txt").c_str());
    EXPECT_FALSE(missing.Exists());
    TEException const e = Caught([&] { missing.GetFileSize(); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_NOT_FOUND);
    EXPECT_EQ(std::string(e.GetDescription()), "Could not read the information of " +
                                                   Quoted(At("missing.txt")) + ". File not found.");
#if !defined(_WIN32)
    EXPECT_STREQ(e.GetAPIFunctionName(), "stat");
    EXPECT_EQ(e.GetAPIErrorCode(), ENOENT);
#endif
}

TEST_F(PathFiles, FileTimesReadBackWhatWasSet) {
    Write("times.txt", "t");
    DynamicPath file(At("times.txt").c_str());
    file.SetFileTime(PathBase::kLastWriteTime, kSomeTime);
    EXPECT_EQ(file.GetFileTime(PathBase::kLastWriteTime), kSomeTime);
#if defined(_WIN32)
    file.SetFileTime(PathBase::kCreationTime, kSomeTime);
    EXPECT_EQ(file.GetFileTime(PathBase::kCreationTime), kSomeTime);
#else
    std::uint64_t const created = file.GetFileTime(PathBase::kCreationTime);
    TEException const e = Caught([&] { file.SetFileTime(PathBase::kCreationTime, kSomeTime); });
    EXPECT_EQ(e.GetErrorCode(), TE_NOT_SUPPORTED);
    EXPECT_EQ(file.GetFileTime(PathBase::kCreationTime), created);
#endif
    // Before 1970 as well.
    file.SetFileTime(PathBase::kLastWriteTime, 100000000000000000ULL);
    EXPECT_EQ(file.GetFileTime(PathBase::kLastWriteTime), 100000000000000000ULL);
    DynamicPath missing(At("missing").c_str());
    EXPECT_RAISES(missing.SetFileTime(PathBase::kLastWriteTime, 1), TE_FILE_NOT_FOUND);
    EXPECT_RAISES(missing.GetFileTime(PathBase::kLastWriteTime), TE_FILE_NOT_FOUND);
    EXPECT_RAISES(missing.SetReadOnly(true), TE_FILE_NOT_FOUND);
}

TEST_F(PathFiles, ReadOnlyFilesAreNeitherDeletedNorReplaced) {
    Write("locked.txt", "keep");
    Write("other.txt", "new");
    DynamicPath locked(At("locked.txt").c_str());
    DynamicPath other(At("other.txt").c_str());
    locked.SetReadOnly(true);
    EXPECT_TRUE(locked.IsReadOnly());

    TEException e = Caught([&] { locked.Delete(); });
    EXPECT_EQ(e.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(std::string(e.GetDescription()),
              "Could not delete " + Quoted(At("locked.txt")) + ". Access denied.");
    e = Caught([&] { other.CopyTo(locked, true); });
    EXPECT_EQ(e.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(Caught([&] { other.MoveToReplacing(locked); }).GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(Read("locked.txt"), "keep");
    EXPECT_EQ(Read("other.txt"), "new");
    EXPECT_EQ(NumEntries(), 2u); // no temporary copy left behind

    locked.SetReadOnly(false);
    locked.Delete();
    EXPECT_FALSE(Has("locked.txt"));
}

TEST_F(PathFiles, CopyKeepsContentsAndRefusesToOverwriteUnlessAsked) {
    Write("source.bin", std::string("a\0b\xFF", 4));
    DynamicPath source(At("source.bin").c_str());
    source.SetFileTime(PathBase::kLastWriteTime, kSomeTime);
    DynamicPath copy(At("copy.bin").c_str());
    source.CopyTo(copy, false);
    EXPECT_EQ(Read("copy.bin"), std::string("a\0b\xFF", 4));
    EXPECT_EQ(copy.GetFileTime(PathBase::kLastWriteTime), kSomeTime);

    Write("copy.bin", "older");
    TEException const e = Caught([&] { source.CopyTo(copy, false); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_ALREADY_EXISTS);
    EXPECT_EQ(std::string(e.GetDescription()), "Could not copy " + Quoted(At("source.bin")) +
                                                   " to " + Quoted(At("copy.bin")) +
                                                   ". File already exists.");
    EXPECT_EQ(Read("copy.bin"), "older");
    source.CopyTo(copy, true);
    EXPECT_EQ(Read("copy.bin"), std::string("a\0b\xFF", 4));
}

TEST_F(PathFiles, FailedCopiesLeaveNothingBehind) {
    DynamicPath target(At("target.txt").c_str());
    TEException e = Caught([&] { DynamicPath(At("missing.txt").c_str()).CopyTo(target, true); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_NOT_FOUND);
    fs::create_directory(At("folder"));
    e = Caught([&] { DynamicPath(At("folder").c_str()).CopyTo(target, true); });
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
    DynamicPath a(At("a.txt").c_str());
    DynamicPath b(At("b.txt").c_str());
    DynamicPath c(At("c.txt").c_str());
    TEException const e = Caught([&] { a.MoveTo(b); });
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_ALREADY_EXISTS);
    EXPECT_EQ(std::string(e.GetDescription()), "Could not move " + Quoted(At("a.txt")) + " to " +
                                                   Quoted(At("b.txt")) + ". File already exists.");
    EXPECT_EQ(Read("b.txt"), "B");

    a.MoveTo(c);
    EXPECT_FALSE(Has("a.txt"));
    EXPECT_EQ(Read("c.txt"), "A");
    c.MoveToReplacing(b);
    EXPECT_FALSE(Has("c.txt"));
    EXPECT_EQ(Read("b.txt"), "A");
    EXPECT_EQ(Caught([&] { c.MoveTo(a); }).GetErrorCode(), TE_FILE_NOT_FOUND);
}

TEST_F(PathFiles, BackupCopySitsBesideTheFile) {
    Write("station.ini", "v1");
    DynamicPath file(At("station.ini").c_str());
    DynamicPath backup;
    file.MakeBackupCopy(backup);
    EXPECT_EQ(std::string(backup.CStr()), At("station.ini.bak"));
    EXPECT_EQ(Read("station.ini.bak"), "v1");
}

TEST_F(PathFiles, AllDirectoriesOfAPathAreMadeOrNoneAre) {
    std::string const nested = At(std::string("a") + kHostSeparator + "b" + kHostSeparator + "c");
    DynamicPath(nested.c_str()).MakeAllDirectoriesInPathNameLong();
    EXPECT_TRUE(fs::is_directory(nested));
    DynamicPath(nested.c_str()).MakeAllDirectoriesInPathNameLong(); // already there

    Write("plain", "file");
    std::string const blocked = At(std::string("plain") + kHostSeparator + "sub");
    TEException e =
        Caught([&] { DynamicPath(blocked.c_str()).MakeAllDirectoriesInPathNameLong(); });
    EXPECT_STREQ(e.GetFunctionName(), "PathBase::MakeAllDirectoriesInPathNameLong");

    // The third level cannot be made: the first two go again.
    std::string const tooLong =
        At(std::string("new1") + kHostSeparator + "new2" + kHostSeparator + std::string(300, 'x'));
    e = Caught([&] { DynamicPath(tooLong.c_str()).MakeAllDirectoriesInPathNameLong(); });
    EXPECT_NE(e.GetErrorCode(), TE_NO_ERROR);
    EXPECT_FALSE(Has("new1"));
}

TEST_F(PathFiles, WildcardListingFillsTheOrderedSet) {
    Write("a.txt", "");
    Write("B.TXT", "");
    Write("c.log", "");
    fs::create_directory(At("d.txt"));
    PathBase::PathSet files;
    EXPECT_EQ(DynamicPath(At("*.txt").c_str()).FindFilesEx(files, false), 2);
    ASSERT_EQ(files.size(), 2u);
    EXPECT_EQ(std::string(files.begin()->CStr()), At("a.txt"));
    EXPECT_EQ(std::string(files.rbegin()->CStr()), At("B.TXT"));

    files.clear();
    EXPECT_EQ(DynamicPath(At("*.TXT").c_str()).FindFilesEx(files, true), 3);
    EXPECT_EQ(files.count(Path(At("d.txt").c_str())), 1u);
    EXPECT_EQ(DynamicPath(At("?.*").c_str()).FindFilesEx(files, false), 3);

    TEException const e = Caught([&] {
        DynamicPath(At("nowhere" + std::string(1, kHostSeparator) + "*").c_str())
            .FindFilesEx(files, false);
    });
#if defined(_WIN32)
    EXPECT_EQ(e.GetErrorCode(), TE_PATH_NOT_FOUND);
#else
    EXPECT_EQ(e.GetErrorCode(), TE_FILE_NOT_FOUND);
#endif
}

TEST_F(PathFiles, UniqueTemporaryFilesAreCreatedBesideTheTarget) {
    DynamicPath target(At("settings.ini").c_str());
    DynamicPath first, second;
    target.CreateUniqueTempFile("ini$$", first);
    target.CreateUniqueTempFile("ini$$", second);
    EXPECT_TRUE(second.Exists());
    EXPECT_NE(std::string(first.CStr()), std::string(second.CStr()));
    std::string const name = fs::path(first.CStr()).filename().string();
    EXPECT_EQ(name.size(), 5u + 6u + 4u) << name;
    EXPECT_EQ(name.substr(0, 5), "ini$$");
    EXPECT_EQ(name.substr(11), ".tmp");

    DynamicPath inDirectory((m_rootText + kHostSeparator).c_str());
    DynamicPath third;
    inDirectory.CreateUniqueTempFile(nullptr, third);
    EXPECT_EQ(fs::path(third.CStr()).parent_path(), m_root);

    DynamicPath nowhere(At("missing" + std::string(1, kHostSeparator) + "x.ini").c_str());
    EXPECT_NE(Caught([&] { nowhere.CreateUniqueTempFile("ini$$", third); }).GetErrorCode(),
              TE_NO_ERROR);
}

TEST_F(PathFiles, SameFileUnderAnotherSpelling) {
    Write("same.txt", "s");
    DynamicPath const plain(At("same.txt").c_str());
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

TEST_F(PathFiles, FullDiskDuringACopyLeavesTheTargetAsItWas) {
    Write("source.txt", "new contents");
    DynamicPath const source(At("source.txt").c_str());
    DynamicPath const target(At("target.txt").c_str());
    std::string const description = "Could not copy " + Quoted(At("source.txt")) + " to " +
                                    Quoted(At("target.txt")) + ". The disk is full.";
    for (bool const targetExists : {false, true}) {
        SCOPED_TRACE(targetExists ? "overwriting" : "new target");
        if (targetExists)
            Write("target.txt", "old contents");
        size_t const entries = NumEntries();
        ScopedFault const full(FaultKind::Write, 1, native::kDiskFull);
        TEException const e = Raised([&] { source.CopyTo(target, true); });
        EXPECT_EQ(e.GetErrorCode(), TE_DISK_FULL);
        EXPECT_EQ(std::string(e.GetDescription()), description);
        EXPECT_EQ(e.GetAPIErrorCode(), native::kDiskFull);
        EXPECT_EQ(Has("target.txt"), targetExists);
        if (targetExists) {
            EXPECT_EQ(Read("target.txt"), "old contents");
        }
        EXPECT_EQ(NumEntries(), entries); // no temporary file left behind
    }
}

TEST_F(PathFiles, FailedTemporaryFileStopsTheCopyBeforeAnythingIsWritten) {
    Write("source.txt", "contents");
    ScopedFault const denied(FaultKind::TemporaryFile, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(
        DynamicPath(At("source.txt").c_str()).CopyTo(DynamicPath(At("t.txt").c_str()), false),
        TE_ACCESS_DENIED, "PathBase::CopyTo");
    EXPECT_TRUE(denied.Fired());
    EXPECT_FALSE(Has("t.txt"));
    EXPECT_EQ(NumEntries(), 1u);
}

TEST_F(PathFiles, AccessDeniedOnDeleteKeepsTheFile) {
    Write("busy.txt", "x");
    ScopedFault const denied(FaultKind::Delete, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(DynamicPath(At("busy.txt").c_str()).Delete(), TE_ACCESS_DENIED,
                     "PathBase::Delete",
                     ("Could not delete " + Quoted(At("busy.txt")) + ". Access denied.").c_str());
    EXPECT_EQ(Read("busy.txt"), "x");
}

TEST_F(PathFiles, FailedRenameDuringAMoveKeepsSourceAndTarget) {
    Write("a.txt", "A");
    Write("b.txt", "B");
    DynamicPath const a(At("a.txt").c_str());
    std::string const fresh =
        "Could not move " + Quoted(At("a.txt")) + " to " + Quoted(At("c.txt")) + ". Access denied.";
    ScopedFault const denied(FaultKind::Rename, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(a.MoveTo(DynamicPath(At("c.txt").c_str())), TE_ACCESS_DENIED,
                     "PathBase::MoveTo", fresh.c_str());
    EXPECT_EQ(Read("a.txt"), "A");
    EXPECT_EQ(Read("b.txt"), "B");
    EXPECT_FALSE(Has("c.txt"));
}

// Whichever call of a copy or a move fails, the operation is all or nothing: it raises the
// injected error and leaves both files as they were, or it is complete.
TEST_F(PathFiles, AnyFailedCallLeavesACopyOrMoveAllOrNothing) {
    FaultKind const kinds[] = {FaultKind::Open,  FaultKind::Stat,  FaultKind::TemporaryFile,
                               FaultKind::Read,  FaultKind::Write, FaultKind::Attributes,
                               FaultKind::Flush, FaultKind::Close, FaultKind::Rename,
                               FaultKind::Delete};
    DynamicPath const source(At("source.txt").c_str());
    DynamicPath const target(At("target.txt").c_str());
    auto const reset = [&] {
        fs::remove(At("source.txt"));
        Write("source.txt", "new");
        Write("target.txt", "old");
    };
    struct Operation {
        char const* name;
        std::function<void()> run;
        bool keepsSource;
    };
    Operation const operations[] = {
        {"copy", [&] { source.CopyTo(target, true); }, true},
        {"move", [&] { source.MoveToReplacing(target); }, false},
    };
    for (Operation const& operation : operations) {
        for (FaultKind const kind : kinds) {
            reset();
            std::uint32_t calls = 0;
            {
                ScopedFault const counter(kind, ScopedFault::kCountOnly);
                operation.run();
                calls = counter.Calls();
            }
            for (std::uint32_t nth = 1; nth <= calls; ++nth) {
                SCOPED_TRACE(::testing::Message() << operation.name << ", kind "
                                                  << static_cast<int>(kind) << ", call " << nth);
                reset();
                ScopedFault const fault(kind, nth, native::kAccessDenied);
                bool raised = false;
                try {
                    operation.run();
                } catch (TEException const& e) {
                    raised = true;
                    EXPECT_EQ(e.GetErrorCode(), TE_ACCESS_DENIED);
                }
                EXPECT_EQ(Read("target.txt"), raised ? "old" : "new");
                EXPECT_EQ(Has("source.txt"), raised || operation.keepsSource);
                if (Has("source.txt")) {
                    EXPECT_EQ(Read("source.txt"), "new");
                }
                EXPECT_EQ(NumEntries(), Has("source.txt") ? 2u : 1u);
            }
        }
    }
}

TEST_F(PathFiles, DirectoriesMadeBeforeAFailedLevelAreRemovedAgain) {
    auto const nested = [&](char const* prefix) {
        return At(prefix + std::string("1") + kHostSeparator + prefix + "2" + kHostSeparator +
                  prefix + "3");
    };
    std::uint32_t levels = 0; // the existing levels above the test directory count too
    {
        ScopedFault const counter(FaultKind::DirectoryCreate, ScopedFault::kCountOnly);
        DynamicPath(nested("m").c_str()).MakeAllDirectoriesInPathNameLong();
        levels = counter.Calls();
    }
    ASSERT_GE(levels, 3u);
    DynamicPath const path(nested("n").c_str());
    for (std::uint32_t level = 1; level <= levels; ++level) {
        SCOPED_TRACE(::testing::Message() << "level " << level);
        ScopedFault const full(FaultKind::DirectoryCreate, level, native::kDiskFull);
        EXPECT_RAISES_IN(path.MakeAllDirectoriesInPathNameLong(), TE_DISK_FULL,
                         "PathBase::MakeAllDirectoriesInPathNameLong");
        EXPECT_FALSE(Has("n1"));
    }
    ScopedFault const denied(FaultKind::Delete, 1, native::kAccessDenied);
    ScopedFault const full(FaultKind::DirectoryCreate, levels - 1, native::kDiskFull);
    EXPECT_RAISES(path.MakeAllDirectoriesInPathNameLong(), TE_DISK_FULL); // the first error
    EXPECT_TRUE(Has("n1"));                                               // its removal failed
}

TEST_F(PathFiles, AMoveAcrossVolumesCopiesThenRemovesTheSource) {
    Write("a.txt", "A");
    DynamicPath const a(At("a.txt").c_str());
    {
        ScopedFault const otherVolume(FaultKind::Rename, 1, native::kCrossDevice);
        a.MoveTo(DynamicPath(At("b.txt").c_str()));
    }
    EXPECT_FALSE(Has("a.txt"));
    EXPECT_EQ(Read("b.txt"), "A");

    // The source cannot be removed: the copy goes again and the source stays.
    Write("a.txt", "A");
    ScopedFault const otherVolume(FaultKind::Rename, 1, native::kCrossDevice);
    ScopedFault const denied(FaultKind::Delete, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(a.MoveTo(DynamicPath(At("c.txt").c_str())), TE_ACCESS_DENIED,
                     "PathBase::MoveTo");
    EXPECT_EQ(Read("a.txt"), "A");
    EXPECT_FALSE(Has("c.txt"));
}
