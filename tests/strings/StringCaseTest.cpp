#include "TextItems.h"
#include "support/MultiByteFixture.h"

#include "tekit/errors/TEException.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <string>

namespace tekit {
namespace {

using MultiByteCase = testing::MultiByteFixture;

using testing::Text;

TEST(StringCase, OnlyAsciiLettersChangeAndRangesAreClamped) {
    DynamicString s("aBc-\xE4\xC4z");
    s.SetUppercase();
    EXPECT_EQ(Text(s), "ABC-\xE4\xC4Z");
    s.SetLowercase(-5, 2);
    EXPECT_EQ(Text(s), "abC-\xE4\xC4Z");
    s.SetLowercase(3, -1);
    EXPECT_EQ(Text(s), "abC-\xE4\xC4z");
}

TEST(StringCase, TextAlreadyInTheWantedCaseStaysShared) {
    DynamicString a("ALREADY UPPER 123");
    DynamicString b(a);
    b.SetUppercase();
    b.SetLowercase(13, -1);
    EXPECT_EQ(b.GetCopyOnWriteMemory(), a.GetCopyOnWriteMemory());
    b.SetLowercase();
    EXPECT_EQ(Text(b), "already upper 123");
}

TEST_F(MultiByteCase, TrailBytesThatLookLikeLettersAreLeftAlone) {
    DynamicString s("\x83\x61z");
    s.SetUppercase();
    EXPECT_EQ(Text(s), "\x83\x41Z"); // single-byte mode: every byte is a character
    UseShiftJis();
    s.Assign("\x83\x61zz");
    s.SetUppercase(0, 2); // the double-byte character and one "z"
    EXPECT_EQ(Text(s), "\x83\x61Zz");
}

TEST(StringShape, ReverseAndRepeat) {
    DynamicString s("abc");
    s.Reverse();
    s.Repeat(3);
    EXPECT_EQ(Text(s), "cbacbacba");
    s.Repeat(0);
    EXPECT_EQ(Text(s), "");

    StaticString<64> fixed("abc");
    fixed.Repeat(30);
    EXPECT_EQ(Text(fixed).substr(57), "abcabca");
}

TEST(StringShape, RepeatBeyondThirtyTwoBitsRaisesInsteadOfWrapping) {
    DynamicString s("abcd");
    try {
        s.Repeat(INT_MAX / 2);
        FAIL() << "no exception";
    } catch (TEException const& e) {
        EXPECT_EQ(e.GetErrorCode(), TE_INT32_OVERFLOW);
    }
    EXPECT_EQ(Text(s), "abcd");
}

TEST_F(MultiByteCase, ReverseAndRepeatKeepDoubleByteCharactersWhole) {
    UseShiftJis();
    DynamicString s("a\x82\xA0"
                    "b\x82\xA2");
    s.Reverse();
    EXPECT_EQ(Text(s), "\x82\xA2"
                       "b\x82\xA0"
                       "a");

    StaticString<64> fixed("\x82\xA0"
                           "a");
    fixed.Repeat(30); // 90 bytes; byte 64 would be the lead byte of the 22nd copy
    EXPECT_EQ(Text(fixed).size(), 63u);
}

} // namespace
} // namespace tekit
