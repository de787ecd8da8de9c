// The string family's cost promises, checked through what they leave behind: reference counts,
// heap objects created, buffer sizes and the size cache. (How fast they are is measured in
// bench/strings, never asserted here.)
#include "support/AllocationCounter.h"

#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/GlobalConstantDynamicString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using testing::AllocationScope;
using testing::kSeesLibraryAllocations;

/// The buffer size a block grows to when `size` bytes no longer fit: the growth rule.
int Grown(int size) {
    return (size + 4 + (size >> 5) + 3) & ~3;
}

TEST(CopyCost, EveryCopyAddsExactlyOneReferenceEvenFromManyThreadsAtOnce) {
    DynamicString const original("shared by every thread", true);
    CopyOnWriteMemory const* block = original.GetCopyOnWriteMemory();
    ASSERT_EQ(block->GetRefCount(), 1);
    {
        AllocationScope scope;
        DynamicString copy(original), assigned;
        assigned = original;
        if (kSeesLibraryAllocations) {
            EXPECT_EQ(scope.Count(), 0u);
        }
        EXPECT_EQ(assigned.GetCopyOnWriteMemory(), block);
        EXPECT_EQ(block->GetRefCount(), 3);
    }
    constexpr int kThreads = 4, kCopies = 2000;
    std::vector<std::vector<DynamicString>> copies(kThreads);
    std::vector<std::thread> threads;
    for (auto& mine : copies)
        threads.emplace_back([&original, &mine] {
            mine.reserve(kCopies);
            DynamicString assigned;
            for (int i = 0; i < kCopies; ++i) {
                mine.push_back(original); // one add
                assigned = original;      // one add, one release
            }
        });
    for (std::thread& t : threads)
        t.join();
    // A lost update of a plain increment would show here (and leave a block freed twice).
    EXPECT_EQ(block->GetRefCount(), 1 + kThreads * kCopies);
    for (auto const& mine : copies)
        for (DynamicString const& copy : mine)
            ASSERT_EQ(copy.GetCopyOnWriteMemory(), block);
    copies.clear();
    EXPECT_EQ(block->GetRefCount(), 1);
    EXPECT_STREQ(original.GetBufferReadPtr(), "shared by every thread");
}

TEST(CopyCost, EmptyStringsAndConstantsAllocateNothingWhenMadeCopiedAssignedOrCleared) {
    static GlobalConstantDynamicString const constant("interned constant text");
    String::EmptyStrCOWM(); // created on first use, once per process
    DynamicString target("to be replaced", true);
    AllocationScope scope;
    {
        DynamicString const empty, fromNull(static_cast<char const*>(nullptr)), fromEmpty("");
        for (DynamicString const* s : {&empty, &fromNull, &fromEmpty}) {
            EXPECT_EQ(s->GetCopyOnWriteMemory(), String::EmptyStrCOWM());
            EXPECT_EQ(*s->GetBufferReadPtr(), '\0');
        }
        DynamicString copyOfEmpty(empty), copyOfConstant(constant);
        DynamicString moved(std::move(copyOfConstant));
        target = constant;
        EXPECT_EQ(target.GetCopyOnWriteMemory(), constant.GetCopyOnWriteMemory());
        EXPECT_TRUE(target.IsGlobalConstant());
        target = empty;
        target.Clear();
        copyOfEmpty = moved;
        EXPECT_EQ(copyOfEmpty, constant);
    }
    if (kSeesLibraryAllocations) {
        EXPECT_EQ(scope.Count(), 0u);
    }
    EXPECT_EQ(target.GetCopyOnWriteMemory(), String::EmptyStrCOWM());
    EXPECT_STREQ(constant.GetBufferReadPtr(), "interned constant text");
}

/// Appends one piece at a time and checks every change of the buffer size against the rule.
template <class Append> void ExpectGrowthRule(Append append) {
    DynamicString s;
    int bufferSize = s.GetBufferSize();
    for (int length = 0; length < 3000;) {
        append(s);
        int const needed = s.GetNumBytes() + 1;
        if (needed > bufferSize)
            ASSERT_EQ(s.GetBufferSize(), Grown(needed)) << "text of " << needed - 1 << " bytes";
        else
            ASSERT_EQ(s.GetBufferSize(), bufferSize) << "grew although the text fitted";
        bufferSize = s.GetBufferSize();
        length = s.GetNumBytes();
    }
}

TEST(GrowthCost, AppendsGrowTheBufferByTheRuleAtEverySizeAndByEveryRoute) {
    ExpectGrowthRule([](DynamicString& s) { s += "0123456789"; });
    ExpectGrowthRule([](DynamicString& s) { s += DynamicString("abcdefg", true); });
    ExpectGrowthRule([](DynamicString& s) { static_cast<String&>(s) += "xyz"; });
    ExpectGrowthRule([](DynamicString& s) { s.AppendChar('c'); });
    ExpectGrowthRule([](DynamicString& s) { s.InsertSubstring("0123", 0); });
}

TEST(GrowthCost, AShrunkBufferGrowsAgainByTheRule) {
    DynamicString s("0123456789", true);
    EXPECT_EQ(s.Reserve(300), Grown(300));
    EXPECT_EQ(s.Reserve(12, true), 12); // exact: shrinks to the rounded request
    s += "abc";
    EXPECT_EQ(s.GetBufferSize(), Grown(14));
    EXPECT_STREQ(s.GetBufferReadPtr(), "0123456789abc");
}

TEST(SizeCache, EveryWriteKeepsTheSizeSoReadingItNeverMeasures) {
    DynamicString s;
    s = "abcdef";
    s += "gh";
    s.InsertSubstring("-", 4);
    ASSERT_EQ(s.GetNumBytes(), 9);
    // A byte changed behind the string's back is not seen until the cache is dropped: the
    // size was served from the cache, not measured.
    const_cast<char*>(s.GetBufferReadPtr())[3] = '\0';
    EXPECT_EQ(s.GetNumBytes(), 9);
    s.ReleasePtr();
    EXPECT_EQ(s.GetNumBytes(), 3);
}

} // namespace
} // namespace tekit
