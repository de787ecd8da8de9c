#include "AllocationCounter.h"
#include "MultiByteFixture.h"

#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/GlobalConstantDynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <string>

namespace tekit {
namespace {

using testing::AllocationScope;
using testing::kSeesLibraryAllocations;

std::string Text(String const& s) {
    return s.GetBufferReadPtr();
}

TEST(DynamicStringSharing, EmptyStringRefersToTheSharedEmptyBlockAndAllocatesNothing) {
    String::EmptyStrCOWM(); // created on first use, once per process
    AllocationScope scope;
    DynamicString empty;
    DynamicString fromNull(static_cast<char const*>(nullptr));
    DynamicString fromEmpty("");
    if (kSeesLibraryAllocations) {
        EXPECT_EQ(scope.Count(), 0u);
    }
    for (DynamicString const* s : {&empty, &fromNull, &fromEmpty}) {
        EXPECT_EQ(s->GetCopyOnWriteMemory(), String::EmptyStrCOWM());
        EXPECT_EQ(s->GetNumBytes(), 0);
        EXPECT_EQ(s->GetNumChars(), 0);
        EXPECT_EQ(s->GetBufferSize(), 1);
        EXPECT_TRUE(s->IsEmpty());
        EXPECT_EQ(s->GetBufferReadPtr(),
                  reinterpret_cast<char const*>(String::EmptyStrCOWM()->GetReadPtr()));
        EXPECT_EQ(*s->GetBufferReadPtr(), '\0');
    }
}

TEST(DynamicStringSharing, CopyAddsAReferenceAndAllocatesNothing) {
    DynamicString original("shared text", true);
    CopyOnWriteMemory* block = original.GetCopyOnWriteMemory();
    int const count = block->GetRefCount();
    AllocationScope scope;
    {
        DynamicString copy(original);
        DynamicString assigned;
        assigned = original;
        if (kSeesLibraryAllocations) {
            EXPECT_EQ(scope.Count(), 0u);
        }
        EXPECT_EQ(copy.GetCopyOnWriteMemory(), block);
        EXPECT_EQ(assigned.GetCopyOnWriteMemory(), block);
        EXPECT_EQ(block->GetRefCount(), count + 2);
        EXPECT_EQ(copy.GetNumBytes(), 11);
    }
    EXPECT_EQ(block->GetRefCount(), count);
}

TEST(DynamicStringSharing, WritingToACopyLeavesTheOriginalAlone) {
    DynamicString original("abc", true);
    DynamicString copy(original);
    copy += "def";
    copy.SetChar(0, 'X');
    EXPECT_EQ(Text(original), "abc");
    EXPECT_EQ(Text(copy), "Xbcdef");
    EXPECT_NE(copy.GetCopyOnWriteMemory(), original.GetCopyOnWriteMemory());
    EXPECT_EQ(original.GetCopyOnWriteMemory()->GetRefCount(), 1);
}

TEST(DynamicStringSharing, ClearingASharedStringNeverCopies) {
    DynamicString original("keep me", true);
    DynamicString copy(original);
    AllocationScope scope;
    copy.Clear();
    if (kSeesLibraryAllocations) {
        EXPECT_EQ(scope.Count(), 0u);
    }
    EXPECT_EQ(copy.GetCopyOnWriteMemory(), String::EmptyStrCOWM());
    EXPECT_EQ(copy.GetNumBytes(), 0);
    EXPECT_EQ(Text(original), "keep me");
    EXPECT_EQ(original.GetCopyOnWriteMemory()->GetRefCount(), 1);
}

TEST(DynamicStringSharing, MoveTakesTheBlockAndLeavesTheSourceEmpty) {
    DynamicString source("moving", true);
    CopyOnWriteMemory* block = source.GetCopyOnWriteMemory();
    DynamicString target(std::move(source));
    EXPECT_EQ(target.GetCopyOnWriteMemory(), block);
    EXPECT_EQ(block->GetRefCount(), 1);
    EXPECT_EQ(source.GetCopyOnWriteMemory(),
              String::EmptyStrCOWM()); // NOLINT(bugprone-use-after-move)
    EXPECT_TRUE(source.IsEmpty());
}

TEST(DynamicStringSharing, LiteralWithoutCopyIsCopiedOnlyAtTheFirstWrite) {
    static char const kLiteral[] = "literal";
    DynamicString s(kLiteral, false);
    EXPECT_EQ(s.GetBufferReadPtr(), kLiteral);
    EXPECT_FALSE(s.GetCopyOnWriteMemory()->OwnsData());
    EXPECT_EQ(s.GetNumBytes(), 7);

    DynamicString copy(s);
    EXPECT_EQ(copy.GetBufferReadPtr(), kLiteral);

    s.SetChar(0, 'L'); // the literal itself is read-only memory: a write in place would crash
    EXPECT_NE(s.GetBufferReadPtr(), kLiteral);
    EXPECT_EQ(Text(s), "Literal");
    EXPECT_STREQ(kLiteral, "literal");
    EXPECT_EQ(Text(copy), "literal");

    DynamicString alone(kLiteral, false); // held by one string only: still never written in place
    alone += "!";
    EXPECT_EQ(Text(alone), "literal!");
    EXPECT_TRUE(alone.GetCopyOnWriteMemory()->OwnsData());
}

TEST(DynamicStringSharing, AssigningFromStorageWithoutABlockCopiesOrReleases) {
    DynamicString s("old text", true);
    StaticString<64> fixed("fixed");
    s = fixed;
    EXPECT_EQ(Text(s), "fixed");
    EXPECT_NE(s.GetBufferReadPtr(), fixed.GetBufferReadPtr());

    StaticString<64> empty;
    s = empty;
    EXPECT_EQ(s.GetCopyOnWriteMemory(), String::EmptyStrCOWM());
    EXPECT_EQ(s.GetNumBytes(), 0);
}

TEST(DynamicStringGrowth, ReservedCapacityFollowsTheSlackRuleAndAppendsStayInPlace) {
    DynamicString s;
    EXPECT_EQ(s.Reserve(100), 108);
    EXPECT_EQ(s.Reserve(100, true), 100);
    EXPECT_EQ(s.GetBufferSize(), 100);
    EXPECT_TRUE(s.IsEmpty());
    char const* data = s.GetBufferReadPtr();
    for (int i = 0; i < 99; ++i)
        s.AppendChar('a' + i % 26);
    EXPECT_EQ(s.GetBufferReadPtr(), data);
    EXPECT_EQ(s.GetNumBytes(), 99);

    DynamicString sized(50);
    EXPECT_EQ(sized.GetBufferSize(), 56); // 50 + 4 + 1, rounded
    EXPECT_TRUE(sized.IsEmpty());
}

TEST(DynamicStringGrowth, ExactShrinkBelowTheTextKeepsItTerminated) {
    DynamicString s("0123456789abcdef", true);
    EXPECT_EQ(s.Reserve(6, true), 8);
    EXPECT_EQ(Text(s), "0123456");
    EXPECT_EQ(s.GetNumBytes(), 7);
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
}

TEST(DynamicStringAppend, ListAppendPutsTheSeparatorBetweenItemsOnly) {
    DynamicString list;
    list.ListAppend(DynamicString("a", true), ", ");
    list.ListAppend(DynamicString("b", true), ", ");
    list.ListAppend(DynamicString("c", true), nullptr);
    EXPECT_EQ(Text(list), "a, bc");
}

TEST(GlobalConstantDynamicString, WritingCopiesAndLeavesTheConstantUntouched) {
    static char const kText[] = "interned";
    GlobalConstantDynamicString constant(kText);
    EXPECT_TRUE(constant.IsGlobalConstant());
    EXPECT_EQ(constant.GetBufferReadPtr(), kText);

    DynamicString sharer;
    sharer = constant;
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
    EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(nullptr), nullptr);
    {
        GlobalConstantDynamicString scoped("scoped constant");
        DynamicString probe("scoped constant", true);
        EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&probe), &scoped);
        scoped.ClearMemory();
        EXPECT_TRUE(scoped.IsEmpty());
        EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&probe), &probe);
    }
    GlobalConstantDynamicString written("written constant");
    written += "!";
    DynamicString probe("written constant", true);
    EXPECT_EQ(GlobalConstantDynamicString::GetGlobalConstantIfExists(&probe), &probe);
}

} // namespace
} // namespace tekit
