// Range lists: the element and list syntax, the values they iterate in order, sizes,
// overlaps, duplicates, closing an open tail and the text that reads back.
#include "tekit/toolbox/SimpleIntRange.h"
#include "tekit/toolbox/SimpleIntRangeList.h"

#include "support/Raises.h"

#include <gtest/gtest.h>

#include <string>
#include <tuple>
#include <utility>
#include <vector>

namespace {

using namespace tekit;

constexpr int kOpen = SimpleIntRange::OPEN_ENDED_RANGE;

/// The first `limit` values the list iterates.
std::vector<int> Values(SimpleIntRangeList& list, size_t limit = 50) {
    std::vector<int> values;
    for (list.Reset(); !list.IsDone() && values.size() < limit; ++list)
        values.push_back(list.Value());
    return values;
}

SimpleIntRangeList Parsed(char const* text) {
    SimpleIntRangeList list;
    list.Parse(DynamicString(text));
    return list;
}

std::string Text(DynamicString const& s) {
    return s.GetBufferReadPtr();
}

TEST(IntRange, ElementsParseToTheirBoundsAndDirection) {
    struct {
        char const* text;
        int start, end, step, size;
    } const cases[] = {
        // clang-format off
        {"", 0, kOpen, 1, -1}, {"3", 3, 3, 1, 1}, {"0-5", 0, 5, 1, 6}, {"5-0", 5, 0, -1, 6},
        {"7-", 7, kOpen, 1, -1}, {" 2 - +4 ", 2, 4, 1, 3},
        {"2147483645", 2147483645, 2147483645, 1, 1},
        {"0-2147483645", 0, 2147483645, 1, 2147483646},
        // clang-format on
    };
    for (auto const& c : cases) {
        SimpleIntRange const r = SimpleIntRange::ParseString(DynamicString(c.text));
        EXPECT_EQ(std::tuple(r.GetStart(), r.GetEnd(), r.GetStep(), r.GetSize(), r.IsOpenEnded()),
                  std::tuple(c.start, c.end, c.step, c.size, c.end == kOpen))
            << c.text;
    }
    EXPECT_EQ(SimpleIntRange(), SimpleIntRange::sAll);
}

TEST(IntRange, BadElementsRaiseTheCatalogueMessage) {
    std::string const invalid = "Value must be a single positive integer";
    struct {
        char const* text;
        char const* function;
        std::string description;
    } const cases[] = {
        {"x", "SimpleIntRange::ParseRangeIntHelper",
         "Error parsing range element 'x'.  " + invalid},
        {"1-2-3", "SimpleIntRange::ParseString",
         "Error parsing range element '1-2-3'.  " + invalid},
        {"99999999999999999999", "SimpleIntRange::ParseRangeIntHelper",
         "Error parsing range element '99999999999999999999'.  " + invalid},
        {"2147483646", "SimpleIntRange::CheckRangeValue",
         "Range value 2147483646 is out of range.  Values must lie between 0 and 2147483645."},
        {"1-2147483647", "SimpleIntRange::CheckRangeValue", "Range value 2147483647"},
    };
    for (auto const& c : cases) {
        TEException const e =
            tekit::testing::Raised([&] { SimpleIntRange::ParseString(DynamicString(c.text)); });
        EXPECT_EQ(e.GetErrorCode(), TE_INVALID_OR_OUT_OF_RANGE) << c.text;
        EXPECT_STREQ(e.GetFunctionName(), c.function) << c.text;
        EXPECT_EQ(std::string(e.GetDescription()).rfind(c.description, 0), 0u)
            << c.text << ": " << e.GetDescription();
    }
    EXPECT_RAISES(SimpleIntRange(-1), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_RAISES(SimpleIntRange(kOpen, kOpen), TE_INVALID_OR_OUT_OF_RANGE);
}

TEST(IntRange, OverlapTakesEachRangeLowToHighInEitherOrder) {
    struct {
        SimpleIntRange a, b;
        bool overlap;
    } const cases[] = {
        // clang-format off
        {SimpleIntRange(0, 5), SimpleIntRange(5, 9), true},
        {SimpleIntRange(0, 5), SimpleIntRange(6, 9), false},
        {SimpleIntRange(9, 3), SimpleIntRange(2, 3), true}, // downward: 3..9
        {SimpleIntRange(4), SimpleIntRange(0, 9), true},    // inside
        {SimpleIntRange(7, kOpen), SimpleIntRange(100000, 99999), true},
        {SimpleIntRange(7, kOpen), SimpleIntRange(0, 6), false},
        // clang-format on
    };
    for (auto const& c : cases) {
        EXPECT_EQ(std::pair(c.a.Overlaps(c.b), c.b.Overlaps(c.a)), std::pair(c.overlap, c.overlap))
            << Text(c.a.ToString()) << " " << Text(c.b.ToString());
    }
}

TEST(IntRange, ClosingATailKeepsItsStartAndStaysInRange) {
    SimpleIntRange r(7, kOpen);
    EXPECT_TRUE(r.CloseTailIfOpenEnded(10));
    EXPECT_EQ(r, SimpleIntRange(7, 10));
    EXPECT_FALSE(r.CloseTailIfOpenEnded(20)); // no longer open

    SimpleIntRange below(7, kOpen);
    EXPECT_TRUE(below.CloseTailIfOpenEnded(-1)); // e.g. "count - 1" of nothing
    EXPECT_EQ(below, SimpleIntRange(7));
    SimpleIntRange above(7, kOpen);
    EXPECT_TRUE(above.CloseTailIfOpenEnded(kOpen + 1));
    EXPECT_EQ(above.GetEnd(), SimpleIntRange::RANGE_MAX);
}

TEST(IntRange, IterationStopsAtTheEndsOfTheValueRange) {
    // An open-ended range ends after RANGE_MAX, without overflowing its cursor.
    SimpleIntRange tail(SimpleIntRange::RANGE_MAX - 1, kOpen);
    std::vector<int> values;
    for (tail.Reset(); !tail.IsDone(); ++tail)
        values.push_back(tail.Value());
    EXPECT_EQ(values, (std::vector<int>{SimpleIntRange::RANGE_MAX - 1, SimpleIntRange::RANGE_MAX}));
    ++tail; // past the end: no further step
    EXPECT_TRUE(tail.IsDone());
}

TEST(IntRangeList, IteratesAcrossElementsInOrder) {
    struct {
        char const* text;
        std::vector<int> values;
        int size;
    } const cases[] = {
        // clang-format off
        {"5-0", {5, 4, 3, 2, 1, 0}, 6}, {"1-3,7-", {1, 2, 3, 7, 8, 9, 10}, -1},
        {" 4 , 2-1 ,, 9 ", {4, 2, 1, 9}, 4}, {"2,2", {2, 2}, 2}, {"  ", {0, 1, 2}, -1},
        // clang-format on
    };
    for (auto const& c : cases) {
        SimpleIntRangeList list = Parsed(c.text);
        EXPECT_EQ(Values(list, c.values.size()), c.values) << c.text;
        EXPECT_EQ(list.GetSize(), c.size) << c.text;
        EXPECT_EQ(list.IsOpenEnded(), c.size < 0) << c.text;
    }
}

TEST(IntRangeList, ListErrorsNameTheWholeTextAndKeepWhatWasParsed) {
    SimpleIntRangeList list;
    EXPECT_RAISES_IN(list.Parse(DynamicString("7-,1-3")), TE_INVALID_OR_OUT_OF_RANGE,
                     "SimpleIntRangeList::AppendRangeElement",
                     "Error parsing range '7-,1-3'.  Open-ended element '7-' is not the final "
                     "item in the list.");
    EXPECT_EQ(Text(list.ToString()), "7-");

    // "%2" in the user's text stays as written.
    EXPECT_RAISES_IN(list.Parse(DynamicString("1,5-,3,%2")), TE_INVALID_OR_OUT_OF_RANGE,
                     "SimpleIntRangeList::AppendRangeElement",
                     "Error parsing range '1,5-,3,%2'.  Open-ended element '5-' is not the final "
                     "item in the list.");

    EXPECT_RAISES_IN(list.Parse(DynamicString("1,x,3")), TE_INVALID_OR_OUT_OF_RANGE,
                     "SimpleIntRange::ParseRangeIntHelper");
    EXPECT_EQ(Text(list.ToString()), "1");

    EXPECT_RAISES_IN(list.Parse(DynamicString(" , ,")), TE_INVALID_OR_OUT_OF_RANGE,
                     "SimpleIntRangeList::Parse");
    EXPECT_EQ(list.GetNumRanges(), 0);
}

TEST(IntRangeList, TextReadsBackToAnEqualList) {
    struct {
        char const* text;
        char const* normalised;
    } const cases[] = {
        {"", "0-"},          {" 3 ", "3"},
        {"3-3", "3"},        {"1-3, 7-", "1-3,7-"},
        {"9-3,+4", "9-3,4"}, {"0-2147483645,1", "0-2147483645,1"},
    };
    for (auto const& c : cases) {
        SimpleIntRangeList const list = Parsed(c.text);
        DynamicString const text = list.ToString();
        EXPECT_EQ(Text(text), c.normalised) << c.text;
        EXPECT_EQ(Parsed(c.normalised), list) << c.text;
    }
}

TEST(IntRangeList, DuplicatesAreValuesInTwoElements) {
    struct {
        char const* text;
        bool duplicates;
    } const cases[] = {
        {"1-5,3", true},     {"9-5,5", true},    {"0-3,4-9,10-", false},
        {"1,30,40-", false}, {"5-1,7,6", false}, {"150,1,2,100-", true},
    };
    for (auto const& c : cases)
        EXPECT_EQ(Parsed(c.text).ContainsDuplicates(), c.duplicates) << c.text;
}

TEST(IntRangeList, OpenTailCanBeClosedMidIteration) {
    SimpleIntRangeList list = Parsed("1,5-");
    list.Reset();
    EXPECT_FALSE(list.IsInOpenEndedTail());
    ++list;
    EXPECT_TRUE(list.IsInOpenEndedTail());
    ++list;
    ++list; // at 7
    EXPECT_TRUE(list.CloseTailIfOpenEnded(6));
    EXPECT_TRUE(list.IsDone()); // the cursor lies past the new end
    EXPECT_EQ(Values(list), (std::vector<int>{1, 5, 6}));
    EXPECT_FALSE(list.CloseTailIfOpenEnded(9));
    list.SetRange(SimpleIntRange(4, 2));
    EXPECT_EQ(Values(list), (std::vector<int>{4, 3, 2}));
    list.Clear();
    EXPECT_RAISES_IN(list.Value(), TE_PROGRAM_ERROR, "SimpleIntRangeList::Value");
}

TEST(IntRangeList, LargeListsParseAndTheirSizeOverflowIsReported) {
    std::string many;
    for (int i = 0; i < 100000; ++i)
        many += std::to_string(i * 3) + "-" + std::to_string(i * 3 + 1) + ",";
    SimpleIntRangeList list = Parsed(many.c_str());
    EXPECT_EQ(list.GetSize(), 200000);
    EXPECT_FALSE(list.ContainsDuplicates());

    SimpleIntRangeList const wide = Parsed("0-2147483645,0-5");
    EXPECT_RAISES_IN(wide.GetSize(), TE_INT32_OVERFLOW, "SimpleIntRangeList::GetSize");
}

} // namespace
