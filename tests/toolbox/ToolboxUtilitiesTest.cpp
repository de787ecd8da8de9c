#include "tekit/toolbox/DateTime.h"
#include "tekit/toolbox/IntegerList.h"
#include "tekit/toolbox/MemoryHelpers.h"
#include "tekit/toolbox/Random.h"
#include "tekit/toolbox/Sound.h"
#include "tekit/toolbox/Timer.h"

#include "tekit/errors/TEError.h"
#include "toolbox/DateTimeText.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <limits>
#include <string>
#include <vector>

namespace {

using namespace tekit;

std::vector<int> Values(int const* list, int n) {
    return n > 0 ? std::vector<int>(list, list + n) : std::vector<int>{};
}

// "v" and "from-to" items; text that is not such a list fails and leaves the pointer alone.
TEST(IntegerList, BuildsFromValuesAndRangesOrRefusesTheText) {
    constexpr int kBad = TE_UNRECOGNIZED_VALUE;
    struct {
        char const* text;
        int result;
        std::vector<int> values;
    } const cases[] = {
        // clang-format off
        {"1, 3, 5-8", 6, {1, 3, 5, 6, 7, 8}}, {"8-5", 4, {8, 7, 6, 5}}, {" 7 - 7 ", 1, {7}},
        {"-3--1, +4", 4, {-3, -2, -1, 4}}, {"  ", 0, {}},
        {"2147483646-2147483647", 2, {INT_MAX - 1, INT_MAX}},
        {"1,,2", kBad, {}}, {"1,", kBad, {}}, {"x", kBad, {}}, {"1-2-3", kBad, {}},
        {"1 2", kBad, {}}, {"-", kBad, {}}, {"2147483648", kBad, {}},
        {"0-16777216", TE_INVALID_OR_OUT_OF_RANGE, {}}, {nullptr, TE_INVALID_POINTER, {}},
        // clang-format on
    };
    for (auto const& c : cases) {
        int marker = 0;
        int* list = &marker;
        EXPECT_EQ(BuildIntegerList(c.text, &list), c.result) << c.text;
        if (c.result < 0) {
            EXPECT_EQ(list, &marker) << c.text;
        } else {
            EXPECT_EQ(Values(list, c.result), c.values) << c.text;
            TBFree(list);
        }
    }
}

// A built list has room to grow; appending past it reallocates (the sanitizer build would see
// a write past the block).
TEST(IntegerList, AppendsToABuiltListAndRefusesBadCounts) {
    int* list = nullptr;
    int n = BuildIntegerList("1-5", &list), negative = -1;
    for (int v = 6; v <= 9; ++v)
        ASSERT_EQ(AppendToIntegerList(&list, &n, v), 1);
    EXPECT_EQ(Values(list, n), (std::vector<int>{1, 2, 3, 4, 5, 6, 7, 8, 9}));
    int* none = nullptr;
    EXPECT_EQ(AppendToIntegerList(&list, &negative, 1) + AppendToIntegerList(&none, &n, 1) +
                  AppendToIntegerList(nullptr, &n, 1),
              0);
    EXPECT_EQ(n, 9);
    TBFree(list);
}

TEST(IntegerList, FindsANamedParameter) {
    char const* const info = "channels = 1-3, 8 ; Gain=2;;";
    int* list = nullptr;
    EXPECT_EQ(GetIntListFromParmInfo(info, "CHANNELS", &list), 4);
    EXPECT_EQ(Values(list, 4), (std::vector<int>{1, 2, 3, 8}));
    TBFree(list);
    EXPECT_EQ(GetIntListFromParmInfo(info, "offset", &list), TE_READ_OBJECT_NOT_FOUND);
    EXPECT_EQ(GetIntListFromParmInfo("gain", "gain", &list), TE_UNRECOGNIZED_VALUE);
}

TEST(MemoryHelpers, SwapBlockRefusesPartialOverlap) {
    char a[600], b[600];
    std::memset(a, 'a', sizeof a);
    std::memset(b, 'b', sizeof b);
    EXPECT_EQ(SwapBlock(a, b, sizeof a), 1); // more than one step of the swap
    EXPECT_EQ(std::string(a, 600) + b[0], std::string(600, 'b') + 'a');
    EXPECT_EQ(SwapBlock(a, a + 5, 10) + SwapBlock(a, nullptr, 10), 0);
    EXPECT_EQ(a[5], 'b');
}

TEST(MemoryHelpers, RoundToNextMultiple) {
    struct {
        int value, multiple, expected;
    } const cases[] = {
        // clang-format off
        {13, 8, 16}, {16, 8, 16}, {-13, 8, -8}, {13, 0, 13}, {13, -4, 13}, {INT_MAX, 2, INT_MAX},
        {INT_MIN, 3, INT_MIN + 2}, {INT_MAX - 1, INT_MAX, INT_MAX},
        // clang-format on
    };
    for (auto const& c : cases)
        EXPECT_EQ(RoundToNextMultiple(c.value, c.multiple), c.expected)
            << c.value << " " << c.multiple;
}

TEST(Random, RepeatsForASeedAndStaysInRange) {
    SetRandomSeed(42);
    std::vector<double> first;
    for (int i = 0; i < 100; ++i)
        first.push_back(Random(-1.0, 1.0));
    SetRandomSeed(42);
    for (double x : first)
        EXPECT_TRUE(Random(-1.0, 1.0) == x && x >= -1.0 && x < 1.0);
    // The documented generator: the first value for seed 0 is pinned, on every platform.
    SetRandomSeed(0);
    EXPECT_EQ(Random(0.0, 1.0), 0.6012629994179048);
}

TEST(TimerAndDate, TimerIsMonotonicAndDelayWaits) {
    double const start = Timer();
    Delay(0.02);
    EXPECT_GE(Timer() - start, 0.02);
    Delay(-1.0); // returns at once
    Delay(std::numeric_limits<double>::quiet_NaN());
    EXPECT_LT(Timer() - start, 5.0);
}

TEST(TimerAndDate, InternationalForms) {
    platform::LocalDateTime const when{2024, 3, 7, 9, 5, 59};
    char buffer[16];
    EXPECT_EQ(toolbox::FormatInternationalDate(when, buffer, 11), 10);
    EXPECT_STREQ(buffer, "2024-03-07");
    EXPECT_EQ(toolbox::FormatInternationalTime(when, buffer, 9), 8);
    EXPECT_STREQ(buffer, "09:05:59");
    EXPECT_EQ(toolbox::FormatInternationalDate(when, buffer, 10), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(toolbox::FormatInternationalDate({12024, 1, 1, 0, 0, 0}, buffer, 16),
              TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(InternationalDate(buffer, sizeof buffer), 10); // today's, in the same form
    EXPECT_EQ(InternationalTime(buffer, sizeof buffer), 8);
}

TEST(Sound, RefusesArgumentsOutOfRange) {
    EXPECT_EQ(TBTone(10, 100), 0);
    EXPECT_EQ(TBTone(440, -1), 0);
#if !defined(_WIN32)
    EXPECT_EQ(TBBeep(), 0); // documented as not played on POSIX
    EXPECT_EQ(TBTone(440, 10), 0);
#endif
}

} // namespace
