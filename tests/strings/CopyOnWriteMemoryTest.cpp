#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/MemoryBlock.h"
#include "tekit/strings/String.h"

#include "support/Raises.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <string>

namespace tekit {
namespace {

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

} // namespace
} // namespace tekit
