// Handles, and the lists in their blocks: layout, growth, positions, search, sorting, walks.
#include "tekit/toolbox/List.h"
#include "tekit/toolbox/Compare.h"
#include "tekit/toolbox/Sort.h"

#include "toolbox/HandleAssert.h"
#include "toolbox/ListBlock.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <random>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace {

using tekit::toolbox::GrowList;
using Ints = std::vector<int>;
using Fields = std::vector<std::int32_t>;

/// The six header fields, read through the handle as a caller of the block layout would.
Fields HeaderFields(ListType list) {
    Fields fields(6);
    std::memcpy(fields.data(), list->block, 24);
    return fields;
}

std::int32_t Capacity(ListType list) {
    return HeaderFields(list)[3];
}

Ints Items(ListType list) {
    Ints items(ListNumItems(list));
    if (!items.empty())
        std::memcpy(items.data(), ListGetDataPtr(list), items.size() * sizeof(int));
    return items;
}

/// Lists of ints, filled one insertion at a time; a test's lists are disposed when it ends.
struct ListTest : ::testing::Test {
    void TearDown() override {
        for (ListType made : lists)
            ListDispose(made);
    }
    ListType Make(Ints const& values = {}) {
        ListType made = lists.emplace_back(ListCreate(sizeof(int)));
        for (int v : values)
            ListInsertItem(made, &v, LIST_POS_END);
        return made;
    }
    std::vector<ListType> lists;
    ListType list = Make();
};

// Blocks start and grow zero-filled; size 0 has no block.
TEST(HandleTest, BlocksAreZeroFilledAndKeepTheirContentWhenResized) {
    Handle h = NewHandle(4), empty = NewHandle(0);
    EXPECT_EQ(empty->block, nullptr);
    EXPECT_EQ(std::memcmp(h->block, "\0\0\0\0", 4), 0);
    std::memcpy(h->block, "abcd", 4);
    ASSERT_EQ(SetHandleSize(h, 4096), 1);
    EXPECT_EQ(GetHandleSize(h), 4096u);
    EXPECT_EQ(std::string(static_cast<char*>(h->block), 4096), "abcd" + std::string(4092, '\0'));
    ASSERT_EQ(SetHandleSize(h, 2), 1); // shrink, then grow again: no stale bytes come back
    ASSERT_EQ(SetHandleSize(h, 4), 1);
    EXPECT_EQ(std::memcmp(h->block, "ab\0\0", 4), 0);
    ASSERT_EQ(SetHandleSize(h, 0), 1);
    EXPECT_EQ(h->block, nullptr);
    DisposeHandle(h);
    DisposeHandle(empty);
    DisposeHandle(nullptr); // ignored
}

TEST(HandleTest, AssertTextNamesMessageLineAndFile) {
    EXPECT_EQ(
        tekit::toolbox::AssertText("Parameter 1 to GetHandleSize was NULL.", 42, "Handle.cpp"),
        "Assert!\n\nParameter 1 to GetHandleSize was NULL.\n\nThe error was detected on "
        "line 42 of file 'Handle.cpp'.\n\nProgram aborting.");
}

// On Windows the text goes to a message box, which would wait for a click.
#if !defined(_WIN32)
TEST(HandleDeathTest, NullHandleAbortsWithTheAssertText) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(GetHandleSize(nullptr),
                 "Assert!\n\nParameter 1 to GetHandleSize was NULL.\n\nThe error was detected on "
                 "line [0-9]+ of file 'Handle.cpp'.\n\nProgram aborting.");
    EXPECT_DEATH(SetHandleSize(nullptr, 4), "Parameter 1 to SetHandleSize was NULL.");
}
#endif

// A new list is the header and the spare bytes. The policy step adds (100 + 10) percent of the
// capacity, at least 4 slots; a single insertion into a full list asks for one slot more.
TEST_F(ListTest, NewBlockAndGrowthFollowTheCapacitySequences) {
    EXPECT_EQ(GetHandleSize(list), 28u);
    EXPECT_EQ(HeaderFields(list), (Fields{0x4C495354, 10, 4, 0, 4, 0}));
    EXPECT_EQ(ListGetDataPtr(list), static_cast<char*>(list->block) + 24);
    ListType grown = Make();
    Fields inserted, stepped{Capacity(grown)};
    for (int i = 0; i < 60; ++i) {
        ASSERT_EQ(ListInsertItem(list, &i, LIST_POS_END), 1);
        if (inserted.empty() || inserted.back() != Capacity(list))
            inserted.push_back(Capacity(list));
        if (i < 6 && GrowList(grown, 0) == 1)
            stepped.push_back(Capacity(grown));
    }
    EXPECT_EQ(inserted, (Fields{5, 11, 24, 51, 108}));
    EXPECT_EQ(stepped, (Fields{0, 4, 8, 16, 33, 69, 144}));
    ListSetAllocationPolicy(grown, 2, 50);
    ASSERT_EQ(GrowList(grown, 0), 1);
    EXPECT_EQ(Capacity(grown), 144 + 216);
    ASSERT_EQ(GrowList(grown, 3), 1); // an exact request
    EXPECT_EQ(Capacity(grown), 363);
}

