// Tokens, splitting, lines of text and string vectors.
#include "TextItems.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>
#if TEKIT_HAS_OLE
#include <comdef.h> // the _bstr_t, BSTR and SAFEARRAY cases
#endif

#include <cstring>
#include <string>
#include <utility>

namespace tekit {
namespace {
using tekit::testing::Items;
using V = tekit::testing::Texts;

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

using MultiByteLines = testing::MultiByteFixture;

using testing::Text;

std::string Line(String const& s, int index) {
    DynamicString out("stale");
    s.GetNthLine(index, out);
    return Text(out);
}

TEST(StringLines, EveryKindOfEndingClosesALineAndAFinalOneOpensNone) {
    DynamicString s("one\ntwo\r\nthree\rfour\n");
    EXPECT_EQ(s.GetNumLines(), 4);
    EXPECT_EQ(Line(s, 3), "four");
    EXPECT_EQ(Line(s, 4), "");
    EXPECT_EQ(s.CharOffsetOfLine(2), 9);
    EXPECT_EQ(s.CharOffsetOfLine(4), -1);
    EXPECT_EQ(DynamicString("a\n\n").GetNumLines(), 2);
    s.GetNthLine(2, s);
    EXPECT_EQ(Text(s), "three");
}

TEST(StringLines, RemovingAndTruncatingLines) {
    DynamicString s("a\r\nb\nc\rd");
    s.RemoveNthLine(1);
    s.RemoveNthLine(2);
    s.RemoveNthLine(5);
    EXPECT_EQ(Text(s), "a\r\nc\r");
    s.TruncateToNLines(2);
    EXPECT_EQ(Text(s), "a\r\nc\r"); // nothing follows the kept lines
    s.TruncateToNLines(1);
    EXPECT_EQ(Text(s), "a");
    s.Assign("\nx");
    s.TruncateToNLines(1);
    EXPECT_EQ(Text(s), "");
}

TEST(StringLineEndings, ConversionBothWaysAndNoCopyWhenAlreadyDone) {
    DynamicString s("a\nb\r\nc\rd\r\r\n");
    s.ConvertToCRLF();
    EXPECT_EQ(Text(s), "a\r\nb\r\nc\r\nd\r\n\r\n");
    s.Assign("a\r\nb\rc\n\r\n");
    s.ConvertFromCRLF();
    EXPECT_EQ(Text(s), "a\nb\rc\n\n");

    DynamicString a("a\r\nb\r\n");
    DynamicString b(a);
    b.ConvertToCRLF();
    EXPECT_EQ(b.GetCopyOnWriteMemory(), a.GetCopyOnWriteMemory());
}

// Every character outside a line ending must be found at its mapped index in the converted
// text, and the end of the text must map to the end of the converted text.
TEST(StringLineEndings, IndexMappingFollowsTheConversion) {
    char const* const original = "x\ny\r\nz\rw\r\r\n\nv";
    DynamicString toCRLF(original);
    DynamicString fromCRLF(original);
    toCRLF.ConvertToCRLF();
    fromCRLF.ConvertFromCRLF();
    DynamicString const s(original);
    int const length = s.GetNumChars();
    for (int i = 0; i < length; ++i) {
        if (original[i] == '\r' || original[i] == '\n')
            continue;
        EXPECT_EQ(toCRLF.GetChar(s.GetIndexIfConvertToCRLF(i)), original[i]) << i;
        EXPECT_EQ(fromCRLF.GetChar(s.GetIndexIfConvertFromCRLF(i)), original[i]) << i;
    }
    EXPECT_EQ(s.GetIndexIfConvertToCRLF(length + 10), toCRLF.GetNumChars());
    EXPECT_EQ(s.GetIndexIfConvertFromCRLF(length), fromCRLF.GetNumChars());
    EXPECT_EQ(s.GetIndexIfConvertToCRLF(1), 1);   // a lone "\n" maps to its new "\r"
    EXPECT_EQ(s.GetIndexIfConvertFromCRLF(4), 3); // the "\n" of "\r\n" keeps its place
}

TEST(StringLineEndings, StorageThatCannotGrowKeepsTheStart) {
    std::string text;
    for (int i = 0; i < 32; ++i)
        text += "a\n";
    StaticString<64> s(text.c_str());
    s.ConvertToCRLF();
    EXPECT_EQ(Text(s).size(), 64u);
    EXPECT_EQ(Text(s).substr(57), "a\r\na\r\na");
}

TEST_F(MultiByteLines, LinePositionsCountCharacters) {
    UseShiftJis();
    DynamicString s("\x82\xA0\x82\xA2\n\x82\xA4");
    EXPECT_EQ(s.CharOffsetOfLine(1), 3);
    EXPECT_EQ(Line(s, 1), "\x82\xA4");
    EXPECT_EQ(s.GetIndexIfConvertToCRLF(3), 4);
    s.ConvertToCRLF();
    EXPECT_EQ(s.GetIndexIfConvertFromCRLF(4), 3);
}

using MultiByteVector = tekit::testing::MultiByteFixture;

StringVector Make(V const& items) {
    StringVector v;
    for (std::string const& item : items)
        v.emplace_back(item.c_str());
    return v;
}

std::string ToCSV(V const& items, char delimiter = ',') {
    DynamicString csv("stale");
    Make(items).CreateCSVString(csv, delimiter);
    return csv.GetBufferReadPtr();
}

V FromCSV(char const* csv, char delimiter = ',') {
    StringVector v = Make({"stale"});
    v.SetFromCSVString(DynamicString(csv), delimiter);
    return Items(v);
}

TEST(CommaSeparatedText, OnlyItemsThatNeedItAreQuoted) {
    EXPECT_EQ(ToCSV({"a", "b,c", "say \"hi\"", "line\nbreak", "cr\r", "", "x"}),
              "a,\"b,c\",\"say \"\"hi\"\"\",\"line\nbreak\",\"cr\r\",,x");
    EXPECT_EQ(ToCSV({""}), "\"\"");
    EXPECT_EQ(ToCSV({"b,c", "a;b"}, ';'), "b,c;\"a;b\"");
    EXPECT_EQ(ToCSV({"a", "b"}, '\0'), "a,b");
}

TEST(CommaSeparatedText, ReadingFollowsTheQuotingRules) {
    EXPECT_EQ(FromCSV("a,\"b,c\",,\"say \"\"hi\"\"\","), (V{"a", "b,c", "", "say \"hi\"", ""}));
    EXPECT_EQ(FromCSV("\"\""), V{""});
    EXPECT_EQ(FromCSV(""), V{});
    EXPECT_EQ(FromCSV("\"ab\"cd,e"), (V{"abcd", "e"})); // text after the closing quote
    EXPECT_EQ(FromCSV("a\"b,c"), (V{"a\"b", "c"}));     // quote inside an unquoted item
    EXPECT_EQ(FromCSV(" \"a\",b"), (V{" \"a\"", "b"})); // quotes only as first character
    EXPECT_EQ(FromCSV("a;\"b;c\"", ';'), (V{"a", "b;c"}));
}

TEST(CommaSeparatedText, BadDelimiterOrUnterminatedQuoteRaisesAndKeepsTheItems) {
    StringVector v = Make({"kept"});
    DynamicString csv;
    EXPECT_RAISES_IN(v.CreateCSVString(csv, '"'), TE_INVALID_OR_OUT_OF_RANGE,
                     "StringVector::CreateCSVString",
                     "A quote character cannot be used as the delimiter of comma-separated text.");
    EXPECT_RAISES(v.SetFromCSVString(DynamicString("a\"b"), '"'), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_RAISES_IN(v.SetFromCSVString(DynamicString("a,\"bc")), TE_UNRECOGNIZED_VALUE, nullptr,
                     "Comma-separated text has a quoted item without its closing quote: a,\"bc");
    EXPECT_EQ(Items(v), V{"kept"});
}

TEST_F(MultiByteVector, DelimiterInsideADoubleByteCharacterIsNoDelimiter) {
    // 0x82 0x7C is one Shift-JIS character whose trail byte is '|'.
    EXPECT_EQ(FromCSV("\x82\x7C|b", '|'), (V{"\x82", "", "b"}));
    UseShiftJis();
    EXPECT_EQ(ToCSV({"\x82\x7C", "b"}, '|'), "\x82\x7C|b");
    EXPECT_EQ(FromCSV("\x82\x7C|b", '|'), (V{"\x82\x7C", "b"}));
}

TEST(StringVectorHelpers, JoinAndFind) {
    StringVector const v = Make({"a", "B", "c"});
    DynamicString joined;
    v.Join(joined, ", ");
    EXPECT_STREQ(joined.GetBufferReadPtr(), "a, B, c");
    v.Join(joined, nullptr);
    EXPECT_STREQ(joined.GetBufferReadPtr(), "aBc");
    EXPECT_EQ(v.Find("B"), 1);
    EXPECT_EQ(v.Find("b"), -1);
    EXPECT_EQ(v.Find("b", true), 1);
}

#if TEKIT_HAS_OLE
TEST(StringVectorSafeArray, StringsRoundTripAndOtherArraysAreRefused) {
    StringVector const items = Make({"a", "", "caf\xE9"});
    SAFEARRAY* array = nullptr;
    items.CreateSafeArray(&array);
    ASSERT_NE(array, nullptr);
    LONG low = -1, high = -1;
    SafeArrayGetLBound(array, 1, &low);
    SafeArrayGetUBound(array, 1, &high);
    EXPECT_EQ(low, 0);
    EXPECT_EQ(high, 2);
    StringVector back = Make({"stale"});
    back.SetFromSafeArray(array);
    SafeArrayDestroy(array);
    EXPECT_EQ(Items(back), Items(items));

    SAFEARRAY* numbers = SafeArrayCreateVector(VT_I4, 0, 2);
    EXPECT_RAISES_IN(back.SetFromSafeArray(numbers), TE_TYPE_MISMATCH_ERROR, nullptr,
                     "Expected a one-dimensional array of strings.");
    SafeArrayDestroy(numbers);
    back.SetFromSafeArray(nullptr);
    EXPECT_TRUE(back.empty());
}
#endif

} // namespace
} // namespace tekit
