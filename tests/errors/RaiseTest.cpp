#include "tekit/errors/Raise.h"

#include "DebugCapture.h"
#include "tekit/errors/TEException.h"

#include <gtest/gtest.h>

#include <functional>
#include <regex>
#include <stdexcept>
#include <string>

using namespace tekit;
using tekit::testing::DebugCapture;
using tekit::testing::DiagnosticLevelScope;

namespace {

/// The exception that `raise` throws; fails the test when it throws nothing.
TEException Caught(std::function<void()> const& raise) {
    try {
        raise();
    } catch (TEException const& e) {
        return e;
    }
    ADD_FAILURE() << "nothing was raised";
    return TEException();
}

class Raising : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
};

} // namespace

TEST_F(Raising, MacroRecordsTheSitesFileLineAndBuildStamp) {
    long line = 0;
    TEException const e = Caught([&] {
        line = __LINE__ + 1;
        TE_RAISE(TE_INDEX_OUT_OF_RANGE, "Index 7 is past the end", "OVMemoryStream::Seek");
    });
    EXPECT_EQ(e.GetErrorCode(), TE_INDEX_OUT_OF_RANGE);
    EXPECT_STREQ(e.GetDescription(), "Index 7 is past the end");
    EXPECT_STREQ(e.GetFunctionName(), "OVMemoryStream::Seek");
    EXPECT_STREQ(e.GetFileName(), "RaiseTest");
    EXPECT_EQ(e.GetLine(), line);
    EXPECT_STREQ(e.GetAPIFunctionName(), "");
    EXPECT_EQ(e.GetAPIErrorCode(), 0);
    EXPECT_STREQ(e.GetSource(), "");
    EXPECT_TRUE(
        std::regex_match(e.GetCompilationDate(), std::regex("[A-Z][a-z]{2} [ 1-3][0-9] [0-9]{4}")))
        << e.GetCompilationDate();
    EXPECT_TRUE(std::regex_match(e.GetCompilationTime(), std::regex("[0-9]{2}:[0-9]{2}:[0-9]{2}")))
        << e.GetCompilationTime();

    TEException const api =
        Caught([] { TE_RAISE_API(TE_IO_ERROR, nullptr, "OVBinaryFileStream::Read", "read", 5); });
    EXPECT_STREQ(api.GetAPIFunctionName(), "read");
    EXPECT_EQ(api.GetAPIErrorCode(), 5);
    EXPECT_STREQ(api.GetDescription(), "File input/output error.");
}

TEST_F(Raising, AssertionKeepsItsTextOnlyAboveDiagnosticLevelZero) {
    auto const assertion = [] {
        RaiseTEAssertion("index < size", "Cache::Get", TE_PROGRAM_ERROR, false, nullptr, 0, nullptr,
                         "Cache", 42, "Jan  1 2024", "00:00:00");
    };
    auto const fromString = [] {
        RaiseTEAssertion(DynamicString("index < size", true), "Cache::Get", TE_PROGRAM_ERROR, false,
                         nullptr, 0, nullptr, "Cache", 42, "Jan  1 2024", "00:00:00");
    };
    {
        DiagnosticLevelScope level(0);
        EXPECT_STREQ(Caught(assertion).GetDescription(), "Program error.");
        EXPECT_STREQ(Caught(fromString).GetDescription(), "Program error.");
        TEException const e = Caught([] { TE_ASSERT(1 == 2, "Cache::Get"); });
        EXPECT_STREQ(e.GetDescription(), "Program error.");
        EXPECT_STREQ(e.GetFunctionName(), "Cache::Get");
        EXPECT_STREQ(e.GetFileName(), "RaiseTest");
    }
    {
        DiagnosticLevelScope level(1);
        TEException const e = Caught(assertion);
        EXPECT_STREQ(e.GetDescription(), "index < size");
        EXPECT_EQ(e.GetLine(), 42);
        EXPECT_STREQ(Caught(fromString).GetDescription(), "index < size");
        EXPECT_STREQ(Caught([] { TE_ASSERT(1 == 2, "Cache::Get"); }).GetDescription(),
                     "Assertion failed: 1 == 2");
    }
}

