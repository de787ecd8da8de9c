#include "TextItems.h"
#include "support/AllocationCounter.h"
#include "support/MultiByteFixture.h"

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

} // namespace
} // namespace tekit
