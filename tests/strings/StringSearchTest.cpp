#include "support/MultiByteFixture.h"

#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

namespace tekit {
namespace {

using MultiByteSearch = testing::MultiByteFixture;

TEST(StringSearch, CharacterSearchClampsItsStart) {
    DynamicString s("a,b,c");
    EXPECT_EQ(s.FindChar(',', 2), 3);
    EXPECT_EQ(s.FindChar(',', -7), 1);
    EXPECT_EQ(s.FindChar(0), -1);
    EXPECT_EQ(s.FindCharReverse(',', 2), 1);
    EXPECT_EQ(s.FindCharReverse(',', 99), 3);
    EXPECT_EQ(DynamicString().FindCharReverse('a'), -1);
}

TEST(StringSearch, SubstringSearchFoldsAsciiLettersOnly) {
    DynamicString s("Hello World, hello \xC4pfel");
    EXPECT_EQ(s.FindSubstring("HELLO", 1, true), 13);
    EXPECT_EQ(s.FindSubstring("\xE4pfel", 0, true), -1); // bytes above 127 never fold
    EXPECT_EQ(s.FindSubstring(""), -1);
    EXPECT_EQ(s.FindSubstring(s), 0);
    EXPECT_FALSE(DynamicString("Hell").ContainsSubstring("Hello"));
    EXPECT_EQ(DynamicString("aaaa").GetNumOccurrences("AA", true), 2);
}

TEST(StringSearch, PrefixesSuffixesSetsAndControlCharacters) {
    StaticString<64> s("Report.TXT");
    EXPECT_TRUE(s.StartsWith("rep", true));
    EXPECT_FALSE(s.EndsWith(".txt"));
    EXPECT_TRUE(s.StartsWith(nullptr));
    EXPECT_FALSE(s.EndsWith("xReport.TXT"));
    EXPECT_EQ(s.FindCharInSet(".T", 2), 6);
    EXPECT_EQ(s.FindCharInSet(nullptr), -1);
    EXPECT_TRUE(DynamicString("a\x7F").ContainsCntrlChar());
    EXPECT_FALSE(DynamicString("\x80\xFF").ContainsCntrlChar());
}

TEST(StringSearch, WhiteSpaceSkippingCoversTheSixBlankCharacters) {
    DynamicString s(" \t\r\n\v\fword  next");
    EXPECT_EQ(s.SkipWhiteSpace(-3), 6);
    EXPECT_EQ(s.SkipNonWhiteSpace(6), 10);
    EXPECT_EQ(s.SkipNonWhiteSpace(12), 16);
    EXPECT_EQ(s.SkipWhiteSpace(40), 16);
}

// "\x83\x41" is one Shift-JIS character whose trail byte is the letter 'A'.
TEST_F(MultiByteSearch, NothingIsFoundInsideADoubleByteCharacter) {
    UseShiftJis();
    DynamicString s("\x83\x41"
                    "bA\x82\xA0"
                    "c");
    EXPECT_EQ(s.FindChar('A'), 2);
    EXPECT_EQ(s.FindChar('c'), 4); // a character index, not the byte offset 6
    EXPECT_EQ(s.FindCharReverse('A'), 2);
    EXPECT_EQ(s.FindSubstring("Ab", 0, true), -1);
    EXPECT_EQ(s.GetNumOccurrences("A"), 1);
    EXPECT_EQ(s.FindCharInSet("\x82\xA0"), 3);
    EXPECT_FALSE(DynamicString("x\x83\x41").EndsWith("A"));
    EXPECT_EQ(DynamicString("\x82\xA0 \x82\xA2").SkipWhiteSpace(1), 2);
}

TEST_F(MultiByteSearch, IgnoringCaseNeverFoldsATrailByte) {
    UseShiftJis();
    DynamicString s("\x83\x61"); // trail byte 'a'
    EXPECT_EQ(s.FindSubstring("\x83\x41", 0, true), -1);
    EXPECT_FALSE(s.StartsWith("\x83\x41", true));
}

} // namespace
} // namespace tekit
