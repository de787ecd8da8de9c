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
    ASSERT_EQ(ListInsertItems(list, nullptr, LIST_POS_FRONT, 8), 1);
    EXPECT_EQ(Capacity(list), 4 + 4 + 8); // policy step (4) plus the count
    EXPECT_EQ(ListPreAllocate(list, 9), 1);
    EXPECT_EQ(Capacity(list), 18);
    ListCompact(list);
    EXPECT_EQ(Capacity(list), 9);
    EXPECT_EQ(Items(list), (Ints{0, 0, 0, 0, 0, 0, 0, 0, 1})); // zero-filled
}

// Inserting at numItems + 1 appends; getting and removing need the whole run inside the list.
// A refused call changes nothing.
TEST_F(ListTest, PositionsPlaceInsertedItemsAndSelectRuns) {
    struct Case {
        bool insert;
        std::int32_t position, count;
        Ints after, taken;
    } const cases[] = {
        // clang-format off
        {true, LIST_POS_FRONT, 1, {9, 1, 2, 3}, {}}, {true, LIST_POS_END, 2, {1, 2, 3, 9, 9}, {}},
        {true, 3, 3, {1, 2, 9, 9, 9, 3}, {}}, {true, 4, 1, {1, 2, 3, 9}, {}},
        {true, 5, 1, {1, 2, 3}, {}}, {true, -2, 1, {1, 2, 3}, {}}, {true, 2, 0, {1, 2, 3}, {}},
        {true, 2, INT32_MAX, {1, 2, 3}, {}}, {false, LIST_POS_FRONT, 1, {2, 3}, {1}},
        {false, LIST_POS_END, 1, {1, 2}, {3}}, {false, 2, 2, {1}, {2, 3}},
        {false, LIST_POS_END, 2, {1, 2, 3}, {}}, {false, -2, 1, {1, 2, 3}, {}},
        {false, 1, 4, {1, 2, 3}, {}},
        // clang-format on
    };
    for (auto const& c : cases) {
        SCOPED_TRACE(testing::Message() << c.insert << " at " << c.position << " x" << c.count);
        ListType three = Make({1, 2, 3});
        int const nines[3] = {9, 9, 9};
        Ints got(3, -1), removed(3, -1);
        if (c.insert) {
            EXPECT_EQ(ListInsertItems(three, nines, c.position, c.count), c.after.size() > 3u);
        } else {
            ListGetItems(three, got.data(), c.position, c.count);
            ListRemoveItems(three, removed.data(), c.position, c.count);
            got.resize(c.taken.size());
            removed.resize(c.taken.size());
            EXPECT_EQ(got, c.taken);
            EXPECT_EQ(removed, c.taken);
            EXPECT_EQ(Capacity(three), 5); // removal never gives memory back
        }
        EXPECT_EQ(Items(three), c.after);
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
    EXPECT_EQ(Items(a), (Ints{1, 2, 3}));
    ListSetAllocationPolicy(a, 7, 25);
    ListType copy = lists.emplace_back(ListCopy(a)); // compact, with the policy
    EXPECT_EQ(HeaderFields(copy), (Fields{0x4C495354, 25, 7, 3, 4, 3}));
    EXPECT_EQ(ListEqual(a, copy), 1);
    ListClear(b);
    ListClear(shorts);
    EXPECT_EQ(ListEqual(b, shorts), 1); // only item bytes are compared
}

TEST_F(ListTest, FindAndInsertRelativeToAnItem) {
    ListType found = Make({5, 7, 5, 9});
    int const five = 5, eight = 8, nine = 9, absent = 4, missing = 42;
    EXPECT_EQ(ListFindItem(found, &five, 2, IntCompare), 3); // from the given position on
    ListInsertBeforeItem(found, &eight, &nine, IntCompare);
    ListInsertAfterItem(found, &eight, &five, IntCompare);
    ListInsertBeforeItem(found, &absent, &absent, IntCompare);
    ListInsertAfterItem(found, &nine, &missing, nullptr); // not found: at the end
    EXPECT_EQ(Items(found), (Ints{4, 5, 8, 7, 5, 8, 9, 9}));
}

TEST_F(ListTest, IsSortedRemoveDuplicatesAndSort) {
    for (auto const sort : {ListHeapSort, ListQuickSort, ListInsertionSort}) {
        ListType mixed = Make({3, 1, 3, 2, 1, 3});
        ListRemoveDuplicates(mixed, IntCompare);
        EXPECT_EQ(ListIsSorted(mixed, IntCompare), 0);
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
        EXPECT_EQ(sort(data.data(), 1, 4, IntCompare) + sort(nullptr, 0, 4, IntCompare), 2);
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

// The list's search and ordered insertion share BinSearch: it halves ranges of 7 or more
// entries and walks shorter ones; a missing key gives its insertion point as -point - 1.
TEST_F(ListTest, BinarySearchHalvesSevenOrMoreEntriesAndWalksFewer) {
    Ints const values{0, 10, 20, 30, 40, 50, 60, 70};
    struct {
        int n, key, result;
        Ints probes;
    } const cases[] = {
        // clang-format off
        {6, 50, 5, {0, 10, 20, 30, 40, 50}}, {7, -1, -1, {30, 0}}, {8, 35, -5, {30, 40}},
        {8, 75, -9, {30, 40, 50, 60, 70}}, {0, 5, -1, {}},
        // clang-format on
    };
    for (auto const& c : cases) {
        gProbes.clear();
        EXPECT_EQ(BinSearch(values.data(), c.n, sizeof(int), &c.key, RecordingCompare), c.result);
        EXPECT_EQ(gProbes, c.probes) << c.n << " " << c.key;
    }
    EXPECT_EQ(BinSearch(nullptr, 3, 4, "key", IntCompare), -1);
    ListType sorted = Make(values);
    int const forty = 40, key = 35;
    EXPECT_EQ(ListBinSearch(sorted, &forty, IntCompare), 5); // a position: 1-based
    EXPECT_EQ(ListBinSearch(sorted, &key, IntCompare), 0);
    ASSERT_EQ(ListInsertInOrder(sorted, &key, IntCompare), 1);
    EXPECT_EQ(Items(sorted), (Ints{0, 10, 20, 30, 35, 40, 50, 60, 70}));
    EXPECT_EQ(ListInsertInOrder(list, &key, IntCompare), 1); // an empty list needs no search
}

} // namespace
