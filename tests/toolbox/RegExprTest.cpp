// The pattern engine's flat interface: errors and their order, the dialect, sets and case,
// line breaks, backward search, match policies, multibyte text and hostile input.
#include "tekit/toolbox/RegExpr.h"

#include "support/MultiByteFixture.h"
#include "tekit/errors/RString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <tuple>

namespace tekit {
namespace {

struct Outcome {
    int rc = 0;
    int found = 0;
    int position = -1;
    int length = -1;
    char bad = 0;
};

struct Options {
    int start = 0;
    bool forward = true;
    int policy = REGEXPR_MATCH_FIRST;
    bool caseSensitive = true;
    int length = -1;
};

Outcome Find(char const* pattern, char const* text, Options options = {}) {
    Outcome o;
    o.rc = RegExpr_FindPatternInText(pattern, options.caseSensitive ? 1 : 0, text, options.length,
                                     options.start, options.forward ? 1 : 0, options.policy,
                                     &o.found, &o.position, &o.length, &o.bad);
    return o;
}

Options Backward(int start, int policy = REGEXPR_MATCH_LONGEST) {
    return {start, false, policy};
}

struct ErrorCase {
    char const* pattern;
    int code;
    char bad;
};

void ExpectErrors(std::initializer_list<ErrorCase> cases) {
    for (ErrorCase const& c : cases) {
        Outcome const o = Find(c.pattern, "text");
        EXPECT_EQ(std::tuple(o.rc, o.bad, o.found, o.position, o.length),
                  std::tuple(c.code, c.bad, 0, -1, -1))
            << c.pattern;
    }
}

TEST(RegExprTest, LexicalErrorsComeFirstInReadingOrderWithTheirCharacter) {
    ExpectErrors({
        // clang-format off
        {"]", REGEXPR_UNMATCHED_CHAR, ']'}, {"a}", REGEXPR_UNMATCHED_CHAR, '}'},
        {"[a", REGEXPR_UNMATCHED_CHAR, '['}, {"[a[b]", REGEXPR_INVALID_CHAR_IN_RANGE, '['},
        {"[-a]", REGEXPR_INVALID_CHAR_IN_RANGE, '-'}, {"[a-]", REGEXPR_INVALID_CHAR_IN_RANGE, ']'},
        {"ab\\", REGEXPR_END_WITH_BACKSLASH, 0}, {"\\x4", REGEXPR_INVALID_HEX_VALUE, 0},
        {"", REGEXPR_EMPTY_INPUT_STRING, 0},
        // The first problem in reading order wins; the end-of-pattern checks come last, and
        // structural and set errors only after the whole pattern is read.
        {"{]", REGEXPR_UNMATCHED_CHAR, ']'}, {"[a\\", REGEXPR_END_WITH_BACKSLASH, 0},
        {"*]", REGEXPR_UNMATCHED_CHAR, ']'}, {"[9-0]}", REGEXPR_UNMATCHED_CHAR, '}'},
        {"{[a-]", REGEXPR_INVALID_CHAR_IN_RANGE, ']'},
        // clang-format on
    });
    EXPECT_EQ(Find(nullptr, "text").rc, REGEXPR_NULL_INPUT_STRING);
}

TEST(RegExprTest, StructuralAndSetErrorsInReadingOrder) {
    ExpectErrors({
        // clang-format off
        {"*a", REGEXPR_OPERATOR_ON_EMPTY_PATTERN, '*'},
        {"a|+b", REGEXPR_OPERATOR_ON_EMPTY_PATTERN, '+'}, {"|a", REGEXPR_EMPTY_LEFT_SIDE, 0},
        {"a|", REGEXPR_EMPTY_RIGHT_SIDE, 0}, {"{}", REGEXPR_EMPTY_GROUP, 0},
        {"[9-0]", REGEXPR_INVALID_RANGE, 0}, {"[]", REGEXPR_EMPTY_SET, 0},
        {"[9-0]|", REGEXPR_INVALID_RANGE, 0}, {"a||[]", REGEXPR_EMPTY_RIGHT_SIDE, 0},
        // clang-format on
    });
}

struct MatchCase {
    char const* pattern;
    char const* text;
    int position; ///< -1: no match
    int length;
    bool caseSensitive = true;
};

void ExpectMatches(std::initializer_list<MatchCase> cases) {
    for (MatchCase const& c : cases) {
        Options options;
        options.caseSensitive = c.caseSensitive;
        Outcome const o = Find(c.pattern, c.text, options);
        EXPECT_EQ(std::tuple(o.rc, o.found, o.position, o.length),
                  std::tuple(0, c.position >= 0, c.position, c.position >= 0 ? c.length : -1))
            << c.pattern << " in " << c.text;
    }
}

TEST(RegExprTest, DialectOperatorsEscapesAndSets) {
    ExpectMatches({
        // clang-format off
        {"(a)", "x(a)y", 1, 3}, {"a-b~", "xa-b~", 1, 4}, {"\\{a\\}", "x{a}", 1, 3},
        {"\\\\", "a\\b", 1, 1}, {"\\x41", "zA", 1, 1}, {"\\X4a", "zJ", 1, 1}, {"\\t", "a\tb", 1, 1},
        {"ab*c", "xacabbc", 1, 2}, {"{ab}+", "xababa", 1, 4}, {"colou?r", "a color", 2, 5},
        {"x|yz|w", "ayz", 1, 2}, {"[~0-9]", "12a3", 2, 1}, {"[*+?.|{}]+", "a{*}|.", 1, 5},
        {"[\\]\\-]+", "a-]", 1, 2}, {"[\\x30-\\x32]", "a2", 1, 1}, {"[a-c]", "xB", -1, 0},
        // Case: literal letters and every letter of a set fold when case is ignored.
        {"[a-c]", "xB", 1, 1, false}, {"[~a-c]", "BCd", 2, 1, false},
        {"HeLLo", "say hello", 4, 5, false},
        {"[@-A]", "a", 0, 1, false}, // the range @..A holds A, so a as well
        // clang-format on
    });
}

TEST(RegExprTest, MatchesStayInsideLinesAndAnchorsHoldPerLine) {
    ExpectMatches({
        // clang-format off
        {"a.b", "a\r\nb", -1, 0}, {"a.*b", "a\nxb", -1, 0}, {"^b", "ab\nb", 3, 1},
        {"a$", "a b a\nc", 4, 1}, {"$", "ab", 2, 0}, {"^$", "", 0, 0}, {"^a|b$", "ba\nxb", 4, 1},
        {"\\x0a", "a\nb", -1, 0}, // a line holds no break
        {"[~a]", "a\na", -1, 0},
        // clang-format on
    });
    // Breaks: CR LF and LF CR are one break each, "\r\r" and "\n\n" two with an empty line
    // between, and pairs are taken left to right ("\n\r\n" is a pair and a break).
    char const* const text = "ab\r\ncd\n\rEF\r\rgh\n\nij\n\r\nk";
    int start = 0;
    for (int expected : {11, 15, 20}) {
        EXPECT_EQ(Find("^$", text, {start}).position, expected);
        start = expected + 1;
    }
    EXPECT_EQ(Find("^$", text, {start}).found, 0);
    EXPECT_EQ(Find("^$", text, Backward(100)).position, 20);
    EXPECT_EQ(Find("^$", text, Backward(19)).position, 15);
    EXPECT_EQ(Find("^$", text, Backward(14, REGEXPR_MATCH_FIRST)).position, 11);
    // An offset on a break's first byte is its line's end; on a pair's second byte it is past
    // that line (forward) or at its end (backward).
    EXPECT_EQ(Find("$", text, {2}).position, 2);
    EXPECT_EQ(Find("$", text, {3}).position, 6);
    EXPECT_EQ(Find("$", text, Backward(3)).position, 2);
    EXPECT_EQ(Find("^.", text, {3}).position, 4);
}

TEST(RegExprTest, BackwardSearchFollowsThePolicy) {
    char const* const text = "ab ab ab\nxx\nab x";
    // Longest policy: every position of a line retried downward from the offset.
    EXPECT_EQ(Find("ab", text, Backward(8)).position, 6);
    EXPECT_EQ(Find("ab", text, Backward(6)).position, 6); // a match may start at the offset
    EXPECT_EQ(Find("ab", text, Backward(100)).position, 12);
    // First-match policy: each line's first match, when it starts at or before the offset.
    EXPECT_EQ(Find("ab", text, Backward(8, REGEXPR_MATCH_FIRST)).position, 0);
    EXPECT_EQ(Find("x", text, Backward(100, REGEXPR_MATCH_FIRST)).position, 15);
    EXPECT_EQ(Find("b", text, Backward(0)).found, 0);
    EXPECT_EQ(Find("a", text, Backward(0)).position, 0);
}

TEST(RegExprTest, PolicyDecidesTheLengthAtTheFirstMatchingPosition) {
    struct Case {
        char const* pattern;
        char const* text;
        int first;
        int longest;
    } const cases[] = {
        {"{a|ab}", "abb", 1, 2},      {"{a|ab}b", "abb", 2, 3},  {"{a|ab}{c|bcd}", "abcd", 4, 4},
        {"a*", "aaab", 3, 3},         {"{a|aa}*", "aaaa", 4, 4}, {"x?{xy}?", "xy", 1, 2},
        {"{b|bb|bbb}$", "bbb", 3, 3},
    };
    for (Case const& c : cases) {
        EXPECT_EQ(Find(c.pattern, c.text, {0, true, REGEXPR_MATCH_FIRST}).length, c.first)
            << c.pattern;
        EXPECT_EQ(Find(c.pattern, c.text, {0, true, REGEXPR_MATCH_LONGEST}).length, c.longest)
            << c.pattern;
    }
}

TEST(RegExprTest, OffsetsLengthsAndNulBytes) {
    EXPECT_EQ(Find("b", "abab", {2}).position, 3);
    EXPECT_EQ(Find("a", "abab", {-5}).position, 0);
    EXPECT_EQ(Find("a", "abab", {5}).found, 0);
    EXPECT_EQ(Find("a", "abab", Backward(-1)).found, 0);
    // An explicit length reaches past NUL bytes, which are ordinary characters.
    char const text[] = "a\0b\0c";
    EXPECT_EQ(Find("c", text, {0, true, 0, true, 5}).position, 4);
    EXPECT_EQ(Find("\\x00c", text, {0, true, 0, true, 5}).position, 3);
    EXPECT_EQ(Find("c", text).found, 0); // -1: up to the first NUL
    EXPECT_EQ(Find("b", "abc", {0, true, 0, true, 1}).found, 0);
    EXPECT_EQ(Find("a", nullptr).rc, REGEXPR_NULL_INPUT_STRING);
    // Every out-pointer may be null.
    EXPECT_EQ(
        RegExpr_FindPatternInText("[", 1, "x", -1, 0, 1, 0, nullptr, nullptr, nullptr, nullptr),
        REGEXPR_UNMATCHED_CHAR);
}

TEST(RegExprTest, HostilePatternsGiveResultsNotCrashes) {
    std::string const megabyte(1 << 20, 'a');
    EXPECT_EQ(Find(megabyte.c_str(), "aaa").found, 0);
    EXPECT_EQ(Find(megabyte.c_str(), megabyte.c_str()).length, 1 << 20);
    std::string const opens(1 << 20, '{');
    EXPECT_EQ(Find(opens.c_str(), "a").rc, REGEXPR_UNMATCHED_CHAR);
    std::string const nested = std::string(10000, '{') + "a" + std::string(10000, '}') + "*b";
    EXPECT_EQ(Find(nested.c_str(), "xaaab").length, 4);
    std::string const stars = "a" + std::string(100000, '*');
    EXPECT_EQ(Find(stars.c_str(), "baa").length, 0);
    std::string const bars = std::string(5000, '{') + "a|" + std::string(5000, '}');
    EXPECT_EQ(Find(bars.c_str(), "a").rc, REGEXPR_EMPTY_RIGHT_SIDE);
}

using RegExprMultiByteTest = testing::MultiByteFixture;

TEST_F(RegExprMultiByteTest, DoubleByteCharactersAreSingleCharacters) {
    UseShiftJis();
    ExpectMatches({
        {"a.b",
         "a\x82\xA0"
         "b",
         0, 4},
        {"\x82\xA0+", "x\x82\xA0\x82\xA0", 1, 4},
        {"\x82\xA0", "\x82\x82\xA0", -1, 0},     // the text's pair is 82 82
        {"\\xA0", "\x82\xA0", -1, 0},            // a trail byte is not a character
        {"[~a]", "a\x82\xA0", 1, 2},             // a complement holds double-byte characters
        {"[\\x80-\\xFF]", "\x82\xA0\xA1", 2, 1}, // a set holds single bytes only
        {"\\\x82\xA0", "\x82\xA0", 0, 2},
        {"\\x82$", "ab\x82", 2, 1},  // a lead byte at the end is a byte
        {"\\x82$", "\x82\nb", 0, 1}, // and before a line break
        {"\\x82\\x00", "\x82", -1, 0},
    });
    EXPECT_EQ(Find("\\x82.", "\x82\0b", {0, true, 0, true, 3}).length, 2); // NUL ends a pair
    ExpectErrors({
        {"[\x82\xA0]", REGEXPR_MULTIBYTE_CHARS_NOT_ALLOWED_IN_RANGE, 0},
        {"[a-\x82\xA0]", REGEXPR_MULTIBYTE_CHARS_NOT_ALLOWED_IN_RANGE, 0},
        {"[\x82\xA0-a]", REGEXPR_INVALID_RANGE, 0},
        {"[\x82]", REGEXPR_UNMATCHED_CHAR, '['}, // "\x82]" is one character
    });
    // Offsets inside a double-byte character move to a character boundary.
    char const* const text = "a\x82\xA0"
                             "b";
    EXPECT_EQ(Find(".", text, {2}).position, 3);
    EXPECT_EQ(Find(".", text, Backward(2)).length, 2);

    String::EnableMultiByteSupport(false);
    EXPECT_EQ(Find("\x82\xA0", "\x82\x82\xA0").position, 1);
    EXPECT_EQ(Find("[\x82\xA0]", "\xA0").position, 0);
}

TEST(RegExprTest, EveryCodeHasAKeyAndACatalogueText) {
    struct Row {
        int code;
        char const* key;
        int takesArgument;
    } const rows[] = {
        // clang-format off
        {-7900, "REGEXPR_UnmatchedChar", 1}, {-7901, "REGEXPR_InvalidCharInRange", 1},
        {-7902, "REGEXPR_EndWithBackslash", 0}, {-7903, "REGEXPR_InvalidHexValue", 0},
        {-7904, "REGEXPR_OperatorOnEmptyPattern", 1}, {-7905, "REGEXPR_EmptyLeftSide", 0},
        {-7906, "REGEXPR_EmptyRightSide", 0}, {-7907, "REGEXPR_EmptyGroup", 0},
        {-7908, "REGEXPR_InvalidRange", 0}, {-7909, "REGEXPR_EmptySet", 0},
        {-7910, "REGEXPR_EmptyInputString", 0}, {-7911, "REGEXPR_NullInputString", 0},
        {-7912, "REGEXPR_MultibyteCharsNotAllowedInRange", 0}, {-12, "REGEXPR_OutOfMemory", 0},
        {-5261, "REGEXPR_UnknownError", 0}, {0, "REGEXPR_UnknownError", 0},
        {-7913, "REGEXPR_UnknownError", 0},
        // clang-format on
    };
    for (Row const& row : rows) {
        int takesArgument = -1;
        char const* const key = RegExpr_GetOVErrorDescTag(row.code, &takesArgument);
        EXPECT_STREQ(key, row.key) << row.code;
        EXPECT_EQ(takesArgument, row.takesArgument) << row.code;
        bool found = false;
        RString const text("CRX_TOOLERR", key, nullptr, &found);
        EXPECT_TRUE(found) << key;
        EXPECT_EQ(std::strstr(text, "%1") != nullptr, row.takesArgument == 1) << key;
    }
    // The texts are kept byte for byte: two backslashes where the message quotes the escape.
    EXPECT_STREQ(RString("CRX_TOOLERR", "REGEXPR_EndWithBackslash"), "Cannot end with '\\\\'");
    EXPECT_STREQ(RString("ERR_DESCR", "REGEXPR_InvalidHexValue"),
                 "Invalid hex value following '\\\\x'");
}

TEST(RegExprTest, ValidityCheckReportsTheCode) {
    int error = 1;
    EXPECT_TRUE(OVIsValidRegularExpression("x{y|z}*", &error));
    EXPECT_EQ(error, 0);
    EXPECT_FALSE(OVIsValidRegularExpression("a[", &error));
    EXPECT_EQ(error, REGEXPR_UNMATCHED_CHAR);
    EXPECT_FALSE(OVIsValidRegularExpression(nullptr, nullptr));
}

} // namespace
} // namespace tekit
