#include "tekit/toolbox/List.h"
#include "tekit/toolbox/Compare.h"

#include "toolbox/ListBlock.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
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

TEST_F(ListTest, NewListBlockIsHeaderAndSpareBytes) {
    EXPECT_EQ(GetHandleSize(list), 28u);
    EXPECT_EQ(HeaderFields(list), (Fields{0x4C495354, 10, 4, 0, 4, 0}));
    EXPECT_EQ(ListGetDataPtr(list), static_cast<char*>(list->block) + 24);
}

// The policy step adds (100 + 10) percent of the capacity, at least 4 slots; a single insertion
// into a full list asks for one slot more than the step.
TEST_F(ListTest, GrowthFollowsTheCapacitySequences) {
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

TEST_F(ListTest, OrderedInsertionKeepsOrderAndGoesBeforeAnEqualItem) {
    for (int n : {0, 1, 6, 7, 8, 13, 100}) { // below and above the linear finish
        Ints values;
        for (int i = 0; i < n; ++i)
            values.push_back(2 * i);
        for (int key = -1; key <= 2 * n; ++key) {
            ListType sorted = Make(values);
            bool const present = key % 2 == 0 && key >= 0 && key < 2 * n;
            EXPECT_EQ(ListBinSearch(sorted, &key, IntCompare), present ? key / 2 + 1 : 0);
            ASSERT_EQ(ListInsertInOrder(sorted, &key, IntCompare), 1);
            Ints expected = values;
            expected.insert(std::lower_bound(expected.begin(), expected.end(), key), key);
            ASSERT_EQ(Items(sorted), expected) << "n=" << n << " key=" << key;
        }
    }
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
    for (int i = 0; i < 3; ++i) {
        void* owned = std::malloc(16);
        ListInsertItem(list, &owned, LIST_POS_END);
    }
    ListDisposePtrList(list); // the leak checker of the sanitizer build sees the rest
}

} // namespace
