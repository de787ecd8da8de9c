#include "tekit/errors/TEException.h"

#include "support/DebugCapture.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <sstream>
#include <string>

using namespace tekit;
using tekit::testing::DebugCapture;

namespace {

TEException Make(char const* description, TEError code, bool debug = false) {
    return TEException(description, "OVMemoryStream::ReadInt", code, debug, "ReadFile", 6, "Engine",
                       "MemoryStream", 120, "Aug 12 2021", "18:30:26");
}

} // namespace

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