TEST_F(ListTest, PreAllocateAndMultiItemInsertionAddOnlyWhatIsMissing) {
    ASSERT_EQ(ListPreAllocate(list, 4), 1);
    int const one = 1;
    ListInsertItem(list, &one, LIST_POS_FRONT); // 3 slots spare, 8 wanted
    Ints const eight{2, 3, 4, 5, 6, 7, 8, 9};
    ASSERT_EQ(ListInsertItems(list, eight.data(), LIST_POS_END, 8), 1);
    EXPECT_EQ(Capacity(list), 4 + 4 + 8); // policy step (4) plus the count
    EXPECT_EQ(ListPreAllocate(list, 9), 1);
    EXPECT_EQ(Capacity(list), 18);
    ListRemoveItems(list, nullptr, 2, 8);
    ASSERT_EQ(ListInsertItems(list, nullptr, 1, 2), 1); // zero-fills over the stale 1 and 2
    EXPECT_EQ(Items(list), (Ints{0, 0, 1}));
    ListCompact(list);
    EXPECT_EQ(Capacity(list), 3);
}

TEST_F(ListTest, InsertionPlacesItemsByPosition) {
    struct Case {
        std::int32_t position, count;
        int result;
        Ints after;
    } const cases[] = {
        // clang-format off
        {LIST_POS_FRONT, 1, 1, {9, 1, 2, 3}}, {LIST_POS_END, 1, 1, {1, 2, 3, 9}},
        {3, 1, 1, {1, 2, 9, 3}}, {4, 1, 1, {1, 2, 3, 9}}, /* numItems + 1 appends */
        {5, 1, 0, {1, 2, 3}}, {-2, 1, 0, {1, 2, 3}}, {2, 0, 0, {1, 2, 3}},
        {2, 2, 1, {1, 9, 9, 2, 3}}, {2, std::numeric_limits<std::int32_t>::max(), 0, {1, 2, 3}},
        // clang-format on
    };
    for (auto const& c : cases) {
        ListType three = Make({1, 2, 3});
        int const nines[2] = {9, 9};
        EXPECT_EQ(ListInsertItems(three, nines, c.position, c.count), c.result) << c.position;
        EXPECT_EQ(Items(three), c.after) << c.position << " x" << c.count;
    }
}

TEST_F(ListTest, RemovalAndGetNeedTheWholeRun) {
    struct Case {
        std::int32_t position, count;
        Ints taken; // empty: nothing happens
    } const cases[] = {
        // clang-format off
        {LIST_POS_FRONT, 1, {1}}, {LIST_POS_END, 1, {4}}, {2, 2, {2, 3}}, {LIST_POS_END, 2, {}},
        {3, 3, {}}, {0, 0, {}}, {-2, 1, {}},
        // clang-format on
    };
    for (auto const& c : cases) {
        ListType four = Make({1, 2, 3, 4});
        Ints got(4, -1), removed(4, -1);
        ListGetItems(four, got.data(), c.position, c.count);
        got.resize(c.taken.size());
        EXPECT_EQ(got, c.taken) << c.position << " x" << c.count;
        ListRemoveItems(four, removed.data(), c.position, c.count);
        removed.resize(c.taken.size());
        EXPECT_EQ(removed, c.taken);
        EXPECT_EQ(Capacity(four), 5); // removal never gives memory back
    }
}

TEST_F(ListTest, NullForeignAndOversizedListsAreRefused) {
    int v = 1;
    EXPECT_EQ(ListCreate(0), nullptr);
    EXPECT_EQ(ListInsertItem(nullptr, &v, LIST_POS_END), 0);
    EXPECT_EQ(ListNumItems(nullptr) + ListGetItemSize(nullptr) + ListPreAllocate(nullptr, 1) +
                  ListIsSorted(nullptr, nullptr),
              0);
    EXPECT_EQ(ListCopy(nullptr), nullptr);
    EXPECT_EQ(ListEqual(nullptr, nullptr), 1);
    ListCompact(nullptr);
    ListDispose(nullptr);

    ListType notAList = lists.emplace_back(NewHandle(64)); // zero bytes: no magic
    EXPECT_EQ(ListInsertItem(notAList, &v, LIST_POS_END), 0);
    EXPECT_EQ(GetHandleSize(notAList), 64u);

    ListType big = lists.emplace_back(ListCreate(std::numeric_limits<std::int32_t>::max()));
    EXPECT_EQ(ListPreAllocate(big, 2), 0); // 2 x (2^31 - 1) bytes does not fit a handle
    EXPECT_EQ(ListInsertItems(big, nullptr, LIST_POS_END, 3), 0);
    EXPECT_EQ(GetHandleSize(big), 28u);
}

