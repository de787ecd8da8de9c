// DynamicString and its shared copy-on-write blocks: sharing, growth, constants.
#include "tekit/strings/DynamicString.h"
#include "TextItems.h"
#include "support/AllocationCounter.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"
#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/GlobalConstantDynamicString.h"
#include "tekit/strings/MemoryBlock.h"
#include "tekit/strings/StaticString.h"
#include "tekit/strings/String.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <string>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using testing::AllocationScope;
using testing::kSeesLibraryAllocations;

using testing::Text;

TEST(DynamicStringSharing, WritingToACopyLeavesTheOriginalAloneAndClearingNeverCopies) {
    DynamicString original("abc", true);
    DynamicString copy(original), cleared(original);
    copy += "def";
    copy.SetChar(0, 'X');
    EXPECT_EQ(Text(original), "abc");
    EXPECT_EQ(Text(copy), "Xbcdef");
    AllocationScope scope;
    cleared.Clear();
    if (kSeesLibraryAllocations) {
        EXPECT_EQ(scope.Count(), 0u);
    }
    EXPECT_EQ(cleared.GetCopyOnWriteMemory(), String::EmptyStrCOWM());
    EXPECT_EQ(original.GetCopyOnWriteMemory()->GetRefCount(), 1);

    CopyOnWriteMemory* block = original.GetCopyOnWriteMemory();
    DynamicString target(std::move(original)); // the block moves, the source is left empty
    EXPECT_EQ(target.GetCopyOnWriteMemory(), block);
    EXPECT_EQ(original.GetCopyOnWriteMemory(), // NOLINT(bugprone-use-after-move)
              String::EmptyStrCOWM());
}

TEST(DynamicStringSharing, LiteralWithoutCopyIsCopiedOnlyAtTheFirstWrite) {
    static char const kLiteral[] = "literal";
    DynamicString s(kLiteral, false);
    EXPECT_EQ(s.GetBufferReadPtr(), kLiteral);
    DynamicString copy(s);

    s.SetChar(0, 'L'); // the literal itself is read-only memory: a write in place would crash
    EXPECT_NE(s.GetBufferReadPtr(), kLiteral);
    EXPECT_STREQ(kLiteral, "literal");
    EXPECT_EQ(Text(copy), "literal");

    DynamicString alone(kLiteral, false); // held by one string only: still never written in place
    alone += "!";
    EXPECT_TRUE(alone.GetCopyOnWriteMemory()->OwnsData());
}

TEST(DynamicStringSharing, AssigningFromStorageWithoutABlockCopiesOrReleases) {
    DynamicString s("old text", true);
    StaticString<64> fixed("fixed");
    s = fixed;
    EXPECT_NE(s.GetBufferReadPtr(), fixed.GetBufferReadPtr());
    s = StaticString<64>();
    EXPECT_EQ(s.GetCopyOnWriteMemory(), String::EmptyStrCOWM());
}

TEST(DynamicStringGrowth, ReservedCapacityFollowsTheSlackRuleAndAppendsStayInPlace) {
    DynamicString s;
    EXPECT_EQ(s.Reserve(100), 108);
    EXPECT_EQ(s.Reserve(100, true), 100);
    char const* data = s.GetBufferReadPtr();
    for (int i = 0; i < 99; ++i)
        s.AppendChar('a' + i % 26);
    EXPECT_EQ(s.GetBufferReadPtr(), data);

    EXPECT_EQ(DynamicString(50).GetBufferSize(), 56); // 50 + 4 + 1, rounded

    DynamicString shrunk("0123456789abcdef", true); // exact, below the text: still terminated
    EXPECT_EQ(shrunk.Reserve(6, true), 8);
    EXPECT_EQ(Text(shrunk), "0123456");
}

TEST(DynamicStringAppend, TextFromThisStringItselfIsAppendedWhole) {
    DynamicString s("abc", true);
    s += s;
    EXPECT_EQ(Text(s), "abcabc");
    for (int i = 0; i < 6; ++i)
        s += s; // each append outgrows the buffer: the source must survive the reallocation
    EXPECT_EQ(s.GetNumBytes(), 6 * 64);
    s.Assign(s.GetBufferReadPtr() + 380);
    EXPECT_EQ(Text(s), "cabc");

    DynamicString list; // the separator goes between items only
    list.ListAppend(DynamicString("a", true), ", ");
    list.ListAppend(DynamicString("b", true), ", ");
    list.ListAppend(DynamicString("c", true), nullptr);
    EXPECT_EQ(Text(list), "a, bc");
}

