#include "tekit/strings/DynamicString.h"

#include "strings/TextItems.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"

#include <gtest/gtest.h>

#include <utility>

using namespace tekit;
using tekit::testing::Items;
using V = tekit::testing::Texts;

namespace {

using MultiByteTokens = tekit::testing::MultiByteFixture;

V Tokens(char const* text) {
    DynamicString token;
    V out;
    for (int i = 0; DynamicString(text).GetNthToken(i, token); ++i)
        out.emplace_back(token.GetBufferReadPtr());
    return out;
}

/// GetNextToken's index and length.
std::pair<int, int> Next(char const* text, int start) {
    int length = -1;
    int const index = DynamicString(text).GetNextToken(start, length);
    return {index, length};
}

V Location(char const* text, bool removeQuotes) {
    StringVector parts;
    int const count = String::ParseLocationString(DynamicString(text), parts, removeQuotes);
    EXPECT_EQ(count, static_cast<int>(parts.size()));
    return Items(parts);
}

V SplitAt(char const* text, char const* separators, bool skipEmpty, bool trim) {
    StringVector items{DynamicString("stale")};
    DynamicString(text).Split(items, separators, skipEmpty, trim);
    return Items(items);
}

} // namespace

TEST(Tokens, WhiteSpaceSeparatesAndQuotedRunsStayWhole) {
    EXPECT_EQ(Tokens("  set \"a b\\\" c\"  x\"y z\"w\t\n last"),
              (V{"set", "\"a b\\\" c\"", "x\"y z\"w", "last"}));
    EXPECT_EQ(Tokens("a \"b c"), (V{"a", "\"b c"})); // an open quote runs to the end
    EXPECT_EQ(Tokens(" \t\r\n"), V{});
    EXPECT_EQ(Next("  ab \"c d\"", 0), std::make_pair(2, 2));
    EXPECT_EQ(Next("  ab \"c d\"", 4), std::make_pair(5, 5));
    EXPECT_EQ(Next("  ab \"c d\"", 99), std::make_pair(-1, 0));
    DynamicString token("stale");
    EXPECT_FALSE(DynamicString("a b").GetNthToken(2, token));
    EXPECT_TRUE(token.IsEmpty());
}

TEST(LocationStrings, SplitIntoNamesAndIndices) {
    EXPECT_EQ(Location("Main[\"Step 1\"].Result", false), (V{"Main", "\"Step 1\"", "Result"}));
    EXPECT_EQ(Location("Locals.Array[3][\"a]\\\"b.\"]", true),
              (V{"Locals", "Array", "3", "a]\"b."}));
    EXPECT_EQ(Location("", true), V{});

    DynamicString location("Main[\"Step 1\"].Result"), token;
    EXPECT_TRUE(String::GetNextLocationStringToken(location, token, false));
    EXPECT_STREQ(token.GetBufferReadPtr(), "Main");
    EXPECT_STREQ(location.GetBufferReadPtr(), "[\"Step 1\"].Result");
    location.Clear();
    EXPECT_FALSE(String::GetNextLocationStringToken(location, token, false));
}

TEST(LocationStrings, MalformedLocationsRaiseWithTheLocationInTheMessage) {
    std::pair<char const*, char const*> const cases[] = {
        {"a..b", "The location 'a..b' has an empty name or index."},
        {"a[]", "The location 'a[]' has an empty name or index."},
        {"a[3", "The location 'a[3' has a '[' without a matching ']'."},
        {"a[\"x\"b]", "The location 'a[\"x\"b]' has a '[' without a matching ']'."},
        {"a[\"x]", "The location 'a[\"x]' has a quoted index without its closing quote."},
        {"a[1]b", "The location 'a[1]b' has text after ']' that does not begin with '.' or '['."},
    };
    for (auto const& [location, description] : cases) {
        StringVector parts;
        EXPECT_RAISES_IN(String::ParseLocationString(DynamicString(location), parts, true),
                         TE_BAD_PROP_OR_VAR_NAME, "String::ParseLocationString", description);
    }
}

TEST(WholeWords, SpanIsAWholeWordOnlyBetweenNonWordCharacters) {
    char const* text = "cat concat cat_x (cat) \xE9t\xE9";
    EXPECT_TRUE(String::IsPtrToWholeWord(text, text, 3));
    EXPECT_FALSE(String::IsPtrToWholeWord(text, text + 7, 3));
    EXPECT_TRUE(String::IsPtrToWholeWord(text, text + 18, 3));
    EXPECT_FALSE(String::IsPtrToWholeWord(text, text + 24, 1)); // letters above 127 are word
    EXPECT_FALSE(String::IsPtrToWholeWord(text + 1, text, 3));
    EXPECT_FALSE(String::IsPtrToWholeWord(text, text + 19, 50)); // runs past the text
}

TEST(EmbeddedConstants, ReverseSearchSkipsQuotedText) {
    DynamicString s("a + \"b + c\\\" + d\" + e");
    EXPECT_EQ(s.FindCharReverseIgnoringEmbeddedStringConstants('+'), 18);
    EXPECT_EQ(s.FindCharReverseIgnoringEmbeddedStringConstants('+', 17), 2);
    EXPECT_EQ(s.FindCharReverseIgnoringEmbeddedStringConstants('+', 1), -1);
}

TEST(Split, SeparatorCharactersCutIntoItems) {
    EXPECT_EQ(SplitAt("a,b;;c", ",;", false, false), (V{"a", "b", "", "c"}));
    EXPECT_EQ(SplitAt("a,b;;c", ",;", true, false), (V{"a", "b", "c"}));
    EXPECT_EQ(SplitAt(" a , b ,  ", ",", false, true), (V{"a", "b", ""}));
    EXPECT_EQ(SplitAt("a b\tc\n", nullptr, false, false), (V{"a", "b", "c", ""}));
    EXPECT_EQ(SplitAt(",", ",", false, false), (V{"", ""}));
}

TEST(Split, SeparatorTextsPreferTheLongest) {
    StringVector const separators{DynamicString("<>"), DynamicString(">>"), DynamicString("<"),
                                  DynamicString("")};
    StringVector items;
    DynamicString("a<>b<c>>d").Split(items, separators);
    EXPECT_EQ(Items(items), (V{"a", "b", "c", "d"}));
    DynamicString("<x<").Split(items, separators);
    EXPECT_EQ(Items(items), (V{"", "x", ""}));
}

TEST_F(MultiByteTokens, DoubleByteCharactersCountAsOneAndAreNeverCut) {
    // 0x82 0x40 is one character (a word character) whose trail byte is '@'; 0x82 0x7C one
    // whose trail byte is '|'.
    char const* word = "\x82\x40"
                       "cat";
    EXPECT_TRUE(String::IsPtrToWholeWord(word, word + 2, 3));
    UseShiftJis();
    EXPECT_FALSE(String::IsPtrToWholeWord(word, word + 2, 3));
    EXPECT_EQ(Next("\x82\xA0\x82\xA2 ab", 0), std::make_pair(0, 2));
    EXPECT_EQ(Next("\x82\xA0\x82\xA2 ab", 2), std::make_pair(3, 2));
    EXPECT_EQ(SplitAt("\x82\x7C|x", "|", false, false), (V{"\x82\x7C", "x"}));
    EXPECT_EQ(SplitAt(" \x82\x20 ,", ",", false, true), (V{"\x82\x20", ""}));
}
