#include "tekit/toolbox/TextHelpers.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include "support/MultiByteFixture.h"
#include "tekit/errors/TEError.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <string>
#include <vector>

namespace {

using namespace tekit;
using TextHelpers = tekit::testing::MultiByteFixture;

TEST_F(TextHelpers, WhiteSpaceScansAndTrims) {
    char text[] = " \t\r\n\v\fab c \n";
    EXPECT_EQ(SkipWhiteSpace(text), text + 6);
    EXPECT_EQ(SkipNonWhiteSpace(text + 6), text + 8);
    EXPECT_EQ(HasNonWhiteSpace(" \t x") + HasNonWhiteSpace(" \t\r\n") + HasNonWhiteSpace(nullptr),
              1);
    EXPECT_EQ(SkipWhiteSpace(nullptr), SkipNonWhiteSpace(nullptr));
    char* const copies[] = {StrDupWithoutSurrWhiteSpace(text), TBStrDup(" z ")};
    EXPECT_EQ(RemoveSurroundingWhiteSpace(text), 4);
    EXPECT_EQ(std::string(copies[0]) + "|" + copies[1] + "|" + text, "ab c| z |ab c");
    for (char* copy : copies)
        TBFree(copy);
}

TEST_F(TextHelpers, CompareIgnoringCase) {
    struct {
        char const *a, *b;
        int expected;
    } const cases[] = {
        // clang-format off
        {"Voltage", "vOLTAGE", 0}, {"abc", "abd", -1}, {"abc", "ab", 1},
        {"_", "a", -1}, // case folds to lower: '_' (0x5F) sorts before 'a'
        {"", "", 0}, {nullptr, "", -1}, {nullptr, nullptr, 0}, {"\xE9", "a", 1},
        // clang-format on
    };
    for (auto const& c : cases) {
        EXPECT_EQ(StrICmp(c.a, c.b), c.expected) << (c.a ? c.a : "null");
        EXPECT_EQ(StrICmp(c.b, c.a), -c.expected);
    }
    EXPECT_EQ(StrICmpWithoutSurrWhiteSpace("  Gain \t", "GAIN"), 0);
    EXPECT_EQ(StrICmpWithoutSurrWhiteSpace(" a b ", "a  b"), 1); // inner space counts
}

// In Shift-JIS "\x82\x61" and "\x82\x41" are two different double-byte characters whose trail
// bytes happen to be 'a' and 'A'; only the single-byte view may fold them together.
TEST_F(TextHelpers, MultiByteModeNeverFoldsTrailBytes) {
    EXPECT_EQ(StrICmp("\x82\x61", "\x82\x41"), 0);
    UseShiftJis();
    EXPECT_EQ(StrICmp("\x82\x61", "\x82\x41"), 1);
    EXPECT_EQ(StrICmpWithoutSurrWhiteSpace(" \x82\x61 ", "\x82\x61"), 0);
}

TEST_F(TextHelpers, CopyMaxCutsWithoutSplittingACharacter) {
    char buffer[4];
    UseShiftJis();
    EXPECT_EQ(StringCopyMax(buffer, "ab\x82\xA0", sizeof buffer), 2); // not half a character
    EXPECT_STREQ(buffer, "ab");
    EXPECT_EQ(StringCopyMax(buffer, "a\x82\xA0z", sizeof buffer), 3);
    EXPECT_STREQ(buffer, "a\x82\xA0");
}

TEST_F(TextHelpers, InsertCountsCharactersAndCutsTheEnd) {
    char buffer[6] = "ad";
    EXPECT_EQ(StringInsert(buffer, "bcxyz", 1, sizeof buffer), 5);
    EXPECT_STREQ(buffer, "abcxy");
    UseShiftJis();
    char mb[8] = "\x82\xA0z";
    EXPECT_EQ(StringInsert(mb, "y", 1, sizeof mb), 4); // after the first character, not byte
    EXPECT_STREQ(mb, "\x82\xA0yz");
    EXPECT_EQ(StringInsert(mb, "1234", 0, 6), 4); // room for 5 bytes: no half character
    EXPECT_STREQ(mb, "1234");
}

TEST_F(TextHelpers, BadArgumentsChangeNothing) {
    char buffer[8] = "abc";
    EXPECT_EQ(StringCopyMax(nullptr, "x", 4), TE_INVALID_POINTER);
    EXPECT_EQ(StringCopyMax(buffer, "x", 0), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(StringCopyMax(buffer + 1, buffer, 4), TE_INCOMPATIBLE_PARAMETERS);
    EXPECT_EQ(StringInsert(buffer, "x", 4, sizeof buffer), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(StringInsert(buffer, buffer + 1, 0, sizeof buffer), TE_INCOMPATIBLE_PARAMETERS);
    EXPECT_EQ(StringInsert(buffer, "x", 0, 3), TE_INVALID_OR_OUT_OF_RANGE); // no terminator
    EXPECT_EQ(StringCopyMax(buffer + 4, nullptr, 4), 0);                    // null copies as empty
    EXPECT_STREQ(buffer, "abc");
    EXPECT_EQ(StrDupWithoutSurrWhiteSpace(nullptr), TBStrDup(nullptr));
    EXPECT_EQ(RemoveSurroundingWhiteSpace(nullptr), TE_INVALID_POINTER);
    EXPECT_EQ(TBStrToInt(nullptr, nullptr) + StrToUInt("1", nullptr), 0);
}

TEST_F(TextHelpers, SpliceSplitsAtCommasInPlace) {
    char text[] = " a , b c,, d ";
    char* items[4];
    EXPECT_EQ(SpliceCommaSeparatedList(text, nullptr, 0), 4); // counting changes nothing
    EXPECT_EQ(SpliceCommaSeparatedList(text, items, 3), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_STREQ(text, " a , b c,, d ");
    ASSERT_EQ(SpliceCommaSeparatedList(text, items, 4), 4);
    EXPECT_EQ(std::vector<std::string>(items, items + 4),
              (std::vector<std::string>{"a", "b c", "", "d"}));
    char blank[] = "  ";
    EXPECT_EQ(SpliceCommaSeparatedList(blank, items, 4), 0);
}

TEST_F(TextHelpers, StringsToIntegers) {
    struct {
        char const* text;
        int ok;
        int value;
    } const ints[] = {
        // clang-format off
        {" -12 ", 1, -12}, {"+7", 1, 7}, {"2147483647", 1, INT_MAX}, {"-2147483648", 1, INT_MIN},
        {"2147483648", 0, 0}, {"-2147483649", 0, 0}, {"99999999999999999999", 0, 0},
        {" ", 0, 0}, {"-", 0, 0}, {"1 2", 0, 0}, {"12x", 0, 0}, {"0x10", 0, 0}, {"- 1", 0, 0},
        // clang-format on
    };
    for (auto const& c : ints) {
        int value = 12345;
        EXPECT_EQ(TBStrToInt(c.text, &value), c.ok) << c.text;
        EXPECT_EQ(value, c.ok ? c.value : 12345) << c.text;
    }
    unsigned value = 5;
    EXPECT_EQ(StrToUInt(" 4294967295 ", &value), 1);
    EXPECT_EQ(value, 4294967295u);
    EXPECT_EQ(StrToUInt("4294967296", &value) + StrToUInt("-1", &value), 0);
}

} // namespace
