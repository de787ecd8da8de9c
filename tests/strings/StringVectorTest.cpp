#include "tekit/strings/DynamicString.h"

#include "strings/TextItems.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"

#include <gtest/gtest.h>
#if TEKIT_HAS_OLE
#include <comdef.h> // the _bstr_t, BSTR and SAFEARRAY cases
#endif

#include <string>

using namespace tekit;
using tekit::testing::Items;
using V = tekit::testing::Texts;

namespace {

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

} // namespace

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