TEST_F(ListTest, BuffersInsideTheBlockAreRefusedWhereTheBlockMoves) {
    ListType full = Make({1, 2, 3, 4, 5}); // an insertion grows the block
    EXPECT_EQ(ListInsertItem(full, ListGetPtrToItem(full, 2), LIST_POS_END), 0);
    ListRemoveItem(full, ListGetPtrToItem(full, 1), 2);
    EXPECT_EQ(Items(full), (Ints{1, 2, 3, 4, 5}));
    // Getting and replacing never move the block: overlap is copied as through a temporary.
    ListReplaceItems(full, ListGetPtrToItem(full, 1), 2, 3);
    EXPECT_EQ(Items(full), (Ints{1, 1, 2, 3, 5}));
    ListGetItems(full, ListGetPtrToItem(full, 1), 3, 3);
    EXPECT_EQ(Items(full), (Ints{2, 3, 5, 3, 5}));
}

TEST_F(ListTest, AppendCopyAndEqual) {
    ListType a = Make({1, 2}), b = Make({3});
    ListType shorts = lists.emplace_back(ListCreate(2));
    ListInsertItems(shorts, nullptr, LIST_POS_END, 1);
    EXPECT_EQ(ListAppend(a, shorts), 0);
    ASSERT_EQ(ListAppend(a, b), 1);
    ASSERT_EQ(ListAppend(a, a), 1);
    EXPECT_EQ(Items(a), (Ints{1, 2, 3, 1, 2, 3}));
    ListSetAllocationPolicy(a, 7, 25);
    ListType copy = lists.emplace_back(ListCopy(a));
    EXPECT_EQ(HeaderFields(copy), (Fields{0x4C495354, 25, 7, 6, 4, 6}));
    EXPECT_EQ(ListEqual(a, copy), 1);
    ListClear(b);
    ListClear(shorts);
    EXPECT_EQ(ListEqual(b, shorts), 1); // only item bytes are compared
}

TEST_F(ListTest, FindAndInsertRelativeToAnItem) {
    ListType found = Make({5, 7, 5, 9});
    int const five = 5, eight = 8, nine = 9, absent = 4, missing = 42;
    EXPECT_EQ(ListFindItem(found, &five, LIST_POS_FRONT, IntCompare), 1);
    EXPECT_EQ(ListFindItem(found, &five, 2, IntCompare), 3);
    EXPECT_EQ(ListFindItem(found, &five, 4, nullptr), 0); // byte order
    ListInsertBeforeItem(found, &eight, &nine, IntCompare);
    ListInsertAfterItem(found, &eight, &five, IntCompare);
    ListInsertBeforeItem(found, &absent, &absent, IntCompare);
    ListInsertAfterItem(found, &nine, &missing, nullptr); // not found: at the end
    EXPECT_EQ(Items(found), (Ints{4, 5, 8, 7, 5, 8, 9, 9}));
}

// The list's search and ordered insertion share BinSearch: below and above its linear finish
// (under 7 entries) every key finds its entry, or its insertion point encoded as -point - 1.
TEST_F(ListTest, BinarySearchesFindTheEntryOrTheInsertionPoint) {
    for (int n : {0, 1, 5, 6, 7, 8, 13, 50}) {
        Ints values;
        for (int i = 0; i < n; ++i)
            values.push_back(10 * i);
        for (int key = -5; key <= 10 * n + 5; key += 5) {
            SCOPED_TRACE(testing::Message() << "n=" << n << " key=" << key);
            int const at =
                int(std::lower_bound(values.begin(), values.end(), key) - values.begin());
            bool const found = key % 10 == 0 && key >= 0 && key < 10 * n;
            EXPECT_EQ(BinSearch(values.data(), n, sizeof(int), &key, IntCompare),
                      found ? at : -at - 1);
            ListType sorted = Make(values);
            EXPECT_EQ(ListBinSearch(sorted, &key, IntCompare), found ? at + 1 : 0);
            ASSERT_EQ(ListInsertInOrder(sorted, &key, IntCompare), 1);
            Ints expected = values;
            expected.insert(expected.begin() + at, key);
            ASSERT_EQ(Items(sorted), expected);
        }
    }
    EXPECT_EQ(BinSearch(nullptr, 3, 4, "key", IntCompare), -1);
}

