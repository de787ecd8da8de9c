#include "tekit/toolbox/Sort.h"
#include "tekit/toolbox/Compare.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

/// A 12-byte record ordered by its key only (IntCompare reads the first field), so stability
/// and payload moves are visible.
struct Record {
    int key, order, check;
};

using SortFunction = std::int32_t(TEKIT_STDCALL*)(void*, std::int32_t, std::int32_t,
                                                  CompareFunction);
struct Named {
    char const* name;
    SortFunction sort;
};
Named const kSorts[] = {{"heap", HeapSort}, {"quick", QuickSort}, {"insertion", InsertionSort}};

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

TEST(BinSearchTest, ReturnsIndexOrEncodedInsertionPoint) {
    for (int n : {0, 1, 5, 6, 7, 8, 50}) {
        std::vector<int> values;
        for (int i = 0; i < n; ++i)
            values.push_back(10 * i);
        for (int key = -5; key <= 10 * n + 5; key += 5) {
            std::int32_t const got = BinSearch(values.data(), n, sizeof(int), &key, IntCompare);
            auto const at = std::lower_bound(values.begin(), values.end(), key) - values.begin();
            bool const found = key % 10 == 0 && key >= 0 && key < 10 * n;
            EXPECT_EQ(got, found ? at : -std::int32_t(at) - 1) << n << " " << key;
        }
    }
    EXPECT_EQ(BinSearch(nullptr, 3, 4, "key", IntCompare), -1);
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