TEST(GlobalConstantDynamicString, WritingCopiesAndLeavesTheConstantUntouched) {
    static char const kText[] = "interned";
    GlobalConstantDynamicString constant(kText);
    DynamicString sharer(constant);
    EXPECT_EQ(sharer.GetBufferReadPtr(), kText);

    sharer += "!";
    constant.SetChar(0, 'I');
    EXPECT_EQ(Text(sharer), "interned!");
    EXPECT_EQ(Text(constant), "Interned");
    EXPECT_STREQ(kText, "interned");
    EXPECT_FALSE(constant.IsGlobalConstant());
}

TEST(GlobalConstantDynamicString, LookupFindsTheRegisteredConstantOfEqualText) {
    static GlobalConstantDynamicString const kYes("Yes, registered");
    DynamicString input("Yes, registered", true);
    DynamicString other("No", true);
    EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&input), &kYes);
    EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&other), &other);
    {
        GlobalConstantDynamicString scoped("scoped constant");
        DynamicString probe("scoped constant", true);
        scoped.ClearMemory();
        EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&probe), &probe);
    }
    GlobalConstantDynamicString written("written constant");
    written += "!";
    DynamicString probe("written constant", true);
    EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&probe), &probe);
}

unsigned char const* Bytes(char const* text) {
    return reinterpret_cast<unsigned char const*>(text);
}

std::string Text(CopyOnWriteMemory const* block) {
    return reinterpret_cast<char const*>(block->GetReadPtr());
}

/// A holder that starts on a block of its own (the base kind, count 1).
struct Holder {
    CopyOnWriteMemory block;
    CopyOnWriteMemory* holder = &block;
    ~Holder() {
        if (holder != &block)
            holder->Release();
    }
};

TEST(CopyOnWriteMemoryGrowth, GrowsWithSlackRoundsToFourAndShrinksOnlyWhenExact) {
    Holder h;
    EXPECT_EQ(h.holder->ResizeBuffer(&h.holder, 100, false, false), 108); // 100 + 4 + 3
    Holder odd;
    EXPECT_EQ(odd.holder->ResizeBuffer(&odd.holder, 7, false, true), 8);
    EXPECT_TRUE(odd.holder->OwnsData());

    unsigned char* data = h.holder->GetWritePtr(&h.holder);
    std::memcpy(data, "kept", 5);
    EXPECT_EQ(h.holder->ResizeBuffer(&h.holder, 50, false, false), 108); // within: no change
    EXPECT_EQ(h.holder->GetReadPtr(), data);
    EXPECT_EQ(h.holder, &h.block);
    EXPECT_EQ(h.holder->ResizeBuffer(&h.holder, 10, true, true), 12);
    EXPECT_EQ(Text(h.holder), "kept");
    h.holder->ResizeBuffer(&h.holder, 5000, true, false);
    EXPECT_EQ(Text(h.holder), "kept");
    EXPECT_GE(h.holder->GetBufferSize(), 5000);
}

TEST(CopyOnWriteMemoryGrowth, OversizedRequestRaisesOutOfMemoryAndKeepsTheBlock) {
    Holder h;
    h.holder->SetContents(&h.holder, Bytes("safe"), 5);
    unsigned char const* before = h.holder->GetReadPtr();
    TEException const e =
        testing::Raised([&] { h.holder->ResizeBuffer(&h.holder, INT_MAX - 2, true, false); });
    EXPECT_EQ(e.GetErrorCode(), TE_OUT_OF_MEMORY);
    EXPECT_STREQ(e.GetFunctionName(), "CopyOnWriteMemory::ResizeBuffer");
    EXPECT_STREQ(e.GetDescription(), "Out of memory.");
    EXPECT_EQ(h.holder->GetReadPtr(), before);
    EXPECT_EQ(Text(h.holder), "safe");
}