TEST_F(ListTest, IsSortedRemoveDuplicatesAndSort) {
    for (auto const sort : {ListHeapSort, ListQuickSort, ListInsertionSort}) {
        ListType mixed = Make({3, 1, 3, 2, 1, 3});
        EXPECT_EQ(ListIsSorted(mixed, IntCompare), 0);
        ListRemoveDuplicates(mixed, IntCompare);
        EXPECT_EQ(Items(mixed), (Ints{3, 1, 2}));
        sort(mixed, IntCompare);
        EXPECT_EQ(Items(mixed), (Ints{1, 2, 3}));
        EXPECT_EQ(ListIsSorted(mixed, IntCompare), 1);
    }
}

struct Walk {
    std::vector<std::pair<std::int32_t, int>> seen;
    ListType list = nullptr;
    int stopAt = -1;
};

std::int32_t TEKIT_CDECL AppendSmall(std::int32_t position, void* item, void* data) {
    auto& walk = *static_cast<Walk*>(data);
    int const value = *static_cast<int*>(item);
    walk.seen.emplace_back(position, value);
    if (value < 3) {
        int const added = value + 10; // grows the block: the walk must follow it
        ListInsertItem(walk.list, &added, LIST_POS_END);
    }
    return value == walk.stopAt ? -5 : position;
}

std::int32_t TEKIT_CDECL RemoveTwo(std::int32_t position, void* item, void* data) {
    auto& walk = *static_cast<Walk*>(data);
    walk.seen.emplace_back(position, *static_cast<int*>(item));
    if (position == 4)
        ListRemoveItems(walk.list, nullptr, 2, 2);
    return 1;
}

// Up, appended items are visited and a negative result stops; down, the walk stops once
// removals overtake its position.
TEST_F(ListTest, ApplyToEachFollowsTheListAsTheCallbackChangesIt) {
    ListType five = Make({1, 2, 3, 4, 5}), six = Make({1, 2, 3, 4, 5, 6});
    Walk up{{}, five}, stop{{}, five, 2}, down{{}, six};
    EXPECT_EQ(ListApplyToEach(five, 1, AppendSmall, &up), 7);
    EXPECT_EQ(up.seen, (std::vector<std::pair<std::int32_t, int>>{
                           {1, 1}, {2, 2}, {3, 3}, {4, 4}, {5, 5}, {6, 11}, {7, 12}}));
    EXPECT_EQ(ListApplyToEach(five, 1, AppendSmall, &stop), -5);
    EXPECT_EQ(stop.seen.size(), 2u);
    EXPECT_EQ(ListApplyToEach(six, 0, RemoveTwo, &down), 1);
    // After position 4 the list has 4 items: positions 3, 2, 1 still exist.
    EXPECT_EQ(down.seen, (std::vector<std::pair<std::int32_t, int>>{
                             {6, 6}, {5, 5}, {4, 4}, {3, 5}, {2, 4}, {1, 1}}));
}

TEST_F(ListTest, ThrowingCallbackDoesNotEscape) {
    ListType mixed = Make({3, 1, 2});
    auto thrower = [](void const*, void const*) -> int { throw 1; };
    auto walker = [](std::int32_t, void*, void*) -> std::int32_t { throw 2; };
    int const key = 1;
    EXPECT_EQ(ListFindItem(mixed, &key, 1, thrower), 0);
    EXPECT_EQ(ListInsertInOrder(mixed, &key, thrower), 0);
    EXPECT_EQ(ListApplyToEach(mixed, 1, walker, nullptr), 0);
    ListHeapSort(mixed, thrower);
    ListRemoveDuplicates(mixed, thrower);
    Ints items = Items(mixed);
    std::sort(items.begin(), items.end());
    EXPECT_EQ(items, (Ints{1, 2, 3}));
}

TEST(ListDisposeTest, PointerListFreesEachItem) {
    ListType list = ListCreate(sizeof(void*));
    for (void* owned : {std::malloc(16), std::malloc(16)})
        ListInsertItem(list, &owned, LIST_POS_END);
    ListDisposePtrList(list); // the leak checker of the sanitizer build sees the rest
}

/// A 12-byte record ordered by its key only (IntCompare reads the first field), so stability
/// and payload moves are visible.
struct Record {
    int key, order, check;
};

