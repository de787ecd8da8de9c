// The fault seam: which calls an armed kind fails, that disarming restores the real calls, and
// that an injected failure changes nothing on the file system.
#include "platform/File.h"
#include "support/FaultInjection.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <random>
#include <string>
#include <thread>
#include <vector>

namespace tekit::platform {
namespace {

using testing::ScopedFault;
namespace fs = std::filesystem;

class FaultSeam : public ::testing::Test {
protected:
    void SetUp() override {
        m_root =
            fs::temp_directory_path() / ("tekit-fault-" + std::to_string(std::random_device{}()));
        fs::create_directories(m_root);
        m_file = (m_root / "file.txt").string();
        std::ofstream(m_file, std::ios::binary) << "contents";
    }
    void TearDown() override {
        DisarmAllFaults();
        std::error_code ignored;
        fs::remove_all(m_root, ignored);
    }

    /// Which of `calls` queries of the file failed (1-based), with the errors they reported.
    std::vector<int> FailingQueries(int calls, std::vector<SystemError>* errors = nullptr) const {
        std::vector<int> failed;
        for (int call = 1; call <= calls; ++call) {
            FileInfo info;
            if (SystemError const error = QueryFile(m_file.c_str(), info)) {
                failed.push_back(call);
                if (errors)
                    errors->push_back(error);
            }
        }
        return failed;
    }

    fs::path m_root;
    std::string m_file;
};

TEST_F(FaultSeam, FailsExactlyThePlannedCallsOfTheArmedKind) {
    struct Case {
        std::uint32_t nth;
        bool sticky;
        std::vector<int> failing;
    };
    Case const cases[] = {
        {1, false, {1}},
        {3, false, {3}},
        {2, true, {2, 3, 4, 5}},
        {6, false, {}}, // never reached
        {ScopedFault::kCountOnly, false, {}},
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(::testing::Message() << "nth " << c.nth << (c.sticky ? " sticky" : ""));
        ScopedFault const fault(FaultKind::Stat, c.nth, native::kAccessDenied, c.sticky);
        std::vector<SystemError> errors;
        EXPECT_EQ(FailingQueries(5, &errors), c.failing);
        EXPECT_EQ(fault.Calls(), 5u);
        for (SystemError const& error : errors) {
            EXPECT_EQ(error.code, native::kAccessDenied);
            ASSERT_NE(error.apiFunction, nullptr);
            EXPECT_NE(std::string(error.apiFunction), "");
        }
        // Other kinds pass while this one is armed.
        NativeFile file = kNoFile;
        ASSERT_FALSE(OpenFileForReading(m_file.c_str(), file));
        EXPECT_FALSE(CloseFile(file));
    }
}

TEST_F(FaultSeam, DisarmingRestoresTheRealCallsAndKeepsTheCount) {
    {
        ScopedFault const fault(FaultKind::Stat, 1, native::kAccessDenied, true);
        EXPECT_EQ(FailingQueries(2), (std::vector<int>{1, 2}));
    }
    EXPECT_TRUE(FailingQueries(2).empty());
    EXPECT_EQ(FaultCallCount(FaultKind::Stat), 2u); // counting stopped at disarming

    ArmFault(FaultKind::Stat, 1, native::kAccessDenied, true);
    ArmFault(FaultKind::Open, 1, native::kAccessDenied, true);
    DisarmAllFaults();
    EXPECT_TRUE(FailingQueries(1).empty());
    NativeFile file = kNoFile;
    ASSERT_FALSE(OpenFileForReading(m_file.c_str(), file));
    CloseFile(file);
}

TEST_F(FaultSeam, AnInjectedFailureChangesNothingOnTheFileSystem) {
    {
        ScopedFault const fault(FaultKind::Delete, 1, native::kSharingViolation);
        SystemError const error = RemoveFileOrDirectory(m_file.c_str());
        EXPECT_EQ(error.code, native::kSharingViolation);
        EXPECT_TRUE(fs::exists(m_file));
    }
    {
        ScopedFault const fault(FaultKind::Rename, 1, native::kAccessDenied);
        std::string const renamed = (m_root / "renamed.txt").string();
        EXPECT_EQ(RenameFile(m_file.c_str(), renamed.c_str(), true).code, native::kAccessDenied);
        EXPECT_TRUE(fs::exists(m_file));
        EXPECT_FALSE(fs::exists(renamed));
    }
    {
        ScopedFault const fault(FaultKind::DirectoryCreate, 1, native::kDiskFull);
        std::string const directory = (m_root / "made").string();
        bool created = true;
        EXPECT_EQ(MakeDirectory(directory.c_str(), created).code, native::kDiskFull);
        EXPECT_FALSE(created);
        EXPECT_FALSE(fs::exists(directory));
    }
    std::string created;
    NativeFile file = kNoFile;
    ASSERT_FALSE(CreateUniqueFile((m_root / "x").string().c_str(), "w", created, &file));
    {
        ScopedFault const fault(FaultKind::Write, 1, native::kDiskFull);
        EXPECT_EQ(WriteToFile(file, "abc", 3).code, native::kDiskFull);
        EXPECT_FALSE(WriteToFile(file, "de", 2)); // once only
    }
    EXPECT_FALSE(CloseFile(file));
    EXPECT_EQ(fs::file_size(created), 2u);
}

TEST_F(FaultSeam, CountsTheCallsOfEveryThread) {
    ScopedFault const counter(FaultKind::Stat, ScopedFault::kCountOnly);
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t)
        threads.emplace_back([this] { FailingQueries(50); });
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(counter.Calls(), 200u);
}

} // namespace
} // namespace tekit::platform
