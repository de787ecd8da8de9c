// Searching: characters and texts, case-insensitive comparison and case changes, and the
// wildcard patterns.
#include "TextItems.h"
#include "support/MultiByteFixture.h"
#include "tekit/errors/TEException.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

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

using tekit::testing::Items;
using V = tekit::testing::Texts;

using MultiBytePattern = tekit::testing::MultiByteFixture;

bool Matches(char const* text, char const* pattern, bool ignoreCase = false) {
    StringVector wildcards;
    return DynamicString(text).MatchPattern(DynamicString(pattern), wildcards, ignoreCase);
}

V Wildcards(char const* text, char const* pattern) {
    StringVector wildcards{DynamicString("stale")};
    DynamicString(text).MatchPattern(DynamicString(pattern), wildcards, false);
    return Items(wildcards);
}

/// FindPatternEx's index and length.
std::pair<int, int> Find(char const* text, char const* pattern, int start, bool shortest) {
    int length = -1;
    int const index =
        DynamicString(text).FindPatternEx(pattern, start, false, shortest, &length, nullptr);
    return {index, length};
}

std::string Replaced(char const* text, char const* pattern, char const* replacement, bool shortest,
                     int expectedCount) {
    DynamicString s(text);
    EXPECT_EQ(s.ReplaceAllPatterns(pattern, replacement, false, shortest), expectedCount);
    return s.GetBufferReadPtr();
}

std::vector<int> Positions(char const* text, char const* find, bool ignoreCase) {
    std::vector<int> positions{42};
    DynamicString s(text);
    int const count = ignoreCase ? s.FindSubStringPositionsNoCase(find, positions)
                                 : s.FindSubStringPositions(find, positions);
    EXPECT_EQ(count, static_cast<int>(positions.size()));
    return positions;
}

TEST(Patterns, WildcardSetEscapeAndCaseSyntax) {
    struct Case {
        char const* text;
        char const* pattern;
        bool ignoreCase, matches;
    } const cases[] = {
        // clang-format off
        {"Step 1.seq", "Step ?.seq", false, true}, {"Step 12.seq", "Step ?.seq", false, false},
        {"main.c", "*.[ch]", false, true}, {"x", "[!a-c]", false, true},
        {"q", "[z-a]", false, true}, {"a*b", "a\\*b", false, true}, {"]", "[]]", false, true},
        {"-", "[a-]", false, true}, {"]", "[\\]]", false, true}, {"[a", "[a", false, true},
        {"a\\", "a\\", false, true}, {"a", "", false, false}, {"", "*", false, true},
        {"abc", "a**c", false, true}, {"MAIN.C", "main.[c]", true, true},
        {"A", "[!a]", true, false},
        // clang-format on
    };
    for (Case const& c : cases)
        EXPECT_EQ(Matches(c.text, c.pattern, c.ignoreCase), c.matches)
            << c.text << " ~ " << c.pattern;
}

TEST(Patterns, MatchReportsWhatEachWildcardMatched) {
    EXPECT_EQ(Wildcards("Step 12.seq", "Step *.seq"), V{"12"});
    EXPECT_EQ(Wildcards("ab-cd.x", "*-?[a-z].*"), (V{"ab", "c", "d", "x"}));
    EXPECT_EQ(Wildcards("a-b-c", "*-*"), (V{"a-b", "c"})); // the first star is greedy
    StringVector wildcards;
    EXPECT_EQ(DynamicString("xa1b2b").FindPatternEx("a*b", 0, false, true, nullptr, &wildcards), 1);
    EXPECT_EQ(Items(wildcards), V{"1"});
}

TEST(Patterns, FindTakesTheLeftmostMatchThenGreedyOrShortest) {
    EXPECT_EQ(Find("xa1b2b", "a*b", 0, false), std::make_pair(1, 5));
    EXPECT_EQ(Find("xa1b2b", "a*b", 0, true), std::make_pair(1, 3));
    EXPECT_EQ(Find("a1b a2b", "a?b", 1, false), std::make_pair(4, 3));
    EXPECT_EQ(Find("a1b a2b", "a?b", 8, false), std::make_pair(-1, 0));
    EXPECT_EQ(Find("a1b a2b", "", 0, false), std::make_pair(-1, 0));
    EXPECT_EQ(Find("a1b a2b", "*", 7, false), std::make_pair(7, 0)); // empty match at the end
    EXPECT_EQ(DynamicString("abc").FindPattern(nullptr), -1);
}

TEST(Patterns, SearchStaysFastOnPathologicalPatterns) {
    // Without the table of explored states this backtracks exponentially.
    EXPECT_EQ(DynamicString(std::string(3000, 'a').c_str()).FindPattern("*a*a*a*a*a*a*b"), -1);
}

TEST(Patterns, ReplaceAllInsertsWildcardReferences) {
    EXPECT_EQ(Replaced("k1=v1;k2=v2;", "*=*;", "\\2=\\1;", true, 2), "v1=k1;v2=k2;");
    EXPECT_EQ(Replaced("ab", "?", "[\\0]\\\\\\9\\q", false, 2), "[a]\\\\q[b]\\\\q");
    EXPECT_EQ(Replaced("ab", "*", "X", true, 0), "ab"); // empty matches replace nothing
    EXPECT_EQ(Replaced("ab", "*", "X", false, 1), "X");
    EXPECT_EQ(Replaced("aXbxc", "x", nullptr, false, 1), "aXbc");
}

TEST(SubStringPositions, NonOverlappingOccurrencesLeftToRight) {
    EXPECT_EQ(Positions("abcabcab", "abc", false), (std::vector<int>{0, 3}));
    EXPECT_EQ(Positions("aaaa", "aa", false), (std::vector<int>{0, 2}));
    EXPECT_EQ(Positions("ABcaBC", "abc", true), (std::vector<int>{0, 3}));
    EXPECT_EQ(Positions("abc", "", false), std::vector<int>{});
}

TEST_F(MultiBytePattern, DoubleByteCharactersAreOneCharacter) {
    UseShiftJis();
    EXPECT_EQ(Find("\x82\xA0\x82\xA2x", "?x", 0, false), std::make_pair(1, 2));
    EXPECT_TRUE(Matches("\x81\x5C", "\x81\x5C")); // the trail byte 0x5C is no escape
    EXPECT_TRUE(Matches("\x82\xA1", "[\x82\xA0-\x82\xA2]"));
    EXPECT_EQ(Positions("\x82\x61"
                        "a\x82\x61",
                        "a", false),
              std::vector<int>{1});
}

} // namespace
} // namespace tekit