TEST_F(Raising, SystemErrorsBecomeTheirTEErrorWithTheSystemsText) {
    TEException const denied =
        Caught([] { RaiseTESystemException(5, "Registry", 17, "Jan  1 2024", "00:00:00"); });
    EXPECT_EQ(denied.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(denied.GetAPIErrorCode(), 5);
    EXPECT_STREQ(denied.GetAPIFunctionName(), "");
    EXPECT_STREQ(denied.GetFileName(), "Registry");
    EXPECT_EQ(denied.GetLine(), 17);
    EXPECT_GT(std::string(denied.GetDescription()).size(), 0u);

    TEException const other = Caught(
        [] { RaiseTESystemException(0x8000FFFFu, "Registry", 18, "Jan  1 2024", "00:00:00"); });
    EXPECT_EQ(other.GetErrorCode(), TE_OS_EXCEPTION);
    EXPECT_EQ(other.GetAPIErrorCode(), std::int32_t(0x8000FFFFu));
    EXPECT_GT(std::string(other.GetDescription()).size(), 0u);
}

TEST_F(Raising, ThrowHelpersRaiseTheirCodeWithTheCodesMessage) {
    TEException const error = Caught([] { ThrowTEError(TE_DISK_FULL); });
    EXPECT_EQ(error.GetErrorCode(), TE_DISK_FULL);
    EXPECT_STREQ(error.GetDescription(), "The disk is full.");
    EXPECT_STREQ(error.GetFunctionName(), "ThrowTEError");

    TEException const memory = Caught([] { ThrowOutOfMemory(); });
    EXPECT_EQ(memory.GetErrorCode(), TE_OUT_OF_MEMORY);
    EXPECT_STREQ(memory.GetDescription(), "Out of memory.");
    EXPECT_STREQ(memory.GetFunctionName(), "ThrowOutOfMemory");
}

TEST_F(Raising, SizeOverflowNamesTheSignednessOfTheLimit) {
    TEException const unsignedLimit = Caught(
        [] { Throw32BitOverflowException("OVMemoryStream::Grow", "MemoryStream", 88, false); });
    EXPECT_EQ(unsignedLimit.GetErrorCode(), TE_UINT32_OVERFLOW);
    EXPECT_EQ(unsignedLimit.GetErrorCode(), -17011);
    EXPECT_STREQ(unsignedLimit.GetDescription(), "32-BIT SIZE LIMITATION.");
    EXPECT_STREQ(unsignedLimit.GetFunctionName(), "OVMemoryStream::Grow");
    EXPECT_STREQ(unsignedLimit.GetFileName(), "MemoryStream");
    EXPECT_EQ(unsignedLimit.GetLine(), 88);

    TEException const signedLimit =
        Caught([] { Throw32BitOverflowException("f", "file", 1, true); });
    EXPECT_EQ(signedLimit.GetErrorCode(), -17010);
    EXPECT_STREQ(signedLimit.GetDescription(), "32-BIT SIZE LIMITATION.");
}

TEST(Warnings, AreWrittenInTwoOrThreeLinesAboveLevelZeroOnly) {
    DebugCapture capture;
    {
        DiagnosticLevelScope level(0);
        ReportTEWarning("ignored", "F", "api", 1, "file", 2, "d", "t");
        EXPECT_EQ(capture.Text(), "");
    }
    DiagnosticLevelScope level(1);
    ReportTEWarning("Cache is cold", "Cache::Get", nullptr, 0, "Cache", 31, "Aug 12 2021",
                    "18:30:26");
    EXPECT_EQ(capture.Text(), "WARNING! 'Cache is cold' Line 31 in function Cache::Get in file "
                              "Cache\nCompilation Date: Aug 12 2021 Compilation Time: 18:30:26\n");

    DebugCapture withApi;
    ReportTEWarning("Close failed", "File::Close", "CloseHandle", -6, "File", 9, "Aug 12 2021",
                    "18:30:26");
    EXPECT_EQ(withApi.Text(),
              "WARNING! 'Close failed' Line 9 in function File::Close in file File\n"
              "Compilation Date: Aug 12 2021 Compilation Time: 18:30:26\n"
              "API Function: CloseHandle, API Error Code: -6\n");
}

namespace {

/// Destructors must not throw: they hand what they caught to HandleDestructorException.
struct Guard {
    std::function<void()> cleanup;
    ~Guard() {
        try {
            cleanup();
        } catch (...) {
            TEException::HandleDestructorException("Guard::~Guard", "Guard", 7, "Aug 12 2021",
                                                   "18:30:26");
        }
    }
};

std::string ReportOf(std::function<void()> const& cleanup) {
    DebugCapture capture;
    EXPECT_NO_THROW({ Guard guard{cleanup}; });
    return capture.Text();
}

} // namespace

TEST(DestructorExceptions, AreReportedAsWarningsAtAnyLevelAndNeverRethrown) {
    DiagnosticLevelScope level(0);
    std::string const te = ReportOf([] {
        TE_RAISE_API(TE_UNABLE_TO_CLOSE_FILE, "Handle lost", "File::Close", "CloseHandle", 6);
    });
    EXPECT_EQ(te.rfind("WARNING! 'Exception caught in destructor: Handle lost", 0), 0u) << te;
    for (char const* part : {"-17213", "File::Close", "RaiseTest",
                             "' Line 7 in function Guard::~Guard in file Guard\n",
                             "API Function: CloseHandle, API Error Code: 6\n"})
        EXPECT_NE(te.find(part), std::string::npos) << part;

    std::string const standard = ReportOf([] { throw std::runtime_error("disk gone"); });
    EXPECT_NE(standard.find("'Exception caught in destructor: disk gone'"), std::string::npos);

    std::string const other = ReportOf([] { throw 42; });
    EXPECT_NE(other.find("'Exception caught in destructor: unknown exception'"), std::string::npos);

    DebugCapture capture;
    TEException::HandleDestructorException("f", "file", 1, "d", "t"); // outside any catch
    EXPECT_NE(capture.Text().find("unknown exception"), std::string::npos);
}