using SortFunction = std::int32_t(TEKIT_STDCALL*)(void*, std::int32_t, std::int32_t,
                                                  CompareFunction);
std::pair<char const*, SortFunction> const kSorts[] = {
    {"heap", HeapSort}, {"quick", QuickSort}, {"insertion", InsertionSort}};

std::vector<int> Data(std::size_t n, int range, unsigned seed) {
    std::mt19937 random(seed);
    std::uniform_int_distribution<int> value(-range, range);
    std::vector<int> data(n);
    for (int& v : data)
        v = value(random);
    return data;
}

TEST(SortTest, AgreesWithStdSortOnRandomSortedReversedAndEqualKeys) {
    for (auto const& [name, sort] : kSorts) {
        for (std::size_t n : {0u, 1u, 2u, 3u, 16u, 17u, 100u, 2000u}) {
            for (int range : {0, 3, 1000000}) { // all equal, many equal, mostly distinct
                std::vector<std::vector<int>> inputs{Data(n, range, unsigned(n + range))};
                inputs.push_back(inputs[0]);
                std::sort(inputs[1].begin(), inputs[1].end());
                inputs.push_back(inputs[1]);
                std::reverse(inputs[2].begin(), inputs[2].end());
                for (auto data : inputs) {
                    std::vector<int> expected = data;
                    std::sort(expected.begin(), expected.end());
                    ASSERT_EQ(sort(data.data(), std::int32_t(n), sizeof(int), IntCompare), 1);
                    ASSERT_EQ(data, expected) << name << " n=" << n << " range=" << range;
                }
            }
        }
    }
}

TEST(SortTest, LargeItemsMoveWholeAndNullComparisonOrdersByUnsignedBytes) {
    for (auto const& [name, sort] : kSorts) {
        std::vector<Record> records;
        for (int i = 0; i < 500; ++i)
            records.push_back({(i * 7919) % 37, i, (i * 7919) % 37 * 31 + 1});
        ASSERT_EQ(sort(records.data(), 500, sizeof(Record), IntCompare), 1);
        for (std::size_t i = 1; i < records.size(); ++i) {
            Record const &before = records[i - 1], &r = records[i];
            ASSERT_EQ(r.check, r.key * 31 + 1) << name;
            ASSERT_LE(before.key, r.key) << name;
            // Insertion sort is stable: equal keys keep their order.
            ASSERT_TRUE(sort != InsertionSort || before.key < r.key || before.order < r.order);
        }
        std::string bytes = "pear\xFF\x01zzapplpea\x80Zulupear"; // six items of four bytes
        ASSERT_EQ(sort(bytes.data(), 6, 4, nullptr), 1);
        EXPECT_EQ(bytes, "Zuluapplpearpearpea\x80\xFF\x01zz") << name;
    }
}

TEST(SortTest, BadArgumentsAndThrowingComparisonsFailKeepingTheItems) {
    for (auto const& [name, sort] : kSorts) {
        std::vector<int> data = Data(200, 1000, 5);
        std::vector<int> items = data;
        EXPECT_EQ(sort(nullptr, 3, 4, IntCompare) + sort(data.data(), -1, 4, IntCompare) +
                      sort(data.data(), 3, 0, IntCompare),
                  0)
            << name;
        EXPECT_EQ(data, items);
        static int calls;
        calls = 0;
        auto throwing = [](void const* a, void const* b) -> int {
            if (++calls == 150)
                throw std::runtime_error("stop");
            return IntCompare(a, b);
        };
        EXPECT_EQ(sort(data.data(), 200, sizeof(int), throwing), 0) << name;
        std::sort(data.begin(), data.end());
        std::sort(items.begin(), items.end());
        EXPECT_EQ(data, items) << name;
    }
}

/// Records each probe, to show which entries the search looks at.
std::vector<int> gProbes;
int TEKIT_CDECL RecordingCompare(void const* key, void const* item) {
    gProbes.push_back(*static_cast<int const*>(item));
    return IntCompare(key, item);
}

TEST(BinSearchTest, HalvesSevenOrMoreEntriesAndWalksFewer) {
    std::vector<int> const seven{0, 1, 2, 3, 4, 5, 6};
    int const five = 5, low = -1;
    EXPECT_EQ(BinSearch(seven.data(), 6, sizeof(int), &five, RecordingCompare), 5);
    EXPECT_EQ(gProbes, (std::vector<int>{0, 1, 2, 3, 4, 5}));
    gProbes.clear();
    EXPECT_EQ(BinSearch(seven.data(), 7, sizeof(int), &low, RecordingCompare), -1);
    EXPECT_EQ(gProbes, (std::vector<int>{3, 0}));
}

} // namespace
