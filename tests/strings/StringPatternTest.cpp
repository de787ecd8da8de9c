#include "tekit/strings/DynamicString.h"

#include "strings/TextItems.h"
#include "support/MultiByteFixture.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

using namespace tekit;
using tekit::testing::Items;
using V = tekit::testing::Texts;

namespace {

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

} // namespace

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
