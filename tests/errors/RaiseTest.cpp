// TEException and raising it: the fields, the raise macros and helpers, warnings.
#include "tekit/errors/Raise.h"
#include "support/DebugCapture.h"
#include "support/Raises.h"
#include "tekit/errors/TEException.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <string>

namespace tekit {
namespace {
using tekit::testing::DebugCapture;
using tekit::testing::DiagnosticLevelScope;
using tekit::testing::Raised;

class Raising : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
};

TEST_F(Raising, MacroRecordsTheSitesFileLineAndBuildStamp) {
    long line = 0;
    TEException const e = Raised([&] {
        line = __LINE__ + 1;
        TE_RAISE(TE_INDEX_OUT_OF_RANGE, "Index 7 is past the end", "OVMemoryStream::Seek");
    });
    EXPECT_EQ(e.GetErrorCode(), TE_INDEX_OUT_OF_RANGE);
    EXPECT_STREQ(e.GetDescription(), "Index 7 is past the end");
    EXPECT_STREQ(e.GetFunctionName(), "OVMemoryStream::Seek");
    EXPECT_STREQ(e.GetFileName(), "RaiseTest");
    EXPECT_EQ(e.GetLine(), line);
    EXPECT_TRUE(
        std::regex_match(e.GetCompilationDate(), std::regex("[A-Z][a-z]{2} [ 1-3][0-9] [0-9]{4}")))
        << e.GetCompilationDate();
    EXPECT_TRUE(std::regex_match(e.GetCompilationTime(), std::regex("[0-9]{2}:[0-9]{2}:[0-9]{2}")))
        << e.GetCompilationTime();

    TEException const api =
        Raised([] { TE_RAISE_API(TE_IO_ERROR, nullptr, "OVBinaryFileStream::Read", "read", 5); });
    EXPECT_EQ(api.GetAPIErrorCode(), 5);
    EXPECT_STREQ(api.GetDescription(), "File input/output error.");
}

TEST_F(Raising, AssertionKeepsItsTextOnlyAboveDiagnosticLevelZero) {
    auto const fromText = [] {
        RaiseTEAssertion("index < size", "Cache::Get", TE_PROGRAM_ERROR, false, nullptr, 0, nullptr,
                         "Cache", 42, "Jan  1 2024", "00:00:00");
    };
    auto const fromString = [] {
        RaiseTEAssertion(DynamicString("index < size", true), "Cache::Get", TE_PROGRAM_ERROR, false,
                         nullptr, 0, nullptr, "Cache", 42, "Jan  1 2024", "00:00:00");
    };
    for (int level : {0, 1}) {
        DiagnosticLevelScope scope(level);
        char const* const text = level > 0 ? "index < size" : "Program error.";
        EXPECT_RAISES_IN(fromText(), TE_PROGRAM_ERROR, "Cache::Get", text);
        EXPECT_RAISES_IN(fromString(), TE_PROGRAM_ERROR, "Cache::Get", text);
        EXPECT_RAISES_IN(TE_ASSERT(1 == 2, "Cache::Get"), TE_PROGRAM_ERROR, "Cache::Get",
                         level > 0 ? "Assertion failed: 1 == 2" : "Program error.");
    }
}

TEST_F(Raising, SystemErrorsBecomeTheirTEErrorWithTheSystemsText) {
    TEException const denied =
        Raised([] { RaiseTESystemException(5, "Registry", 17, "Jan  1 2024", "00:00:00"); });
    EXPECT_EQ(denied.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_EQ(denied.GetAPIErrorCode(), 5);
    EXPECT_STREQ(denied.GetFileName(), "Registry");

    TEException const other = Raised(
        [] { RaiseTESystemException(0x8000FFFFu, "Registry", 18, "Jan  1 2024", "00:00:00"); });
    EXPECT_EQ(other.GetErrorCode(), TE_OS_EXCEPTION);
    EXPECT_GT(std::string(other.GetDescription()).size(), 0u);
}

TEST_F(Raising, ThrowHelpersRaiseTheirCodeWithTheCodesMessage) {
    EXPECT_RAISES_IN(ThrowTEError(TE_DISK_FULL), TE_DISK_FULL, "ThrowTEError", "The disk is full.");
    EXPECT_RAISES_IN(ThrowOutOfMemory(), TE_OUT_OF_MEMORY, "ThrowOutOfMemory", "Out of memory.");
    // The size limit names its signedness by its code.
    EXPECT_RAISES_IN(Throw32BitOverflowException("f", "file", 1, false), TE_UINT32_OVERFLOW, "f",
                     "32-BIT SIZE LIMITATION.");
    EXPECT_RAISES_IN(Throw32BitOverflowException("f", "file", 1, true), TE_INT32_OVERFLOW, "f",
                     "32-BIT SIZE LIMITATION.");
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

TEST(DestructorExceptions, AreReportedAsWarningsAtAnyLevelAndNeverRethrown) {
    DiagnosticLevelScope level(0);
    std::string const te = ReportOf([] {
        TE_RAISE_API(TE_UNABLE_TO_CLOSE_FILE, "Handle lost", "File::Close", "CloseHandle", 6);
    });
    EXPECT_EQ(te.rfind("WARNING! 'Exception caught in destructor: Handle lost", 0), 0u) << te;
    for (char const* part : {"-17213", "' Line 7 in function Guard::~Guard in file Guard\n",
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

TEException Make(char const* description, TEError code, bool debug = false) {
    return TEException(description, "OVMemoryStream::ReadInt", code, debug, "ReadFile", 6, "Engine",
                       "MemoryStream", 120, "Aug 12 2021", "18:30:26");
}

TEST(TEException, NullTextsBecomeEmpty) {
    TEException const e(nullptr, nullptr, TE_IO_ERROR, false, nullptr, 0, nullptr, nullptr, 0,
                        nullptr, nullptr);
    for (char const* text : {e.GetSource(), e.GetAPIFunctionName(), e.GetFunctionName(),
                             e.GetFileName(), e.GetCompilationDate(), e.GetCompilationTime()})
        EXPECT_STREQ(text, "");
}

TEST(TEException, MissingDescriptionTakesTheCodesOwnMessage) {
    RString::ResetStrings();
    EXPECT_STREQ(Make(nullptr, TE_FILE_NOT_FOUND).GetDescription(), "File not found.");
    TEException const fromString(DynamicString(), "f", TE_DISK_FULL, false, nullptr, 0, nullptr,
                                 "x", 1, "d", "t");
    EXPECT_STREQ(fromString.GetDescription(), "The disk is full.");
    EXPECT_STREQ(Make(nullptr, TE_NO_ERROR).GetDescription(), ""); // success has no message
}

TEST(TEException, CopiesAreIndependentValuesAndTheDescriptionGrowsAtEitherEnd) {
    TEException const original = Make("middle", TE_IO_ERROR);
    TEException copy = original;
    copy.PrependToDescription(DynamicString("start ", true));
    copy.AppendToDescription(DynamicString(" end", true));
    copy.SetErrorCode(TE_DISK_FULL);
    TEException assigned;
    assigned = copy;
    copy.SetFunctionName(DynamicString("Other::Function", true));
    EXPECT_STREQ(original.GetDescription(), "middle");
    EXPECT_STREQ(assigned.GetDescription(), "start middle end");
    DynamicString function;
    assigned.GetFunctionName(function);
    EXPECT_STREQ(function.GetBufferReadPtr(), "OVMemoryStream::ReadInt");
}

TEST(TEException, ThirtyTwoBitFieldsAndTheHelpFileKeepTheirWindowsLimits) {
    TEException e;
    e.SetAPIErrorCode(long(std::int32_t(0x80070005u)));
    EXPECT_EQ(e.GetAPIErrorCode(), std::int32_t(0x80070005u));
    std::string const longPath = "C:\\" + std::string(300, 'h');
    e.SetWinHelpFile(DynamicString(longPath.c_str(), true));
    DynamicString helpFile;
    e.GetWinHelpFile(helpFile);
    EXPECT_EQ(std::string(helpFile.GetBufferReadPtr()), longPath.substr(0, 260));
}

TEST(TEException, DebugDumpShowsEveryField) {
    TEException e = Make("Bad count", TE_BAD_FILE_FORMAT);
    e.SetWinHelpID(77);
    e.SetWinHelpFile(DynamicString("help.chm", true));
    std::ostringstream out;
    e.Debug("Dump", &out);
    std::string const dump = out.str();
    EXPECT_EQ(dump.rfind("Dump\n", 0), 0u);
    for (char const* part :
         {"-17100 (TE_BAD_FILE_FORMAT)", "Bad count", "ReadFile", "Engine", "18:30:26", "help.chm"})
        EXPECT_NE(dump.find(part), std::string::npos) << part;

    DebugCapture capture;
    e.Debug("To the debug output", nullptr);
    Make("quiet", TE_IO_ERROR, false);
    EXPECT_EQ(capture.Text().rfind("To the debug output\n", 0), 0u);
    EXPECT_EQ(capture.Text().find("quiet"), std::string::npos);
    DebugCapture onConstruction;
    Make("loud", TE_IO_ERROR, true);
    EXPECT_EQ(onConstruction.Text().rfind("Debugging When Exception Constructed\n", 0), 0u);
}

} // namespace
} // namespace tekit