TEST(CopyOnWriteMemorySharing, WriteToSharedBlockGivesTheWriterACopy) {
    GlobalConstantCopyOnWriteMemory constant(Bytes("shared"), 7, false);
    CopyOnWriteMemory* first = &constant;
    first->GetWritePtr(&first); // a heap block of its own, count 1
    ASSERT_NE(first, &constant);
    CopyOnWriteMemory* second = first->AddRef();
    EXPECT_EQ(first->GetRefCount(), 2);

    unsigned char* data = second->GetWritePtr(&second);
    data[0] = 'S';
    EXPECT_NE(second, first);
    EXPECT_EQ(first->GetRefCount(), 1);
    EXPECT_EQ(Text(first), "shared");
    EXPECT_EQ(Text(second), "Shared");
    first->Release();
    second->Release();
}

TEST(CopyOnWriteMemorySharing, ResizingASharedBlockCopiesWhatFits) {
    GlobalConstantCopyOnWriteMemory constant(Bytes("abcdefgh"), 9, false);
    CopyOnWriteMemory* holder = &constant;
    EXPECT_EQ(holder->ResizeBuffer(&holder, 20, true, true), 20);
    ASSERT_NE(holder, &constant);
    EXPECT_EQ(Text(holder), "abcdefgh");
    EXPECT_EQ(constant.GetRefCount(), 2);
    holder->Release();
}

TEST(CopyOnWriteMemorySharing, SetContentsSharesABlockCopiesBytesAndRefersToConstants) {
    GlobalConstantCopyOnWriteMemory constant(Bytes("old"), 4, false);
    CopyOnWriteMemory* holder = &constant;
    holder->GetWritePtr(&holder);
    CopyOnWriteMemory* other = holder->AddRef();
    holder->SetContents(&holder, other); // its own block: the count stays
    EXPECT_EQ(holder->GetRefCount(), 2);
    other->Release();

    char text[] = "private";
    holder->SetContents(&holder, Bytes(text), 8);
    text[0] = 'X';
    EXPECT_EQ(Text(holder), "private");
    holder->Release();

    static char const kText[] = "in place";
    Holder h;
    h.holder->ResizeBuffer(&h.holder, 40, false, false);
    h.holder->SetContentsToConstant(&h.holder, Bytes(kText), sizeof kText);
    EXPECT_EQ(h.holder->GetReadPtr(), Bytes(kText));
    EXPECT_FALSE(h.holder->OwnsData());
}

TEST(GlobalConstantCopyOnWriteMemory, IsNeverExclusiveAndNeverDeleted) {
    GlobalConstantCopyOnWriteMemory constant(Bytes("const"), 6, false);
    EXPECT_TRUE(constant.IsGlobalConstant());
    EXPECT_EQ(constant.GetRefCount(), 2);
    constant.AddRef();
    constant.Release();
    constant.Release();
    constant.Release(); // a constant counts nothing and is never deleted
    EXPECT_EQ(Text(&constant), "const");
}

TEST(CopyOnWriteMemoryConstruction, CopyingConstructorAllocatesRoundedAndOwns) {
    char text[] = "abcde";
    CopyOnWriteMemory copied(Bytes(text), 6, true);
    text[0] = 'X';
    EXPECT_EQ(copied.GetBufferSize(), 8);
    EXPECT_EQ(Text(&copied), "abcde");

    CopyOnWriteMemory inPlace(Bytes(text), 6, false);
    EXPECT_EQ(inPlace.GetReadPtr(), Bytes(text));
    EXPECT_FALSE(inPlace.OwnsData());
}

TEST(MemoryBlock, AllocReplacesAndReleaseEmpties) {
    MemoryBlock block(16);
    ASSERT_NE(block.GetPtr(), nullptr);
    block.GetInt32Ptr()[3] = 42; // the whole range is usable
    block.Alloc(4);
    EXPECT_EQ(block.GetNumBytes(), 4u);
    void* held = block.GetPtr();
    block.Alloc(); // something is held: nothing changes
    EXPECT_EQ(block.GetPtr(), held);
    block.Release();
    EXPECT_EQ(block.GetNumBytes(), 0u);
}

// The string family's cost promises, checked through what they leave behind: reference counts,
// heap objects created, buffer sizes and the size cache. (How fast they are is measured in
// bench/strings, never asserted here.)

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
