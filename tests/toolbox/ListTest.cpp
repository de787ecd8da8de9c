#include "tekit/toolbox/List.h"

#include "toolbox/ListBlock.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <tuple>
#include <vector>

namespace {

using tekit::toolbox::GrowList;

int TEKIT_CDECL CompareInts(void const* a, void const* b) {
    int const x = *static_cast<int const*>(a), y = *static_cast<int const*>(b);
    return x < y ? -1 : x > y;
}

/// The six header fields, read through the handle as a caller of the block layout would.
std::vector<std::int32_t> Fields(ListType list) {
    std::vector<std::int32_t> fields(6);
    std::memcpy(fields.data(), list->block, 24);
    return fields;
}

std::int32_t Capacity(ListType list) {
    return Fields(list)[3];
}

std::vector<int> Items(ListType list) {
    std::vector<int> items(ListNumItems(list));
    if (!items.empty())
        std::memcpy(items.data(), ListGetDataPtr(list), items.size() * sizeof(int));
    return items;
}

ListType ListOf(std::vector<int> const& values) {
    ListType list = ListCreate(sizeof(int));
    for (int v : values)
        ListInsertItem(list, &v, LIST_POS_END);
    return list;
}

struct ListTest : ::testing::Test {
    void TearDown() override { ListDispose(list); }
    ListType list = ListCreate(sizeof(int));
};

TEST_F(ListTest, NewListBlockIsHeaderAndSpareBytes) {
    EXPECT_EQ(GetHandleSize(list), 28u);
    EXPECT_EQ(Fields(list), (std::vector<std::int32_t>{0x4C495354, 10, 4, 0, 4, 0}));
    EXPECT_EQ(ListGetDataPtr(list), static_cast<char*>(list->block) + 24);
}

TEST_F(ListTest, SingleInsertionsFollowTheGrowthSequence) {
    std::vector<std::int32_t> capacities;
    for (int i = 0; i < 60; ++i) {
        ASSERT_EQ(ListInsertItem(list, &i, LIST_POS_END), 1);
        if (capacities.empty() || capacities.back() != Capacity(list))
            capacities.push_back(Capacity(list));
    }
    EXPECT_EQ(capacities, (std::vector<std::int32_t>{5, 11, 24, 51, 108}));
}

TEST_F(ListTest, PolicyGrowthAddsMoreThanDouble) {
    std::vector<std::int32_t> capacities{Capacity(list)};
    for (int i = 0; i < 6; ++i) {
        ASSERT_EQ(GrowList(list, 0), 1);
        capacities.push_back(Capacity(list));
    }
    EXPECT_EQ(capacities, (std::vector<std::int32_t>{0, 4, 8, 16, 33, 69, 144}));
    ListSetAllocationPolicy(list, 2, 50);
    ASSERT_EQ(GrowList(list, 0), 1);
    EXPECT_EQ(Capacity(list), 144 + 216);
    ASSERT_EQ(GrowList(list, 3), 1); // an exact request
    EXPECT_EQ(Capacity(list), 363);
}

TEST_F(ListTest, PreAllocateAndMultiItemInsertionAddOnlyWhatIsMissing) {
    ASSERT_EQ(ListPreAllocate(list, 4), 1);
    int const one = 1;
    ListInsertItem(list, &one, LIST_POS_END); // 3 slots spare, 8 wanted
    std::vector<int> const eight{2, 3, 4, 5, 6, 7, 8, 9};
    ASSERT_EQ(ListInsertItems(list, eight.data(), LIST_POS_END, 8), 1);
    EXPECT_EQ(Capacity(list), 4 + 4 + 8); // policy step (4) plus the count
    EXPECT_EQ(ListPreAllocate(list, 9), 1);
    EXPECT_EQ(Capacity(list), 18);
    ListCompact(list);
    EXPECT_EQ(Capacity(list), 9);
}

TEST(ListPositionTest, InsertionPlacesItemsByPosition) {
    struct Case {
        std::int32_t position, count;
        int result;
        std::vector<int> after;
    } const cases[] = {
        // clang-format off
        {LIST_POS_FRONT, 1, 1, {9, 1, 2, 3}}, {LIST_POS_END, 1, 1, {1, 2, 3, 9}},
        {3, 1, 1, {1, 2, 9, 3}}, {4, 1, 1, {1, 2, 3, 9}}, /* numItems + 1 appends */
        {5, 1, 0, {1, 2, 3}}, {-2, 1, 0, {1, 2, 3}}, {2, 0, 0, {1, 2, 3}}, {2, 2, 1, {1, 9, 9, 2, 3}},
        {2, std::numeric_limits<std::int32_t>::max(), 0, {1, 2, 3}},
        // clang-format on
    };
    for (auto const& c : cases) {
        ListType list = ListOf({1, 2, 3});
        int const nines[2] = {9, 9};
        EXPECT_EQ(ListInsertItems(list, nines, c.position, c.count), c.result) << c.position;
        EXPECT_EQ(Items(list), c.after) << c.position << " x" << c.count;
        ListDispose(list);
    }
}

TEST_F(ListTest, FrontOfAnEmptyListAndNullSourceZeroFills) {
    int const v = 5;
    ASSERT_EQ(ListInsertItems(list, nullptr, LIST_POS_FRONT, 2), 1);
    ASSERT_EQ(ListInsertItem(list, &v, 1), 1);
    EXPECT_EQ(Items(list), (std::vector<int>{5, 0, 0}));
}

TEST(ListPositionTest, RemovalGetAndReplaceNeedTheWholeRun) {
    struct Case {
        std::int32_t position, count;
        std::vector<int> taken; // empty: nothing happens
    } const cases[] = {
        // clang-format off
        {LIST_POS_FRONT, 1, {1}}, {LIST_POS_END, 1, {4}}, {2, 2, {2, 3}}, {LIST_POS_END, 2, {}},
        {3, 3, {}}, {0, 0, {}}, {-2, 1, {}},
        // clang-format on
    };
    for (auto const& c : cases) {
        ListType list = ListOf({1, 2, 3, 4});
        std::vector<int> got(4, -1), removed(4, -1);
        ListGetItems(list, got.data(), c.position, c.count);
        got.resize(c.taken.size());
        EXPECT_EQ(got, c.taken) << c.position << " x" << c.count;
        ListRemoveItems(list, removed.data(), c.position, c.count);
        removed.resize(c.taken.size());
        EXPECT_EQ(removed, c.taken);
        EXPECT_EQ(Capacity(list), 5); // removal never gives memory back
        ListDispose(list);
    }
}

TEST(ListGuardTest, NullForeignAndOversizedListsAreRefused) {
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

    Handle notAList = NewHandle(64); // zero bytes: no magic
    EXPECT_EQ(ListInsertItem(notAList, &v, LIST_POS_END), 0);
    EXPECT_EQ(GetHandleSize(notAList), 64u);
    DisposeHandle(notAList);

    ListType big = ListCreate(std::numeric_limits<std::int32_t>::max());
    EXPECT_EQ(ListPreAllocate(big, 2), 0); // 2 x (2^31 - 1) bytes does not fit a handle
    EXPECT_EQ(ListInsertItems(big, nullptr, LIST_POS_END, 3), 0);
    EXPECT_EQ(GetHandleSize(big), 28u);
    ListDispose(big);
}

TEST(ListGuardTest, BuffersInsideTheBlockAreRefusedWhereTheBlockMoves) {
    ListType list = ListOf({1, 2, 3, 4, 5}); // full: an insertion grows the block
    EXPECT_EQ(ListInsertItem(list, ListGetPtrToItem(list, 2), LIST_POS_END), 0);
    ListRemoveItem(list, ListGetPtrToItem(list, 1), 2);
    EXPECT_EQ(Items(list), (std::vector<int>{1, 2, 3, 4, 5}));
    // Getting and replacing never move the block: overlap is copied as through a temporary.
    ListReplaceItems(list, ListGetPtrToItem(list, 1), 2, 3);
    EXPECT_EQ(Items(list), (std::vector<int>{1, 1, 2, 3, 5}));
    ListGetItems(list, ListGetPtrToItem(list, 1), 3, 3);
    EXPECT_EQ(Items(list), (std::vector<int>{2, 3, 5, 3, 5}));
    ListDispose(list);
}

TEST(ListWholeTest, AppendCopyAndEqual) {
    ListType a = ListOf({1, 2});
    ListType b = ListOf({3});
    ListType shorts = ListCreate(2);
    ListInsertItems(shorts, nullptr, LIST_POS_END, 1);
    EXPECT_EQ(ListAppend(a, shorts), 0);
    ASSERT_EQ(ListAppend(a, b), 1);
    ASSERT_EQ(ListAppend(a, a), 1);
    EXPECT_EQ(Items(a), (std::vector<int>{1, 2, 3, 1, 2, 3}));
    ListSetAllocationPolicy(a, 7, 25);
    ListType copy = ListCopy(a);
    EXPECT_EQ(Fields(copy), (std::vector<std::int32_t>{0x4C495354, 25, 7, 6, 4, 6}));
    EXPECT_EQ(ListEqual(a, copy), 1);
    ListClear(b);
    ListClear(shorts);
    EXPECT_EQ(ListEqual(b, shorts), 1); // only item bytes are compared
    for (ListType l : {a, b, shorts, copy})
        ListDispose(l);
}

TEST(ListSearchTest, FindAndInsertRelativeToAnItem) {
    ListType list = ListOf({5, 7, 5, 9});
    int const five = 5, eight = 8, nine = 9, absent = 4, missing = 42;
    EXPECT_EQ(ListFindItem(list, &five, LIST_POS_FRONT, CompareInts), 1);
    EXPECT_EQ(ListFindItem(list, &five, 2, CompareInts), 3);
    EXPECT_EQ(ListFindItem(list, &five, 4, nullptr), 0); // byte order
    ListInsertBeforeItem(list, &eight, &nine, CompareInts);
    ListInsertAfterItem(list, &eight, &five, CompareInts);
    ListInsertBeforeItem(list, &absent, &absent, CompareInts);
    ListInsertAfterItem(list, &nine, &missing, nullptr); // not found: at the end
    EXPECT_EQ(Items(list), (std::vector<int>{4, 5, 8, 7, 5, 8, 9, 9}));
    ListDispose(list);
}

TEST(ListSearchTest, OrderedInsertionKeepsOrderAndGoesBeforeAnEqualItem) {
    for (int n : {0, 1, 6, 7, 8, 13, 100}) { // below and above the linear finish
        std::vector<int> values;
        for (int i = 0; i < n; ++i)
            values.push_back(2 * i);
        for (int key = -1; key <= 2 * n; ++key) {
            ListType list = ListOf(values);
            bool const present = key % 2 == 0 && key >= 0 && key < 2 * n;
            EXPECT_EQ(ListBinSearch(list, &key, CompareInts), present ? key / 2 + 1 : 0);
            ASSERT_EQ(ListInsertInOrder(list, &key, CompareInts), 1);
            std::vector<int> expected = values;
            expected.insert(std::lower_bound(expected.begin(), expected.end(), key), key);
            ASSERT_EQ(Items(list), expected) << "n=" << n << " key=" << key;
            ListDispose(list);
        }
    }
}

TEST(ListSearchTest, IsSortedAndRemoveDuplicates) {
    ListType list = ListOf({3, 1, 3, 2, 1, 3});
    EXPECT_EQ(ListIsSorted(list, CompareInts), 0);
    ListRemoveDuplicates(list, CompareInts);
    EXPECT_EQ(Items(list), (std::vector<int>{3, 1, 2}));
    ListQuickSort(list, CompareInts);
    EXPECT_EQ(ListIsSorted(list, CompareInts), 1);
    ListDispose(list);
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

TEST(ListApplyTest, AscendingVisitsAppendedItemsAndStopsOnANegativeResult) {
    ListType list = ListOf({1, 2, 3, 4, 5});
    Walk walk{{}, list};
    EXPECT_EQ(ListApplyToEach(list, 1, AppendSmall, &walk), 7);
    EXPECT_EQ(walk.seen, (std::vector<std::pair<std::int32_t, int>>{
                             {1, 1}, {2, 2}, {3, 3}, {4, 4}, {5, 5}, {6, 11}, {7, 12}}));
    Walk stop{{}, list, 2};
    EXPECT_EQ(ListApplyToEach(list, 1, AppendSmall, &stop), -5);
    EXPECT_EQ(stop.seen.size(), 2u);
    ListDispose(list);
}

TEST(ListApplyTest, DescendingStopsWhenRemovalsOvertakeThePosition) {
    ListType list = ListOf({1, 2, 3, 4, 5, 6});
    Walk walk{{}, list};
    EXPECT_EQ(ListApplyToEach(list, 0, RemoveTwo, &walk), 1);
    // After position 4 the list has 4 items: positions 3, 2, 1 still exist.
    EXPECT_EQ(walk.seen, (std::vector<std::pair<std::int32_t, int>>{
                             {6, 6}, {5, 5}, {4, 4}, {3, 5}, {2, 4}, {1, 1}}));
    ListDispose(list);
}

TEST(ListApplyTest, ThrowingCallbackDoesNotEscape) {
    ListType list = ListOf({3, 1, 2});
    auto thrower = [](void const*, void const*) -> int { throw 1; };
    auto walker = [](std::int32_t, void*, void*) -> std::int32_t { throw 2; };
    int const key = 1;
    EXPECT_EQ(ListFindItem(list, &key, 1, thrower), 0);
    EXPECT_EQ(ListInsertInOrder(list, &key, thrower), 0);
    EXPECT_EQ(ListApplyToEach(list, 1, walker, nullptr), 0);
    ListHeapSort(list, thrower);
    ListRemoveDuplicates(list, thrower);
    std::vector<int> items = Items(list);
    std::sort(items.begin(), items.end());
    EXPECT_EQ(items, (std::vector<int>{1, 2, 3}));
    ListDispose(list);
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
