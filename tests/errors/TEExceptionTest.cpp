#include "tekit/errors/TEException.h"

#include "DebugCapture.h"

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

TEST(TEException, ConstructionKeepsEveryArgument) {
    TEException const e = Make("Bad count", TE_BAD_FILE_FORMAT);
    EXPECT_EQ(e.GetErrorCode(), TE_BAD_FILE_FORMAT);
    EXPECT_STREQ(e.GetDescription(), "Bad count");
    EXPECT_STREQ(e.GetFunctionName(), "OVMemoryStream::ReadInt");
    EXPECT_STREQ(e.GetAPIFunctionName(), "ReadFile");
    EXPECT_EQ(e.GetAPIErrorCode(), 6);
    EXPECT_STREQ(e.GetSource(), "Engine");
    EXPECT_STREQ(e.GetFileName(), "MemoryStream");
    EXPECT_EQ(e.GetLine(), 120);
    EXPECT_STREQ(e.GetCompilationDate(), "Aug 12 2021");
    EXPECT_STREQ(e.GetCompilationTime(), "18:30:26");
    DynamicString function;
    e.GetFunctionName(function);
    EXPECT_STREQ(function.GetBufferReadPtr(), "OVMemoryStream::ReadInt");
}

TEST(TEException, MissingDescriptionTakesTheCodesOwnMessage) {
    RString::ResetStrings();
    EXPECT_STREQ(Make(nullptr, TE_FILE_NOT_FOUND).GetDescription(), "File not found.");
    EXPECT_STREQ(Make("", TE_DISK_FULL).GetDescription(), "The disk is full.");
    DynamicString const empty;
    TEException const fromString(empty, "f", TE_DISK_FULL, false, nullptr, 0, nullptr, "x", 1, "d",
                                 "t");
    EXPECT_STREQ(fromString.GetDescription(), "The disk is full.");
    EXPECT_STREQ(Make(nullptr, TE_NO_ERROR).GetDescription(), ""); // success has no message
}

TEST(TEException, NullTextsBecomeEmpty) {
    TEException const e(nullptr, nullptr, TE_IO_ERROR, false, nullptr, 0, nullptr, nullptr, 0,
                        nullptr, nullptr);
    EXPECT_STREQ(e.GetSource(), "");
    EXPECT_STREQ(e.GetAPIFunctionName(), "");
    EXPECT_STREQ(e.GetFunctionName(), "");
    EXPECT_STREQ(e.GetFileName(), "");
    EXPECT_STREQ(e.GetCompilationDate(), "");
    TEException changed = e;
    changed.SetSource(static_cast<char const*>(nullptr));
    EXPECT_STREQ(changed.GetSource(), "");
}

TEST(TEException, CopiesAreIndependentValues) {
    TEException const original = Make("Original", TE_IO_ERROR);
    TEException copy = original;
    copy.SetDescription("Changed");
    copy.AppendToDescription(DynamicString(" later", true));
    copy.SetErrorCode(TE_DISK_FULL);
    TEException assigned;
    assigned = copy;
    copy.SetFunctionName(DynamicString("Other::Function", true));
    EXPECT_STREQ(original.GetDescription(), "Original");
    EXPECT_EQ(original.GetErrorCode(), TE_IO_ERROR);
    EXPECT_STREQ(assigned.GetDescription(), "Changed later");
    EXPECT_STREQ(assigned.GetFunctionName(), "OVMemoryStream::ReadInt");
}

TEST(TEException, DescriptionGrowsAtEitherEnd) {
    TEException e = Make("middle", TE_IO_ERROR);
    e.PrependToDescription(DynamicString("start ", true));
    e.AppendToDescription(DynamicString(" end", true));
    EXPECT_STREQ(e.GetDescription(), "start middle end");
}

TEST(TEException, ThirtyTwoBitFieldsReadTheSameOnEveryPlatform) {
    TEException e;
    e.SetAPIErrorCode(long(std::int32_t(0x80070005u)));
    EXPECT_EQ(e.GetAPIErrorCode(), std::int32_t(0x80070005u));
    e.SetWinHelpID(4000000000ul);
    EXPECT_EQ(e.GetWinHelpID(), 4000000000ul);
}

TEST(TEException, HelpFileIsCutAtTheWindowsPathLimit) {
    TEException e;
    std::string const longPath = "C:\\" + std::string(300, 'h');
    e.SetWinHelpFile(DynamicString(longPath.c_str(), true));
    EXPECT_EQ(std::string(e.GetWinHelpFile()), longPath.substr(0, 260));
    DynamicString helpFile;
    e.GetWinHelpFile(helpFile);
    EXPECT_EQ(helpFile.GetNumBytes(), 260);
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
         {"-17100 (TE_BAD_FILE_FORMAT)", "Bad count", "OVMemoryStream::ReadInt", "ReadFile",
          "Engine", "MemoryStream", "120", "Aug 12 2021", "18:30:26", "77", "help.chm"})
        EXPECT_NE(dump.find(part), std::string::npos) << part;

    DebugCapture capture;
    e.Debug("To the debug output", nullptr);
    EXPECT_EQ(capture.Text().rfind("To the debug output\n", 0), 0u);
    EXPECT_NE(capture.Text().find("Bad count"), std::string::npos);
}

TEST(TEException, DebugOnConstructionDumpsAtOnce) {
    DebugCapture capture;
    Make("quiet", TE_IO_ERROR, false);
    EXPECT_EQ(capture.Text(), "");
    Make("loud", TE_IO_ERROR, true);
    std::string const text = capture.Text();
    EXPECT_EQ(text.rfind("Debugging When Exception Constructed\n", 0), 0u);
    EXPECT_NE(text.find("loud"), std::string::npos);
}
